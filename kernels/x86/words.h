// Words of 16 bits on x86, and the bytes that they come from and go to, as several families use
// them. No #pragma once, no includes: included inside a back end's unnamed namespace, behind
// bits128.h or its like. Interleaving and packing work within 128 bits, both ways alike. Inline,
// for not every family uses all of it.

inline V SetWords(int x) {
    return VIDSHOW_MM(set1_epi16)(static_cast<int16_t>(x));
}
inline V AddW(V a, V b) {
    return VIDSHOW_MM(add_epi16)(a, b);
}
inline V SubW(V a, V b) {
    return VIDSHOW_MM(sub_epi16)(a, b);
}
inline V MulW(V a, V b) {
    return VIDSHOW_MM(mullo_epi16)(a, b);
}
/// Unsigned and saturating.
/// @{
inline V AddSat(V a, V b) {
    return VIDSHOW_MM(adds_epu16)(a, b);
}
inline V SubSat(V a, V b) {
    return VIDSHOW_MM(subs_epu16)(a, b);
}
/// @}
template <int kBits>
V ShlW(V v) {
    return VIDSHOW_MM(slli_epi16)(v, kBits);
}
template <int kBits>
V ShrW(V v) {
    return VIDSHOW_MM(srli_epi16)(v, kBits);
}
template <int kBits>
V ShrSignedW(V v) {
    return VIDSHOW_MM(srai_epi16)(v, kBits);
}

inline V LowBytes(V a, V b) {
    return VIDSHOW_MM(unpacklo_epi8)(a, b);
}
inline V HighBytes(V a, V b) {
    return VIDSHOW_MM(unpackhi_epi8)(a, b);
}
/// Signed words cut to bytes.
inline V PackWords(V low, V high) {
    return VIDSHOW_MM(packus_epi16)(low, high);
}
/// Words of neighbouring products, added: of bytes and signed factors.
inline V WeighPairs(V bytes, V factors) {
    return VIDSHOW_MM(maddubs_epi16)(bytes, factors);
}
