#pragma once

#include "vidshow/types.h"

namespace vidshow {

/// @return whether a handle stands in the table of threads. Looks without the table's lock
bool IsThread(HANDLE handle);

/// Takes a handle out of the table, if it is there.
void ForgetThread(HANDLE handle);

}  // namespace vidshow
