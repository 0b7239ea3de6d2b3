// How SSE4.1 and AVX2 make pixels of channels. No #pragma once, no includes: included inside a back
// end's unnamed namespace, behind pixels.h, vec_ops.h and
//
//   StoreWords(out, even, odd)            words of even and of odd pixels

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
void Store888(uint8_t* out, Wide a, Wide b, Wide c) {
    StoreThrees(out, Levels(a), Levels(b), Levels(c));
}
void Store8888(uint8_t* out, Wide a, Wide b, Wide c, V d) {
    StoreFours(out, Levels(a), Levels(b), Levels(c), Or(And(d, 0xFF), ShiftLeft<8>(d)));
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
