// What the x86 back ends of every family begin with, for registers of 256 bits. No #pragma once:
// included inside a back end's unnamed namespace.

using V = __m256i;

#undef VIDSHOW_MM
#undef VIDSHOW_MM_ALL
/// The instruction of that name for this width.
#define VIDSHOW_MM(name) _mm256_##name
/// The same of those that know no lanes.
#define VIDSHOW_MM_ALL(name) _mm256_##name##_si256

#include "kernels/x86/bits.h"
