// What the x86 back ends of every family begin with, for registers of 128 bits. No #pragma once:
// included inside a back end's unnamed namespace.

using V = __m128i;

#undef VIDSHOW_MM
#undef VIDSHOW_MM_ALL
/// The instruction of that name for this width.
#define VIDSHOW_MM(name) _mm_##name
/// The same of those that know no lanes.
#define VIDSHOW_MM_ALL(name) _mm_##name##_si128

#include "kernels/x86/bits.h"
