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

TEST_F(GxLogTest, PrintsUnderFileStemAtTheLevelsPriority) {
    Testing::LogCapture capture;
    GxLog::setPrintLogLevel(255);
    GxLog::printLog(GX_LOG_DEBUG, "src/text/GxTextObject.cpp", "value %d", 42);
    GxLog::printLog(GX_LOG_INFO, "a.b.c", "%s", "info");
    GxLog::printLog(GX_LOG_WARN, "noext", "warn");
    GxLog::printLog(GX_LOG_ERROR, "e.cpp", "error");
    GxLog::printLog(3, "x.cpp", "mixed");           // unnamed table entries: info
    GxLog::printLog(GX_LOG_TIME, "x.cpp", "time");  // above the table: info
    auto lines = capture.Lines();
    ASSERT_EQ(lines.size(), 6u);
    for (const auto& line : lines) EXPECT_EQ(line.tag, "gxeffect");
    EXPECT_EQ(lines[0].message, "[src/text/GxTextObject] value 42 \n");
    EXPECT_EQ(lines[0].priority, 3);
    EXPECT_EQ(lines[1].message, "[a.b] info \n");
    EXPECT_EQ(lines[1].priority, 4);
    EXPECT_EQ(lines[2].message, "[noext] warn \n");
    EXPECT_EQ(lines[2].priority, 5);
    EXPECT_EQ(lines[3].priority, 6);
    EXPECT_EQ(lines[4].priority, 4);
    EXPECT_EQ(lines[5].priority, 4);
}

TEST_F(GxLogTest, MaskNamesAndFormatDecideWhetherAnythingPrints) {
    Testing::LogCapture capture;
    GxLog::setPrintLogLevel(GX_LOG_ERROR | GX_LOG_WARN);
    GxLog::printLog(GX_LOG_INFO, "f.cpp", "hidden");
    GxLog::printLog(GX_LOG_DEBUG | GX_LOG_WARN, "f.cpp", "shown");
    GxLog::printLog(GX_LOG_ERROR, "f.cpp", nullptr);
    GxLog::printLog(GX_LOG_ERROR, nullptr, "no file");
    GxLog::printLog(GX_LOG_ERROR, std::string(255, 'n').c_str(), "longest name");
    GxLog::printLog(GX_LOG_ERROR, std::string(256, 'n').c_str(), "too long a name");
    auto lines = capture.Lines();
    ASSERT_EQ(lines.size(), 2u);
    EXPECT_EQ(lines[0].message, "[f] shown \n");
    EXPECT_EQ(lines[1].message, "[" + std::string(255, 'n') + "] longest name \n");

    // The message is cut to the 1,024-byte buffer (the platform cuts again at
    // its own 1,024 bytes, so only the start is compared).
    capture.Clear();
    GxLog::printLog(GX_LOG_ERROR, "f", "%s", std::string(2000, 'm').c_str());
    ASSERT_EQ(capture.Lines().size(), 1u);
    EXPECT_EQ(capture.Lines()[0].message.rfind("[f] mmm", 0), 0u);
}

TEST_F(GxLogTest, TimingLinesNeedTheTimeAndInfoBits) {
    Testing::LogCapture capture;
    GxLog::setPrintLogLevel(GX_LOG_TIME | GX_LOG_INFO);
    GxLog::printTime("render.cpp", "draw", 1234567);
    GxLog::printTime("render.cpp", "blur", 1500, "%dx%d", 64, 32);
    GxLog::setPrintLogLevel(GX_LOG_INFO);
    GxLog::printTime("render.cpp", "off", 1);
    GxLog::setPrintLogLevel(GX_LOG_TIME);
    GxLog::printTime("render.cpp", "info off", 1);
    auto lines = capture.Lines();
    ASSERT_EQ(lines.size(), 2u);
    EXPECT_EQ(lines[0].message, "[render] [Time] draw 1234.567ms \n");
    EXPECT_EQ(lines[0].priority, 4);
    EXPECT_EQ(lines[1].message, "[render] [Time] blur 1.500ms 64x32 \n");
}

TEST_F(GxLogTest, ConvertLogGuardsItsBuffer) {
    EXPECT_STREQ(GxLog::ConvertLog(nullptr), "[### null ###]");
    GxString unconstructed;
    EXPECT_STREQ(GxLog::ConvertLog(&unconstructed), "[### null ###]");

    GxString s;
    ASSERT_TRUE(s.Construct("caf\xC3\xA9"));
    EXPECT_STREQ(GxLog::ConvertLog(&s), "caf\xC3\xA9");

    // 511 bytes plus the terminator fill the buffer exactly; one more is too long.
    ASSERT_TRUE(s.Set(std::string(511, 'x').c_str()));
    EXPECT_EQ(std::string(GxLog::ConvertLog(&s)), std::string(511, 'x'));
    ASSERT_TRUE(s.Append("y"));
    EXPECT_STREQ(GxLog::ConvertLog(&s), "[### string is too long ###]");
    ASSERT_TRUE(s.Set((std::string(509, 'x') + "\xE2\x82\xAC").c_str()));  // 512 bytes
    EXPECT_STREQ(GxLog::ConvertLog(&s), "[### string is too long ###]");
    ASSERT_TRUE(s.Set((std::string(509, 'x') + "\xC3\xA9").c_str()));  // 511 bytes
    EXPECT_EQ(std::string(GxLog::ConvertLog(&s)).size(), 511u);

    // Each thread converts into its own buffer.
    GxString other;
    ASSERT_TRUE(other.Construct("other"));
    ASSERT_TRUE(s.Set("mine"));
    const char* mine = GxLog::ConvertLog(&s);
    std::thread([&] { EXPECT_STREQ(GxLog::ConvertLog(&other), "other"); }).join();
    EXPECT_STREQ(mine, "mine");
}

TEST_F(GxLogTest, BuildTypeIsSetOnce) {
    GxLog::SetBuildType(true);
    EXPECT_TRUE(GxLog::IsCheckedBuildType());
    const bool eng = GxLog::IsBuildTypeEngMode();  // true unless set earlier in this process
    GxLog::SetBuildType(!eng);
    EXPECT_EQ(GxLog::IsBuildTypeEngMode(), eng);

    GxLog::SetDebugEnable(true);
    EXPECT_EQ(GxLog::IsAllLogEnable(), eng);
    GxLog::SetDebugEnable(false);
    EXPECT_FALSE(GxLog::IsAllLogEnable());
}

}  // namespace
}  // namespace Glimmer
