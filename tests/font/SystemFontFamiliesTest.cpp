#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "font/FontManager.h"
#include "font/SystemFontFamilies.h"
#include "foundation/GxString.h"
#include "foundation/List.h"
#include "platform/LocaleList.h"
#include "platform/SystemFonts.h"
#include "text/TextFixtures.h"

namespace Glimmer {
namespace {

using Platform::SystemFont;
using Platform::SystemFontFamily;

SystemFont Face(const char* path, bool italic = false, const char* fallbackFor = "") {
    SystemFont font;
    font.path = path;
    font.italic = italic;
    font.fallbackFor = fallbackFor;
    return font;
}

GxFontFamily* At(const List& list, int i) { return static_cast<GxFontFamily*>(list.Get(i)); }

std::string PathOf(const GxFontFamily* family, int i) {
    char path[1024];
    static_cast<GxFontEntry*>(family->fonts->Get(i))->path->GetUTF8(path, sizeof path);
    return path;
}

TEST(SystemFontFamiliesTest, ConversionKeepsTheUsableFamiliesAndBuildsTheEagerOnes) {
    FontManager manager;
    const char* sans = Testing::kDejaVuSans;
    const char* bold = Testing::kDejaVuSansBold;
    const std::vector<SystemFontFamily> config = {
        {"sans-serif", "", 0, {Face(sans), Face(bold, true)}},   // the italic face is never taken
        {"serif", "", 0, {Face(bold)}},                          // a second named family: dropped
        {"", "und-Arab", 0, {Face("/nonexistent.ttf"), Face(bold)}},
        {"", "ja", 0, {Face(sans, true), Face(sans, false, "serif")}},   // nothing usable: dropped
        {"", "und-Zsye", 0, {Face(bold)}},
        {"", "", 0, {Face(bold)}},
    };
    List families;
    families.Construct();
    ASSERT_TRUE(ConvertToFontFamilies(&manager, config, &families));
    ASSERT_EQ(families.GetCount(), 4);
    const struct {
        int built;
        const char* languages;
        std::vector<std::string> paths;
    } expected[] = {
        {1, "", {sans}},
        {0, "und-Arab", {bold}},   // waits for a text that needs it; the unreadable file is skipped
        {1, "und-Zsye", {bold}},   // emoji: at once
        {1, "", {bold}},           // no languages: at once
    };
    for (int i = 0; i < 4; ++i) {
        const GxFontFamily* family = At(families, i);
        EXPECT_EQ(family->built, expected[i].built) << i;
        EXPECT_EQ(family->localeListId, Platform::RegisterLocaleList(expected[i].languages)) << i;
        ASSERT_EQ(family->fonts->GetCount(), int(expected[i].paths.size())) << i;
        EXPECT_EQ(PathOf(family, 0), expected[i].paths[0]) << i;
    }
    EXPECT_TRUE(manager.IsExisting(sans, 0));
    for (int i = 0; i < families.GetCount(); ++i) DeleteFontFamily(At(families, i));
}

// The family a locale list asks for must have the script's letters.
TEST(SystemFontFamiliesTest, TheSystemHasAFamilyForEachMajorScript) {
    const std::vector<SystemFontFamily> config = Platform::GetSystemFontFamilies();
    ASSERT_FALSE(config.empty());
    EXPECT_EQ(config[0].name, "sans-serif");
    const std::pair<const char*, uint32_t> needs[] = {
        {"zh-Hans", 0x6F22}, {"zh-Hant", 0x6F22}, {"ja", 0x3042}, {"ko", 0xD55C}, {"und-Arab", 0x0628}};
    for (const auto& [languages, letter] : needs) {
        bool covered = false;   // light faces may cover less; the family as a whole must have it
        for (const SystemFontFamily& family : config) {
            if (family.languages != languages) continue;
            for (const SystemFont& face : family.fonts) {
                std::vector<char> bytes = Testing::ReadFile(face.path.c_str());
                auto font = Platform::CreateFont(bytes.data(), bytes.size(), face.ttcIndex,
                                                 Platform::FontData::kBorrowed);
                covered = covered || (font != nullptr && font->HasGlyph(letter));
            }
        }
        EXPECT_TRUE(covered) << "no family for " << languages << " has U+" << std::hex << letter;
    }
}

}  // namespace
}  // namespace Glimmer
