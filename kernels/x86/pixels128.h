// What registers of 128 bits hold in blocks of 16 bytes, stored. No #pragma once, no includes:
// included inside a back end's unnamed namespace, behind bits128.h. Inline, for not every family
// uses all of it.

inline V Repeat(__m128i x) {
    return x;
}
/// Of a and b, block by block. Registers of more than one block go `apart` bytes on with each.
inline void StoreBlocks(uint8_t* out, V a, V b, size_t = 0) {
    Store(out, a);
    Store(out + 16, b);
}
/// Pixels of 32 bits: 0-3, 4-7, 8-11, 12-15.
inline void StorePixels(uint8_t* out, V q0, V q1, V q2, V q3) {
    StoreBlocks(out, q0, q1);
    StoreBlocks(out + 32, q2, q3);
}
inline void StoreParts(uint8_t* out, V p0, V p1, V p2) {
    StoreBlocks(out, p0, p1);
    Store(out + 32, p2);
}
