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
//   LumaTerms(p, m, o)       (sample x m + o) >> kLineShift for kPixels samples, cut to 0..65535;
//                            m and o are D
//   StorePairs(p, low, high) kPixels words of 32 bits from their halves
//   Terms, LoadTerms(blue, red)              a chroma term of each pixel from the entries of
//                            kPixels / 2 sample pairs, each term a W to add and one to subtract,
//                            one of which is 0
//
//   WidenBytes(p)            kPixels bytes as words
//   AddW(a, b), MulW(a, b)
//
//   kLanes                   lanes a step of the resamplers
//   D                        kLanes words of 32 bits
//   Load(p), Store(p, v), Set(x)
//   Add, Sub, Mul, And, Or, Shl<n>, Shr<n>
//   Pick(p, i)               p[i] for every lane, i from 0 to kLanes - 1; reads p[0 .. kLanes - 1]
//   WeighPairs(p, i, t)      for each lane, from quad of columns i of the picks t on: its pair of
//                            words, weighed and added, less than 65536
//   StoreBytes(p, v)         kLanes bytes, all lanes being below 256
//   StoreLow(p, v)           kLanes words of 16 bits, all lanes being below 65536

uint8_t* AsBytes(uint16_t* words) {
    return reinterpret_cast<uint8_t*>(words);
}
void Luma(const uint8_t* samples, int32_t count, const LumaLine& line, uint16_t* terms) {
    const D slope = Set(static_cast<uint32_t>(line.slope));
    const D offset = Set(static_cast<uint32_t>(line.offset));
    for (int32_t x = 0; x < count; x += kPixels)
        StoreWords(AsBytes(terms + x), LumaTerms(samples + x, slope, offset));
}

// A level in 1/128: the luma term and a chroma term, cut to 0..32767, which is what the clamp of
// every channel lets through. The saturation at 65535 on the way lies above that.
W Level(W luma, const Term& term) {
    return Min(SubSat(AddSat(luma, term.up), term.down), SetWords(0x7FFF));
}

struct PackRgb565 {
    static constexpr int32_t kBytes = 2;

    explicit PackRgb565(uint32_t) {}
    void operator()(uint8_t* out, W r, W g, W b) const {
        const W red = AndW(ShlW<1>(r), SetWords(0xF800));
        const W green = AndW(ShrW<4>(g), SetWords(0x07E0));
        StoreWords(out, OrW(OrW(red, green), ShrW<10>(b)));
    }
};

struct PackArgb32 {
    static constexpr int32_t kBytes = 4;
    W alpha;

    explicit PackArgb32(uint32_t a) : alpha(SetWords(static_cast<int>((a & 0xFF) << 8))) {}
    void operator()(uint8_t* out, W r, W g, W b) const {
        const W green = AndW(ShlW<1>(g), SetWords(0xFF00));
        StorePairs(out, OrW(green, ShrW<7>(b)), OrW(alpha, ShrW<7>(r)));
    }
};

struct PackSpread {
    static constexpr int32_t kBytes = 4;

    explicit PackSpread(uint32_t) {}
    void operator()(uint8_t* out, W r, W g, W b) const {
        const W green = AndW(ShlW<1>(g), SetWords(0xFC00));
        StorePairs(out, OrW(green, ShrW<10>(b)), AndW(ShrW<4>(r), SetWords(0x07E0)));
    }
};

