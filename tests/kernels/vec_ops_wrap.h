// Included behind a back end's source, where its operations are visible. Fills one table.

namespace {
namespace wrap {

Wide LevelsOf(const uint8_t* bytes) {
    return Channel(LoadLuma(bytes, SetBytes(64)), Double(Offset(0)));
}

void Levels(const uint8_t* luma, int gain, const uint8_t* chroma, int offset, int plus, int minus,
            uint8_t* out) {
    const B x = LoadChroma(chroma);
    V term = Offset(static_cast<int16_t>(offset));
    term = MinusTimes(term, x, SetBytes(static_cast<uint8_t>(minus)));
    term = AddTerm(term, x, SetBytes(static_cast<uint8_t>(plus)));
    const Wide level = Channel(LoadLuma(luma, SetBytes(static_cast<uint8_t>(gain))), Double(term));
    // All four bytes of a pixel, but the fourth is a constant: StoreSpread has the level's top
    // bits.
    Store8888(out, level, level, level, Set(0));
}

void Pairs(const uint8_t* pairs, bool second, uint8_t* out) {
    alignas(64) static const uint8_t zeros[kStep] = {};
    B a, b;
    LoadPairs(pairs, a, b);
    const V term = AddTerm(Offset(0), second ? b : a, SetBytes(64));
    const Wide level = Channel(LoadLuma(zeros, SetBytes(0)), Double(term));
    Store8888(out, level, level, level, Set(0));
}

void Store(vec_ops::Layout layout, const uint8_t* a, const uint8_t* b, const uint8_t* c, int extra,
           uint8_t* out) {
    const Wide x = LevelsOf(a), y = LevelsOf(b), z = LevelsOf(c);
    const V more = Set(static_cast<uint16_t>(extra));
    if (layout == vec_ops::k565) Store565(out, x, y, z);
    if (layout == vec_ops::k5551) Store5551(out, x, y, z, more);
    if (layout == vec_ops::k888) Store888(out, x, y, z);
    if (layout == vec_ops::k8888) Store8888(out, x, y, z, more);
    if (layout == vec_ops::kSpread) StoreSpread(out, x, y, z);
}

V Of(V words, vec_ops::Field field, B times, B plus, B minus) {
    const B x = field == vec_ops::kLow8   ? Low8(words)
                : field == vec_ops::kMid8 ? Mid8(words)
                                          : High8(words);
    return PlusTimes(MinusTimes(Times(x, times), x, minus), x, plus);
}

void Field(const uint8_t* words, vec_ops::Field field, int times, int plus, int minus,
           uint8_t* out) {
    const Wide w = LoadWords(words);
    const B t = SetBytes(static_cast<uint8_t>(times)), p = SetBytes(static_cast<uint8_t>(plus));
    const B m = SetBytes(static_cast<uint8_t>(minus));
    StoreBytes(out, Wide{Of(w.lo, field, t, p, m), Of(w.hi, field, t, p, m)}, Set(0));
}

void Narrow(const uint8_t* words, int offset, uint8_t* out) {
    StoreBytes(out, LoadWords(words), Set(static_cast<uint16_t>(offset)));
}
void NarrowEven(const uint8_t* words, int offset, uint8_t* out) {
    StoreHalf(out, EvenWords(LoadWords(words)), Set(static_cast<uint16_t>(offset)));
}
void Luma(const uint8_t* quads, int a, int b, int c, uint8_t* out) {
    StoreBytes(out, LumaSums(LoadQuads(quads), LumaWeights(a, b, c)), Set(0));
}
void Chroma(const uint8_t* quads, int a, int b, int c, uint8_t* out) {
    StoreHalf(out, EvenSums(LoadQuads(quads), ChromaWeights(a, b, c)), Set(0));
}

constexpr vec_ops::Ops kOps = {kStep,      Levels, Pairs,  Store,     Field,      Narrow,
                               NarrowEven, Luma,   Chroma, BlendQuad, AverageQuad};

}  // namespace wrap
}  // namespace
