#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <thread>

#include "foundation/Error.h"
#include "support/LogCapture.h"

namespace Glimmer {
namespace {

// The code and the reason are the calling thread's own; reporting logs the
// code and the source line under the tag and leaves the code's phrase.
TEST(Error, ReportLogsUnderTheTagAndEachThreadKeepsItsOwnCodeAndReason) {
    Error::SetError(kErrorNotFound);
    Error::SetReason("%s: %d", "first", 1);
    Testing::LogCapture capture;
    int line = 0, otherBefore = -1;
    std::string reasonBefore = "?";
    std::thread([&] {
        otherBefore = Error::GetError();
        reasonBefore = Error::GetReason();
        GX_REPORT_ERROR("GxString", kErrorNotBound);
        line = __LINE__ - 1;
        EXPECT_EQ(Error::GetError(), 19);
        EXPECT_EQ(Error::GetReason(), std::string("error 19: ") + ReasonOfCode(kErrorNotBound));
    }).join();
    EXPECT_EQ(otherBefore, 0);
    EXPECT_EQ(reasonBefore, "");
    EXPECT_EQ(Error::GetError(), 9);
    EXPECT_STREQ(Error::GetReason(), "first: 1");
    ASSERT_EQ(capture.Lines().size(), 1u);
    EXPECT_EQ(capture.Lines()[0].priority, 6);
    EXPECT_EQ(capture.Lines()[0].tag, "GxString");
    EXPECT_EQ(capture.Lines()[0].message, "@ Native Error 19 : " + std::to_string(line));

    // A long reason is cut, never overrun.
    Error::SetReason("%s", std::string(5000, 'x').c_str());
    EXPECT_EQ(std::strlen(Error::GetReason()), size_t(Error::kMaxReasonBytes - 1));
}

}  // namespace
}  // namespace Glimmer
