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

void LumaOfWords(const uint8_t* words, int a, int b, int c, int offset, uint8_t* out) {
    StoreLuma(out, LumaSums(LoadWords(words), LumaWords(a, b, c)),
              Set(static_cast<uint16_t>(offset)));
}
void ChromaOfWords(const uint8_t* words, const int v[3], const int w[3], int offset, uint8_t* first,
                   uint8_t* second) {
    const Words p = LoadWords(words);
    StoreChroma(first, second, EvenSums(p, ChromaWords(v[0], v[1], v[2])),
                EvenSums(p, ChromaWords(w[0], w[1], w[2])), Set(static_cast<uint16_t>(offset)));
}
void LumaOfQuads(const uint8_t* quads, int a, int b, int c, int offset, uint8_t* out) {
    StoreLuma(out, LumaSums(LoadQuads(quads), LumaQuads(a, b, c)),
              Set(static_cast<uint16_t>(offset)));
}
void ChromaOfQuads(const uint8_t* quads, const int v[3], const int w[3], int offset, uint8_t* first,
                   uint8_t* second) {
    const Quads p = LoadQuads(quads);
    StoreChroma(first, second, EvenSums(p, ChromaQuads(v[0], v[1], v[2])),
                EvenSums(p, ChromaQuads(w[0], w[1], w[2])), Set(static_cast<uint16_t>(offset)));
}

constexpr vec_ops::Ops kOps = {kStep,         Levels,      Pairs,         Store,     LumaOfWords,
                               ChromaOfWords, LumaOfQuads, ChromaOfQuads, BlendQuad, AverageQuad};

}  // namespace wrap
}  // namespace
