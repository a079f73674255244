#include <gtest/gtest.h>

#include <unistd.h>

#include <cerrno>
#include <string>

#include "foundation/Error.h"
#include "foundation/File.h"
#include "foundation/GxString.h"
#include "support/LogCapture.h"
#include "text/TextFixtures.h"

namespace Glimmer {
namespace {

using Testing::CodeOf;

TEST(FileTest, WritesReadsAndKeepsTheStreamOpenWhenAsked) {
    Testing::TempDir dir;
    GxString path;   // a UTF-8 name
    ASSERT_TRUE(path.Construct((dir.Path() + "/\xC3\xA9t\xC3\xA9.bin").c_str()));
    FILE* stream = nullptr;
    {
        File out;
        ASSERT_TRUE(out.Construct(&path, "w", true));
        EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(out.Construct(&path, "w", false)); }), 4);
        EXPECT_EQ(out.Write("abcdef", 1, 6), 6u);
        stream = out.GetFilePointer();
    }
    // The wrapper is gone; the stream is still the caller's to use and close.
    ASSERT_NE(stream, nullptr);
    EXPECT_EQ(std::fputs("!", stream), 1);
    EXPECT_EQ(std::fclose(stream), 0);

    File in;
    ASSERT_TRUE(in.Construct(&path, "rb", false));
    char buffer[8] = {};
    EXPECT_EQ(in.Seek(2, SEEK_SET), 0);
    EXPECT_EQ(in.Read(buffer, 1, 8), 5u);
    EXPECT_STREQ(buffer, "cdef!");
    EXPECT_EQ(CodeOf([&] { EXPECT_EQ(in.Read(buffer, size_t(1) << 40, size_t(1) << 40), 0u); }), 7);
    EXPECT_TRUE(in.Close());   // then free for another file
    EXPECT_EQ(CodeOf([&] { EXPECT_EQ(in.Read(buffer, 1, 1), 0u); }), 8);
    EXPECT_EQ(File::Unlink(&path), 0);
}

TEST(FileTest, FailuresLeaveTheObjectFreeAndSayWhy) {
    Testing::LogCapture capture;
    File f;
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(f.Construct("/no/such/folder/x", "rb")); }), 11);
    EXPECT_EQ(capture.Count("Gx_File", "OpenFile - Fail to open file. errno = " + std::to_string(ENOENT)), 1);
    GxString unconstructed;
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(f.Construct(&unconstructed, "rb", false)); }), 7);
    EXPECT_EQ(capture.Count("Gx_File", "OpenFile() - pathSize < 0"), 1);
    EXPECT_EQ(CodeOf([&] { EXPECT_EQ(File::Unlink(static_cast<const GxString*>(nullptr)), -1); }), 7);
    EXPECT_EQ(capture.Count("Gx_File", "Unlink() - pathSize < 0"), 1);
    EXPECT_TRUE(f.Construct("/dev/null", "r"));
}

}  // namespace
}  // namespace Glimmer
