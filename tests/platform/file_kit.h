#pragma once

#include <sys/types.h>

#include <cstddef>
#include <cstdint>
#include <string>

namespace file_kit {

constexpr uint32_t kFailed = 0xFFFFFFFF;

/// A directory of the test's own, gone with everything in it at the end.
class TempDirectory {
  public:
    TempDirectory();
    ~TempDirectory();
    TempDirectory(const TempDirectory&) = delete;
    TempDirectory& operator=(const TempDirectory&) = delete;

    /// @return the path of an entry; of the directory itself without a name
    std::string path(const std::string& name = "") const;

    /// Writes a whole file. @return its path
    std::string file(const std::string& name, const std::string& contents) const;

  private:
    std::string m_path;
};

/// Sets the process's file mode mask for as long as it lives.
class Mask {
  public:
    explicit Mask(mode_t mask);
    ~Mask();
    Mask(const Mask&) = delete;
    Mask& operator=(const Mask&) = delete;

  private:
    mode_t m_before;
};

std::string ContentsOf(const std::string& path);
unsigned ModeOf(const std::string& path);  ///< the twelve permission bits
uint64_t SizeOf(const std::string& path);  ///< bytes
bool Exists(const std::string& path);
bool IsOpen(int fd);
size_t OpenDescriptors();  ///< of this process

/// @return a path of `bytes` characters in `directory`, of many components that mostly do not exist
std::string PathOfLength(const std::string& directory, size_t bytes);

}  // namespace file_kit
