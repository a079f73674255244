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

SystemFontFamily Family(const char* name, const char* languages, std::vector<SystemFont> fonts) {
    SystemFontFamily family;
    family.name = name;
    family.languages = languages;
    family.fonts = std::move(fonts);
    return family;
}

GxFontFamily* At(const List& list, int i) { return static_cast<GxFontFamily*>(list.Get(i)); }

std::string PathOf(const GxFontFamily* family, int i) {
    auto* entry = static_cast<GxFontEntry*>(family->fonts->Get(i));
    char path[1024];
    entry->path->GetUTF8(path, sizeof path);
    return path;
}

TEST(SystemFontFamiliesTest, ConversionKeepsTheUsableFamiliesAndBuildsTheEagerOnes) {
    FontManager manager;
    const std::vector<SystemFontFamily> config = {
        Family("sans-serif", "", {Face(Testing::kDejaVuSans), Face(Testing::kDejaVuSansBold, true)}),
        Family("serif", "", {Face(Testing::kDejaVuSansBold)}),                   // second named: dropped
        Family("", "und-Arab", {Face("/nonexistent.ttf"), Face(Testing::kDejaVuSansBold)}),
        Family("", "ja", {Face(Testing::kDejaVuSans, true), Face(Testing::kDejaVuSans, false, "serif")}),
        Family("", "und-Zsye", {Face(Testing::kDejaVuSansBold)}),
        Family("", "", {Face(Testing::kDejaVuSansBold)}),
    };
    List families;
    families.Construct();
    ASSERT_TRUE(ConvertToFontFamilies(&manager, config, &families));
    ASSERT_EQ(families.GetCount(), 4);   // the serif family and the ja family (nothing usable) are gone

    const GxFontFamily* named = At(families, 0);
    EXPECT_EQ(named->built, 1);
    EXPECT_EQ(named->localeListId, 0u);
    ASSERT_EQ(named->fonts->GetCount(), 1);   // the italic face is never taken
    EXPECT_EQ(PathOf(named, 0), Testing::kDejaVuSans);

    const GxFontFamily* arabic = At(families, 1);
    EXPECT_EQ(arabic->built, 0);   // waits for a text that needs it
    EXPECT_EQ(arabic->localeListId, Platform::RegisterLocaleList("und-Arab"));
    ASSERT_EQ(arabic->fonts->GetCount(), 1);   // the unreadable file is skipped
    EXPECT_EQ(PathOf(arabic, 0), Testing::kDejaVuSansBold);

    EXPECT_EQ(At(families, 2)->built, 1);   // emoji: at once
    EXPECT_EQ(At(families, 3)->built, 1);   // no languages: at once
    EXPECT_TRUE(manager.IsExisting(Testing::kDejaVuSans, 0));
    EXPECT_TRUE(manager.IsExisting(Testing::kDejaVuSansBold, 0));

    for (int i = 0; i < families.GetCount(); ++i) DeleteFontFamily(At(families, i));
}

// The families a locale list's family offers must have the script's letters.
TEST(SystemFontFamiliesTest, TheSystemHasAFamilyForEachMajorScript) {
    const std::vector<SystemFontFamily> config = Platform::GetSystemFontFamilies();
    ASSERT_FALSE(config.empty());
    EXPECT_EQ(config[0].name, "sans-serif");
    for (size_t i = 1; i < config.size(); ++i) EXPECT_TRUE(config[i].name.empty());

    struct Need {
        const char* languages;
        uint32_t letter;
    };
    const Need needs[] = {{"zh-Hans", 0x6F22}, {"zh-Hant", 0x6F22}, {"ja", 0x3042},
                          {"ko", 0xD55C},      {"und-Arab", 0x0628}};
    for (const Need& need : needs) {
        const SystemFontFamily* found = nullptr;
        for (const SystemFontFamily& family : config) {
            if (family.languages == need.languages) found = &family;
        }
        ASSERT_NE(found, nullptr) << need.languages;
        ASSERT_FALSE(found->fonts.empty());
        // Light faces may cover less; the family as a whole must have it.
        bool covered = false;
        for (const SystemFont& face : found->fonts) {
            std::vector<char> bytes = Testing::ReadFile(face.path.c_str());
            auto font = Platform::CreateFont(bytes.data(), bytes.size(), face.ttcIndex,
                                             Platform::FontData::kBorrowed);
            ASSERT_NE(font, nullptr) << face.path;
            covered = covered || font->HasGlyph(need.letter);
        }
        EXPECT_TRUE(covered) << need.languages;
    }
}

}  // namespace
}  // namespace Glimmer
