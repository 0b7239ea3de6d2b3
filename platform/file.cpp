// Files: a descriptor, and perhaps a region of the file that is shown as if it were the whole.
//
// Positions are the descriptor's own, counted from the file's start; only what callers see of a
// region counts from the region's. Every position that a region allows is checked before the
// descriptor moves, so that a refusal leaves it where it was.

#include <errno.h>
#include <fcntl.h>
#include <unistd.h>

#include <algorithm>
#include <limits>

#include "platform/file_status.h"
#include "platform/handles.h"
#include "vidshow/platform/file.h"

namespace {

constexpr DWORD kFailed = 0xFFFFFFFF;
constexpr int kNoFile = -1;

int64_t OffsetOf(LONG low, const LONG* high) {
    if (high == nullptr) return low;
    const uint64_t upper = static_cast<uint32_t>(*high);
    return static_cast<int64_t>(upper << 32 | static_cast<uint32_t>(low));
}

// @return the lower 32 bits of a number that is not negative
template <typename Word>
DWORD Split(int64_t number, Word* high) {
    if (high != nullptr) *high = static_cast<Word>(number >> 32);
    return static_cast<DWORD>(number & 0xFFFFFFFF);
}

int64_t Fail(int error) {
    errno = error;
    return -1;
}

}  // namespace

CLinuxFile::CLinuxFile() : CLinuxFile(kNoFile) {}

CLinuxFile::CLinuxFile(int fd) : m_fd(fd), m_regionStart(0), m_regionLength(0), m_regionMode(0) {}

CLinuxFile::~CLinuxFile() {
    if (m_fd != kNoFile) close(m_fd);
}

int CLinuxFile::Init(const char* path, int flags, int mode) {
    if (m_fd != kNoFile) close(m_fd);
    m_regionMode = 0;
    // Large files without being asked: where that is a choice, clients do not know of it.
    m_fd = open(path, flags | O_LARGEFILE, mode);
    return m_fd != kNoFile ? 0 : -1;
}

int CLinuxFile::SetRegion(int64_t start, int64_t length) {
    constexpr int64_t kLast = std::numeric_limits<int64_t>::max();
    if (start < 0 || length < 0 || length > kLast - start) return static_cast<int>(Fail(EINVAL));
    if (lseek64(m_fd, start, SEEK_SET) == -1) return -1;
    m_regionStart = start;
    m_regionLength = length;
    m_regionMode = 1;
    return 0;
}

int CLinuxFile::GetFD() const {
    return m_fd;
}

int64_t CLinuxFile::GetSize() const {
    if (m_regionMode != 0) return m_regionLength;
    vidshow::FileStatus status;
    return vidshow::StatusOf(m_fd, &status) == 0 ? status.st_size : -1;
}

DWORD CLinuxFile::GetFileSize(DWORD* high) const {
    const int64_t size = GetSize();
    return size >= 0 ? Split(size, high) : kFailed;
}

int CLinuxFile::Read(void* buffer, int n) {
    int64_t bytes = n;
    if (m_regionMode != 0) {
        const int64_t position = lseek64(m_fd, 0, SEEK_CUR);
        const int64_t left = m_regionStart + m_regionLength - position;
        if (position == -1 || left <= 0) return 0;
        bytes = std::min(bytes, left);
    }
    return static_cast<int>(read(m_fd, buffer, static_cast<size_t>(bytes)));
}

int CLinuxFile::Write(const void* buffer, int n) {
    return static_cast<int>(write(m_fd, buffer, static_cast<size_t>(n)));
}

int64_t CLinuxFile::SeekInRegion(int64_t offset, int origin) {
    if (origin == SEEK_CUR) {
        const int64_t position = lseek64(m_fd, 0, SEEK_CUR);
        return position != -1 ? position - m_regionStart : -1;
    }
    const bool fromStart = origin == SEEK_SET && offset >= 0 && offset <= m_regionLength;
    const bool fromEnd = origin == SEEK_END && offset <= 0 && offset >= -m_regionLength;
    if (!fromStart && !fromEnd) return Fail(EINVAL);
    const int64_t target = fromStart ? offset : m_regionLength + offset;
    return lseek64(m_fd, m_regionStart + target, SEEK_SET) != -1 ? target : -1;
}

DWORD CLinuxFile::SetFilePointer(LONG low, LONG* high, int origin) {
    const int64_t offset = OffsetOf(low, high);
    const int64_t position =
        m_regionMode != 0 ? SeekInRegion(offset, origin) : lseek64(m_fd, offset, origin);
    return position != -1 ? Split(position, high) : kFailed;
}

const char* CLinuxFile::getType() const {
    return vidshow::kObjectType;
}

int CLinuxFile::WaitAction() {
    return 0;
}

DWORD CLinuxFile::WaitForSignal(DWORD) {
    return WAIT_OBJECT_0;
}
