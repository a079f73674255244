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

using Testing::NewArray;
using Testing::ReadFile;

std::unique_ptr<GxString> Text(const char* utf8) {
    auto text = std::make_unique<GxString>();
    text->Construct(utf8);
    return text;
}

GxFontFamily* NewFamily(uint32_t localeListId, const char* path) {
    auto* family = new GxFontFamily();
    family->localeListId = localeListId;
    family->fonts = new List();
    family->fonts->Construct();
    auto* entry = new GxFontEntry();
    entry->path = new GxString();
    entry->path->Construct(path);
    family->fonts->Add(entry);
    return family;
}

List* NewList(std::vector<GxFontFamily*> families) {
    auto* list = new List();
    list->Construct();
    for (GxFontFamily* family : families) list->Add(family);
    return list;
}

class FontManagerTest : public ::testing::Test {
protected:
    FontManager manager;
    std::vector<char> dejavu = ReadFile(Testing::kDejaVuSans);
};

TEST_F(FontManagerTest, WeightAndSlantComeFromTheFontName) {
    const struct {
        const char* name;
        int weight;
        bool italic;
    } cases[] = {
        {"MyFont-BoldItalic", 700, true},
        {"Font-BlackBold", 900, false},   // Black is tested before Bold
        {"A-ThinBold", 100, false},
        {"Serif-LightItalic", 300, true},
        {"Sans-Medium", 500, false},
        {"FontBold", 400, false},      // no dash: the name says nothing
        {"-BoldItalic", 400, false},   // a dash at 0 does not count
    };
    for (const auto& c : cases) {
        ASSERT_TRUE(manager.AddMinikinFont(c.name, NewArray(dejavu), unsigned(dejavu.size()), 0, true));
        Platform::FontFamilies families;
        int weight = 400;
        EXPECT_TRUE(manager.GetMinikinFontFamilies(families, Text(c.name).get(), &weight));
        EXPECT_EQ(weight, c.weight) << c.name;
        ASSERT_EQ(families.size(), 1u) << c.name;
        EXPECT_EQ(families[0]->fonts.at(0).weight, c.weight) << c.name;
        EXPECT_EQ(families[0]->fonts[0].italic, c.italic) << c.name;
    }
    // A name the manager does not know adds no family but still sets the weight.
    Platform::FontFamilies families;
    int weight = 400;
    EXPECT_TRUE(manager.GetMinikinFontFamilies(families, Text("/system/fonts/Nowhere-Bold.ttf").get(), &weight));
    EXPECT_TRUE(families.empty());
    EXPECT_EQ(weight, 700);
}

TEST_F(FontManagerTest, FacesOfOneFileShareItsBytesAndAKnownFaceIsKept) {
    const size_t fileSize = ReadFile(Testing::kNotoCjk).size();
    ASSERT_TRUE(manager.AddMinikinFont(Testing::kNotoCjk, nullptr, 0, 0, true));
    ASSERT_TRUE(manager.AddMinikinFont(Testing::kNotoCjk, nullptr, 0, 2, true));
    EXPECT_TRUE(manager.IsExisting(Testing::kNotoCjk, 256));   // index keys are one character, '0' + index
    EXPECT_DOUBLE_EQ(manager.GetTotalMegabytes(), double(fileSize) / 1.024e6);   // read once
    auto path = Text(Testing::kNotoCjk);
    std::shared_ptr<Platform::Font> sc, none;
    ASSERT_TRUE(manager.GetMinikinFont(sc, path.get(), 2));
    EXPECT_STREQ(sc->FamilyName(), "Noto Sans CJK SC");
    EXPECT_FALSE(manager.GetMinikinFont(none, path.get(), 1));

    // With or without the check, the face already there stays and the bytes
    // passed in are freed (the sanitizer build reports them if they leak).
    ASSERT_TRUE(manager.AddMinikinFont(Testing::kDejaVuSans, nullptr, 0, 0, true));
    auto dejavuPath = Text(Testing::kDejaVuSans);
    std::shared_ptr<Platform::Font> first, second;
    ASSERT_TRUE(manager.GetMinikinFont(first, dejavuPath.get(), 0));
    EXPECT_TRUE(manager.AddMinikinFont(Testing::kDejaVuSans, NewArray(dejavu), unsigned(dejavu.size()), 0, true));
    EXPECT_TRUE(manager.AddMinikinFont(Testing::kDejaVuSans, NewArray(dejavu), unsigned(dejavu.size()), 0, false));
    EXPECT_TRUE(manager.AddMinikinFont(dejavuPath.get(), nullptr, 0, 0, false));
    ASSERT_TRUE(manager.GetMinikinFont(second, dejavuPath.get(), 0));
    EXPECT_EQ(first, second);
}

