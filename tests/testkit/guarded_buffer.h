#pragma once

#include <cstddef>
#include <cstdint>

namespace testkit {

/// Memory that lies between two unmapped pages. The block ends exactly at the second one, so that
/// reading or writing one byte too far ends the program; `Placement::start` puts it right behind
/// the first one instead, for walks that run downwards.
class GuardedBuffer {
  public:
    enum class Placement { end, start };

    explicit GuardedBuffer(size_t bytes, Placement placement = Placement::end, uint8_t fill = 0xA5);
    ~GuardedBuffer();
    GuardedBuffer(const GuardedBuffer&) = delete;
    GuardedBuffer& operator=(const GuardedBuffer&) = delete;

    uint8_t* data() { return m_data; }
    const uint8_t* data() const { return m_data; }
    size_t size() const { return m_size; }
    uint8_t& operator[](size_t i) { return m_data[i]; }
    uint8_t operator[](size_t i) const { return m_data[i]; }

  private:
    void* m_mapping;
    size_t m_mappingBytes;
    uint8_t* m_data;
    size_t m_size;
};

}  // namespace testkit
