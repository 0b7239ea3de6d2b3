// The inner loops of the fused kernels, written once. No #pragma once, no includes: every back end
// includes this file inside its own unnamed namespace, behind its operations.
//
// Vocabulary that a back end defines:
//
//   kPixels                  words of 16 bits in a register; a conversion's step is twice as many
//   W                        a register of words
//   B                        one of 2 kPixels bytes, in whatever order packing leaves them
//   StoreWords(p, v), SetWords(x)
//   AddSat(a, b), SubSat(a, b)               unsigned
//   AddSigned(a, b)                          signed and saturating
//   AddW(a, b), SubW(a, b), MulW(a, b)       the low words
//   SetFraction(x), TimesFraction(v, f)      (v x) >> 15, both being below 32768
//   AndW, OrW, ShlW<n>, ShrW<n>, ShrSignedW<n>
//   WidenBytes(p)            kPixels bytes as words
//   EvenOdd                  two W, `even` and `odd`
//   WidenPairs(p)            EvenOdd of 2 kPixels bytes
//   LoadPairs(p)             EvenOdd of 2 kPixels words
//   Channel<n>(levels)       B: n bits of EvenOdd levels in 1/64, signed, cut to their range
//   SetBytes(x), ShlB<n>, ShrB<n>
//   StoreBytes(p, b)
//   StoreRgb565(p, r, g, b), StoreRgb5551(p, r, g, b)   pixels of channels of 8 bits
//   StoreThrees(p, b, g, r)  2 kPixels times three bytes
//   StoreFours(p, b, g, r, a)           2 kPixels times four bytes
//   StorePairs(p, low, high) kPixels words of 32 bits from their halves
//   Packed(first, second)    B of 2 kPixels words in order, which are bytes
//
//   PickColumns(p, t, i, q)  kPixels bytes q from group of columns i of the taps t on: pairs of the
//                            words p, weighed, added and shifted down by 6 bits
//   PickGroup(p, n, q)       eight bytes q, those of the sixteen bytes p that the eight n say
//
//   kBytes                   bytes a step of BlendPlanes
//   ByteWeights, WeightsOf(w)           of the upper and the lower row, 32 - w and w
//   BlendStep(a, b, w, p)    kBytes blended bytes, truncated
//   Step(t, i)               taps of kPixels columns from group i on
//   JoinedStep(t, i)         the same of joined groups
//   Weigh(p)                 a step's pairs of the bytes p, weighed and added: a W

// What passes registers by the dozen has to be inlined: a call would pass them through memory.
#define VIDSHOW_INLINE __attribute__((always_inline)) inline

uint8_t* AsBytes(uint16_t* words) {
    return reinterpret_cast<uint8_t*>(words);
}

/// What chroma samples add to the luma of two pixels each, an even one and the odd one behind it: a
/// term in 1/64, and a bit of 1/128. Entries of the tables hold it so: the bit of red and blue is
/// the sign of their part of green.
struct Terms {
    W red, redBit, green, blue, blueBit;

    VIDSHOW_INLINE Terms(W toRed, W crToGreen, W toBlue, W cbToGreen)
        : red(toRed),
          redBit(ShrW<15>(crToGreen)),
          green(AddW(cbToGreen, crToGreen)),
          blue(toBlue),
          blueBit(ShrW<15>(cbToGreen)) {}
};

/// What a step over two rows starts from, by look-ups in whatever the tables hold.
struct FromTerms {
    LookedUp from;

    VIDSHOW_INLINE Terms Chroma(int32_t x) const {
        const EvenOdd cb = Halves(from.blue + x / 2), cr = Halves(from.red + x / 2);
        return {cr.odd, cr.even, cb.odd, cb.even};
    }
    VIDSHOW_INLINE EvenOdd Upper(int32_t x) const { return LoadPairs(from.upper + x); }
    VIDSHOW_INLINE EvenOdd Lower(int32_t x) const { return LoadPairs(from.lower + x); }

    /// Low and high halves of entries.
    static VIDSHOW_INLINE EvenOdd Halves(const uint32_t* entries) {
        return LoadPairs(reinterpret_cast<const uint16_t*>(entries));
    }
};

struct LaneLine {
    W whole, fraction, phase;

    explicit LaneLine(const Line& line)
        : whole(SetWords(line.whole)),
          fraction(SetFraction(line.fraction)),
          phase(SetWords(line.phase)) {}
    VIDSHOW_INLINE W Rise(W samples) const {
        return AddW(MulW(samples, whole), TimesFraction(AddW(samples, phase), fraction));
    }
};

struct LumaLine : LaneLine {
    W up, down;

    explicit LumaLine(const Line& line)
        : LaneLine(line), up(SetWords(Cut(line.offset))), down(SetWords(Cut(-line.offset))) {}
    VIDSHOW_INLINE W At(W samples) const { return SubSat(AddSat(Rise(samples), up), down); }
    VIDSHOW_INLINE EvenOdd At(const EvenOdd& samples) const {
        return {At(samples.even), At(samples.odd)};
    }

