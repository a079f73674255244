#include <gtest/gtest.h>
#include <sys/stat.h>

#include <string>
#include <vector>

#include "platform/Assets.h"
#include "text/TextFixtures.h"

namespace Glimmer::Platform {
namespace {

TEST(AssetsTest, AssetsAreFilesUnderTheRootAndNothingElse) {
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
    EXPECT_EQ(asset->Read(buffer, 8), 0);

    EXPECT_EQ(assets.Open("missing.bin"), nullptr);
    EXPECT_EQ(assets.Open(nullptr), nullptr);
    EXPECT_EQ(assets.Open(""), nullptr);
    EXPECT_EQ(assets.Open("."), nullptr);   // a folder is no asset
    ASSERT_EQ(::mkfifo((dir.Path() + "/pipe.bin").c_str(), 0600), 0);
    EXPECT_EQ(assets.Open("pipe.bin"), nullptr);   // refused, not waited on
    const std::string outside = "../" + dir.Path().substr(dir.Path().rfind('/') + 1) + "/font.bin";
    EXPECT_EQ(assets.Open(outside.c_str()), nullptr);
    EXPECT_EQ(assets.Open((dir.Path() + "/font.bin").c_str()), nullptr);   // absolute
}

}  // namespace
}  // namespace Glimmer::Platform
