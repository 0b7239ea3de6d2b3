#include "playkit/image.h"

#include <gtest/gtest.h>
#include <png.h>

#include <algorithm>
#include <cmath>

namespace playkit {

namespace {

int level(double value) {
    return static_cast<int>(std::lround(std::clamp(value, 0.0, 255.0)));
}

}  // namespace

Rgb Image::at(int x, int y) const {
    const size_t place =
        3 * (static_cast<size_t>(y) * static_cast<size_t>(width) + static_cast<size_t>(x));
    return {bytes.at(place), bytes.at(place + 1), bytes.at(place + 2)};
}

Image readPng(const std::string& path) {
    Image image;
    png_image header = {};
    header.version = PNG_IMAGE_VERSION;
    if (png_image_begin_read_from_file(&header, path.c_str()) == 0) {
        ADD_FAILURE() << path << ": " << header.message;
        return image;
    }
    EXPECT_EQ(header.format, static_cast<png_uint_32>(PNG_FORMAT_RGB));
    header.format = PNG_FORMAT_RGB;
    image.width = static_cast<int>(header.width);
    image.height = static_cast<int>(header.height);
    image.bytes.resize(3 * size_t{header.width} * header.height);
    if (png_image_finish_read(&header, nullptr, image.bytes.data(), 0, nullptr) == 0) {
        ADD_FAILURE() << path << ": " << header.message;
    }
    return image;
}

Rgb colourAt(const RawFrame& frame, int x, int y, const Weights& weights, bool fullRange) {
    const size_t luma = static_cast<size_t>(y * frame.width + x);
    const size_t chroma = static_cast<size_t>(y / 2 * ((frame.width + 1) / 2) + x / 2);
    double light = frame.planes[0].at(luma);
    double cb = frame.planes[1].at(chroma) - 128.0;
    double cr = frame.planes[2].at(chroma) - 128.0;
    if (!fullRange) {
        light = (light - 16) * 255 / 219;
        cb = cb * 255 / 224;
        cr = cr * 255 / 224;
    }
    const double red = light + 2 * (1 - weights.red) * cr;
    const double blue = light + 2 * (1 - weights.blue) * cb;
    const double green =
        (light - weights.red * red - weights.blue * blue) / (1 - weights.red - weights.blue);
    return {level(red), level(green), level(blue)};
}

void expectNear(const Rgb& shown, const Rgb& expected, int tolerance) {
    EXPECT_NEAR(shown.red, expected.red, tolerance);
    EXPECT_NEAR(shown.green, expected.green, tolerance);
    EXPECT_NEAR(shown.blue, expected.blue, tolerance);
}

}  // namespace playkit
