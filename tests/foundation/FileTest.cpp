#include <gtest/gtest.h>

#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <string>

#include "foundation/Error.h"
#include "foundation/File.h"
#include "foundation/GxString.h"
#include "support/LogCapture.h"

namespace Glimmer {
namespace {

using Testing::CodeOf;

class FileTest : public ::testing::Test {
protected:
    void SetUp() override {
        char templ[] = "/tmp/glimmer-file-XXXXXX";
        ASSERT_NE(mkdtemp(templ), nullptr);
        dir_ = templ;
    }
    void TearDown() override {
        for (const char* name : {"a.bin", "b.bin", "\xC3\xA9t\xC3\xA9.txt", "kept.txt"}) {
            unlink(Path(name).c_str());
        }
        rmdir(dir_.c_str());
    }
    std::string Path(const std::string& name) const { return dir_ + "/" + name; }
    std::string dir_;
};

TEST_F(FileTest, WritesReadsAndSeeks) {
    File out;
    ASSERT_TRUE(out.Construct(Path("a.bin").c_str(), "wb"));
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(out.Construct(Path("b.bin").c_str(), "wb")); }), 4);
    EXPECT_EQ(out.Write("abcdef", 1, 6), 6u);
    EXPECT_GE(out.GetFileDescriptor(), 0);
    EXPECT_NE(out.GetFilePointer(), nullptr);
    EXPECT_TRUE(out.Close());  // flush + fsync + close; then free for another file

    ASSERT_TRUE(out.Construct(Path("a.bin").c_str(), "rb"));
    char buffer[8] = {};
    EXPECT_EQ(out.Seek(2, SEEK_SET), 0);
    EXPECT_EQ(out.Tell(), 2);
    EXPECT_EQ(out.Read(buffer, 2, 2), 2u);
    EXPECT_STREQ(buffer, "cdef");
    EXPECT_EQ(out.Read(buffer, 1, 1), 0u);
    EXPECT_NE(out.Eof(), 0);
    EXPECT_EQ(out.Error(), 0);
    EXPECT_EQ(CodeOf([&] { EXPECT_EQ(out.Read(nullptr, 1, 1), 0u); }), 7);
    EXPECT_EQ(CodeOf([&] { EXPECT_EQ(out.Read(buffer, size_t(1) << 40, size_t(1) << 40), 0u); }), 7);
}

TEST_F(FileTest, NothingOpenMeansZeroOrMinusOne) {
    File none;
    EXPECT_EQ(CodeOf([&] { EXPECT_EQ(none.Read(nullptr, 1, 1), 0u); }), 8);
    EXPECT_EQ(none.Write("x", 1, 1), 0u);
    EXPECT_EQ(none.Seek(0, SEEK_SET), -1);
    EXPECT_EQ(none.GetFileDescriptor(), -1);
    EXPECT_EQ(none.GetFilePointer(), nullptr);
}

TEST_F(FileTest, OpenFailuresReportTheirCodes) {
    Testing::LogCapture capture;
    File f;
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(f.Construct(Path("missing/x").c_str(), "rb")); }), 11);
    auto lines = capture.Lines();
    ASSERT_EQ(lines.size(), 2u);
    EXPECT_EQ(lines[0].tag, "Gx_File");
    EXPECT_EQ(lines[0].priority, 6);
    EXPECT_EQ(lines[0].message, "OpenFile - Fail to open file. errno = " + std::to_string(ENOENT));
    EXPECT_EQ(lines[1].message.rfind("@ Native Error 11 : ", 0), 0u);

    capture.Clear();
    GxString unconstructed;
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(f.Construct(&unconstructed, "rb", false)); }), 7);
    EXPECT_EQ(capture.Count("Gx_File", "OpenFile() - pathSize < 0"), 1);
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(f.Construct(static_cast<const char*>(nullptr), "rb")); }), 7);
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(f.Construct(Path("a.bin").c_str(), nullptr)); }), 7);
    // None of the failures left the object constructed.
    EXPECT_TRUE(f.Construct(Path("a.bin").c_str(), "w"));
}

TEST_F(FileTest, GxStringPathsAreUtf8AndKeepOpenLeavesTheStream) {
    GxString path;
    ASSERT_TRUE(path.Construct(Path("\xC3\xA9t\xC3\xA9.txt").c_str()));
    FILE* stream = nullptr;
    {
        File f;
        ASSERT_TRUE(f.Construct(&path, "w", true));
        EXPECT_EQ(f.Write("kept", 1, 4), 4u);
        stream = f.GetFilePointer();
        ASSERT_NE(stream, nullptr);
    }
    // The wrapper is gone; the stream is still ours to use and close.
    EXPECT_EQ(std::fputs("!", stream), 1);
    EXPECT_EQ(std::fclose(stream), 0);

    struct stat info;
    ASSERT_EQ(stat(Path("\xC3\xA9t\xC3\xA9.txt").c_str(), &info), 0);
    EXPECT_EQ(info.st_size, 5);

    File appended;
    ASSERT_TRUE(appended.Construct(&path, "a", false));
    EXPECT_EQ(appended.Write("+", 1, 1), 1u);
    EXPECT_TRUE(appended.Close());
    ASSERT_EQ(stat(Path("\xC3\xA9t\xC3\xA9.txt").c_str(), &info), 0);
    EXPECT_EQ(info.st_size, 6);
}

TEST_F(FileTest, PathHelpers) {
    Testing::LogCapture capture;
    GxString a, b, unconstructed;
    ASSERT_TRUE(a.Construct(Path("a.bin").c_str()));
    ASSERT_TRUE(b.Construct(Path("b.bin").c_str()));
    EXPECT_EQ(File::IsAccessible(&a, F_OK), -1);
    {
        File f;
        ASSERT_TRUE(f.Construct(&a, "w", false));
    }
    EXPECT_EQ(File::IsAccessible(&a, R_OK), 0);
    EXPECT_EQ(File::IsAccessible(Path("a.bin").c_str(), W_OK), 0);
    EXPECT_EQ(File::Rename(&a, &b), 0);
    EXPECT_EQ(File::IsAccessible(&a, F_OK), -1);
    EXPECT_EQ(File::Rename(Path("b.bin").c_str(), Path("a.bin").c_str()), 0);
    EXPECT_EQ(File::Unlink(&a), 0);
    EXPECT_EQ(File::Unlink(Path("a.bin").c_str()), -1);

    capture.Clear();
    EXPECT_EQ(CodeOf([&] { EXPECT_EQ(File::IsAccessible(&unconstructed, F_OK), -1); }), 7);
    EXPECT_EQ(capture.Count("Gx_File", "IsAccessible() - pathSize < 0"), 1);
    EXPECT_EQ(CodeOf([&] { EXPECT_EQ(File::Unlink(static_cast<const GxString*>(nullptr)), -1); }), 7);
    EXPECT_EQ(capture.Count("Gx_File", "Unlink() - pathSize < 0"), 1);
    EXPECT_EQ(CodeOf([&] { EXPECT_EQ(File::Rename(&a, &unconstructed), -1); }), 7);
    EXPECT_EQ(capture.Count("Gx_File", "Rename() - pathSize < 0 : old " +
                                           std::to_string(a.GetUTF8Size()) + ", new -1"),
              1);
}

}  // namespace
}  // namespace Glimmer
