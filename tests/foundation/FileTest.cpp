#include <gtest/gtest.h>

#include <sys/stat.h>
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
    const std::string a = dir.Write("\xC3\xA9t\xC3\xA9.bin", {});   // a UTF-8 name
    GxString path;
    ASSERT_TRUE(path.Construct(a.c_str()));
    FILE* stream = nullptr;
    {
        File out;
        ASSERT_TRUE(out.Construct(&path, "w", true));
        EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(out.Construct(a.c_str(), "w")); }), 4);
        EXPECT_EQ(out.Write("abcdef", 1, 6), 6u);
        stream = out.GetFilePointer();
    }
    // The wrapper is gone; the stream is still the caller's to use and close.
    ASSERT_NE(stream, nullptr);
    EXPECT_EQ(std::fputs("!", stream), 1);
    EXPECT_EQ(std::fclose(stream), 0);

    File in;
    ASSERT_TRUE(in.Construct(a.c_str(), "rb"));
    char buffer[8] = {};
    EXPECT_EQ(in.Seek(2, SEEK_SET), 0);
    EXPECT_EQ(in.Read(buffer, 1, 8), 5u);
    EXPECT_STREQ(buffer, "cdef!");
    EXPECT_NE(in.Eof(), 0);
    EXPECT_EQ(CodeOf([&] { EXPECT_EQ(in.Read(buffer, size_t(1) << 40, size_t(1) << 40), 0u); }), 7);
    EXPECT_TRUE(in.Close());   // then free for another file
    EXPECT_EQ(CodeOf([&] { EXPECT_EQ(in.Read(buffer, 1, 1), 0u); }), 8);
    EXPECT_EQ(in.Seek(0, SEEK_SET), -1);

    GxString renamed;
    ASSERT_TRUE(renamed.Construct((dir.Path() + "/b.bin").c_str()));
    EXPECT_EQ(File::Rename(&path, &renamed), 0);
    EXPECT_EQ(File::IsAccessible(&path, F_OK), -1);
    EXPECT_EQ(File::Unlink(&renamed), 0);
}

TEST(FileTest, FailuresLeaveTheObjectFreeAndSayWhy) {
    Testing::TempDir dir;
    Testing::LogCapture capture;
    File f;
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(f.Construct((dir.Path() + "/missing/x").c_str(), "rb")); }), 11);
    EXPECT_EQ(capture.Count("Gx_File", "OpenFile - Fail to open file. errno = " + std::to_string(ENOENT)), 1);
    GxString unconstructed;
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(f.Construct(&unconstructed, "rb", false)); }), 7);
    EXPECT_EQ(capture.Count("Gx_File", "OpenFile() - pathSize < 0"), 1);
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(f.Construct(dir.Path().c_str(), nullptr)); }), 7);
    EXPECT_EQ(CodeOf([&] { EXPECT_EQ(File::Unlink(static_cast<const GxString*>(nullptr)), -1); }), 7);
    EXPECT_EQ(capture.Count("Gx_File", "Unlink() - pathSize < 0"), 1);
    const std::string kept = dir.Write("kept.txt", {});
    EXPECT_TRUE(f.Construct(kept.c_str(), "w"));
}

}  // namespace
}  // namespace Glimmer
