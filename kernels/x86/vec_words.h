// Lanes of 16 bits as the vector kernels use them. No #pragma once, no includes: included inside a
// back end's unnamed namespace, behind bits128.h or its like.

using B = V;  // widened to 16 bits
struct Wide {
    V lo, hi;
};

V Set(int x) {
    return VIDSHOW_MM(set1_epi16)(static_cast<int16_t>(x));
}
V And(V a, int mask) {
    return And(a, Set(mask));
}
