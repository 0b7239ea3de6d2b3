// How SSE4.1 and AVX2 make pixels of channels. No #pragma once, no includes: included inside a back
// end's unnamed namespace, behind vec_ops.h and
//
//   StoreWords(out, even, odd)            words of even and of odd pixels
//   StorePixels(out, q0, q1, q2, q3)      32-bit pixels, as two interleaves leave them
//   StoreParts(out, p0, p1, p2)           24-bit pixels; of every 48 bytes, a third in each

// Channels for bytes are signed sums; the pack that narrows them clamps them.
V Offset(int x, vec::ForBytes) {
    return Set(x);
}
V AddTerm(V term, B a, B b, vec::ForBytes) {
    return VIDSHOW_MM(add_epi16)(term, Times(a, b));
}
V Channel(V y, V term, vec::ForBytes) {
    return VIDSHOW_MM(adds_epi16)(y, term);
}

V Pack565(V a, V b, V c) {
    return Or(Or(And(ShiftLeft<2>(a), kTop5At11), And(ShiftRight<3>(b), kTop6At5)),
              ShiftRight<9>(c));
}
void Store565(uint8_t* out, Wide a, Wide b, Wide c) {
    StoreWords(out, Pack565(a.lo, b.lo, c.lo), Pack565(a.hi, b.hi, c.hi));
}

// Bit 0 holds a bit of c until it is set.
V Pack5551(V a, V b, V c, V key) {
    const V ab = Or(And(ShiftLeft<2>(a), kTop5At11), And(ShiftRight<3>(b), kTop5At6));
    return Unless(Or(Or(ab, ShiftRight<8>(c)), Set(1)), key);
}
void Store5551(uint8_t* out, Wide a, Wide b, Wide c, V key) {
    StoreWords(out, Pack5551(a.lo, b.lo, c.lo, key), Pack5551(a.hi, b.hi, c.hi, key));
}

/// The levels as bytes: in every 128 bits the even pixels, then the odd ones.
V Levels(Wide a) {
    return VIDSHOW_MM(packus_epi16)(VIDSHOW_MM(srai_epi16)(a.lo, 6),
                                    VIDSHOW_MM(srai_epi16)(a.hi, 6));
}
V Shuffled(Wide a, __m128i places) {
    return VIDSHOW_MM(shuffle_epi8)(Levels(a), Repeat(places));
}

/// Of 48 bytes a0 b0 c0 a1 ..., those of one channel fall on places that differ modulo 16. So one
/// shuffle a channel serves all three 16-byte parts, and blends by place modulo 3 finish them.
void Store888(uint8_t* out, Wide a, Wide b, Wide c) {
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
void StoreJoined(uint8_t* out, V ab0, V ab1, V cd0, V cd1) {
    StorePixels(out, VIDSHOW_MM(unpacklo_epi16)(ab0, cd0), VIDSHOW_MM(unpackhi_epi16)(ab0, cd0),
                VIDSHOW_MM(unpacklo_epi16)(ab1, cd1), VIDSHOW_MM(unpackhi_epi16)(ab1, cd1));
}
void Store8888(uint8_t* out, Wide a, Wide b, Wide c, V d) {
    const __m128i order = _mm_setr_epi8(0, 8, 1, 9, 2, 10, 3, 11, 4, 12, 5, 13, 6, 14, 7, 15);
    const V first = Shuffled(a, order), second = Shuffled(b, order), third = Shuffled(c, order);
    const V fourth = Or(And(d, 0xFF), ShiftLeft<8>(d));
    StoreJoined(out, VIDSHOW_MM(unpacklo_epi8)(first, second),
                VIDSHOW_MM(unpackhi_epi8)(first, second), VIDSHOW_MM(unpacklo_epi8)(third, fourth),
                VIDSHOW_MM(unpackhi_epi8)(third, fourth));
}

V SpreadLower(V b, V c) {
    return Or(And(ShiftLeft<2>(b), kTop6At10), ShiftRight<9>(c));
}
V SpreadUpper(V a) {
    return And(ShiftRight<3>(a), kTop6At5);
}
void StoreSpread(uint8_t* out, Wide a, Wide b, Wide c) {
    const Wide lower = {SpreadLower(b.lo, c.lo), SpreadLower(b.hi, c.hi)};
    const Wide upper = {SpreadUpper(a.lo), SpreadUpper(a.hi)};
    const V even0 = VIDSHOW_MM(unpacklo_epi16)(lower.lo, upper.lo);
    const V even1 = VIDSHOW_MM(unpackhi_epi16)(lower.lo, upper.lo);
    const V odd0 = VIDSHOW_MM(unpacklo_epi16)(lower.hi, upper.hi);
    const V odd1 = VIDSHOW_MM(unpackhi_epi16)(lower.hi, upper.hi);
    StorePixels(out, VIDSHOW_MM(unpacklo_epi32)(even0, odd0),
                VIDSHOW_MM(unpackhi_epi32)(even0, odd0), VIDSHOW_MM(unpacklo_epi32)(even1, odd1),
                VIDSHOW_MM(unpackhi_epi32)(even1, odd1));
}
