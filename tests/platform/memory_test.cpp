#include <errno.h>
#include <gtest/gtest.h>

#include <cstring>
#include <limits>
#include <string>
#include <thread>

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

TEST(LocalMemory, IsWritableAndFreeReturnsNull) {
    constexpr UINT kZeroInitialise = 0x40;
    void* memory = LocalAlloc(kZeroInitialise, 1000);
    ASSERT_NE(memory, nullptr);
    std::memset(memory, 1, 1000);
    EXPECT_EQ(LocalFree(memory), nullptr);
    EXPECT_EQ(LocalFree(nullptr), nullptr);
}

TEST(LocalMemory, AbsurdSizeGivesNull) {
    volatile size_t absurd = std::numeric_limits<size_t>::max() - 4096;
#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
    GTEST_SKIP() << "the sanitizer ends the program instead; asked for " << absurd;
#else
    EXPECT_EQ(LocalAlloc(0, absurd), nullptr);
#endif
}

TEST(GetLastError, IsErrno) {
    errno = ENOENT;
    EXPECT_EQ(GetLastError(), static_cast<DWORD>(ENOENT));
    EXPECT_EQ(errno, ENOENT) << "reading leaves it";
    errno = 0;
    EXPECT_EQ(GetLastError(), 0u);
}

TEST(GetLastError, IsPerThread) {
    errno = EACCES;
    DWORD other = 0;
    std::thread([&] {
        errno = EBADF;
        other = GetLastError();
    }).join();
    EXPECT_EQ(other, static_cast<DWORD>(EBADF));
    EXPECT_EQ(GetLastError(), static_cast<DWORD>(EACCES));
}

std::string Itoa(int value, int radix) {
    char text[16];
    std::memset(text, '?', sizeof text);
    EXPECT_EQ(itoa(value, text, radix), text);
    return text[0] == '?' ? "untouched" : text;
}

TEST(Itoa, DecimalIsSigned) {
    EXPECT_EQ(Itoa(0, 10), "0");
    EXPECT_EQ(Itoa(-45, 10), "-45");
    EXPECT_EQ(Itoa(std::numeric_limits<int>::min(), 10), "-2147483648");
}

TEST(Itoa, HexadecimalIsUnsignedAndLowerCase) {
    EXPECT_EQ(Itoa(255, 16), "ff");
    EXPECT_EQ(Itoa(-1, 16), "ffffffff");
}

TEST(Itoa, OtherRadixLeavesTheBuffer) {
    EXPECT_EQ(Itoa(255, 8), "untouched");
    EXPECT_EQ(Itoa(255, 2), "untouched");
    EXPECT_EQ(Itoa(255, 0), "untouched");
}

}  // namespace
