#include <gtest/gtest.h>

#include <cstring>

#include "presenter/android/media_framework.h"
#include "vidshow-host/window.h"

namespace {

using android::GraphicBuffer;
using android::MediaBuffer;
using android::MetaData;
using android::sp;
using vidshow::host::DecoderBuffer;
using vidshow::host::liveBuffers;

constexpr uint32_t kRendered = 0x72656E64;  // "rend"

MediaBuffer* MediaBufferOf(const DecoderBuffer& buffer) {
    return static_cast<MediaBuffer*>(buffer.mediaBuffer());
}

TEST(DecoderBuffer, HasAYv12GraphicBuffer) {
    const DecoderBuffer decoded(100, 40, 16);
    const sp<GraphicBuffer> graphic = MediaBufferOf(decoded)->graphicBuffer();
    const ANativeWindowBuffer* const native = graphic->getNativeBuffer();
    EXPECT_EQ(native->width, 100);
    EXPECT_EQ(native->height, 40);
    EXPECT_EQ(native->stride, 112);
    EXPECT_EQ(native->format, vidshow::host::kFormatYv12);
    EXPECT_EQ(native->handle, decoded.bits());
    EXPECT_EQ(decoded.stride(), 112);
    std::memset(decoded.bits(), 1, 112 * 40 + 2 * 64 * 20);
}

TEST(DecoderBuffer, StrongPointersCountThroughTheNativeBuffersHooks) {
    const int32_t before = liveBuffers();
    sp<GraphicBuffer> kept;
    {
        const DecoderBuffer decoded(16, 16);
        EXPECT_EQ(decoded.strongCount(), 1);
        kept = MediaBufferOf(decoded)->graphicBuffer();
        EXPECT_EQ(decoded.strongCount(), 2);
        ANativeWindowBuffer* const native = kept->getNativeBuffer();
        native->common.incRef(&native->common);
        EXPECT_EQ(decoded.strongCount(), 3);
        native->common.decRef(&native->common);
        EXPECT_EQ(decoded.strongCount(), 2);
    }
    EXPECT_EQ(liveBuffers(), before + 1) << "somebody still holds the graphic buffer";
    kept = nullptr;
    EXPECT_EQ(liveBuffers(), before);
}

TEST(DecoderBuffer, CanHaveLostItsGraphicBuffer) {
    const DecoderBuffer lost(16, 16, 32, false);
    EXPECT_EQ(MediaBufferOf(lost)->graphicBuffer().get(), nullptr);
    EXPECT_EQ(lost.bits(), nullptr);
    EXPECT_EQ(lost.stride(), 0);
    EXPECT_EQ(lost.strongCount(), 0);
    EXPECT_NE(MediaBufferOf(lost)->meta_data().get(), nullptr);
}

TEST(DecoderBuffer, IsRenderedWhenItsMetadataSaysSo) {
    DecoderBuffer decoded(16, 16);
    EXPECT_FALSE(decoded.rendered());
    MediaBufferOf(decoded)->meta_data()->setInt32(kRendered, 1);
    EXPECT_TRUE(decoded.rendered());
    decoded.reset();
    EXPECT_FALSE(decoded.rendered());
}

TEST(MetaData, KeepsOneValueAKey) {
    const DecoderBuffer decoded(16, 16);
    const sp<MetaData> data = MediaBufferOf(decoded)->meta_data();
    int32_t value = 5;
    EXPECT_FALSE(data->findInt32(1, &value));
    EXPECT_EQ(value, 5);
    EXPECT_FALSE(data->setInt32(1, -7)) << "nothing was replaced";
    EXPECT_TRUE(data->setInt32(1, -8));
    EXPECT_FALSE(data->setInt32(2, 9));
    ASSERT_TRUE(data->findInt32(1, &value));
    EXPECT_EQ(value, -8);
    ASSERT_TRUE(data->findInt32(2, &value));
    EXPECT_EQ(value, 9);
}

TEST(MetaData, IsOneObjectABuffer) {
    const DecoderBuffer decoded(16, 16);
    const sp<MetaData> first = MediaBufferOf(decoded)->meta_data();
    const sp<MetaData> second = MediaBufferOf(decoded)->meta_data();
    EXPECT_EQ(first.get(), second.get());
    EXPECT_EQ(first->getStrongCount(), 3);
}

}  // namespace
