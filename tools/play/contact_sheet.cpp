#include "play/contact_sheet.h"

#include <algorithm>
#include <cmath>
#include <cstring>

#include "play/fit.h"

namespace vidshow::tools {

namespace {

constexpr Size kLargest = {320, 320};
constexpr int kGap = 8;  // pixels around every cell
constexpr uint8_t kGrey = 32;
constexpr int kBytesPerPixel = 3;

RgbImage greySheet(int width, int height) {
    RgbImage sheet;
    sheet.width = width;
    sheet.height = height;
    sheet.stride = width * kBytesPerPixel;
    sheet.pixels.assign(static_cast<size_t>(sheet.stride) * static_cast<size_t>(height), kGrey);
    return sheet;
}

void paste(const RgbImage& image, int left, int top, RgbImage* sheet) {
    for (int y = 0; y < image.height; ++y) {
        std::memcpy(sheet->row(top + y) + left * kBytesPerPixel, image.row(y),
                    static_cast<size_t>(image.width) * kBytesPerPixel);
    }
}

}  // namespace

ContactSheet::ContactSheet() : m_converter(AV_PIX_FMT_RGB24, RgbConverter::Quality::best) {}

void ContactSheet::add(const Picture& picture) {
    const Size display = displaySize(picture);
    const bool small = display.width <= kLargest.width && display.height <= kLargest.height;
    const Size size = small ? display : fitInto(display, kLargest).size;
    m_thumbnails.push_back(m_converter.convert(picture, size.width, size.height));
}

RgbImage ContactSheet::image() const {
    Size cell = {1, 1};
    for (const RgbImage& thumbnail : m_thumbnails) {
        cell.width = std::max(cell.width, thumbnail.width);
        cell.height = std::max(cell.height, thumbnail.height);
    }
    const int count = static_cast<int>(m_thumbnails.size());
    const int columns = static_cast<int>(std::ceil(std::sqrt(static_cast<double>(count))));
    const int rows = (count + columns - 1) / columns;
    RgbImage sheet =
        greySheet(kGap + columns * (cell.width + kGap), kGap + rows * (cell.height + kGap));
    for (int i = 0; i < count; ++i) {
        const RgbImage& thumbnail = m_thumbnails[static_cast<size_t>(i)];
        const int left = kGap + i % columns * (cell.width + kGap);
        const int top = kGap + i / columns * (cell.height + kGap);
        paste(thumbnail, left + (cell.width - thumbnail.width) / 2,
              top + (cell.height - thumbnail.height) / 2, &sheet);
    }
    return sheet;
}

}  // namespace vidshow::tools
