// vr_malloc, vr_free and getVersion.

#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <vector>

#include "vidshow/presenter.h"

namespace {

uintptr_t Address(const void* p) {
    return reinterpret_cast<uintptr_t>(p);
}

TEST(AlignedMemory, IsAlignedZeroedAndMarkedWithItsDistance) {
    for (DWORD align = 1; align <= 128; align *= 2) {
        for (const DWORD size : {0u, 1u, 3u, 16u, 1000u, 70000u}) {
            SCOPED_TRACE(testing::Message() << size << " bytes at " << align);
            auto* const p = static_cast<uint8_t*>(vr_malloc(size, align));
            ASSERT_NE(p, nullptr);
            EXPECT_EQ(Address(p) % align, 0u);
            EXPECT_GE(p[-1], 1u);
            EXPECT_LE(p[-1], align);
            for (DWORD i = 0; i < size; ++i)
                ASSERT_EQ(p[i], 0) << i;
            if (size != 0) std::memset(p, 0xFF, size);
            vr_free(p);
        }
    }
}

TEST(AlignedMemory, AlignmentZeroMeansFour) {
    for (int i = 0; i < 16; ++i) {
        auto* const p = static_cast<uint8_t*>(vr_malloc(static_cast<DWORD>(i), 0));
        ASSERT_NE(p, nullptr);
        EXPECT_EQ(Address(p) % 4, 0u);
        EXPECT_EQ(p[-1], 4) << "the heap's own alignment is a multiple of 4";
        vr_free(p);
    }
}

TEST(AlignedMemory, AlreadyAlignedBlockIsMovedByTheWholeAlignment) {
    // Every block of the heap is a multiple of 8 at least.
    for (const DWORD align : {1u, 2u, 4u, 8u}) {
        auto* const p = static_cast<uint8_t*>(vr_malloc(10, align));
        ASSERT_NE(p, nullptr);
        EXPECT_EQ(p[-1], align);
        vr_free(p);
    }
}

TEST(AlignedMemory, TooMuchIsNull) {
    if (sizeof(void*) != 4) GTEST_SKIP() << "every 32-bit size fits this address space";
    EXPECT_EQ(vr_malloc(0xFFFFFFFF, 128), nullptr) << "the sum does not fit an address";
    EXPECT_EQ(vr_malloc(0xFFFFFFF0, 4), nullptr);
}

TEST(AlignedMemory, BlocksDoNotOverlap) {
    std::vector<uint8_t*> blocks;
    for (uint8_t i = 0; i < 100; ++i) {
        blocks.push_back(static_cast<uint8_t*>(vr_malloc(64, 64)));
        ASSERT_NE(blocks.back(), nullptr);
        std::memset(blocks.back(), i, 64);
    }
    for (uint8_t i = 0; i < 100; ++i) {
        EXPECT_EQ(blocks[i][0], i);
        EXPECT_EQ(blocks[i][63], i);
        vr_free(blocks[i]);
    }
}

TEST(Version, EndsInTheVersion) {
    const std::string text = getVersion();
    const std::string end = "Vidshow Version:1.0.10461.1";
    ASSERT_GE(text.size(), end.size());
    EXPECT_EQ(text.substr(text.size() - end.size()), end);
    EXPECT_EQ(getVersion(), getVersion()) << "one constant text";
}

}  // namespace
