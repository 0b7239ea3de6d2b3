#include <gtest/gtest.h>

#include <cstring>

#include "vidshow/platform/misc.h"

namespace {

constexpr GUID kGuid = {0x00112233, 0x4455, 0x6677, {8, 9, 10, 11, 12, 13, 14, 15}};

TEST(Guid, EqualToItsCopy) {
    const GUID copy = kGuid;
    EXPECT_EQ(IsEqualGUID(kGuid, copy), 1);
    EXPECT_TRUE(kGuid == copy);
    EXPECT_FALSE(kGuid != copy);
}

TEST(Guid, EveryByteCounts) {
    for (size_t i = 0; i < sizeof(GUID); ++i) {
        GUID other = kGuid;
        unsigned char bytes[sizeof(GUID)];
        std::memcpy(bytes, &other, sizeof bytes);
        bytes[i] = static_cast<unsigned char>(bytes[i] ^ 0x80);
        std::memcpy(&other, bytes, sizeof bytes);
        EXPECT_EQ(IsEqualGUID(kGuid, other), 0) << "byte " << i;
        EXPECT_FALSE(kGuid == other) << "byte " << i;
        EXPECT_TRUE(kGuid != other) << "byte " << i;
    }
}

}  // namespace
