#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <thread>

#include "foundation/Error.h"
#include "support/LogCapture.h"

namespace Glimmer {
namespace {

TEST(Error, SlotIsPerThread) {
    Error::SetError(kErrorNotFound);
    int otherBefore = -1;
    int otherAfter = -1;
    std::thread other([&] {
        otherBefore = Error::GetError();
        Error::SetError(kErrorFileOpen);
        otherAfter = Error::GetError();
    });
    other.join();
    EXPECT_EQ(otherBefore, 0);
    EXPECT_EQ(otherAfter, 11);
    EXPECT_EQ(Error::GetError(), 9);
}

TEST(Error, ReasonIsPerThreadAndReportingACodeSetsItsPhrase) {
    Error::SetReason("%s: %d", "first", 1);
    std::string other;
    std::thread([&] {
        other = Error::GetReason();
        GX_REPORT_ERROR("GxTest", kErrorNotBound);
        EXPECT_STREQ(Error::GetReason(), (std::string("error 19: ") + ReasonOfCode(kErrorNotBound)).c_str());
    }).join();
    EXPECT_EQ(other, "");
    EXPECT_STREQ(Error::GetReason(), "first: 1");
    // A long reason is cut, never overrun.
    Error::SetReason("%s", std::string(5000, 'x').c_str());
    EXPECT_EQ(std::strlen(Error::GetReason()), size_t(Error::kMaxReasonBytes - 1));
    Error::ClearReason();
    EXPECT_STREQ(Error::GetReason(), "");
}

TEST(Error, ReportLogsCodeAndLineUnderTag) {
    Testing::LogCapture capture;
    GX_REPORT_ERROR("GxString", kErrorAlreadyConstructed);
    const int line = __LINE__ - 1;
    EXPECT_EQ(Error::GetError(), 4);
    auto lines = capture.Lines();
    ASSERT_EQ(lines.size(), 1u);
    EXPECT_EQ(lines[0].priority, 6);
    EXPECT_EQ(lines[0].tag, "GxString");
    EXPECT_EQ(lines[0].message, "@ Native Error 4 : " + std::to_string(line));
}

}  // namespace
}  // namespace Glimmer
