#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "platform/LocaleList.h"

namespace Glimmer::Platform {
namespace {

using Tags = std::vector<std::string>;

TEST(LocaleListTest, TagsAreNormalisedAndTheSameListKeepsItsId) {
    const struct {
        const char* list;
        Tags tags;
    } cases[] = {
        {nullptr, {}},
        {" , ,", {}},
        {"1234,-,x", {}},
        {"ja_jp", {"ja-JP"}},
        {"ja-JP-u-ca-japanese", {"ja-JP"}},   // extensions dropped
        {"ZH-hans-cn", {"zh-Hans-CN"}},
        {"es-419", {"es-419"}},
        {"en-US, 12, fr ,en_us", {"en-US", "fr"}},   // repeats and bad tags go; order stays
    };
    for (const auto& c : cases) {
        const uint32_t id = RegisterLocaleList(c.list);
        EXPECT_EQ(GetLocaleList(id), c.tags) << (c.list != nullptr ? c.list : "(null)");
        EXPECT_EQ(id == kEmptyLocaleListId, c.tags.empty()) << (c.list != nullptr ? c.list : "(null)");
    }
    const uint32_t ja = RegisterLocaleList("ja-JP");
    EXPECT_EQ(RegisterLocaleList("  JA-jp "), ja);
    EXPECT_GT(RegisterLocaleList("ja-JP,de-CH"), ja);   // a new list, a new id
    EXPECT_EQ(GetLocaleList(0xFFFFFFF0u), Tags());
}

}  // namespace
}  // namespace Glimmer::Platform
