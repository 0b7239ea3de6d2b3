#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "android/log.h"
#include "vidshow-host/window.h"

namespace {

struct Line {
    int priority;
    std::string tag;
    std::string text;
};

class LogSink : public testing::Test {
  protected:
    void SetUp() override {
        vidshow::host::setLogSink([this](int priority, const char* tag, const char* text) {
            lines.push_back({priority, tag, text});
        });
    }
    void TearDown() override { vidshow::host::setLogSink(nullptr); }

    std::vector<Line> lines;
};

TEST_F(LogSink, ReceivesPriorityTagAndText) {
    EXPECT_EQ(__android_log_print(ANDROID_LOG_ERROR, "Tag", "%s %d", "five", 5), 6);
    __android_log_print(ANDROID_LOG_INFO, "Other", "%%");
    ASSERT_EQ(lines.size(), 2u);
    EXPECT_EQ(lines[0].priority, 6);
    EXPECT_EQ(lines[0].tag, "Tag");
    EXPECT_EQ(lines[0].text, "five 5");
    EXPECT_EQ(lines[1].priority, 4);
    EXPECT_EQ(lines[1].text, "%");
}

TEST_F(LogSink, LongLineIsCut) {
    const std::string text(2000, 'x');
    __android_log_print(ANDROID_LOG_ERROR, "Tag", "%s", text.c_str());
    ASSERT_EQ(lines.size(), 1u);
    EXPECT_EQ(lines[0].text, std::string(1023, 'x'));
}

TEST_F(LogSink, NullSinkGivesStandardErrorBack) {
    vidshow::host::setLogSink(nullptr);
    testing::internal::CaptureStderr();
    __android_log_print(ANDROID_LOG_ERROR, "Tag", "no sink");
    __android_log_print(ANDROID_LOG_DEBUG, "Tag", "no sink");
    EXPECT_EQ(testing::internal::GetCapturedStderr(), "E/Tag: no sink\nD/Tag: no sink\n");
    EXPECT_TRUE(lines.empty());
}

}  // namespace
