#include "play/fit.h"

#include <algorithm>
#include <cstdint>

namespace vidshow::tools {

namespace {

// a * b / c, rounded to the nearest, at least 1.
int scaled(int64_t a, int64_t b, int64_t c) {
    return static_cast<int>(std::max<int64_t>((a * b + c / 2) / c, 1));
}

}  // namespace

Size displaySize(const Picture& picture) {
    const AVRational aspect = picture.look.pixelAspect;
    return {scaled(picture.planes.width, aspect.num, aspect.den), picture.planes.height};
}

Place fitInto(const Size& inner, const Size& outer) {
    const bool widthLimits = static_cast<int64_t>(inner.width) * outer.height >=
                             static_cast<int64_t>(inner.height) * outer.width;
    const Size size = widthLimits
                          ? Size{outer.width, scaled(outer.width, inner.height, inner.width)}
                          : Size{scaled(outer.height, inner.width, inner.height), outer.height};
    return {(outer.width - size.width) / 2, (outer.height - size.height) / 2, size};
}

}  // namespace vidshow::tools
