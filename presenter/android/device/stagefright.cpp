// Names of the device's libstagefright.so, for the linker alone: nothing here ever runs.

#include "presenter/android/media_framework.h"

namespace android {

sp<GraphicBuffer> MediaBuffer::graphicBuffer() const {
    return nullptr;
}
sp<MetaData> MediaBuffer::meta_data() {
    return nullptr;
}
bool MetaData::setInt32(uint32_t, int32_t) {
    return false;
}

}  // namespace android
