#pragma once

#include <map>

#include "host/src/pixel_buffer.h"
#include "presenter/android/media_framework.h"

namespace vidshow::host {

/// The metadata behind every `android::MetaData` here.
class Metadata : public android::MetaData {
  public:
    std::map<uint32_t, int32_t> values;

  protected:
    ~Metadata() override = default;
};

/// The decoder output behind every `android::MediaBuffer` here.
class MediaOutput : public android::MediaBuffer {
  public:
    android::sp<PixelBuffer> graphic;  // may be null
    android::sp<Metadata> metadata = new Metadata;
};

}  // namespace vidshow::host
