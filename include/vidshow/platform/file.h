#ifndef VIDSHOW_PLATFORM_FILE_H
#define VIDSHOW_PLATFORM_FILE_H

/// @file
/// Files, mappings, modules and the environment.

#include "vidshow/types.h"

#endif
