#include "compare/difference.h"

#include <algorithm>
#include <cstdlib>

namespace vidshow::tools {

namespace {

// Which component each of red, green and blue shows.
struct Channels {
    size_t component[3];
};

Channels channelsFor(size_t components, bool rgb) {
    if (components < 3) return {{0, 0, 0}};
    return rgb ? Channels{{0, 1, 2}} : Channels{{2, 0, 1}};
}

uint8_t shown(int difference, int peak, int gain) {
    return static_cast<uint8_t>(std::min(std::abs(difference) * 255 / peak * gain, 255));
}

}  // namespace

RgbImage differencePicture(const std::vector<Samples>& a, const std::vector<Samples>& b, int peak,
                           bool rgb, int gain) {
    const Channels channels = channelsFor(a.size(), rgb);
    RgbImage image;
    image.width = a[0].width;
    image.height = a[0].height;
    image.stride = 3 * image.width;
    image.pixels.resize(static_cast<size_t>(image.stride) * static_cast<size_t>(image.height));
    for (int y = 0; y < image.height; ++y) {
        for (int x = 0; x < image.width; ++x) {
            for (int i = 0; i < 3; ++i) {
                const Samples& left = a[channels.component[i]];
                const Samples& right = b[channels.component[i]];
                // Chroma has whole fractions of the picture's sides, rounded up.
                const int column = x / ((image.width + left.width - 1) / left.width);
                const int row = y / ((image.height + left.height - 1) / left.height);
                image.row(y)[3 * x + i] =
                    shown(left.at(column, row) - right.at(column, row), peak, gain);
            }
        }
    }
    return image;
}

}  // namespace vidshow::tools