template <class Pack>
void PackRows(const LookedUp& from, int32_t pixels, uint8_t* upper, uint8_t* lower,
              uint32_t alpha) {
    const Pack pack(alpha);
    for (int32_t x = 0; x < pixels; x += kPixels) {
        const Terms t = LoadTerms(from.blue + x / 2, from.red + x / 2);
        const W top = LoadWords(from.upper + x);
        pack(upper, Level(top, t.red), Level(top, t.green), Level(top, t.blue));
        const W bottom = LoadWords(from.lower + x);
        pack(lower, Level(bottom, t.red), Level(bottom, t.green), Level(bottom, t.blue));
        upper += kPixels * Pack::kBytes;
        lower += kPixels * Pack::kBytes;
    }
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

void PickAcross(const uint16_t* columns, const ColumnPicks& picks, int32_t count,
                uint8_t* samples) {
    constexpr int32_t kColumns = static_cast<int32_t>(kLanes);
    for (int32_t x = 0; x < count; x += kColumns)
        StoreBytes(samples + x, Shr<6>(WeighPairs(columns, x / ColumnPicks::kAtOnce, picks)));
}

// Sums of spread pixels whose weights add to 32 become pixels.

struct SumToRgb565 {
    static constexpr int32_t kBytes = 2;

    explicit SumToRgb565(uint32_t) {}
    void operator()(uint8_t* out, D sum) const {
        const D red = And(Shr<16>(sum), Set(0xF800)), green = And(Shr<10>(sum), Set(0x07E0));
        StoreLow(out, Or(Or(red, green), And(Shr<5>(sum), Set(0x001F))));
    }
};

struct SumToArgb32 {
    static constexpr int32_t kBytes = 4;
    D alpha;

    explicit SumToArgb32(uint32_t a) : alpha(Set(a << 24)) {}
    void operator()(uint8_t* out, D sum) const {
        const D red = And(Shr<8>(sum), Set(0xFF0000)), green = And(Shr<5>(sum), Set(0x00FF00));
        Store(out, Or(Or(alpha, red), Or(green, And(Shr<2>(sum), Set(0x0000FF)))));
    }
};

/// a (32 - weight) + b weight. Fields borrow from each other on the way and have all back at the
/// end.
D WeighedSum(D a, D b, D weight) {
    return Add(Shl<5>(a), Mul(Sub(b, a), weight));
}
D SumAt(const uint32_t* line, D index, D weight) {
    return WeighedSum(Pick(line, index), Pick(line + 1, index), weight);
}

constexpr int32_t kStep = static_cast<int32_t>(kLanes);

template <class Pack>
int32_t Resample(const uint32_t* line, void* to, int32_t step, int32_t width, uint32_t alpha) {
    const int32_t end = static_cast<int32_t>(((width - 1) * step) >> 16) + 1;  // last entry read
    uint32_t lanes[kLanes];
    for (size_t i = 0; i < kLanes; ++i)
        lanes[i] = static_cast<uint32_t>(i) * static_cast<uint32_t>(step);
    const D offsets = Load(lanes);
    const Pack pack(alpha);
    uint8_t* out = static_cast<uint8_t*>(to);
    int32_t x = 0;
    for (; x + kStep <= width; x += kStep, out += kStep * Pack::kBytes) {
        const int32_t position = x * step, first = position >> 16;
        if (first + kStep > end) break;
        const D at = Add(offsets, Set(static_cast<uint32_t>(position & 0xFFFF)));
        pack(out, SumAt(line + first, Shr<16>(at), And(Shr<11>(at), Set(31))));
    }
    return x;
}

// At a fixed ratio the taps repeat with every pair of source pixels. A turn of the loop makes what
// kLanes pairs become, kOut steps of kLanes pixels; first[i] is the source pixel that step i begins
// with, index and weight are its taps.
template <size_t kOut>
struct Taps {
    size_t first[kOut];
    uint32_t index[kOut][kLanes];
    uint32_t weight[kOut][kLanes];
};

// For each output pixel of a pair: the source pixel, and the weight of the one behind it.
struct Tap {
    uint32_t index;
    uint32_t weight;
};
constexpr Tap kTwoToThree[3] = {{0, 0}, {0, 21}, {1, 11}};
constexpr Tap kTwoToFive[5] = {{0, 0}, {0, 12}, {0, 25}, {1, 6}, {1, 13}};

template <size_t kOut>
constexpr Taps<kOut> MakeTaps(const Tap (&pair)[kOut]) {
    Taps<kOut> taps{};
    for (size_t i = 0; i < kOut; ++i) {
        for (size_t lane = 0; lane < kLanes; ++lane) {
            const size_t x = i * kLanes + lane;
            const size_t index = x / kOut * 2 + pair[x % kOut].index;
            if (lane == 0) taps.first[i] = index;
            taps.index[i][lane] = static_cast<uint32_t>(index - taps.first[i]);
            taps.weight[i][lane] = pair[x % kOut].weight;
        }
    }
    return taps;
}

template <size_t kOut>
struct FixedTaps;
template <>
struct FixedTaps<3> {
    static constexpr Taps<3> kTaps = MakeTaps(kTwoToThree);
};
template <>
struct FixedTaps<5> {
    static constexpr Taps<5> kTaps = MakeTaps(kTwoToFive);
};

template <class Pack, size_t kOut>
int32_t Stretch(const uint32_t* line, void* to, int32_t srcWidth, uint32_t alpha) {
    constexpr const Taps<kOut>& kTaps = FixedTaps<kOut>::kTaps;
    constexpr int32_t kReach = static_cast<int32_t>(kTaps.first[kOut - 1] + kLanes);
    const Pack pack(alpha);
    uint8_t* out = static_cast<uint8_t*>(to);
    int32_t x = 0;
    for (; x + kReach < srcWidth; x += 2 * kStep) {
        for (size_t i = 0; i < kOut; ++i, out += kStep * Pack::kBytes) {
            pack(out,
                 SumAt(line + x + kTaps.first[i], Load(kTaps.index[i]), Load(kTaps.weight[i])));
        }
    }
    return x;
}

constexpr FusedBackend MakeBackend() {
    return {Luma,
            PackRows<PackRgb565>,
            PackRows<PackArgb32>,
            PackRows<PackSpread>,
            BlendDown,
            PickAcross,
            Resample<SumToRgb565>,
            Resample<SumToArgb32>,
            Stretch<SumToRgb565, 3>,
            Stretch<SumToArgb32, 3>,
            Stretch<SumToRgb565, 5>,
            Stretch<SumToArgb32, 5>};
}
