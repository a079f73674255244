#include <gtest/gtest.h>
#include <sys/stat.h>

#include <string>

#include "platform/Assets.h"
#include "text/TextFixtures.h"

namespace Glimmer::Platform {
namespace {

TEST(AssetsTest, AssetsAreRegularFilesUnderTheRootAndNothingElse) {
    Testing::TempDir dir;
    dir.Write("font.bin", {'a', 'b', 'c', 'd', 'e'});
    AssetManager assets(dir.Path());
    std::unique_ptr<Asset> asset = assets.Open("font.bin");
    ASSERT_NE(asset, nullptr);
    EXPECT_EQ(asset->GetLength(), 5);
    char buffer[8] = {};
    EXPECT_EQ(asset->Read(buffer, 3), 3);
    EXPECT_EQ(asset->Read(buffer + 3, 8), 2);
    EXPECT_EQ(std::string(buffer), "abcde");

    ASSERT_EQ(::mkfifo((dir.Path() + "/pipe.bin").c_str(), 0600), 0);
    const std::string outside = "../" + dir.Path().substr(dir.Path().rfind('/') + 1) + "/font.bin";
    const std::string absolute = dir.Path() + "/font.bin";
    // Missing, none, a folder, a pipe (refused, not waited on), outside the root, absolute.
    for (const char* name : {"missing.bin", static_cast<const char*>(nullptr), "", ".", "pipe.bin",
                             outside.c_str(), absolute.c_str()}) {
        EXPECT_EQ(assets.Open(name), nullptr) << (name != nullptr ? name : "(null)");
    }
}

}  // namespace
}  // namespace Glimmer::Platform
