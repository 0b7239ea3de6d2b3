#ifndef VIDSHOW_PLATFORM_TIMER_H
#define VIDSHOW_PLATFORM_TIMER_H

/// @file
/// Timers that post messages to their owner's thread.

#include "vidshow/types.h"

#endif
