// Included behind a back end's source, where its operations are visible. Fills one table.

namespace {
namespace wrap {

template <class Form>
Wide LevelsOf(const uint8_t* bytes, Form form) {
    return Channel(LoadLuma(bytes, SetBytes(64)), Double(Offset(0, form)), form);
}

template <class Form>
Wide ChannelOf(const vec_ops::Terms& t, const uint8_t* luma, const uint8_t* chroma, Form form) {
    const B x = LoadChroma(chroma);
    V term = Offset(static_cast<int16_t>(t.offset), form);
    term = MinusTimes(term, x, SetBytes(static_cast<uint8_t>(t.minus)));
    term = AddTerm(term, x, SetBytes(static_cast<uint8_t>(t.plus)), form);
    return Channel(LoadLuma(luma, SetBytes(static_cast<uint8_t>(t.gain))), Double(term), form);
}

void Levels(const vec_ops::Terms& t, const uint8_t* luma, const uint8_t* chroma, uint8_t* levels,
            uint8_t* words) {
    const Wide level = ChannelOf(t, luma, chroma, vec::ForBytes());
    Store8888(levels, level, level, level, Set(0));
    const Wide fields = ChannelOf(t, luma, chroma, vec::ForWords());
    Store565(words, fields, fields, fields);
}

void Pairs(const uint8_t* pairs, bool second, uint8_t* out) {
    alignas(64) static const uint8_t zeros[kStep] = {};
    constexpr vec::ForBytes form{};
    B a, b;
    LoadPairs(pairs, a, b);
    const V term = AddTerm(Offset(0, form), second ? b : a, SetBytes(64), form);
    const Wide level = Channel(LoadLuma(zeros, SetBytes(0)), Double(term), form);
    Store8888(out, level, level, level, Set(0));
}

void Store(vec_ops::Layout layout, const uint8_t* a, const uint8_t* b, const uint8_t* c, int extra,
           uint8_t* out) {
    const V more = Set(static_cast<uint16_t>(extra));
    if (layout == vec_ops::k888 || layout == vec_ops::k8888) {
        constexpr vec::ForBytes form{};
        const Wide x = LevelsOf(a, form), y = LevelsOf(b, form), z = LevelsOf(c, form);
        if (layout == vec_ops::k888) Store888(out, x, y, z);
        if (layout == vec_ops::k8888) Store8888(out, x, y, z, more);
    } else {
        constexpr vec::ForWords form{};
        const Wide x = LevelsOf(a, form), y = LevelsOf(b, form), z = LevelsOf(c, form);
        if (layout == vec_ops::k565) Store565(out, x, y, z);
        if (layout == vec_ops::k5551) Store5551(out, x, y, z, more);
        if (layout == vec_ops::kSpread) StoreSpread(out, x, y, z);
    }
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
