// What the x86 back ends of every family begin with, for registers of 512 bits. No #pragma once:
// included inside a back end's unnamed namespace.

using V = __m512i;

#undef VIDSHOW_MM
#undef VIDSHOW_MM_ALL
/// The instruction of that name for this width.
#define VIDSHOW_MM(name) _mm512_##name
/// The same of those that know no lanes.
#define VIDSHOW_MM_ALL(name) _mm512_##name##_si512

#include "kernels/x86/bits.h"
