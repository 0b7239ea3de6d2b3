// Rectangles. Right and bottom lie one past the last column and row.

#include <algorithm>

#include "vidshow/platform/misc.h"

namespace {

// Coordinates wrap, as the two's complement registers do that clients count on.
int32_t WrappingAdd(int32_t a, int32_t b) {
    return static_cast<int32_t>(static_cast<uint32_t>(a) + static_cast<uint32_t>(b));
}

BOOL KeepUnlessEmpty(RECT* rect) {
    if (rect->top < rect->bottom && rect->left < rect->right) return TRUE;
    SetRect(rect, 0, 0, 0, 0);
    return FALSE;
}

}  // namespace

extern "C" {

BOOL SetRect(RECT* rect, int left, int top, int right, int bottom) {
    if (rect == nullptr) return FALSE;
    *rect = RECT{left, top, right, bottom};
    return TRUE;
}

BOOL OffsetRect(RECT* rect, int dx, int dy) {
    if (rect == nullptr) return FALSE;
    rect->left = WrappingAdd(rect->left, dx);
    rect->right = WrappingAdd(rect->right, dx);
    rect->top = WrappingAdd(rect->top, dy);
    rect->bottom = WrappingAdd(rect->bottom, dy);
    return TRUE;
}

BOOL IsRectEmpty(const RECT* rect) {
    return rect == nullptr || rect->right <= rect->left || rect->bottom <= rect->top;
}

BOOL PtInRect(const RECT* rect, LONG x, LONG y) {
    if (IsRectEmpty(rect)) return FALSE;
    return rect->left <= x && x < rect->right && rect->top <= y && y < rect->bottom;
}

BOOL EqualRect(const RECT* a, const RECT* b) {
    return a->left == b->left && a->top == b->top && a->right == b->right && a->bottom == b->bottom;
}

// The results are computed before they are stored: `dst` may be one of the sources.
BOOL IntersectRect(RECT* dst, const RECT* a, const RECT* b) {
    *dst = RECT{std::max(a->left, b->left), std::max(a->top, b->top), std::min(a->right, b->right),
                std::min(a->bottom, b->bottom)};
    return KeepUnlessEmpty(dst);
}

// An empty source counts like any other: clients rely on the bounding box of all eight numbers.
BOOL UnionRect(RECT* dst, const RECT* a, const RECT* b) {
    *dst = RECT{std::min(a->left, b->left), std::min(a->top, b->top), std::max(a->right, b->right),
                std::max(a->bottom, b->bottom)};
    return KeepUnlessEmpty(dst);
}

}  // extern "C"
