#ifndef VIDSHOW_PLATFORM_QUEUE_H
#define VIDSHOW_PLATFORM_QUEUE_H

/// @file
/// A ring queue of fixed-size items between threads.

#include "vidshow/types.h"

#endif