    static int Cut(int offset) { return offset < 0 ? 0 : offset > 0xFFFF ? 0xFFFF : offset; }
};

struct ChromaLine : LaneLine {
    W offset;

    explicit ChromaLine(const Line& line) : LaneLine(line), offset(SetWords(line.offset)) {}
    VIDSHOW_INLINE W At(W samples) const {
        const W term = AddW(Rise(samples), offset);
        return SubW(term, ShrSignedW<15>(term));
    }
};

/// The same by arithmetic, where the tables are lines.
struct FromSamples {
    RowPair from;
    LumaLine luma;
    ChromaLine blue, cbToGreen, red, crToGreen;

    FromSamples(const RowPair& rows, const TableLines& lines)
        : from(rows),
          luma(lines.luma),
          blue(lines.blue),
          cbToGreen(lines.cbToGreen),
          red(lines.red),
          crToGreen(lines.crToGreen) {}

    VIDSHOW_INLINE Terms Chroma(int32_t x) const {
        const W cb = WidenBytes(from.cb + x / 2), cr = WidenBytes(from.cr + x / 2);
        return {red.At(cr), crToGreen.At(cr), blue.At(cb), cbToGreen.At(cb)};
    }
    VIDSHOW_INLINE EvenOdd Upper(int32_t x) const { return luma.At(WidenPairs(from.upper + x)); }
    VIDSHOW_INLINE EvenOdd Lower(int32_t x) const { return luma.At(WidenPairs(from.lower + x)); }
};

/// Levels in 1/64. Where one saturates, it is beyond what any channel lets through: luma is not
/// negative, so that a level goes down to its term at the lowest, which is a word.
struct Levels {
    EvenOdd red, green, blue;

    VIDSHOW_INLINE Levels(const EvenOdd& luma, const Terms& t) {
        const EvenOdd half = {ShrW<1>(luma.even), ShrW<1>(luma.odd)};
        red = Sum(half, luma, t.red, t.redBit);
        green = {AddSigned(half.even, t.green), AddSigned(half.odd, t.green)};
        blue = Sum(half, luma, t.blue, t.blueBit);
    }

    /// Half of luma + 2 term + bit, rounded down.
    static VIDSHOW_INLINE EvenOdd Sum(const EvenOdd& half, const EvenOdd& luma, W term, W bit) {
        return {AddSigned(half.even, AddSigned(term, AndW(luma.even, bit))),
                AddSigned(half.odd, AddSigned(term, AndW(luma.odd, bit)))};
    }
};

struct PackRgb565 {
    static constexpr int32_t kBytes = 2;

    explicit PackRgb565(uint32_t) {}
    VIDSHOW_INLINE void operator()(uint8_t* out, const Levels& l) const {
        StoreRgb565(out, Channel<8>(l.red), Channel<8>(l.green), Channel<8>(l.blue));
    }
};

/// With bit 0 set: the colour key is for the caller to look for.
struct PackRgb5551 {
    static constexpr int32_t kBytes = 2;

    explicit PackRgb5551(uint32_t) {}
    VIDSHOW_INLINE void operator()(uint8_t* out, const Levels& l) const {
        StoreRgb5551(out, Channel<8>(l.red), Channel<8>(l.green), Channel<8>(l.blue));
    }
};

struct PackRgb888 {
    static constexpr int32_t kBytes = 3;

    explicit PackRgb888(uint32_t) {}
    VIDSHOW_INLINE void operator()(uint8_t* out, const Levels& l) const {
        StoreThrees(out, Channel<8>(l.blue), Channel<8>(l.green), Channel<8>(l.red));
    }
};

struct PackArgb32 {
    static constexpr int32_t kBytes = 4;
    B alpha;

    explicit PackArgb32(uint32_t a) : alpha(SetBytes(static_cast<int>(a & 0xFF))) {}
    VIDSHOW_INLINE void operator()(uint8_t* out, const Levels& l) const {
        StoreFours(out, Channel<8>(l.blue), Channel<8>(l.green), Channel<8>(l.red), alpha);
    }
};

/// Blue from bit 0 on, green from bit 10, red from bit 21.
struct PackSpread {
    static constexpr int32_t kBytes = 4;

    explicit PackSpread(uint32_t) {}
    VIDSHOW_INLINE void operator()(uint8_t* out, const Levels& l) const {
        const B red = Channel<6>(l.red);
        StoreFours(out, Channel<5>(l.blue), ShlB<2>(Channel<6>(l.green)), ShlB<5>(red),
                   ShrB<3>(red));
    }
};

struct PackPlanes {
    static constexpr int32_t kBytes = 1;

