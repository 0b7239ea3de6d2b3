#include "convert/displayed.h"

namespace vidshow::tools {

namespace {

// A value of so few bits, spread over eight.
uint8_t widen(unsigned value, int bits) {
    return static_cast<uint8_t>(value << (8 - bits) | value >> (2 * bits - 8));
}

void widen565(const uint8_t* pixel, uint8_t* rgb) {
    const unsigned word = pixel[0] | static_cast<unsigned>(pixel[1]) << 8;
    rgb[0] = widen(word >> 11, 5);
    rgb[1] = widen(word >> 5 & 63, 6);
    rgb[2] = widen(word & 31, 5);
}

// Red, green and blue of five bits each above the bit that tells whether the pixel is seen.
void widen5551(const uint8_t* pixel, uint8_t* rgba) {
    const unsigned word = pixel[0] | static_cast<unsigned>(pixel[1]) << 8;
    rgba[0] = widen(word >> 11, 5);
    rgba[1] = widen(word >> 6 & 31, 5);
    rgba[2] = widen(word >> 1 & 31, 5);
    rgba[3] = (word & 1) != 0 ? 255 : 0;
}

void widenPixel(QZ_IMAGEPROC_FMT format, const uint8_t* pixel, uint8_t* out) {
    switch (format) {
        case QZ_IMAGEPROC_FMT_RGB565:
            return widen565(pixel, out);
        case QZ_IMAGEPROC_FMT_RGB5551:
            return widen5551(pixel, out);
        case QZ_IMAGEPROC_FMT_ARGB32:
            out[3] = pixel[3];
            [[fallthrough]];
        default:
            for (int i = 0; i < 3; ++i)
                out[i] = pixel[2 - i];
    }
}

}  // namespace

RgbImage displayed(const Image& image) {
    const QZ_IMAGEPROC_FMT format = image.format->number;
    RgbImage rgb;
    rgb.alpha = format == QZ_IMAGEPROC_FMT_ARGB32 || format == QZ_IMAGEPROC_FMT_RGB5551;
    const int bytes = rgb.alpha ? 4 : 3;
    rgb.width = image.width;
    rgb.height = image.height;
    rgb.stride = image.width * bytes;
    rgb.pixels.resize(static_cast<size_t>(rgb.stride) * static_cast<size_t>(rgb.height));
    const size_t pixels = static_cast<size_t>(image.width) * static_cast<size_t>(image.height);
    for (size_t i = 0; i < pixels; ++i) {
        widenPixel(format, image.data[0] + i * static_cast<size_t>(image.format->bytes),
                   rgb.pixels.data() + i * static_cast<size_t>(bytes));
    }
    return rgb;
}

}  // namespace vidshow::tools
