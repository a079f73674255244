#include <gtest/gtest.h>

#include <string>
#include <tuple>
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
    return {path, 0, 400, italic, "", fallbackFor};
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
    // Each family as (built, locale list, its one font): the Arabic one waits for
    // a text that needs it (its unreadable file skipped), emoji and families
    // without languages are built at once.
    std::vector<std::tuple<int, uint32_t, std::string>> got;
    for (int i = 0; i < families.GetCount(); ++i) {
        ASSERT_EQ(At(families, i)->fonts->GetCount(), 1) << i;
        got.emplace_back(At(families, i)->built, At(families, i)->localeListId, PathOf(At(families, i), 0));
    }
    const auto id = [](const char* languages) { return Platform::RegisterLocaleList(languages); };
    EXPECT_EQ(got, (std::vector<std::tuple<int, uint32_t, std::string>>{
                       {1, 0u, sans}, {0, id("und-Arab"), bold}, {1, id("und-Zsye"), bold}, {1, 0u, bold}}));
    EXPECT_TRUE(manager.IsExisting(sans, 0));
    for (int i = 0; i < families.GetCount(); ++i) DeleteFontFamily(At(families, i));
}

}  // namespace
}  // namespace Glimmer
