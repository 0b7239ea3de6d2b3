// File mappings: a descriptor of their own, and views that nobody keeps track of.

#include <sys/mman.h>
#include <unistd.h>

#include <new>

#include "platform/handles.h"
#include "vidshow/platform/file.h"

using vidshow::Discard;
using vidshow::HandleOf;
using vidshow::IsInvalid;
using vidshow::ObjectOf;

namespace {
constexpr int kNoFile = -1;
}

CLinuxFileMapping::CLinuxFileMapping() : m_fd(kNoFile), m_size(0), m_viewSize(0), m_flags(0) {}

CLinuxFileMapping::~CLinuxFileMapping() {
    if (m_fd != kNoFile) close(m_fd);
}

int CLinuxFileMapping::Init(CLinuxFile* file, unsigned size, int flags) {
    if (file == nullptr) return -1;
    const int64_t fileSize = file->GetSize();
    if (fileSize < 0) return -1;
    const int fd = dup(file->GetFD());
    if (fd == kNoFile) return -1;
    if (m_fd != kNoFile) close(m_fd);
    m_fd = fd;
    m_size = size != 0 ? size : static_cast<uint32_t>(fileSize & 0xFFFFFFFF);
    m_flags = flags;
    return 0;
}

void* CLinuxFileMapping::MapView(int protection, long offset, unsigned size) {
    if (m_fd == kNoFile) return nullptr;
    m_viewSize = size != 0 ? size : m_size;
    void* view = mmap(nullptr, m_viewSize, protection, m_flags, m_fd, offset);
    return view != MAP_FAILED ? view : nullptr;
}

unsigned CLinuxFileMapping::GetViewSize() const {
    return m_viewSize;
}

BOOL CLinuxFileMapping::UnmapViewByAddress(void* view, unsigned size) {
    return size != 0 && munmap(view, size) == 0;
}

const char* CLinuxFileMapping::getType() const {
    return vidshow::kObjectType;
}

int CLinuxFileMapping::WaitAction() {
    return 0;
}

DWORD CLinuxFileMapping::WaitForSignal(DWORD) {
    return WAIT_OBJECT_0;
}

extern "C" {

HANDLE CreateFileMapping(HANDLE file, void*, DWORD mmapFlags, DWORD, DWORD sizeLow, const char*) {
    if (IsInvalid(file)) return INVALID_HANDLE_VALUE;
    auto* mapping = new (std::nothrow) CLinuxFileMapping;
    if (mapping == nullptr) return INVALID_HANDLE_VALUE;
    const int flags = static_cast<int>(mmapFlags);
    if (mapping->Init(ObjectOf<CLinuxFile>(file), static_cast<unsigned>(sizeLow), flags) == 0) {
        return HandleOf(mapping);
    }
    Discard(mapping);
    return INVALID_HANDLE_VALUE;
}

void* MapViewOfFile(HANDLE mapping, DWORD protection, DWORD, DWORD offsetLow, DWORD size) {
    if (IsInvalid(mapping)) return nullptr;
    return ObjectOf<CLinuxFileMapping>(mapping)->MapView(
        static_cast<int>(protection), static_cast<long>(offsetLow), static_cast<unsigned>(size));
}

// The size of 0 is refused, so this never ends a view. Clients rely on their views staying.
BOOL UnmapViewOfFile(void* view) {
    return CLinuxFileMapping::UnmapViewByAddress(view, 0);
}

BOOL UnmapViewOfFileEx(void* view, DWORD size) {
    return CLinuxFileMapping::UnmapViewByAddress(view, static_cast<unsigned>(size));
}

}  // extern "C"
