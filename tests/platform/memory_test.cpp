#include <gtest/gtest.h>

#include "testkit/guarded_buffer.h"
#include "vidshow/platform/misc.h"

namespace {

TEST(ZeroMemory, ClearsExactlyItsBytes) {
    testkit::GuardedBuffer buffer(33);
    ZeroMemory(buffer.data() + 1, 32);
    EXPECT_EQ(buffer[0], 0xA5);
    for (size_t i = 1; i < buffer.size(); ++i) {
        EXPECT_EQ(buffer[i], 0) << i;
    }
}

TEST(ZeroMemory, NoBytesWriteNothing) {
    testkit::GuardedBuffer buffer(1);
    ZeroMemory(buffer.data(), 0);
    EXPECT_EQ(buffer[0], 0xA5);
}

}  // namespace
