#pragma once

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>

// Before a function whose loops tell a fuzzer nothing: it does not count them, and is quicker.
#if defined(__clang__)
#define FUZZ_UNCOUNTED __attribute__((no_sanitize("coverage")))
#else
#define FUZZ_UNCOUNTED
#endif

namespace fuzz {

/// Turns a fuzzer's input into choices, front to back. Behind its end every choice is 0, so that
/// each input is a whole case.
class Bytes {
  public:
    Bytes(const uint8_t* data, size_t size) : m_next(data), m_end(data + size) {}

    bool empty() const { return m_next == m_end; }
    uint8_t Byte() { return empty() ? uint8_t{0} : *m_next++; }
    bool Bit() { return (Byte() & 1) != 0; }
    uint32_t Word() {
        uint32_t word = 0;
        for (int i = 0; i < 4; ++i)
            word = word << 8 | Byte();
        return word;
    }
    /// @param bound 1 to 65536 @return 0 to `bound` - 1
    uint32_t Below(uint32_t bound) {
        const uint32_t low = Byte();
        return (bound <= 256 ? low : low << 8 | Byte()) % bound;
    }
    /// One of a list.
    template <typename Item, size_t count>
    const Item& Of(const Item (&items)[count]) {
        return items[Below(count)];
    }

  private:
    const uint8_t* m_next;
    const uint8_t* m_end;
};

/// Samples for planes; a fuzzer's own bytes are too few for them.
class Samples {
  public:
    explicit Samples(uint32_t seed) : m_state(seed) {}
    FUZZ_UNCOUNTED uint8_t Next() {
        m_state = m_state * 1664525 + 1013904223;
        const uint8_t sample = static_cast<uint8_t>(m_state >> 24);
        const bool isExtreme = (m_state & 0x7000) == 0;  // clamps deserve their share
        return isExtreme ? static_cast<uint8_t>(sample & 1 ? 255 : 0) : sample;
    }
    FUZZ_UNCOUNTED void Fill(uint8_t* data, size_t bytes) {
        for (size_t i = 0; i < bytes; ++i)
            data[i] = Next();
    }

  private:
    uint32_t m_state;
};

/// Ends the program, and with it the case, unless `holds`.
inline void Require(bool holds, const char* what) {
    if (holds) return;
    std::fprintf(stderr, "\nnot so: %s\n", what);
    std::abort();
}

}  // namespace fuzz
