// How SSE4.1 and AVX2 make pixels of bytes, one register for each channel, which packing has left
// in every 128 bits with the even pixels in front of the odd ones. No #pragma once, no includes:
// included inside a back end's unnamed namespace, behind pixels128.h or pixels256.h:
//
//   Repeat(x)                             128 bits in every 128 bits of a V
//   StoreBlocks(out, a, b)                what interleaving two V leaves, in order
//   StorePixels(out, q0, q1, q2, q3)      32-bit pixels, as two interleaves leave them
//   StoreParts(out, p0, p1, p2)           24-bit pixels; of every 48 bytes, a third in each

inline V Shuffled(V bytes, __m128i places) {
    return VIDSHOW_MM(shuffle_epi8)(bytes, Repeat(places));
}
inline V InOrder(V bytes) {
    return Shuffled(bytes, _mm_setr_epi8(0, 8, 1, 9, 2, 10, 3, 11, 4, 12, 5, 13, 6, 14, 7, 15));
}

/// Pixels of 16 bits from their lower and upper bytes.
inline void StoreTwos(uint8_t* out, V low, V high) {
    const V first = InOrder(low), second = InOrder(high);
    StoreBlocks(out, VIDSHOW_MM(unpacklo_epi8)(first, second),
                VIDSHOW_MM(unpackhi_epi8)(first, second));
}

/// Of 48 bytes a0 b0 c0 a1 ..., those of one channel fall on places that differ modulo 16. So one
/// shuffle a channel serves all three 16-byte parts, and blends by place modulo 3 finish them.
inline void StoreThrees(uint8_t* out, V a, V b, V c) {
    const V first =
        Shuffled(a, _mm_setr_epi8(0, 13, 3, 8, 6, 11, 1, 14, 4, 9, 7, 12, 2, 15, 5, 10));
    const V second =
        Shuffled(b, _mm_setr_epi8(10, 0, 13, 3, 8, 6, 11, 1, 14, 4, 9, 7, 12, 2, 15, 5));
    const V third =
        Shuffled(c, _mm_setr_epi8(5, 10, 0, 13, 3, 8, 6, 11, 1, 14, 4, 9, 7, 12, 2, 15));
    const V places1 = Repeat(_mm_setr_epi8(0, -1, 0, 0, -1, 0, 0, -1, 0, 0, -1, 0, 0, -1, 0, 0));
    const V places2 = Repeat(_mm_setr_epi8(0, 0, -1, 0, 0, -1, 0, 0, -1, 0, 0, -1, 0, 0, -1, 0));
    const auto part = [&](V at0, V at1, V at2) {
        return VIDSHOW_MM(blendv_epi8)(VIDSHOW_MM(blendv_epi8)(at0, at1, places1), at2, places2);
    };
    StoreParts(out, part(first, second, third), part(second, third, first),
               part(third, first, second));
}

/// Pixels of 32 bits, from bytes 0 and 1 (ab) and 2 and 3 (cd), both interleaved already.
inline void StoreJoined(uint8_t* out, V ab0, V ab1, V cd0, V cd1) {
    StorePixels(out, VIDSHOW_MM(unpacklo_epi16)(ab0, cd0), VIDSHOW_MM(unpackhi_epi16)(ab0, cd0),
                VIDSHOW_MM(unpacklo_epi16)(ab1, cd1), VIDSHOW_MM(unpackhi_epi16)(ab1, cd1));
}
inline void StoreFours(uint8_t* out, V a, V b, V c, V d) {
    const V first = InOrder(a), second = InOrder(b), third = InOrder(c), fourth = InOrder(d);
    StoreJoined(out, VIDSHOW_MM(unpacklo_epi8)(first, second),
                VIDSHOW_MM(unpackhi_epi8)(first, second), VIDSHOW_MM(unpacklo_epi8)(third, fourth),
                VIDSHOW_MM(unpackhi_epi8)(third, fourth));
}
