#include "platform/file_kit.h"

#include <dirent.h>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>

namespace file_kit {

namespace fs = std::filesystem;

TempDirectory::TempDirectory() {
    std::string name = (fs::temp_directory_path() / "vidshow-files-XXXXXX").string();
    if (mkdtemp(&name[0]) == nullptr) {
        std::perror("TempDirectory");
        std::abort();
    }
    m_path = name;
}

TempDirectory::~TempDirectory() {
    std::error_code ignored;
    fs::remove_all(m_path, ignored);
}

std::string TempDirectory::path(const std::string& name) const {
    return name.empty() ? m_path : m_path + "/" + name;
}

std::string TempDirectory::file(const std::string& name, const std::string& contents) const {
    std::ofstream(path(name), std::ios::binary) << contents;
    return path(name);
}

Mask::Mask(mode_t mask) : m_before(umask(mask)) {}

Mask::~Mask() {
    umask(m_before);
}

std::string ContentsOf(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    std::ostringstream contents;
    contents << in.rdbuf();
    return contents.str();
}

unsigned ModeOf(const std::string& path) {
    return static_cast<unsigned>(fs::status(path).permissions());
}

uint64_t SizeOf(const std::string& path) {
    return fs::file_size(path);
}

bool Exists(const std::string& path) {
    return fs::exists(fs::symlink_status(path));
}

bool IsOpen(int fd) {
    return fcntl(fd, F_GETFD) != -1;
}

size_t OpenDescriptors() {
    DIR* directory = opendir("/proc/self/fd");
    if (directory == nullptr) return 0;
    size_t entries = 0;
    while (readdir(directory) != nullptr)
        ++entries;
    closedir(directory);
    return entries - 3;  // ".", ".." and the directory's own
}

std::string PathOfLength(const std::string& directory, size_t bytes) {
    std::string path = directory;
    while (path.size() + 101 < bytes)
        path += "/" + std::string(100, 'd');
    return path + "/" + std::string(bytes - path.size() - 1, 'f');
}

}  // namespace file_kit
