#pragma once

#include <sys/types.h>

#include <string>
#include <utility>
#include <vector>

namespace playkit {

/// Variables to set for a program; an empty value takes the variable away.
using Environment = std::vector<std::pair<std::string, std::string>>;

/// What a program left behind.
struct Outcome {
    int status;  ///< exit status; -1 when a signal ended it
    std::string out;
    std::string err;
};

/// A folder that goes away with its contents.
class TempFolder {
  public:
    TempFolder();
    ~TempFolder();
    TempFolder(const TempFolder&) = delete;
    TempFolder& operator=(const TempFolder&) = delete;

    std::string path(const std::string& name) const { return m_path + "/" + name; }

  private:
    std::string m_path;
};

/// A running program, found on PATH. It is ended when the object goes.
class Process {
  public:
    explicit Process(const std::vector<std::string>& command, const Environment& environment = {});
    ~Process();
    Process(const Process&) = delete;
    Process& operator=(const Process&) = delete;

    bool running();
    std::string printed() const;  ///< to standard output so far
    Outcome wait();               ///< until it ends

  private:
    TempFolder m_folder;  // holds what it prints
    pid_t m_pid = -1;
    int m_waitStatus = 0;
    bool m_ended = false;
};

Outcome run(const std::vector<std::string>& command, const Environment& environment = {});

/// Runs vidshow-play without a display.
Outcome play(const std::vector<std::string>& arguments);

/// Run vidshow-convert, vidshow-compare.
Outcome convert(const std::vector<std::string>& arguments);
Outcome compare(const std::vector<std::string>& arguments);

/// The environment of a program that is to find no display.
Environment withoutDisplay();

/// The names in a folder, in order.
std::vector<std::string> listFolder(const std::string& path);

std::string readFile(const std::string& path);
void writeFile(const std::string& path, const std::string& contents);

}  // namespace playkit
