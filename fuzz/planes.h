#pragma once

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <memory>
#include <vector>

#include "fuzz/bytes.h"
#include "testkit/guarded_buffer.h"

namespace fuzz {

using Placement = testkit::GuardedBuffer::Placement;

/// A plane that touches an unmapped page in front or behind.
struct PlaneShape {
    uint32_t rowBytes;
    uint32_t rows;
    uint32_t stride;
    uint32_t lastRowBytes;  ///< that exist of the last row: the picture's, or the whole stride
    Placement placement;

    size_t bytes() const { return rows ? size_t{rows - 1} * stride + lastRowBytes : 0; }
};

/// Up to three planes, as the library takes them.
class Planes {
  public:
    void Add(const PlaneShape& shape) {
        plane[m_memory.size()] = nullptr;
        stride[m_memory.size()] = shape.stride;
        m_memory.push_back(
            std::make_unique<testkit::GuardedBuffer>(shape.bytes(), shape.placement));
        plane[m_memory.size() - 1] = m_memory.back()->data();
        m_shapes.push_back(shape);
    }
    void FillRandom(Samples samples) {
        for (auto& memory : m_memory)
            samples.Fill(memory->data(), memory->size());
    }
    void Fill(uint8_t value) {
        for (auto& memory : m_memory)
            std::memset(memory->data(), value, memory->size());
    }
    std::vector<uint8_t> Snapshot() const {
        std::vector<uint8_t> all;
        for (const auto& memory : m_memory)
            all.insert(all.end(), memory->data(), memory->data() + memory->size());
        return all;
    }
    /// Whether every byte outside the rows of the pictures holds `value`. `flush`: the rows stand
    /// at the ends of the strides.
    bool RestIs(uint8_t value, bool flush) const {
        for (size_t i = 0; i < m_memory.size(); ++i) {
            const PlaneShape& shape = m_shapes[i];
            const uint8_t* const begin = m_memory[i]->data();
            const uint8_t* const end = begin + m_memory[i]->size();
            const uint8_t* gap = begin;  // up to the next row, or the end
            for (uint32_t y = 0; y < shape.rows; ++y) {
                const size_t first = flush ? shape.stride - shape.rowBytes : 0;
                const uint8_t* const row = begin + size_t{y} * shape.stride + first;
                if (!AllAre(value, gap, row)) return false;
                gap = row + shape.rowBytes;
            }
            if (!AllAre(value, gap, end)) return false;
        }
        return true;
    }

    uint8_t* plane[3] = {};
    uint32_t stride[3] = {};

  private:
    FUZZ_UNCOUNTED static bool AllAre(uint8_t value, const uint8_t* from, const uint8_t* to) {
        while (from < to && *from == value)
            ++from;
        return from >= to;
    }

    std::vector<std::unique_ptr<testkit::GuardedBuffer>> m_memory;
    std::vector<PlaneShape> m_shapes;
};

}  // namespace fuzz
