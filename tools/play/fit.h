#pragma once

#include "common/picture.h"

namespace vidshow::tools {

struct Size {
    int width;   ///< pixels
    int height;  ///< pixels
};

struct Place {
    int left;
    int top;
    Size size;
};

/// How large a picture is on square pixels: its width is stretched, its height stays.
Size displaySize(const Picture& picture);

/// The largest place inside `outer` that has the shape of `inner`, in the middle.
Place fitInto(const Size& inner, const Size& outer);

}  // namespace vidshow::tools
