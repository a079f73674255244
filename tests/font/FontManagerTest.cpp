#include <gtest/gtest.h>
#include <sys/stat.h>

#include <memory>
#include <random>
#include <string>
#include <vector>

#include "font/FontManager.h"
#include "foundation/Error.h"
#include "foundation/GxString.h"
#include "foundation/List.h"
#include "platform/TextLayout.h"
#include "support/LogCapture.h"
#include "text/TextFixtures.h"

namespace Glimmer {
namespace {

using Testing::LogCapture;
using Testing::NewArray;
using Testing::ReadFile;

std::unique_ptr<GxString> Text(const char* utf8) {
    auto text = std::make_unique<GxString>();
    text->Construct(utf8);
    return text;
}

GxFontFamily* NewFamily(uint32_t localeListId, std::vector<const char*> paths) {
    auto* family = new GxFontFamily();
    family->localeListId = localeListId;
    family->fonts = new List();
    family->fonts->Construct();
    for (const char* path : paths) {
        auto* entry = new GxFontEntry();
        entry->path = new GxString();
        entry->path->Construct(path);
        family->fonts->Add(entry);
    }
    return family;
}

List* NewList(std::vector<GxFontFamily*> families) {
    auto* list = new List();
    list->Construct();
    for (GxFontFamily* family : families) list->Add(family);
    return list;
}

void DeleteList(List* list) {
    for (int i = 0; i < list->GetCount(); ++i) DeleteFontFamily(static_cast<GxFontFamily*>(list->Get(i)));
    delete list;
}

class FontManagerTest : public ::testing::Test {
protected:
    FontManager manager;
    std::vector<char> dejavu = ReadFile(Testing::kDejaVuSans);
};

TEST_F(FontManagerTest, WeightAndSlantComeFromTheFontName) {
    struct Case {
        const char* name;
        int weight;
        bool italic;
        bool ownFamily;
    };
    const Case cases[] = {
        {"MyFont-BoldItalic", 700, true, true},
        {"Font-Black", 900, false, true},
        {"Font-BlackBold", 900, false, true},   // Black is tested before Bold
        {"A-ThinBold", 100, false, true},
        {"Serif-LightItalic", 300, true, true},
        {"Sans-Medium", 500, false, true},
        {"Sans-Regular", 400, false, true},
        {"FontBold", 400, false, true},          // no dash: the name says nothing
        {"-BoldItalic", 400, false, true},       // a dash at 0 does not count
        {"/system/fonts/Roboto-Bold.ttf", 700, false, false},   // left to the system families
    };
    for (const Case& c : cases) {
        ASSERT_TRUE(manager.AddMinikinFont(c.name, NewArray(dejavu), unsigned(dejavu.size()), 0, true));
        auto name = Text(c.name);
        Platform::FontFamilies families;
        int weight = 400;
        EXPECT_TRUE(manager.GetMinikinFontFamilies(families, name.get(), &weight));
        EXPECT_EQ(weight, c.weight) << c.name;
        ASSERT_EQ(families.size(), c.ownFamily ? 1u : 0u) << c.name;
        if (!c.ownFamily) continue;
        ASSERT_EQ(families[0]->fonts.size(), 1u);
        EXPECT_EQ(families[0]->fonts[0].weight, c.weight) << c.name;
        EXPECT_EQ(families[0]->fonts[0].italic, c.italic) << c.name;
        EXPECT_EQ(families[0]->localeListId, 0u);
    }
    // A name the manager does not know adds no family but still sets the weight.
    auto unknown = Text("Nowhere-Bold");
    Platform::FontFamilies families;
    int weight = 400;
    EXPECT_TRUE(manager.GetMinikinFontFamilies(families, unknown.get(), &weight));
    EXPECT_TRUE(families.empty());
    EXPECT_EQ(weight, 700);
}

TEST_F(FontManagerTest, FacesOfOneFileShareItsBytes) {
    const size_t fileSize = ReadFile(Testing::kNotoCjk).size();
    ASSERT_TRUE(manager.AddMinikinFont(Testing::kNotoCjk, nullptr, 0, 0, true));
    ASSERT_TRUE(manager.AddMinikinFont(Testing::kNotoCjk, nullptr, 0, 2, true));
    EXPECT_TRUE(manager.IsExisting(Testing::kNotoCjk, 0));
    EXPECT_TRUE(manager.IsExisting(Testing::kNotoCjk, 2));
    EXPECT_FALSE(manager.IsExisting(Testing::kNotoCjk, 1));
    // Read once, counted in units of 1,024,000 bytes.
    EXPECT_DOUBLE_EQ(manager.GetTotalMegabytes(), double(fileSize) / 1.024e6);

    auto path = Text(Testing::kNotoCjk);
    std::shared_ptr<Platform::Font> jp, sc;
    ASSERT_TRUE(manager.GetMinikinFont(jp, path.get(), 0));
    ASSERT_TRUE(manager.GetMinikinFont(sc, path.get(), 2));
    EXPECT_STREQ(jp->FamilyName(), "Noto Sans CJK JP");
    EXPECT_STREQ(sc->FamilyName(), "Noto Sans CJK SC");
    std::shared_ptr<Platform::Font> none;
    EXPECT_FALSE(manager.GetMinikinFont(none, path.get(), 1));
    EXPECT_EQ(none, nullptr);

    // Index keys are one character, '0' + index, so 256 lands on index 0.
    EXPECT_TRUE(manager.IsExisting(Testing::kNotoCjk, 256));
}

TEST_F(FontManagerTest, AnExistingFaceIsKeptAndTheNewBytesFreed) {
    ASSERT_TRUE(manager.AddMinikinFont(Testing::kDejaVuSans, nullptr, 0, 0, true));
    auto path = Text(Testing::kDejaVuSans);
    std::shared_ptr<Platform::Font> first, second;
    ASSERT_TRUE(manager.GetMinikinFont(first, path.get(), 0));
    // With or without the check, the face already there stays (the sanitizer
    // build would report the bytes passed in if they leaked).
    EXPECT_TRUE(manager.AddMinikinFont(Testing::kDejaVuSans, NewArray(dejavu), unsigned(dejavu.size()), 0, true));
    EXPECT_TRUE(manager.AddMinikinFont(Testing::kDejaVuSans, NewArray(dejavu), unsigned(dejavu.size()), 0, false));
    EXPECT_TRUE(manager.AddMinikinFont(path.get(), nullptr, 0, 0, false));
    ASSERT_TRUE(manager.GetMinikinFont(second, path.get(), 0));
    EXPECT_EQ(first, second);
}

// The thread's reason after a failure, for people: its words are checked
// loosely, only what a caller needs to tell the failures apart.
::testing::AssertionResult ReasonSays(const std::string& words) {
    const std::string reason = Error::GetReason();
    if (reason.find(words) != std::string::npos) return ::testing::AssertionSuccess();
    return ::testing::AssertionFailure() << "reason \"" << reason << "\" does not say \"" << words << "\"";
}

TEST_F(FontManagerTest, UnreadableFontsFailWithTheirLogLinesAndReasons) {
    Testing::TempDir dir;
    const std::string missing = dir.Path() + "/missing.ttf";
    const std::string empty = dir.Write("empty.ttf", {});
    std::vector<char> noise(3000);
    std::mt19937 random(11);
    for (char& c : noise) c = char(random());
    const std::string corrupt = dir.Write("corrupt.ttf", noise);
    const std::string pipe = dir.Path() + "/pipe.ttf";
    ASSERT_EQ(::mkfifo(pipe.c_str(), 0600), 0);

    LogCapture log;
    EXPECT_FALSE(manager.AddMinikinFont(missing.c_str(), nullptr, 0, 0, true));
    EXPECT_EQ(log.Count("GxFontManager", "getFontData: fail open file path = " + missing), 1);
    EXPECT_EQ(log.Count("GxFontManager", "AddMinikinFont() - Fail to get font"), 1);
    EXPECT_TRUE(ReasonSays(missing + ": cannot be opened (No such file or directory)"));
    // The failed read is remembered: no second attempt at the file.
    log.Clear();
    EXPECT_FALSE(manager.AddMinikinFont(missing.c_str(), nullptr, 0, 0, true));
    EXPECT_EQ(log.Count("GxFontManager", "getFontData: fail open file path = " + missing), 0);
    EXPECT_EQ(log.Count("GxFontManager", "AddMinikinFont() - Fail to get font"), 1);
    EXPECT_TRUE(ReasonSays("first asked for"));

    // A pipe is refused at once instead of waiting for a writer, and a
    // directory before its "size" is taken.
    EXPECT_FALSE(manager.AddMinikinFont(pipe.c_str(), nullptr, 0, 0, true));
    EXPECT_EQ(log.Count("GxFontManager", "getFontData: fail open file path = " + pipe), 1);
    EXPECT_TRUE(ReasonSays(pipe + ": cannot be opened (not a regular file)"));
    EXPECT_FALSE(manager.AddMinikinFont(dir.Path().c_str(), nullptr, 0, 0, true));
    EXPECT_EQ(log.Count("GxFontManager", "getFontData: fail open file path = " + dir.Path()), 1);
    EXPECT_TRUE(ReasonSays("not a regular file"));

    EXPECT_FALSE(manager.AddMinikinFont(empty.c_str(), nullptr, 0, 0, true));
    EXPECT_EQ(log.Count("GxFontManager", "getFontData: font length is 0 path = " + empty), 1);
    EXPECT_TRUE(ReasonSays("empty file"));
    EXPECT_FALSE(manager.AddMinikinFont(corrupt.c_str(), nullptr, 0, 0, true));
    EXPECT_TRUE(ReasonSays(corrupt + ": not a font"));
    EXPECT_FALSE(manager.AddMinikinFont(corrupt.c_str(), nullptr, 0, 0, true));
    EXPECT_EQ(log.Count("GxFontManager", "AddMinikinFont() - Fail to create typeface"), 2);
    EXPECT_FALSE(manager.AddMinikinFont(Testing::kDejaVuSans, nullptr, 0, 1, true));   // no face 1
    EXPECT_EQ(log.Count("GxFontManager", "AddMinikinFont() - Fail to create typeface"), 3);
    EXPECT_TRUE(ReasonSays("no face 1"));
    EXPECT_FALSE(manager.AddMinikinFont("bytes", NewArray(dejavu), 0, 0, true));
    EXPECT_EQ(log.Count("GxFontManager", "AddMinikinFont() - Fail to get font"), 5);
    EXPECT_TRUE(ReasonSays("bytes: no font bytes"));

    EXPECT_FALSE(manager.AddMinikinFont(static_cast<const char*>(nullptr), nullptr, 0, 0, true));
    EXPECT_FALSE(manager.AddMinikinFont("", NewArray(dejavu), unsigned(dejavu.size()), 0, true));
    EXPECT_EQ(log.Count("GxFontManager", "AddMinikinFont() - path is NULL"), 2);
    EXPECT_TRUE(ReasonSays("no font path"));
    EXPECT_FALSE(manager.IsExisting(nullptr, 0));
    EXPECT_EQ(log.Count("GxFontManager", "IsExisting() - path is NULL"), 1);

    unsigned size = 77;
    EXPECT_EQ(getFontData(missing.c_str(), size), nullptr);
    EXPECT_EQ(size, 77u);
}

// Random and damaged font bytes must never crash the manager, the layout or
// the rasteriser; whatever is accepted must draw safely.
TEST_F(FontManagerTest, DamagedFontBytesAreSafe) {
    std::mt19937 random(2024);
    std::vector<std::vector<char>> inputs;
    for (size_t cut : {4, 12, 100, 1000, 10000, 100000}) {
        inputs.emplace_back(dejavu.begin(), dejavu.begin() + long(std::min(cut, dejavu.size())));
    }
    for (int i = 0; i < 40; ++i) {
        std::vector<char> damaged = dejavu;
        for (int flips = 0; flips < 64; ++flips) damaged[random() % damaged.size()] = char(random());
        inputs.push_back(std::move(damaged));
    }
    for (const char* header : {"\x00\x01\x00\x00", "OTTO", "ttcf", "true"}) {
        std::vector<char> noise(2048);
        for (char& c : noise) c = char(random());
        std::copy(header, header + 4, noise.begin());
        inputs.push_back(std::move(noise));
    }

    const std::u16string text = u"Hello \u0628\u0628 \u6F22";
    for (size_t i = 0; i < inputs.size(); ++i) {
        std::string key = "damaged-" + std::to_string(i);
        if (!manager.AddMinikinFont(key.c_str(), NewArray(inputs[i]), unsigned(inputs[i].size()), 0, true)) {
            continue;
        }
        auto name = Text(key.c_str());
        Platform::FontFamilies families;
        int weight = 400;
        ASSERT_TRUE(manager.GetMinikinFontFamilies(families, name.get(), &weight));
        auto typeface = Platform::CreateTypefaceFromFamilies(families, weight, false);
        Platform::Paint paint;
        paint.size = 24.0f;
        paint.embolden = (i % 2) != 0;
        Platform::Layout layout;
        Platform::LayoutText(paint, Platform::Bidi::kDefaultLtr, *typeface,
                             reinterpret_cast<const uint16_t*>(text.data()), text.size(), 0, text.size(),
                             0, text.size(), &layout);
        std::vector<uint8_t> mask(64 * 32);
        Platform::ForEachFontRun(layout, paint, [&](size_t start, size_t end, const Platform::RunFont& font) {
            for (size_t g = start; g < end; ++g) {
                uint16_t id = uint16_t(layout.glyphs[g].glyphId);
                float position[2] = {layout.glyphs[g].x, layout.glyphs[g].y};
                Platform::DrawGlyphs(font, &id, position, 1, 0.0f, 24.0f, mask.data(), 64, 32);
            }
        });
    }
}

TEST_F(FontManagerTest, SystemFamiliesAreTakenOnceAndBuiltOnDemand) {
    GxFontFamily* eager = NewFamily(0, {Testing::kDejaVuSans});
    GxFontFamily* lazy = NewFamily(4242, {Testing::kNotoCjk});
    GxFontFamily* broken = NewFamily(4343, {"/nonexistent/font.ttf"});
    EXPECT_FALSE(manager.IsSystemFontFamiliesAlreadySet());
    ASSERT_TRUE(manager.SetSystemFontFamilies(NewList({eager, lazy, broken})));
    EXPECT_TRUE(manager.IsSystemFontFamiliesAlreadySet());

    List* second = NewList({NewFamily(0, {Testing::kDejaVuSansBold})});
    EXPECT_TRUE(manager.SetSystemFontFamilies(second));   // ignored: still ours to free
    EXPECT_EQ(manager.GetSystemFontFamilies()->Get(0), eager);
    DeleteList(second);

    EXPECT_TRUE(manager.BuildMinikinFamily(eager));
    eager->built = 1;
    Platform::FontFamilies families;
    EXPECT_TRUE(manager.GetMinikinFontFamilies(families, nullptr, nullptr));
    EXPECT_EQ(families.size(), 1u);   // the lazy family is not built yet

    EXPECT_FALSE(manager.LoadMinikinFontFamily(9999));
    EXPECT_TRUE(manager.LoadMinikinFontFamily(4242));
    EXPECT_EQ(lazy->built, 1);
    EXPECT_FALSE(manager.LoadMinikinFontFamily(4242));   // nothing unbuilt is left for it
    EXPECT_TRUE(manager.LoadMinikinFontFamily(4343));    // found, but its file fails
    EXPECT_EQ(broken->built, 0);

    families.clear();
    auto own = Text(Testing::kDejaVuSans);
    ASSERT_TRUE(manager.AddMinikinFont(Testing::kDejaVuSans, nullptr, 0, 0, true));
    EXPECT_TRUE(manager.GetMinikinFontFamilies(families, own.get(), nullptr));
    ASSERT_EQ(families.size(), 3u);   // own font, then the two built families in order
    EXPECT_EQ(families[0]->localeListId, 0u);
    EXPECT_EQ(families[2]->localeListId, 4242u);

    EXPECT_FALSE(manager.BuildMinikinFamily(nullptr));
    GxFontFamily empty;
    EXPECT_FALSE(manager.BuildMinikinFamily(&empty));
}

}  // namespace
}  // namespace Glimmer
