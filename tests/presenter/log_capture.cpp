#include "presenter/log_capture.h"

#include <gtest/gtest.h>
#include <vidshow-host/window.h>

#include <regex>

LogCapture::LogCapture() {
    vidshow::host::setLogSink([this](int priority, const char* tag, const char* text) {
        m_lines.push_back({priority, tag, text});
    });
}

LogCapture::~LogCapture() {
    vidshow::host::setLogSink(nullptr);
}

std::vector<std::string> LogCapture::take() {
    static const std::regex place("^\\[([A-Za-z_]+) [1-9][0-9]*\\]");
    std::vector<std::string> texts;
    for (const Line& line : m_lines) {
        EXPECT_EQ(line.priority, 6) << line.text;
        EXPECT_EQ(line.tag, "QzVidshow") << line.text;
        texts.push_back(std::regex_replace(line.text, place, "[$1 #]"));
    }
    m_lines.clear();
    return texts;
}
