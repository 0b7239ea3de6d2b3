#include "testkit/guarded_buffer.h"

#include <sys/mman.h>
#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>

namespace testkit {

GuardedBuffer::GuardedBuffer(size_t bytes, Placement placement, uint8_t fill) : m_size(bytes) {
    const size_t page = static_cast<size_t>(sysconf(_SC_PAGESIZE));
    const size_t body = (bytes + page - 1) / page * page;
    m_mappingBytes = body + 2 * page;
    m_mapping = mmap(nullptr, m_mappingBytes, PROT_NONE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
    uint8_t* first = static_cast<uint8_t*>(m_mapping) + page;
    if (m_mapping == MAP_FAILED ||
        (body != 0 && mprotect(first, body, PROT_READ | PROT_WRITE) != 0)) {
        std::perror("GuardedBuffer");
        std::abort();
    }
    m_data = placement == Placement::end ? first + body - bytes : first;
    std::memset(first, fill, body);
}

GuardedBuffer::~GuardedBuffer() {
    munmap(m_mapping, m_mappingBytes);
}

}  // namespace testkit
