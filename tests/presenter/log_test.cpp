#include "presenter/log.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "presenter/log_capture.h"

namespace {

using vidshow::kLogError;
using vidshow::kLogTrace;
using vidshow::Log;

using Lines = std::vector<std::string>;

TEST(PresenterLog, ErrorsAreWritten) {
    LogCapture log;
    Log(kLogError, "%s has %d", "Open", 17);
    EXPECT_EQ(log.take(), Lines{"Open has 17"});
}

TEST(PresenterLog, OtherLevelsAreDropped) {
    LogCapture log;
    Log(kLogTrace, "trace");
    Log(1, "one");
    Log(-1, "below");
    EXPECT_EQ(log.take(), Lines{});
}

TEST(PresenterLog, LineHasAtMost255Characters) {
    LogCapture log;
    const std::string text(300, 'a');
    Log(kLogError, "%s", text.substr(0, 255).c_str());
    Log(kLogError, "%s", text.substr(0, 256).c_str());
    Log(kLogError, "[%d]%s", 1, text.c_str());
    const std::string longest = text.substr(0, 255);
    EXPECT_EQ(log.take(), (Lines{longest, longest, "[1]" + text.substr(0, 252)}));
}

TEST(PresenterLog, TextIsNotTakenAsAFormat) {
    LogCapture log;
    Log(kLogError, "%s", "100 %d %s");
    EXPECT_EQ(log.take(), Lines{"100 %d %s"});
}

TEST(PresenterLog, TraceEvaluatesNothing) {
    LogCapture log;
    int evaluated = 0;
    VIDSHOW_TRACE("[%s %d]:%d", __func__, __LINE__, ++evaluated);
    EXPECT_EQ(evaluated, 0);
    EXPECT_EQ(log.take(), Lines{});
}

}  // namespace
