#pragma once

// The objects as their members lie in memory, for what no operation shows.

#include <cstring>

#include "vidshow/presenter.h"

struct StreamImage {
    void* vtable;
    VP_OPEN_STREAM_PARAMS params;
    uint8_t enable;
    uint8_t opened;
    RECT dst;
    DWORD deinterlaceMode;
    ANativeWindow* surface;
    CRITICAL_SECTION lock;
    DWORD setScaling;
    void* softRenderer;
    uint8_t softPath;
};
static_assert(sizeof(StreamImage) == sizeof(CVidshowStream), "same members");

struct PresenterImage {
    struct Slot {
        uint8_t used;
        VP_OPEN_STREAM_PARAMS params;
        CVidshowStream* stream;
    };

    void* vtable;
    CRITICAL_SECTION lock;
    DWORD param0303;
    DWORD param0401;
    DWORD param0402;
    RECT dst;
    RECT srcSize;
    VP_OpenOptionsAdv options;
    DWORD status;
    DWORD opened;
    DWORD enable;
    void* buffer;
    DWORD deinterlaceMode;
    DWORD param0409;
    ANativeWindow* surface;
    void* streamContext;
    Slot streams[4];
};
static_assert(sizeof(PresenterImage) == sizeof(CVidshow), "same members");

inline StreamImage ImageOf(const CVidshowStream& stream) {
    StreamImage image;
    std::memcpy(&image, static_cast<const void*>(&stream), sizeof image);
    return image;
}

inline PresenterImage ImageOf(const CVidshow& presenter) {
    PresenterImage image;
    std::memcpy(&image, static_cast<const void*>(&presenter), sizeof image);
    return image;
}

/// The member of `object` that lies where `member` lies in an image.
template <typename Image, typename Object, typename Member>
Member* MemberOf(Object* object, Member Image::*member) {
    static const Image image = {};
    const auto offset =
        reinterpret_cast<const char*>(&(image.*member)) - reinterpret_cast<const char*>(&image);
    return static_cast<Member*>(static_cast<void*>(reinterpret_cast<char*>(object) + offset));
}
