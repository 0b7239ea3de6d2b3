// Files and pipes by their handles.

#include <errno.h>
#include <fcntl.h>
#include <unistd.h>

#include <new>

#include "platform/handles.h"
#include "vidshow/platform/file.h"

using vidshow::Discard;
using vidshow::HandleOf;
using vidshow::IsInvalid;
using vidshow::IsInvalidOrPseudo;
using vidshow::ObjectOf;

namespace {

constexpr int kUsualMode = 0644;
constexpr int kOpenBeforeCreating = -1;

int Open(CLinuxFile* file, const char* path, int openFlags, int extraFlags, int mode) {
    if (mode != kOpenBeforeCreating) {
        return file->Init(path, openFlags | extraFlags, mode != 0 ? mode : kUsualMode);
    }
    // The new file gets the mode as it stands, special bits included: clients rely on it.
    const int opened = file->Init(path, openFlags, mode);
    return opened == 0 ? 0 : file->Init(path, openFlags | O_CREAT, mode);
}

// A transfer that fails shows in the count alone: clients rely on the result being 1.
template <typename Buffer>
BOOL Transfer(int (CLinuxFile::*transfer)(Buffer, int), HANDLE file, Buffer buffer, DWORD n,
              DWORD* bytes) {
    if (IsInvalidOrPseudo(file) || bytes == nullptr) return FALSE;
    const int moved = (ObjectOf<CLinuxFile>(file)->*transfer)(buffer, static_cast<int>(n));
    *bytes = static_cast<DWORD>(moved);
    return TRUE;
}

}  // namespace

extern "C" {

HANDLE CreateFile(const char* path, int openFlags, DWORD, void*, int extraFlags, int mode) {
    auto* file = new (std::nothrow) CLinuxFile;
    if (file == nullptr) return INVALID_HANDLE_VALUE;
    if (Open(file, path, openFlags, extraFlags, mode) == 0) return HandleOf(file);
    Discard(file);
    return INVALID_HANDLE_VALUE;
}

BOOL ReadFile(HANDLE file, void* buffer, DWORD n, DWORD* bytesRead, void*) {
    return Transfer(&CLinuxFile::Read, file, buffer, n, bytesRead);
}

BOOL WriteFile(HANDLE file, const void* buffer, DWORD n, DWORD* bytesWritten, void*) {
    return Transfer(&CLinuxFile::Write, file, buffer, n, bytesWritten);
}

DWORD GetFileSize(HANDLE file, DWORD* high) {
    return IsInvalid(file) ? 0xFFFFFFFF : ObjectOf<CLinuxFile>(file)->GetFileSize(high);
}

DWORD SetFilePointer(HANDLE file, LONG low, LONG* high, DWORD origin) {
    errno = IsInvalid(file) ? EBADF : 0;
    if (IsInvalid(file)) return 0xFFFFFFFF;
    return ObjectOf<CLinuxFile>(file)->SetFilePointer(low, high, static_cast<int>(origin));
}

BOOL FlushFileBuffers(HANDLE file) {
    return fsync(ObjectOf<CLinuxFile>(file)->GetFD()) == 0;
}

BOOL CreatePipe(HANDLE* readEnd, HANDLE* writeEnd, void*, DWORD) {
    int ends[2];
    if (readEnd == nullptr || writeEnd == nullptr || pipe(ends) != 0) return FALSE;
    auto* reader = new (std::nothrow) CLinuxFile(ends[0]);
    auto* writer = new (std::nothrow) CLinuxFile(ends[1]);
    if (reader == nullptr || writer == nullptr) {
        if (reader == nullptr) close(ends[0]);
        if (writer == nullptr) close(ends[1]);
        Discard(reader);
        Discard(writer);
        return FALSE;
    }
    *readEnd = HandleOf(reader);
    *writeEnd = HandleOf(writer);
    return TRUE;
}

}  // extern "C"
