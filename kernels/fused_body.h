// The inner loops of the fused kernels, written once. No #pragma once, no includes: every back end
// includes this file inside its own unnamed namespace, behind its operations.
//
// Vocabulary that a back end defines:
//
//   kPixels                  pixels a step
//   W                        kPixels words of 16 bits
//   LoadWords(p), StoreWords(p, v), SetWords(x)
//   AddSat(a, b), SubSat(a, b), Min(a, b)    unsigned
//   AndW, OrW, ShlW<n>, ShrW<n>              shifts of words
//   LumaTerms(p, m, o)       (sample x m + o) >> kLumaShift for kPixels samples, cut to 0..65535;
//                            m and o are D
//   Halved(p)                D: kPixels / 2 samples
//   OnLine(s, m, o)          (s m + o) / 2^kChromaShift, signed and truncated towards zero
//   StorePairs(p, low, high) kPixels words of 32 bits from their halves
//   LevelsTo565(r, g, b)     pixels of levels in 1/128, 32768 and more being cut to 32767
//   StoreQuads(p, b, g, r, a)           kPixels times four bytes: three of such levels, and a,
//                            which is below 256
//   Terms, MakeTerms(r, g, b)                a chroma term of each pixel from signed ones for
//                            two pixels, each term a W to add and one to subtract, one of which is
//                            0, cut to 65535
//
//   WidenBytes(p)            kPixels bytes as words
//   AddW(a, b), MulW(a, b)
//
//   D                        kPixels / 2 words of 32 bits
//   Load(p), Set(x), Add, Shl<n>, Shr<n>, ShrSigned<n>
//   PickColumns(p, t, i, q)  kPixels bytes q from group of columns i of the taps t on: pairs of the
//                            words p, weighed, added and shifted down by 6 bits
//   PickGroup(p, n, q)       eight bytes q, those of the sixteen bytes p that the eight n say
//
//   NarrowWords(p, v)        kPixels words as bytes, all being below 256
//   kBytes                   bytes a step of BlendPlanes
//   ByteWeights, WeightsOf(w)           of the upper and the lower row, 32 - w and w
//   BlendStep(a, b, w, p)    kBytes blended bytes, truncated
//   Step(t, i)               taps of kPixels columns from group i on
//   JoinedStep(t, i)         the same of joined groups
//   Weigh(p)                 a step's pairs of the bytes p, weighed and added: a W

uint8_t* AsBytes(uint16_t* words) {
    return reinterpret_cast<uint8_t*>(words);
}

/// What a step over two rows starts from, by look-ups in whatever the tables hold.
struct FromTerms {
    LookedUp from;

    Terms Chroma(int32_t x) const {
        const D b = Load(from.blue + x / 2), r = Load(from.red + x / 2);
        return MakeTerms(ShrSigned<15>(r), Green(Add(b, r)), ShrSigned<15>(b));
    }
    W Upper(int32_t x) const { return LoadWords(from.upper + x); }
    W Lower(int32_t x) const { return LoadWords(from.lower + x); }

    /// Twice the sum of the low halves, wrapped to 16 bits.
    static D Green(D sum) { return ShrSigned<15>(Shl<16>(sum)); }
};

struct LaneLine {
    D slope, offset;

    explicit LaneLine(const Line& line)
        : slope(Set(static_cast<uint32_t>(line.slope))),
          offset(Set(static_cast<uint32_t>(line.offset))) {}
    D At(D samples) const { return OnLine(samples, slope, offset); }
};

/// The same by arithmetic, where the tables are lines. The cut of red and blue needs no step of its
/// own: beyond it, nothing that luma can be brings a level back into its range.
struct FromSamples {
    RowPair from;
    LaneLine luma, blue, cbToGreen, red, crToGreen;

    FromSamples(const RowPair& rows, const TableLines& lines)
        : from(rows),
          luma(lines.luma),
          blue(lines.blue),
          cbToGreen(lines.cbToGreen),
          red(lines.red),
          crToGreen(lines.crToGreen) {}

