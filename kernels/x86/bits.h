// Whole registers on x86, whatever their width. No #pragma once, no includes: bits128.h and
// its like include it behind V and VIDSHOW_MM_ALL. Inline, for not every back end uses all of it.

template <typename Item>
V Load(const Item* p) {
    return VIDSHOW_MM_ALL(loadu)(reinterpret_cast<const V*>(p));
}
inline void Store(uint8_t* p, V v) {
    VIDSHOW_MM_ALL(storeu)(reinterpret_cast<V*>(p), v);
}
inline V And(V a, V b) {
    return VIDSHOW_MM_ALL(and)(a, b);
}
inline V Or(V a, V b) {
    return VIDSHOW_MM_ALL(or)(a, b);
}
inline V Xor(V a, V b) {
    return VIDSHOW_MM_ALL(xor)(a, b);
}
