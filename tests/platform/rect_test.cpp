#include <gtest/gtest.h>

#include <limits>

#include "vidshow/platform/misc.h"

namespace {

constexpr int32_t kMin = std::numeric_limits<int32_t>::min();
constexpr int32_t kMax = std::numeric_limits<int32_t>::max();

// Compares by number, so that a failure names the corner.
void ExpectRect(const RECT& rect, int32_t left, int32_t top, int32_t right, int32_t bottom) {
    EXPECT_EQ(rect.left, left);
    EXPECT_EQ(rect.top, top);
    EXPECT_EQ(rect.right, right);
    EXPECT_EQ(rect.bottom, bottom);
}

TEST(SetRect, StoresTheNumbersAsGiven) {
    RECT rect = {};
    EXPECT_EQ(SetRect(&rect, 9, 7, -3, kMin), 1);
    ExpectRect(rect, 9, 7, -3, kMin);
}

TEST(SetRect, NullIsRefused) {
    EXPECT_EQ(SetRect(nullptr, 1, 2, 3, 4), 0);
}

TEST(OffsetRect, MovesBothEdges) {
    RECT rect = {1, 2, 30, 40};
    EXPECT_EQ(OffsetRect(&rect, 5, -7), 1);
    ExpectRect(rect, 6, -5, 35, 33);
}

TEST(OffsetRect, WrapsAt32Bits) {
    RECT rect = {kMax, kMin, kMax - 1, 0};
    EXPECT_EQ(OffsetRect(&rect, 1, -1), 1);
    ExpectRect(rect, kMin, kMax, kMax, -1);
}

TEST(OffsetRect, NullIsRefused) {
    EXPECT_EQ(OffsetRect(nullptr, 1, 1), 0);
}

TEST(IsRectEmpty, NullIsEmpty) {
    EXPECT_EQ(IsRectEmpty(nullptr), 1);
}

TEST(IsRectEmpty, WithoutColumnOrRow) {
    const RECT noColumn = {5, 5, 5, 9};
    const RECT noRow = {0, 9, 9, 9};
    const RECT upsideDown = {0, 9, 9, 0};
    const RECT insideOut = {9, 0, 0, 9};
    EXPECT_EQ(IsRectEmpty(&noColumn), 1);
    EXPECT_EQ(IsRectEmpty(&noRow), 1);
    EXPECT_EQ(IsRectEmpty(&upsideDown), 1);
    EXPECT_EQ(IsRectEmpty(&insideOut), 1);
}

TEST(IsRectEmpty, ComparesSigned) {
    const RECT aroundZero = {-1, -1, 0, 0};
    const RECT widest = {kMin, kMin, kMax, kMax};
    EXPECT_EQ(IsRectEmpty(&aroundZero), 0);
    EXPECT_EQ(IsRectEmpty(&widest), 0);
}

TEST(PtInRect, LeftAndTopAreInsideRightAndBottomAreNot) {
    const RECT rect = {0, 0, 10, 10};
    EXPECT_EQ(PtInRect(&rect, 0, 0), 1);
    EXPECT_EQ(PtInRect(&rect, 9, 9), 1);
    EXPECT_EQ(PtInRect(&rect, 10, 5), 0);
    EXPECT_EQ(PtInRect(&rect, 5, 10), 0);
    EXPECT_EQ(PtInRect(&rect, -1, 5), 0);
    EXPECT_EQ(PtInRect(&rect, 5, -1), 0);
}

TEST(PtInRect, NothingLiesInAnEmptyRectangle) {
    const RECT noColumn = {0, 0, 0, 10};
    for (LONG x = -1; x <= 1; ++x) {
        for (LONG y = -1; y <= 11; ++y) {
            EXPECT_EQ(PtInRect(&noColumn, x, y), 0) << x << ',' << y;
        }
    }
    EXPECT_EQ(PtInRect(nullptr, 0, 0), 0);
}

TEST(EqualRect, EveryNumberCounts) {
    const RECT rect = {1, 2, 3, 4};
    RECT other = rect;
    EXPECT_EQ(EqualRect(&rect, &other), 1);
    for (int32_t RECT::*edge : {&RECT::left, &RECT::top, &RECT::right, &RECT::bottom}) {
        other = rect;
        other.*edge ^= kMin;
        EXPECT_EQ(EqualRect(&rect, &other), 0);
    }
}

TEST(IntersectRect, TouchingRectanglesShareNothing) {
    const RECT a = {0, 0, 10, 10};
    const RECT b = {10, 0, 20, 10};
    RECT dst = {1, 2, 3, 4};
    EXPECT_EQ(IntersectRect(&dst, &a, &b), 0);
    ExpectRect(dst, 0, 0, 0, 0);
}

TEST(IntersectRect, OverlapIsStored) {
    const RECT a = {0, 0, 10, 10};
    const RECT b = {5, 5, 20, 20};
    RECT dst = {1, 2, 3, 4};
    EXPECT_EQ(IntersectRect(&dst, &a, &b), 1);
    ExpectRect(dst, 5, 5, 10, 10);
}

TEST(IntersectRect, RowsApartShareNothing) {
    const RECT a = {0, 0, 10, 10};
    const RECT b = {0, 10, 10, 20};
    RECT dst = {1, 2, 3, 4};
    EXPECT_EQ(IntersectRect(&dst, &a, &b), 0);
    ExpectRect(dst, 0, 0, 0, 0);
}

TEST(IntersectRect, DestinationMayBeASource) {
    RECT a = {-5, 0, 10, 10};
    RECT b = {-8, 5, 7, 20};
    EXPECT_EQ(IntersectRect(&a, &a, &b), 1);
    ExpectRect(a, -5, 5, 7, 10);
    a = RECT{-5, 0, 10, 10};
    EXPECT_EQ(IntersectRect(&b, &a, &b), 1);
    ExpectRect(b, -5, 5, 7, 10);
}

TEST(UnionRect, DisjointRectanglesGiveTheirBoundingBox) {
    const RECT a = {0, -4, 10, 10};
    const RECT b = {30, 40, 50, 60};
    RECT dst = {1, 2, 3, 4};
    EXPECT_EQ(UnionRect(&dst, &a, &b), 1);
    ExpectRect(dst, 0, -4, 50, 60);
}

TEST(UnionRect, EmptySourceIsNotSkipped) {
    const RECT empty = {0, 0, 0, 0};
    const RECT b = {10, 10, 20, 20};
    RECT dst = {1, 2, 3, 4};
    EXPECT_EQ(UnionRect(&dst, &empty, &b), 1);
    ExpectRect(dst, 0, 0, 20, 20);
}

TEST(UnionRect, EmptyResultIsZeroed) {
    const RECT a = {5, 5, 5, 5};
    RECT dst = {1, 2, 3, 4};
    EXPECT_EQ(UnionRect(&dst, &a, &a), 0);
    ExpectRect(dst, 0, 0, 0, 0);
}

TEST(UnionRect, DestinationMayBeASource) {
    const RECT a = {0, 0, 10, 10};
    RECT b = {30, 40, 50, 60};
    EXPECT_EQ(UnionRect(&b, &a, &b), 1);
    ExpectRect(b, 0, 0, 50, 60);
}

}  // namespace