    Terms Chroma(int32_t x) const {
        const D cb = Halved(from.cb + x / 2), cr = Halved(from.cr + x / 2);
        const D cbGreen = cbToGreen.At(cb), crGreen = crToGreen.At(cr);
        return MakeTerms(Doubled(red.At(cr), crGreen), FromTerms::Green(Add(cbGreen, crGreen)),
                         Doubled(blue.At(cb), cbGreen));
    }
    W Upper(int32_t x) const { return LumaTerms(from.upper + x, luma.slope, luma.offset); }
    W Lower(int32_t x) const { return LumaTerms(from.lower + x, luma.slope, luma.offset); }

    /// A high half with the sign of the low one behind it, as the shifted entry has it.
    static D Doubled(D high, D low) { return Add(Add(high, high), Shr<31>(low)); }
};

// A level in 1/128: the luma term and a chroma term. It is cut below, to 0; where it reaches 32768,
// all that matters is that it does, and so the saturation on the way does not.
W Level(W luma, const Term& term) {
    return SubSat(AddSat(luma, term.up), term.down);
}

// Cut to what the clamp of every channel lets through.
W CutLevel(W level) {
    return Min(level, SetWords(0x7FFF));
}

struct PackRgb565 {
    static constexpr int32_t kBytes = 2;

    explicit PackRgb565(uint32_t) {}
    void operator()(uint8_t* out, W r, W g, W b) const { StoreWords(out, LevelsTo565(r, g, b)); }
};

struct PackArgb32 {
    static constexpr int32_t kBytes = 4;
    W alpha;

    explicit PackArgb32(uint32_t a) : alpha(SetWords(static_cast<int>(a & 0xFF))) {}
    void operator()(uint8_t* out, W r, W g, W b) const { StoreQuads(out, b, g, r, alpha); }
};

struct PackSpread {
    static constexpr int32_t kBytes = 4;

    explicit PackSpread(uint32_t) {}
    void operator()(uint8_t* out, W red, W green, W blue) const {
        const W r = CutLevel(red), g = CutLevel(green), b = CutLevel(blue);
        const W low = OrW(AndW(ShlW<1>(g), SetWords(0xFC00)), ShrW<10>(b));
        StorePairs(out, low, AndW(ShrW<4>(r), SetWords(0x07E0)));
    }
};

struct PackPlanes {
    static constexpr int32_t kBytes = 1;

    explicit PackPlanes(uint32_t) {}
    void operator()(uint8_t* out, W r, W g, W b) const {
        NarrowWords(out, ShrW<9>(CutLevel(r)));
        NarrowWords(out + kPlaneBytes, ShrW<9>(CutLevel(g)));
        NarrowWords(out + 2 * kPlaneBytes, ShrW<10>(CutLevel(b)));
    }
};

template <class Pack, class From>
__attribute__((always_inline)) inline void PackRows(const From& from, int32_t pixels,
                                                    uint8_t* upper, uint8_t* lower,
                                                    const Pack& pack) {
    for (int32_t x = 0; x < pixels; x += kPixels) {
        const Terms t = from.Chroma(x);
        const W top = from.Upper(x);
        pack(upper, Level(top, t.red), Level(top, t.green), Level(top, t.blue));
        const W bottom = from.Lower(x);
        pack(lower, Level(bottom, t.red), Level(bottom, t.green), Level(bottom, t.blue));
        upper += kPixels * Pack::kBytes;
        lower += kPixels * Pack::kBytes;
    }
}

template <class Pack>
void PackTerms(const LookedUp& from, int32_t pixels, uint8_t* upper, uint8_t* lower,
               uint32_t alpha) {
    PackRows(FromTerms{from}, pixels, upper, lower, Pack(alpha));
}
template <class Pack>
void PackSamples(const RowPair& rows, const TableLines& lines, int32_t pixels, uint8_t* upper,
                 uint8_t* lower, uint32_t alpha) {
    PackRows(FromSamples(rows, lines), pixels, upper, lower, Pack(alpha));
}
template <class Pack>
constexpr FusedBackend::Pack Packed() {
    return {PackTerms<Pack>, PackSamples<Pack>};
}

