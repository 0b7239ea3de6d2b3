#ifndef VIDSHOW_PLATFORM_THREAD_H
#define VIDSHOW_PLATFORM_THREAD_H

/// @file
/// Threads, thread messages and thread identity.

#include "vidshow/types.h"

#endif
