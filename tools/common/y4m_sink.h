#pragma once

#include <cstdint>
#include <cstdio>
#include <memory>
#include <string>

#include "common/ffmpeg.h"
#include "common/sink.h"

namespace vidshow::tools {

/// The name of a series' file: `path`, then with "-2" before its extension, and so on.
std::string numberedName(const std::string& path, int number);

/// Writes the pictures as YUV4MPEG2, sample for sample. A file has one size: when the clip changes
/// its own, the rest goes to a second file, FILE with "-2" before its extension, and so on.
class Y4mSink : public Sink {
  public:
    /// @param path "-" is standard output
    Y4mSink(const std::string& path, AVRational frameRate, bool deinterlaced);

    void show(const Picture& picture) override;
    std::string finish() override;
    bool wantsEveryFrame() const override { return true; }
    bool takesStandardOutput() const override { return m_path == "-"; }

  private:
    struct Close {
        void operator()(std::FILE* file) const {
            if (file != stdout) std::fclose(file);
        }
    };
    void open();
    void close();
    void startFile(const Picture& picture);
    void write(const void* data, size_t bytes);

    const std::string m_path;
    const AVRational m_frameRate;
    const bool m_deinterlaced;
    std::unique_ptr<std::FILE, Close> m_file;
    std::string m_name;  // of m_file
    int m_files = 0;
    int m_width = 0;
    int m_height = 0;
};

}  // namespace vidshow::tools
