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

/// One step; upper and lower row are the same.
template <class Weights>
void Planes(const uint8_t* pixels, const Weights& y, const Weights& cb, const Weights& cr,
            int offset, const vec_ops::Planes& out) {
    const V both = Set(static_cast<uint16_t>(offset * 0x0101));
    const ToYuvLanes<Weights> lanes = {y, cb, cr, both, both};
    StepsToPlanes({{pixels, pixels}, {out.upper, out.lower}, out.cb, out.cr}, 1, lanes);
}
void PlanesOfWords(const uint8_t* words, const vec_ops::Factors& f, int offset,
                   const vec_ops::Planes& out) {
    Planes(words, LumaWords(f.y[0], f.y[1], f.y[2]), ChromaWords(f.cb[0], f.cb[1], f.cb[2]),
           ChromaWords(f.cr[0], f.cr[1], f.cr[2]), offset, out);
}
void PlanesOfQuads(const uint8_t* quads, const vec_ops::Factors& f, int offset,
                   const vec_ops::Planes& out) {
    Planes(quads, LumaQuads(f.y[0], f.y[1], f.y[2]), ChromaQuads(f.cb[0], f.cb[1], f.cb[2]),
           ChromaQuads(f.cr[0], f.cr[1], f.cr[2]), offset, out);
}

constexpr vec_ops::Ops kOps = {kStep,         kQuadStep,     Levels,    Pairs,      Store,
                               PlanesOfWords, PlanesOfQuads, BlendQuad, AverageQuad};

}  // namespace wrap
}  // namespace
