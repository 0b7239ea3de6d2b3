#pragma once

#include <string>

namespace testkit {

/// Everything that is written to file descriptor 1 between construction and `text()`.
class StdoutCapture {
  public:
    StdoutCapture();
    ~StdoutCapture();
    StdoutCapture(const StdoutCapture&) = delete;
    StdoutCapture& operator=(const StdoutCapture&) = delete;

    std::string text();  ///< ends the capture

  private:
    void Restore();
    int m_saved;
    int m_file;
};

}  // namespace testkit
