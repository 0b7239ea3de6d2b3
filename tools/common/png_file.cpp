#include "common/png_file.h"

#include <png.h>

#include "common/error.h"

namespace vidshow::tools {

void writePng(const std::string& path, const RgbImage& image) {
    png_image header = {};
    header.version = PNG_IMAGE_VERSION;
    header.width = static_cast<png_uint_32>(image.width);
    header.height = static_cast<png_uint_32>(image.height);
    header.format = image.alpha ? PNG_FORMAT_RGBA : PNG_FORMAT_RGB;
    header.flags = PNG_IMAGE_FLAG_FAST;  // a third of the time for a tenth more bytes
    constexpr int kAsItIs = 0;
    if (png_image_write_to_file(&header, path.c_str(), kAsItIs, image.pixels.data(), image.stride,
                                nullptr) == 0) {
        throw Error("cannot write " + path + ": " + header.message);
    }
}

}  // namespace vidshow::tools
