#include <gtest/gtest.h>

#include <cstring>

#include "testkit/guarded_buffer.h"
#include "vidshow/platform/misc.h"

namespace {

TEST(GetSystemDirectory, WithoutRoomTellsTheSizeAndWritesNothing) {
    for (DWORD size = 0; size <= 4; ++size) {
        testkit::GuardedBuffer buffer(4);
        EXPECT_EQ(GetSystemDirectory(reinterpret_cast<char*>(buffer.data()), size), 5u);
        for (size_t i = 0; i < buffer.size(); ++i)
            EXPECT_EQ(buffer[i], 0xA5);
    }
}

TEST(GetSystemDirectory, FiveBytesAreEnough) {
    testkit::GuardedBuffer buffer(5);
    EXPECT_EQ(GetSystemDirectory(reinterpret_cast<char*>(buffer.data()), 5), 4u);
    EXPECT_STREQ(reinterpret_cast<const char*>(buffer.data()), "/usr");
}

TEST(GlobalMemoryStatus, AnswersTheSameEightNumbersEverywhere) {
    testkit::GuardedBuffer buffer(sizeof(MEMORYSTATUS));
    void* status = buffer.data();
    GlobalMemoryStatus(static_cast<MEMORYSTATUS*>(status));
    uint32_t words[8];
    std::memcpy(words, buffer.data(), sizeof words);
    const uint32_t expected[8] = {32, 0, 128, 32, 128, 32, 0, 0};
    for (size_t i = 0; i < 8; ++i)
        EXPECT_EQ(words[i], expected[i]) << "field " << i;
}

TEST(GlobalMemoryStatus, FieldsStandInWin32Order) {
    EXPECT_EQ(offsetof(MEMORYSTATUS, dwLength), 0u);
    EXPECT_EQ(offsetof(MEMORYSTATUS, dwMemoryLoad), 4u);
    EXPECT_EQ(offsetof(MEMORYSTATUS, dwTotalPhys), 8u);
    EXPECT_EQ(offsetof(MEMORYSTATUS, dwAvailPhys), 12u);
    EXPECT_EQ(offsetof(MEMORYSTATUS, dwTotalPageFile), 16u);
    EXPECT_EQ(offsetof(MEMORYSTATUS, dwAvailPageFile), 20u);
    EXPECT_EQ(offsetof(MEMORYSTATUS, dwTotalVirtual), 24u);
    EXPECT_EQ(offsetof(MEMORYSTATUS, dwAvailVirtual), 28u);
}

}  // namespace
