#pragma once

#include <string>
#include <vector>

/// The library's log lines from construction on; standard error gets them again afterwards.
class LogCapture {
  public:
    LogCapture();
    ~LogCapture();
    LogCapture(const LogCapture&) = delete;
    LogCapture& operator=(const LogCapture&) = delete;

    /// The lines so far, and forgets them. Of a line that begins "[Name 123" the number, which is
    /// the source line, becomes "#". Fails unless all came as errors under the presenter's tag.
    std::vector<std::string> take();

  private:
    struct Line {
        int priority;
        std::string tag;
        std::string text;
    };
    std::vector<Line> m_lines;
};
