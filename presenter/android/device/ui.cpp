// Names of the device's libui.so, for the linker alone: nothing here ever runs.

#include "presenter/android/media_framework.h"

namespace android {

ANativeWindowBuffer* GraphicBuffer::getNativeBuffer() const {
    return nullptr;
}

}  // namespace android