// range: at most 510
void BlendDown(const uint8_t* upper, const uint8_t* lower, int32_t weight, int32_t count,
               uint16_t* columns) {
    const W below = SetWords(weight), above = SetWords(32 - weight);
    for (int32_t x = 0; x < count; x += kPixels) {
        const W sum = AddW(MulW(WidenBytes(upper + x), above), MulW(WidenBytes(lower + x), below));
        StoreWords(AsBytes(columns + x), ShrW<4>(sum));
    }
}

void PickAcross(const uint16_t* columns, const WordTaps& taps, int32_t count, uint8_t* samples) {
    constexpr size_t kGroups = kPixels / WordTaps::kGroup;
    const uint8_t* const end = samples + count;
    for (size_t group = 0; samples < end; samples += kPixels, group += kGroups)
        PickColumns(columns, taps, group, samples);
}

void PickNearest(const uint8_t* row, const NearestPicks& picks, size_t groups, uint8_t* samples) {
    for (size_t group = 0; group < groups; ++group, samples += NearestPicks::kGroup)
        PickGroup(row + picks.first[group], picks.order[group], samples);
}

void BlendPlanes(const uint8_t* upper, const uint8_t* lower, int32_t weight, int32_t pixels,
                 uint8_t* out) {
    const ByteWeights weights = WeightsOf(weight);
    for (int32_t plane = 0; plane < kPlanes * kPlaneBytes; plane += kPlaneBytes) {
        for (int32_t x = plane; x < plane + pixels; x += kBytes)
            BlendStep(upper + x, lower + x, weights, out + x);
    }
}

// Sums of channels whose weights add to 32 become pixels: red and green stand at 11 bits, blue at
// 10.

struct SumsToRgb565 {
    static constexpr int32_t kBytes = 2;

    explicit SumsToRgb565(uint32_t) {}
    void operator()(uint8_t* out, W r, W g, W b) const {
        const W red = AndW(ShlW<5>(r), SetWords(0xF800)), green = AndW(g, SetWords(0x07E0));
        StoreWords(out, OrW(OrW(red, green), ShrW<5>(b)));
    }
};

struct SumsToArgb32 {
    static constexpr int32_t kBytes = 4;
    W alpha;

    explicit SumsToArgb32(uint32_t a) : alpha(SetWords(static_cast<int>((a & 0xFF) << 8))) {}
    void operator()(uint8_t* out, W r, W g, W b) const {
        const W green = AndW(ShlW<5>(g), SetWords(0xFF00));
        StorePairs(out, OrW(green, ShrW<2>(b)), OrW(alpha, ShrW<3>(r)));
    }
};

template <class Pack, class TapStep>
void EnlargePlanes(const uint8_t* line, const ByteTaps& taps, int32_t x, int32_t pixels,
                   uint8_t* out, uint32_t alpha) {
    constexpr size_t kGroups = kPixels / ByteTaps::kGroup;
    const Pack pack(alpha);
    size_t group = static_cast<size_t>(x / ByteTaps::kGroup);
    const uint8_t* const end = out + pixels * Pack::kBytes;
    for (; out < end; out += kPixels * Pack::kBytes, group += kGroups) {
        const TapStep step(taps, group);
        pack(out, step.Weigh(line), step.Weigh(line + kPlaneBytes),
             step.Weigh(line + 2 * kPlaneBytes));
    }
}

constexpr FusedBackend MakeBackend() {
    return {Packed<PackRgb565>(),
            Packed<PackArgb32>(),
            Packed<PackSpread>(),
            Packed<PackPlanes>(),
            BlendDown,
            PickAcross,
            PickNearest,
            BlendPlanes,
            {EnlargePlanes<SumsToRgb565, Step>, EnlargePlanes<SumsToRgb565, JoinedStep>},
            {EnlargePlanes<SumsToArgb32, Step>, EnlargePlanes<SumsToArgb32, JoinedStep>}};
}
