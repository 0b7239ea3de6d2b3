// What registers of 256 bits hold in blocks of 16 bytes, stored. No #pragma once, no includes:
// included inside a back end's unnamed namespace, behind bits256.h. Inline, for not every family
// uses all of it.

inline V Repeat(__m128i x) {
    return _mm256_broadcastsi128_si256(x);
}
/// The lower blocks of a and b, and `apart` bytes on, their upper ones.
inline void StoreBlocks(uint8_t* out, V a, V b, size_t apart = 32) {
    Store(out, _mm256_permute2x128_si256(a, b, 0x20));
    Store(out + apart, _mm256_permute2x128_si256(a, b, 0x31));
}
/// Pixels of 32 bits: 0-3 | 16-19, 4-7 | 20-23, 8-11 | 24-27, 12-15 | 28-31.
inline void StorePixels(uint8_t* out, V q0, V q1, V q2, V q3) {
    StoreBlocks(out, q0, q1, 64);
    StoreBlocks(out + 32, q2, q3, 64);
}
inline void StoreParts(uint8_t* out, V p0, V p1, V p2) {
    Store(out, _mm256_permute2x128_si256(p0, p1, 0x20));
    Store(out + 32, _mm256_permute2x128_si256(p2, p0, 0x30));
    Store(out + 64, _mm256_permute2x128_si256(p1, p2, 0x31));
}
