#include <gtest/gtest.h>

#include <string>
#include <thread>

#include "foundation/GxLog.h"
#include "foundation/GxString.h"
#include "support/LogCapture.h"

namespace Glimmer {
namespace {

// Restores the process-wide mask after each test.
class GxLogTest : public ::testing::Test {
protected:
    void SetUp() override { saved_ = GxLog::getPrintLogLevel(); }
    void TearDown() override { GxLog::setPrintLogLevel(saved_); }
    uint8_t saved_ = 255;
};

TEST_F(GxLogTest, PrintsUnderTheFileStemWhenTheMaskAllows) {
    Testing::LogCapture capture;
    GxLog::setPrintLogLevel(GX_LOG_ERROR | GX_LOG_WARN | GX_LOG_DEBUG);
    GxLog::printLog(GX_LOG_DEBUG, "src/text/GxTextObject.cpp", "value %d", 42);
    GxLog::printLog(GX_LOG_WARN, "a.b.c", "%s", "warn");
    GxLog::printLog(GX_LOG_INFO, "f.cpp", "hidden by the mask");
    GxLog::printLog(GX_LOG_ERROR, "f.cpp", nullptr);
    GxLog::printLog(GX_LOG_ERROR, nullptr, "no file");
    GxLog::printLog(GX_LOG_ERROR, std::string(256, 'n').c_str(), "too long a name");
    GxLog::printLog(GX_LOG_ERROR, "noext", "%s", std::string(2000, 'm').c_str());
    const auto lines = capture.Lines();
    ASSERT_EQ(lines.size(), 3u);
    for (const auto& line : lines) EXPECT_EQ(line.tag, "gxeffect");
    EXPECT_EQ(lines[0].message, "[src/text/GxTextObject] value 42 \n");
    EXPECT_EQ(lines[0].priority, 3);
    EXPECT_EQ(lines[1].message, "[a.b] warn \n");
    EXPECT_EQ(lines[1].priority, 5);
    EXPECT_EQ(lines[2].priority, 6);
    EXPECT_EQ(lines[2].message.rfind("[noext] mmm", 0), 0u);   // cut, not overrun
}

TEST_F(GxLogTest, ConvertLogGuardsItsBufferPerThread) {
    EXPECT_STREQ(GxLog::ConvertLog(nullptr), "[### null ###]");
    GxString s, other;
    ASSERT_TRUE(s.Construct(std::string(511, 'x').c_str()));   // 511 bytes and the terminator fit
    EXPECT_EQ(std::string(GxLog::ConvertLog(&s)), std::string(511, 'x'));
    ASSERT_TRUE(s.Set((std::string(509, 'x') + "\xE2\x82\xAC").c_str()));   // 512 bytes
    EXPECT_STREQ(GxLog::ConvertLog(&s), "[### string is too long ###]");
    ASSERT_TRUE(other.Construct("other"));
    const char* mine = GxLog::ConvertLog(&other);
    std::thread([&] { EXPECT_STREQ(GxLog::ConvertLog(&s), "[### string is too long ###]"); }).join();
    EXPECT_STREQ(mine, "other");
}

TEST_F(GxLogTest, BuildTypeIsSetOnce) {
    GxLog::SetBuildType(true);
    const bool eng = GxLog::IsBuildTypeEngMode();   // true unless set earlier in this process
    GxLog::SetBuildType(!eng);
    EXPECT_EQ(GxLog::IsBuildTypeEngMode(), eng);
    GxLog::SetDebugEnable(true);
    EXPECT_EQ(GxLog::IsAllLogEnable(), eng);
    GxLog::SetDebugEnable(false);
    EXPECT_FALSE(GxLog::IsAllLogEnable());
}

}  // namespace
}  // namespace Glimmer
