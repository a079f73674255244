#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "platform/LocaleList.h"

namespace Glimmer::Platform {
namespace {

using Tags = std::vector<std::string>;

TEST(LocaleListTest, EmptyAndMalformedListsAreIdZero) {
    EXPECT_EQ(RegisterLocaleList(nullptr), kEmptyLocaleListId);
    EXPECT_EQ(RegisterLocaleList(""), kEmptyLocaleListId);
    EXPECT_EQ(RegisterLocaleList(" , ,"), kEmptyLocaleListId);
    EXPECT_EQ(RegisterLocaleList("1234,-,x"), kEmptyLocaleListId);
    EXPECT_EQ(GetLocaleList(kEmptyLocaleListId), Tags());
}

TEST(LocaleListTest, TagsAreNormalisedBeforeTheyAreCompared) {
    uint32_t ja = RegisterLocaleList("ja-JP");
    EXPECT_NE(ja, kEmptyLocaleListId);
    EXPECT_EQ(RegisterLocaleList("ja_jp"), ja);
    EXPECT_EQ(RegisterLocaleList("  JA-jp "), ja);
    EXPECT_EQ(RegisterLocaleList("ja-JP-u-ca-japanese"), ja);   // extensions dropped
    EXPECT_EQ(GetLocaleList(ja), Tags({"ja-JP"}));

    EXPECT_EQ(GetLocaleList(RegisterLocaleList("ZH-hans-cn")), Tags({"zh-Hans-CN"}));
    EXPECT_EQ(GetLocaleList(RegisterLocaleList("und-Arab")), Tags({"und-Arab"}));
    EXPECT_EQ(GetLocaleList(RegisterLocaleList("es-419")), Tags({"es-419"}));
    // Repeats and bad tags go; order stays.
    EXPECT_EQ(GetLocaleList(RegisterLocaleList("en-US, 12, fr ,en_us")), Tags({"en-US", "fr"}));
}

TEST(LocaleListTest, NewListsGetNewIdsAndUnknownIdsHaveNoTags) {
    uint32_t first = RegisterLocaleList("de-AT");
    uint32_t second = RegisterLocaleList("de-CH");
    EXPECT_GT(second, first);
    EXPECT_NE(RegisterLocaleList("de-AT,de-CH"), first);
    EXPECT_EQ(RegisterLocaleList("de-AT"), first);
    EXPECT_EQ(GetLocaleList(0xFFFFFFF0u), Tags());
}

}  // namespace
}  // namespace Glimmer::Platform