// Each failure: false, its log lines, and a reason that tells it apart.
TEST_F(FontManagerTest, UnreadableFontsFailWithTheirLogLinesAndReasons) {
    Testing::TempDir dir;
    const std::string missing = dir.Path() + "/missing.ttf", pipe = dir.Path() + "/pipe.ttf";
    const std::string empty = dir.Write("empty.ttf", {});
    std::vector<char> noise(3000);
    std::mt19937 random(11);
    for (char& c : noise) c = char(random());
    const std::string corrupt = dir.Write("corrupt.ttf", noise);
    ASSERT_EQ(::mkfifo(pipe.c_str(), 0600), 0);
    const std::string open = "getFontData: fail open file path = ", get = "AddMinikinFont() - Fail to get font",
                      create = "AddMinikinFont() - Fail to create typeface";
    const struct {
        std::string path;
        int index;
        std::string log, reason;
    } cases[] = {
        {missing, 0, open + missing, missing + ": cannot be opened (No such file or directory)"},
        {missing, 0, get, "first asked for"},   // the failed read is remembered: no second attempt
        {pipe, 0, open + pipe, pipe + ": cannot be opened (not a regular file)"},   // not waited on
        {dir.Path(), 0, open + dir.Path(), "not a regular file"},
        {empty, 0, "getFontData: font length is 0 path = " + empty, "empty file"},
        {corrupt, 0, create, corrupt + ": not a font"},
        {Testing::kDejaVuSans, 1, create, "no face 1"},
        {"", 0, "AddMinikinFont() - path is NULL", "no font path"},
    };
    for (const auto& c : cases) {
        Testing::LogCapture log;
        EXPECT_FALSE(manager.AddMinikinFont(c.path.c_str(), nullptr, 0, c.index, true)) << c.path;
        EXPECT_EQ(log.Count("GxFontManager", c.log), 1) << c.path << ": no line \"" << c.log << "\"";
        EXPECT_NE(std::string(Error::GetReason()).find(c.reason), std::string::npos)
            << "reason \"" << Error::GetReason() << "\" does not say \"" << c.reason << "\"";
    }
    EXPECT_FALSE(manager.AddMinikinFont("bytes", NewArray(dejavu), 0, 0, true));   // taken and freed
    EXPECT_NE(std::string(Error::GetReason()).find("bytes: no font bytes"), std::string::npos);
}

TEST_F(FontManagerTest, SystemFamiliesAreTakenOnceAndBuiltOnDemand) {
    GxFontFamily* eager = NewFamily(0, Testing::kDejaVuSans);
    GxFontFamily* lazy = NewFamily(4242, Testing::kNotoCjk);
    GxFontFamily* broken = NewFamily(4343, "/nonexistent/font.ttf");
    ASSERT_TRUE(manager.SetSystemFontFamilies(NewList({eager, lazy, broken})));
    List* second = NewList({NewFamily(0, Testing::kDejaVuSansBold)});
    EXPECT_TRUE(manager.SetSystemFontFamilies(second));   // ignored: still ours to free
    EXPECT_EQ(manager.GetSystemFontFamilies()->Get(0), eager);
    DeleteFontFamily(static_cast<GxFontFamily*>(second->Get(0)));
    delete second;

    EXPECT_TRUE(manager.BuildMinikinFamily(eager));
    eager->built = 1;
    EXPECT_FALSE(manager.LoadMinikinFontFamily(9999));
    EXPECT_TRUE(manager.LoadMinikinFontFamily(4242));
    EXPECT_EQ(lazy->built, 1);
    EXPECT_FALSE(manager.LoadMinikinFontFamily(4242));   // nothing unbuilt is left for it
    EXPECT_TRUE(manager.LoadMinikinFontFamily(4343));    // found, but its file fails
    EXPECT_EQ(broken->built, 0);

    // The text's own font first, then the built families in order.
    ASSERT_TRUE(manager.AddMinikinFont(Testing::kDejaVuSans, nullptr, 0, 0, true));
    Platform::FontFamilies families;
    EXPECT_TRUE(manager.GetMinikinFontFamilies(families, Text(Testing::kDejaVuSans).get(), nullptr));
    ASSERT_EQ(families.size(), 3u);
    EXPECT_EQ(families[0]->localeListId, 0u);
    EXPECT_EQ(families[2]->localeListId, 4242u);
}

}  // namespace
}  // namespace Glimmer
