#pragma once

#include <cstdint>
#include <vector>

#include "convert/format.h"

namespace vidshow::tools {

/// A picture in one of the engine's formats; its rows follow each other without gaps.
struct Image {
    Image() = default;
    Image(const Format& itsFormat, int itsWidth, int itsHeight)
        : format(&itsFormat), width(itsWidth), height(itsHeight) {
        for (int i = 0; i < format->planes; ++i) {
            strides[i] = static_cast<uint32_t>(format->rowBytes(i, width));
            planes[i].assign(size_t{strides[i]} * static_cast<size_t>(rows(i) + kRowsBehind), 0);
            data[i] = planes[i].data();
        }
    }
    Image(const Image&) = delete;
    Image& operator=(const Image&) = delete;
    Image(Image&&) = default;
    Image& operator=(Image&&) = default;

    int rows(int plane) const { return format->rows(plane, height); }
    size_t bytes(int plane) const {
        return size_t{strides[plane]} * static_cast<size_t>(rows(plane));
    }

    // One of the fixed enlargements reads so many rows behind its source.
    static constexpr int kRowsBehind = 2;

    const Format* format = nullptr;
    int width = 0;   ///< pixels
    int height = 0;  ///< pixels
    std::vector<uint8_t> planes[3];
    uint8_t* data[3] = {};
    uint32_t strides[3] = {};  ///< bytes
};

}  // namespace vidshow::tools
