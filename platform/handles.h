#pragma once

#include <errno.h>

#include "vidshow/platform/sync.h"

namespace vidshow {

/// What `getType` answers in every class, one address for all: clients cannot tell classes apart by
/// it, and never could.
extern const char kObjectType[1];

/// @return whether a handle is 0 or 0xFFFFFFFF; other values are trusted
inline bool IsInvalid(HANDLE handle) {
    return handle == nullptr || handle == INVALID_HANDLE_VALUE;
}

/// @return whether a handle is invalid or 0xFFFFFFFE, which a few functions refuse besides
inline bool IsInvalidOrPseudo(HANDLE handle) {
    return IsInvalid(handle) ||
           handle == reinterpret_cast<HANDLE>(static_cast<uintptr_t>(0xFFFFFFFEu));
}

inline HANDLE HandleOf(CLinuxSyncObject* object) {
    return object;
}

inline CLinuxSyncObject* ObjectOf(HANDLE handle) {
    return static_cast<CLinuxSyncObject*>(handle);
}

/// The object as the class that the handle's owner vouches for.
template <typename Class>
Class* ObjectOf(HANDLE handle) {
    return static_cast<Class*>(ObjectOf(handle));
}

/// Destroys an object that could not be made ready; `errno` goes on telling why.
inline void Discard(CLinuxSyncObject* object) {
    const int error = errno;
    delete object;
    errno = error;
}

}  // namespace vidshow
