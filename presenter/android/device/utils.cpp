// Names of the device's libutils.so, for the linker alone: nothing here ever runs.

#include "presenter/android/media_framework.h"

namespace android {

RefBase::RefBase() : mRefs(nullptr) {}
RefBase::~RefBase() {}
void RefBase::incStrong(const void*) const {}
void RefBase::decStrong(const void*) const {}
void RefBase::onFirstRef() {}
void RefBase::onLastStrongRef(const void*) {}
bool RefBase::onIncStrongAttempted(uint32_t, const void*) {
    return false;
}
void RefBase::onLastWeakRef(const void*) {}

}  // namespace android
