#pragma once

#include "vidshow/platform/sync.h"

namespace vidshow {

/// Remembers a mutex by a copy of its name. The 128th name is one too many: it empties the
/// registry, is not remembered itself, and a line on standard output says so.
void RememberNamedMutex(CLinuxMutex* mutex, const char* name);

/// @return the mutex that was first remembered by this name and is so still; null without one
CLinuxMutex* FindNamedMutex(const char* name);

/// Takes a mutex out of the registry, if it is there.
void ForgetNamedMutex(const CLinuxMutex* mutex);

/// Leaves the name counted but without a mutex, so that no look-up finds one that is gone.
void ForgetHandleOfNamedMutex(const CLinuxMutex* mutex);

}  // namespace vidshow
