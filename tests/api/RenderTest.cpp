// The public API from a caller's side: fonts, failures with their reasons,
// the stacking order of layer style, the key, threads. The picture table
// (tests/pictures/) pins what every effect, option and script draws.

#include <gtest/gtest.h>

#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <functional>
#include <limits>
#include <thread>
#include <utility>

#include "glimmer/glimmer.h"
#include "text/TextFixtures.h"

namespace glimmer {
namespace {

constexpr const char* kBold = "/usr/share/fonts/truetype/dejavu/DejaVuSans-Bold.ttf";

const Font& Bold() {
    static const Font font = *Font::fromFile(kBold);
    return font;
}

Text Sample(const char* content = "Ag", float size = 40.0f) {
    return Text{.content = content, .font = Bold(), .style = {.size = size}};
}

Picture Render(const Text& text, bool exact = false) {
    Result<Picture> picture = render(text, {.exact = exact});
    EXPECT_TRUE(picture.ok()) << picture.status().message();
    return std::move(picture).value();
}

// --- fonts

// A font is one per path, or per bytes and name; either draws the same glyphs.
TEST(FontTest, LoadsOncePerPathOrBytes) {
    EXPECT_EQ(Bold().familyName(), "DejaVu Sans");
    EXPECT_TRUE(Bold() == *Font::fromFile(kBold));
    const std::vector<char> bytes = Glimmer::Testing::ReadFile(kBold);
    const Result<Font> fromBytes = Font::fromBytes(bytes.data(), bytes.size(), "Mine-Bold.ttf");
    ASSERT_TRUE(fromBytes.ok()) << fromBytes.status().message();
    EXPECT_TRUE(*fromBytes == *Font::fromBytes(bytes.data(), bytes.size(), "Mine-Bold.ttf"));
    EXPECT_FALSE(*fromBytes == Bold());
    Text text = Sample("Hi");
    const Picture a = Render(text);
    text.font = *fromBytes;
    EXPECT_TRUE(Render(text).image.pixels == a.image.pixels) << "the font from bytes draws other glyphs";
}

TEST(FontTest, FailuresSayWhyAndNeverBlock) {
    const Glimmer::Testing::TempDir dir;
    const std::string text = dir.Write("not-a-font.ttf", {'n', 'o'}), fifo = dir.Path() + "/fifo.ttf";
    ASSERT_EQ(mkfifo(fifo.c_str(), 0600), 0);
    const struct {
        Result<Font> result;
        ErrorCode code;
        const char* says;
    } cases[] = {
        {Font::fromFile("/no/such/font.ttf"), ErrorCode::kCannotRead, "cannot read '/no/such/font.ttf'"},
        {Font::fromFile("/tmp"), ErrorCode::kCannotRead, "not a regular file"},
        {Font::fromFile(fifo), ErrorCode::kCannotRead, "not a regular file"},   // opened without blocking
        {Font::fromFile(text), ErrorCode::kNotAFont, "is not a font"},
        {Font::fromFile(""), ErrorCode::kInvalidArgument, "empty"},
        {Font::fromBytes("garbage", 7, "junk.ttf"), ErrorCode::kNotAFont, "'junk.ttf' is not a font"},
        {Font::fromBytes(nullptr, 10), ErrorCode::kInvalidArgument, "no font bytes"},
    };
    for (const auto& c : cases) {
        EXPECT_EQ(c.result.status().code(), c.code) << c.says;
        EXPECT_NE(c.result.status().message().find(c.says), std::string::npos) << c.result.status().message();
        EXPECT_TRUE(c.result->empty());
    }
}

// --- failures

TEST(RenderFailureTest, BadInputGetsAReasonNeverABlankPicture) {
    const float nan = std::numeric_limits<float>::quiet_NaN();
    const struct {
        const char* what;
        std::function<void(Text&)> spoil;
        ErrorCode code;
    } cases[] = {
        {"no font", [](Text& t) { t.font = Font(); }, ErrorCode::kInvalidArgument},
        {"empty", [](Text& t) { t.content.clear(); }, ErrorCode::kInvalidArgument},
        {"not UTF-8", [](Text& t) { t.content = "a\xFF"; }, ErrorCode::kInvalidArgument},   // each form: TextUnitsTest
        {"size 0", [](Text& t) { t.style.size = 0.0f; }, ErrorCode::kInvalidArgument},
        {"size NaN", [&](Text& t) { t.style.size = nan; }, ErrorCode::kInvalidArgument},
        {"fill opacity NaN", [&](Text& t) { t.style.fillOpacity = nan; }, ErrorCode::kInvalidArgument},
        {"negative width", [](Text& t) { t.layout.width = -1; }, ErrorCode::kInvalidArgument},
        {"padding too large", [](Text& t) { t.layout.padding.left = 40000; }, ErrorCode::kInvalidArgument},
        {"negative line count", [](Text& t) { t.layout.maxLines = -1; }, ErrorCode::kInvalidArgument},
        {"stroke size NaN", [&](Text& t) { t.effects = {Stroke{.size = nan}}; }, ErrorCode::kInvalidArgument},
        {"unknown stroke position",
         [](Text& t) { t.effects = {Stroke{.position = StrokePosition(7)}}; }, ErrorCode::kInvalidArgument},
        {"stops going back",
         [](Text& t) { t.effects = {OuterGlow{.stops = {{0xFFFF0000u, 0.8f}, {0xFF0000FFu, 0.2f}}}}; },
         ErrorCode::kInvalidArgument},
        {"a stop past 1", [](Text& t) { t.effects = {InnerGlow{.stops = {{0xFFFF0000u, 1.5f}}}}; },
         ErrorCode::kInvalidArgument},
        {"a gradient without stops", [](Text& t) { t.effects = {LinearGradient{.stops = {}}}; },
         ErrorCode::kInvalidArgument},
        {"an empty tile", [](Text& t) { t.effects = {Pattern{}}; }, ErrorCode::kInvalidArgument},
        {"a tile short of pixels", [](Text& t) { t.effects = {Pattern{.tile = {4, 4, {0xFF000000u}}}}; },
         ErrorCode::kInvalidArgument},
        {"a line past the text", [](Text& t) { t.layout.firstLine = 1; }, ErrorCode::kLineRange},
        {"a huge view", [](Text& t) { t.layout.width = t.layout.height = 32000; }, ErrorCode::kTooLarge},
        {"only spaces", [](Text& t) { t.content = "   "; }, ErrorCode::kInvalidArgument},
    };
    for (const auto& c : cases) {
        Text text = Sample();
        c.spoil(text);
        const Result<Picture> picture = render(text);
        EXPECT_EQ(picture.status().code(), c.code) << c.what;
        EXPECT_FALSE(picture.status().message().empty()) << c.what;
        EXPECT_TRUE(picture->image.pixels.empty()) << c.what;
    }
    Text text = Sample("one\ntwo\nthree");
    text.layout.firstLine = 3;
    EXPECT_EQ(render(text).status().message(), "line 3 lies past the text's last line (it has 3, counted from 0)");
}

// --- layer style and the key

// Layer style stacks the effects in one order whatever the order of adding;
// the exact mode stacks them as added.
TEST(LayerStyleTest, TheOrderOfAddingMattersOnlyInTheExactMode) {
    Text text = Sample("Hom");
    text.effects = {Bevel{},       InnerGlow{},      OuterGlow{}, LinearGradient{},
                    InnerShadow{}, RadialGradient{}, Emboss{},    Stroke{.size = 5, .color = 0xFFFFD000u},
                    OuterShadow{.angle = 90, .distance = 6, .size = 0, .color = 0xFF0000FFu, .opacity = 1.0f}};
    const Picture style = Render(text), exact = Render(text, true);
    std::reverse(text.effects.begin(), text.effects.end());
    const Picture reversed = Render(text);
    EXPECT_TRUE(reversed.image.pixels == style.image.pixels) << "layer style depends on the order of adding";
    EXPECT_EQ(reversed.key, style.key);
    EXPECT_FALSE(Render(text, true).image.pixels == exact.image.pixels) << "the exact mode ignores the order of adding";
}

TEST(RenderGeometryTest, TheKeyNamesEveryLayerWithItsParameters) {
    Text text = Sample("O");
    text.effects = {Stroke{.size = 4, .color = 0xFFFF0000u}};
    // Stroke 'K' (size 4, opaque red, outside), then the text 'T' (opaque black).
    EXPECT_EQ(Render(text, true).key, "K848F8F8F8F808080808081 T8F8F808080808080");
    EXPECT_EQ(Render(text).key, "K848F8F8F8F808080808081 T8F8F808080808080");
}

// --- threads

TEST(RenderTextTest, RendersOnSeveralThreadsGiveOnePicture) {
    Text text = Sample("Threads");
    text.effects = {Stroke{}, OuterGlow{}};
    const Picture reference = Render(text);
    std::vector<std::thread> threads;
    std::vector<int> mismatches(4, 0);
    for (int t = 0; t < 4; ++t) {
        threads.emplace_back([&, t] {
            for (int i = 0; i < 5; ++i) {
                const Result<Picture> p = render(text);
                mismatches[size_t(t)] += !p.ok() || p->image.pixels != reference.image.pixels;
            }
        });
    }
    for (std::thread& thread : threads) thread.join();
    EXPECT_EQ(mismatches, std::vector<int>(4, 0));
}

}  // namespace
}  // namespace glimmer
