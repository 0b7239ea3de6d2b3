#ifndef VIDSHOW_PLATFORM_H
#define VIDSHOW_PLATFORM_H

/// @file
/// The Win32-style platform layer over POSIX, whole.

#include "vidshow/platform/file.h"
#include "vidshow/platform/misc.h"
#include "vidshow/platform/queue.h"
#include "vidshow/platform/sync.h"
#include "vidshow/platform/thread.h"
#include "vidshow/platform/timer.h"

#endif