    explicit PackPlanes(uint32_t) {}
    VIDSHOW_INLINE void operator()(uint8_t* out, const Levels& l) const {
        StoreBytes(out, Channel<6>(l.red));
        StoreBytes(out + kPlaneBytes, Channel<6>(l.green));
        StoreBytes(out + 2 * kPlaneBytes, Channel<5>(l.blue));
    }
};

template <class Pack, class From>
VIDSHOW_INLINE void PackRows(const From& from, int32_t pixels, uint8_t* upper, uint8_t* lower,
                             const Pack& pack) {
    constexpr int32_t kStep = 2 * kPixels;
    for (int32_t x = 0; x < pixels; x += kStep) {
        const Terms terms = from.Chroma(x);
        pack(upper, Levels(from.Upper(x), terms));
        pack(lower, Levels(from.Lower(x), terms));
        upper += kStep * Pack::kBytes;
        lower += kStep * Pack::kBytes;
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
constexpr FusedBackend::Pack Packers() {
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
        for (int32_t x = plane; x < plane + pixels; x += 2 * kBytes) {
            BlendStep(upper + x, lower + x, weights, out + x);
            BlendStep(upper + x + kBytes, lower + x + kBytes, weights, out + x + kBytes);
        }
    }
}

// Sums of channels whose weights add to 32 become pixels: red and green stand at 11 bits, blue at
// 10.

struct Sums {
    W red, green, blue;
};

struct SumsToRgb565 {
    static constexpr int32_t kBytes = 2;

    explicit SumsToRgb565(uint32_t) {}
    VIDSHOW_INLINE void operator()(uint8_t* out, const Sums& first, const Sums& second) const {
        StoreWords(out, Words(first));
        StoreWords(out + sizeof(W), Words(second));
    }
    static VIDSHOW_INLINE W Words(const Sums& s) {
        const W red = AndW(ShlW<5>(s.red), SetWords(0xF800));
        return OrW(OrW(red, AndW(s.green, SetWords(0x07E0))), ShrW<5>(s.blue));
    }
};

struct SumsToRgb888 {
    static constexpr int32_t kBytes = 3;

    explicit SumsToRgb888(uint32_t) {}
    VIDSHOW_INLINE void operator()(uint8_t* out, const Sums& first, const Sums& second) const {
        StoreThrees(out, Packed(ShrW<2>(first.blue), ShrW<2>(second.blue)),
                    Packed(ShrW<3>(first.green), ShrW<3>(second.green)),
                    Packed(ShrW<3>(first.red), ShrW<3>(second.red)));
    }
};

struct SumsToArgb32 {
    static constexpr int32_t kBytes = 4;
    W alpha;

    explicit SumsToArgb32(uint32_t a) : alpha(SetWords(static_cast<int>((a & 0xFF) << 8))) {}
    VIDSHOW_INLINE void operator()(uint8_t* out, const Sums& first, const Sums& second) const {
        Store(out, first);
        Store(out + 2 * sizeof(W), second);
    }
    VIDSHOW_INLINE void Store(uint8_t* out, const Sums& s) const {
        const W green = AndW(ShlW<5>(s.green), SetWords(0xFF00));
        StorePairs(out, OrW(green, ShrW<2>(s.blue)), OrW(alpha, ShrW<3>(s.red)));
    }
};

template <class TapStep>
VIDSHOW_INLINE Sums WeighPlanes(const TapStep& step, const uint8_t* line) {
    return {step.Weigh(line), step.Weigh(line + kPlaneBytes), step.Weigh(line + 2 * kPlaneBytes)};
}

template <class Pack, class TapStep>
void EnlargePlanes(const uint8_t* line, const ByteTaps& taps, int32_t x, int32_t pixels,
                   uint8_t* out, uint32_t alpha) {
    constexpr size_t kGroups = kPixels / ByteTaps::kGroup;
    const Pack pack(alpha);
    size_t group = static_cast<size_t>(x / ByteTaps::kGroup);
    const uint8_t* const end = out + pixels * Pack::kBytes;
    for (; out < end; out += 2 * kPixels * Pack::kBytes, group += 2 * kGroups) {
        pack(out, WeighPlanes(TapStep(taps, group), line),
             WeighPlanes(TapStep(taps, group + kGroups), line));
    }
}
template <class Pack>
constexpr FusedBackend::Enlargers Enlarged() {
    return {{EnlargePlanes<Pack, Step>, EnlargePlanes<Pack, JoinedStep>}};
}

constexpr FusedBackend MakeBackend() {
    return {Packers<PackRgb565>(),
            Packers<PackRgb5551>(),
            Packers<PackRgb888>(),
            Packers<PackArgb32>(),
            Packers<PackSpread>(),
            Packers<PackPlanes>(),
            BlendDown,
            PickAcross,
            PickNearest,
            BlendPlanes,
            Enlarged<SumsToRgb565>(),
            Enlarged<SumsToRgb888>(),
            Enlarged<SumsToArgb32>()};
}
