// The loops of the vector kernels, written once. No #pragma once, no includes: every back end
// includes this file inside its own unnamed namespace, behind its lane operations, so that each
// instruction set has a copy of its own and the linker never mixes them.
//
// Vocabulary that a back end defines:
//
//   V                        kLanes unsigned 16-bit lanes; their arithmetic wraps
//   B                        kLanes bytes (the factors of products), perhaps held wider
//   Wide { V lo, hi; }       kStep = 2 kLanes pixels, one lane each. The order of the lanes is the
//                            back end's own: what makes a Wide and what stores it agree on it.
//   Set(x), SetBytes(x)      x in every lane of a V, of a B
//   kAhead                   how many bytes ahead rows are fetched into the cache; 0: not at all
//   Times(a, b)              V: the products of two B
//   MinusTimes(v, a, b)      v - a b
//
//   LoadChroma(p)            B: kLanes bytes
//   LoadPairs(p, a, b)       kLanes pairs of bytes: the first ones to a, the second ones to b
//   LoadLuma(p, k)           Wide: kStep bytes times k
//   Offset(x, f)             a signed offset, at most 16383, to begin a chroma term with. Here and
//                            below f is ForWords or ForBytes: what the channel will be stored as
//   AddTerm(t, a, b, f)      t + a b, where the sum is a signed 16-bit number
//   (MinusTimes(t, a, b)     likewise)
//   Double(t)                Wide: every lane twice, side by side
//   Channel(y, t, f)         y + t, saturated to signed 16 bits, then clamped to 0..16383 (that is
//                            255 63/64 levels), by now or by its store; y below 32768, t a chroma
//                            term; kept in a form that only the stores know
//                            Stores of channels for words:
//   Store565(p, a, b, c)     16-bit pixels: a in bits 15-11, b in 10-5, c in 4-0
//   Store5551(p, a, b, c, k) 16-bit pixels: a in bits 15-11, b in 10-6, c in 5-1, bit 0 set; pixels
//                            that are then equal to k become 0
//   StoreSpread(p, a, b, c)  32-bit spread pixels: a in bits 26-21, b in 15-10, c in 4-0
//                            Stores of channels for bytes:
//   Store888(p, a, b, c)     bytes a, b, c
//   Store8888(p, a, b, c, d) bytes a, b, c and the low byte of d
//
//   WordWeights, QuadWeights factors for the channels of pixels of 16 and of 32 bits. Words: bits
//                            15-8; bits 10-3; bits 4-0 shifted up by 3. Quads: the first three
//                            bytes.
//   LumaWords, LumaQuads(a, b, c)      such factors for luma: none negative; b at most 254,
//                            a + c at most 127, all together at most 255
//   ChromaWords, ChromaQuads(a, b, c)  such factors for chroma: -127..128; those of one sign
//                            together at most 128
//                            Of the loads and stores that follow, each leaves its addresses behind
//                            what it read or wrote
//   LoadPixels(p, w)         kStep pixels, of the kind that such weights are for
//   LumaSums(pixels, w)      the weighted sums of these pixels, modulo 65536
//   EvenSums(pixels, w)      the same of pixels 0, 2, 4 ..., with chroma factors
//   StoreLuma(p, s, v)       LumaSums as bytes: each is read as a signed number x, and becomes
//                            (x + 128) >> 8, saturated to signed 8 bits, plus v (the same in
//                            every byte), modulo 256
//   StoreChroma(p, q, s, t, v)   EvenSums s to p, t to q, in the same way
//   kQuadStep                pixels of 32 bits a step. Other than kStep where the back end has its
//                            own StepsToPlanes for them
//
//   BlendQuad(u, l, o, w)    four spread pixels: (u (32 - w) + l w) >> 5, masked
//   AverageQuad(u, l, o)     four spread pixels: (u + l) >> 1, masked

using vec::ForBytes;
using vec::ForWords;

constexpr int kStep = 2 * kLanes;

template <class Form>
Wide Channel(Wide y, Wide t, Form form) {
    return {Channel(y.lo, t.lo, form), Channel(y.hi, t.hi, form)};
}

// ---- 4:2:0 to pixels ---------------------------------------------------------------------------

/// Where one step over two rows reads and writes.
struct PixelsAt {
    const uint8_t* luma[2];
    const uint8_t* cb;
    const uint8_t* cr;
    uint8_t* out[2];
};

struct PlanarChroma {
    static constexpr int kBytes = 1;
    static void Load(const PixelsAt& at, B& cb, B& cr) {
        cb = LoadChroma(at.cb);
        cr = LoadChroma(at.cr);
    }
};

struct PairedChroma {
    static constexpr int kBytes = 2;
    static void Load(const PixelsAt& at, B& cb, B& cr) { LoadPairs(at.cb, cb, cr); }
};

struct Rgb565 {
    using Form = ForWords;
    static constexpr int kBytes = 2;
    explicit Rgb565(uint32_t) {}
    void Put(uint8_t* out, Wide r, Wide g, Wide b) const { Store565(out, r, g, b); }
};

struct Rgb5551 {
    using Form = ForWords;
    static constexpr int kBytes = 2;
    V key;
    explicit Rgb5551(uint32_t k) : key(Set(static_cast<uint16_t>(k))) {}
    void Put(uint8_t* out, Wide r, Wide g, Wide b) const { Store5551(out, r, g, b, key); }
};

struct Rgb888 {
    using Form = ForBytes;
    static constexpr int kBytes = 3;
    explicit Rgb888(uint32_t) {}
    void Put(uint8_t* out, Wide r, Wide g, Wide b) const { Store888(out, b, g, r); }
};

struct Argb32 {
    using Form = ForBytes;
    static constexpr int kBytes = 4;
    V alpha;
    explicit Argb32(uint32_t a) : alpha(Set(static_cast<uint8_t>(a))) {}
    void Put(uint8_t* out, Wide r, Wide g, Wide b) const { Store8888(out, b, g, r, alpha); }
};

struct SpreadPixels {
    using Form = ForWords;
    static constexpr int kBytes = 4;
    explicit SpreadPixels(uint32_t) {}
    void Put(uint8_t* out, Wide r, Wide g, Wide b) const { StoreSpread(out, r, g, b); }
};

/// The same pixels with red and blue in each other's place.
template <class Pixels>
struct Exchanged : Pixels {
    using Pixels::Pixels;
    void Put(uint8_t* out, Wide r, Wide g, Wide b) const { Pixels::Put(out, b, g, r); }
};

template <class Form>
struct RgbLanes {
    B gain, crToRed, cbToGreen, crToGreen, cbToBlue;
    V red, green, blue;
    explicit RgbLanes(const ToRgbCoef& c)
        : gain(SetBytes(c.gain)),
          crToRed(SetBytes(c.crToRed)),
          cbToGreen(SetBytes(c.cbToGreen)),
          crToGreen(SetBytes(c.crToGreen)),
          cbToBlue(SetBytes(c.cbToBlue)),
          red(Offset(c.red, Form())),
          green(Offset(c.green, Form())),
          blue(Offset(c.blue, Form())) {}
};

/// kStep pixels of one row, from luma and what chroma adds to it.
template <class Pixels>
__attribute__((always_inline)) inline void PutRow(uint8_t* out, Wide y, Wide red, Wide green,
                                                  Wide blue, const Pixels& pixels) {
    constexpr typename Pixels::Form form{};
    pixels.Put(out, Channel(y, red, form), Channel(y, green, form), Channel(y, blue, form));
}

/// kStep pixels of two rows. What chroma adds is formed once, at half the width, for both rows.
/// Ranges in 1/64 level: red -15889..25500, green -17085..8676, blue -18497..30090 (the product in
/// it alone reaches 34425, no signed number); luma 0..18870, so blue plus luma may pass 32767.
template <class Chroma, class Pixels>
__attribute__((always_inline)) inline void StepToPixels(const PixelsAt& at,
                                                        const RgbLanes<typename Pixels::Form>& c,
                                                        const Pixels& pixels) {
    constexpr typename Pixels::Form form{};
    B cb, cr;
    Chroma::Load(at, cb, cr);
    const Wide red = Double(AddTerm(c.red, cr, c.crToRed, form));
    const Wide blue = Double(AddTerm(c.blue, cb, c.cbToBlue, form));
    const Wide green = Double(MinusTimes(MinusTimes(c.green, cr, c.crToGreen), cb, c.cbToGreen));
    // No loop: one that is left rolled would keep all of the above in memory.
    PutRow<Pixels>(at.out[0], LoadLuma(at.luma[0], c.gain), red, green, blue, pixels);
    PutRow<Pixels>(at.out[1], LoadLuma(at.luma[1], c.gain), red, green, blue, pixels);
}

/// Asks for what comes kAhead bytes on, in both rows; a step writes kBytes of either.
template <int kBytes>
__attribute__((always_inline)) inline void FetchAhead(const PixelsAt& at) {
    if constexpr (kAhead != 0) {
        for (int row = 0; row < 2; ++row) {
            __builtin_prefetch(at.luma[row] + kAhead);
            for (int i = 0; i < kBytes; i += 64)
                __builtin_prefetch(at.out[row] + kAhead + i, 1);
        }
    }
}

/// `steps` whole steps of `pairs` pairs of rows, from `at` on. The constants are made here: copied
/// from a caller's, they would stay in memory and be loaded again at every step.
template <class Chroma, class Pixels>
__attribute__((noinline)) void PairsToPixels(PixelsAt at, const ToPixelsJob& job, int32_t pairs,
                                             int32_t steps) {
    const RgbLanes<typename Pixels::Form> c(*job.coef);
    const Pixels pixels(job.extra);
    for (;;) {
        PixelsAt step = at;
        for (int32_t left = steps; left > 0; --left) {
            StepToPixels<Chroma>(step, c, pixels);
            FetchAhead<kStep * Pixels::kBytes>(step);
            step = {{step.luma[0] + kStep, step.luma[1] + kStep},
                    step.cb + kLanes * Chroma::kBytes,
                    step.cr + kLanes * Chroma::kBytes,
                    {step.out[0] + kStep * Pixels::kBytes, step.out[1] + kStep * Pixels::kBytes}};
        }
        if (--pairs <= 0) return;
        at = {{at.luma[0] + job.lumaStep, at.luma[1] + job.lumaStep},
              at.cb + job.cbStep,
              at.cr + job.crStep,
              {at.out[0] + job.outStep, at.out[1] + job.outStep}};
    }
}

/// How many pairs of `rows` rows are converted in one go: all of them, unless what remains of their
/// width has to follow each while it is in the cache, or there is only one row.
inline int32_t PairsAtOnce(int32_t rows, size_t rest) {
    return rest == 0 && rows > 1 ? rows / 2 : 1;
}

/// The last pixels, fewer than a step, by way of buffers that hold a whole one: the same
/// arithmetic, and not a byte outside the rows is read or written.
template <class Chroma, class Pixels>
void TailToPixels(const PixelsAt& at, const ToPixelsJob& job, size_t first, size_t n) {
    alignas(64) uint8_t luma[2][kStep] = {};
    alignas(64) uint8_t cb[kLanes * Chroma::kBytes] = {};
    alignas(64) uint8_t cr[kLanes * Chroma::kBytes] = {};
    alignas(64) uint8_t out[2][kStep * Pixels::kBytes];
    const size_t chromaFirst = first / 2 * Chroma::kBytes,
                 chromaBytes = (n + 1) / 2 * Chroma::kBytes;
    for (int row = 0; row < 2; ++row)
        memcpy(luma[row], at.luma[row] + first, n);
    memcpy(cb, at.cb + chromaFirst, chromaBytes);
    memcpy(cr, at.cr + chromaFirst, chromaBytes);
    PairsToPixels<Chroma, Pixels>({{luma[0], luma[1]}, cb, cr, {out[0], out[1]}}, job, 1, 1);
    for (int row = 0; row < 2; ++row) {
        memcpy(at.out[row] + first * Pixels::kBytes, out[row], n * Pixels::kBytes);
    }
}

template <class Chroma, class Pixels>
void FrameToPixels(const ToPixelsJob& job) {
    if (job.width <= 0) return;
    const int32_t steps = job.width / kStep;
    const size_t whole = static_cast<size_t>(steps) * kStep;
    const size_t rest = static_cast<size_t>(job.width) - whole;
    for (int32_t y = 0; y < job.height;) {
        const size_t pass = static_cast<size_t>(y / 2);
        const int lower = y + 1 < job.height;  // else the upper row stands in: converted twice
        const PixelsAt at = {
            {job.luma[0] + pass * job.lumaStep, job.luma[lower] + pass * job.lumaStep},
            job.cb + pass * job.cbStep,
            job.cr + pass * job.crStep,
            {job.out[0] + pass * job.outStep, job.out[lower] + pass * job.outStep}};
        const int32_t pairs = PairsAtOnce(job.height - y, rest);
        PairsToPixels<Chroma, Pixels>(at, job, pairs, steps);
        if (rest != 0) TailToPixels<Chroma, Pixels>(at, job, whole, rest);
        y += 2 * pairs;
    }
}

// ---- pixels to 4:2:0 ---------------------------------------------------------------------------

using vec::PlanesAt;

template <class Weights>
using ToYuvLanes = vec::ToYuvLanes<Wide, Weights>;

V BothBytes(int x) {
    return Set(static_cast<uint16_t>(x * 0x0101));
}

/// `steps` whole steps over two rows; at least one.
///
/// Rounding narrows as a signed number, so sums 32640..32767 give 127 (143 with the offset of
/// limited range) where 128 would be right, and 128 * 255 stays 127. Kept: clients compare.
template <class Weights>
__attribute__((always_inline)) inline void StepsToPlanes(PlanesAt at, int32_t steps,
                                                         const ToYuvLanes<Weights>& c) {
    for (; steps > 0; --steps) {
        const auto upper = LoadPixels(at.in[0], c.y);
        StoreLuma(at.luma[0], LumaSums(upper, c.y), c.lumaOffset);
        // Even pixels of the upper row: sampled, not averaged.
        StoreChroma(at.cb, at.cr, EvenSums(upper, c.cb), EvenSums(upper, c.cr), c.chromaOffset);
        StoreLuma(at.luma[1], LumaSums(LoadPixels(at.in[1], c.y), c.y), c.lumaOffset);
    }
}

/// Channels are taken from 16-bit pixels unmasked: 8 bits from the top of each field on, so that
/// the low bits of red and green are their neighbours' top bits. Kept: clients compare pictures.
struct From565 {
    static constexpr int kBytes = 2, kPixels = kStep;
    static ToYuvLanes<WordWeights> Lanes(const ToYuvCoef& c) {
        return {LumaWords(c.redToY, c.greenToY, c.blueToY),
                ChromaWords(-c.redToCb, -c.greenToCb, c.blueToCb),
                ChromaWords(c.redToCr, -c.greenToCr, -c.blueToCr), BothBytes(c.lumaOffset),
                BothBytes(128)};
    }
};

/// Bytes blue, green, red, alpha, or red first: the order is in the weights.
template <bool kRedFirst>
struct From8888 {
    static constexpr int kBytes = 4, kPixels = kQuadStep;
    static QuadWeights Luma(int r, int g, int b) {
        return kRedFirst ? LumaQuads(r, g, b) : LumaQuads(b, g, r);
    }
    static QuadWeights Chroma(int r, int g, int b) {
        return kRedFirst ? ChromaQuads(r, g, b) : ChromaQuads(b, g, r);
    }
    static ToYuvLanes<QuadWeights> Lanes(const ToYuvCoef& c) {
        return {Luma(c.redToY, c.greenToY, c.blueToY), Chroma(-c.redToCb, -c.greenToCb, c.blueToCb),
                Chroma(c.redToCr, -c.greenToCr, -c.blueToCr), BothBytes(c.lumaOffset),
                BothBytes(128)};
    }
};

/// `steps` whole steps of `pairs` pairs of rows, from `at` on.
template <class Source>
__attribute__((noinline)) void PairsToPlanes(PlanesAt at, const ToPlanesJob& job, int32_t pairs,
                                             int32_t steps) {
    const auto lanes = Source::Lanes(*job.coef);
    for (;;) {
        StepsToPlanes(at, steps, lanes);
        if (--pairs <= 0) return;
        at = {{at.in[0] + job.inStep, at.in[1] + job.inStep},
              {at.luma[0] + job.lumaStep, at.luma[1] + job.lumaStep},
              at.cb + job.cbStep,
              at.cr + job.crStep};
    }
}

/// The last pixels, fewer than a step, of one pair of rows.
template <class Source>
void TailToPlanes(const PlanesAt& at, const ToPlanesJob& job, size_t first, size_t n) {
    alignas(64) uint8_t in[2][Source::kPixels * Source::kBytes] = {};
    alignas(64) uint8_t luma[2][Source::kPixels];
    alignas(64) uint8_t cb[Source::kPixels / 2];
    alignas(64) uint8_t cr[Source::kPixels / 2];
    for (int row = 0; row < 2; ++row) {
        memcpy(in[row], at.in[row] + first * Source::kBytes, n * Source::kBytes);
    }
    PairsToPlanes<Source>({{in[0], in[1]}, {luma[0], luma[1]}, cb, cr}, job, 1, 1);
    for (int row = 0; row < 2; ++row)
        memcpy(at.luma[row] + first, luma[row], n);
    memcpy(at.cb + first / 2, cb, (n + 1) / 2);
    memcpy(at.cr + first / 2, cr, (n + 1) / 2);
}

template <class Source>
void FrameToPlanes(const ToPlanesJob& job) {
    if (job.width <= 0) return;
    const int32_t steps = job.width / Source::kPixels;
    const size_t whole = static_cast<size_t>(steps) * Source::kPixels;
    const size_t rest = static_cast<size_t>(job.width) - whole;
    for (int32_t y = 0; y < job.height;) {
        const size_t pass = static_cast<size_t>(y / 2);
        const int lower = y + 1 < job.height;
        const PlanesAt at = {
            {job.in[0] + pass * job.inStep, job.in[lower] + pass * job.inStep},
            {job.luma[0] + pass * job.lumaStep, job.luma[lower] + pass * job.lumaStep},
            job.cb + pass * job.cbStep,
            job.cr + pass * job.crStep};
        const int32_t pairs = PairsAtOnce(job.height - y, rest);
        if (steps != 0) PairsToPlanes<Source>(at, job, pairs, steps);
        if (rest != 0) TailToPlanes<Source>(at, job, whole, rest);
        y += 2 * pairs;
    }
}

// ---- lines of spread pixels --------------------------------------------------------------------

void BlendLines(const uint32_t* upper, const uint32_t* lower, uint32_t* out, int32_t w,
                int32_t quads) {
    for (; quads > 0; --quads, upper += 4, lower += 4, out += 4)
        BlendQuad(upper, lower, out, w);
}

void AverageLines(const uint32_t* upper, const uint32_t* lower, uint32_t* out, int32_t quads) {
    for (; quads > 0; --quads, upper += 4, lower += 4, out += 4)
        AverageQuad(upper, lower, out);
}

// ---- what the back end offers ------------------------------------------------------------------

constexpr VectorBackend MakeBackend(const char* name) {
    using P = PlanarChroma;
    using Q = PairedChroma;
    return {name,
            {{{FrameToPixels<P, Rgb565>, FrameToPixels<P, Exchanged<Rgb565>>},
              {FrameToPixels<P, Rgb888>, FrameToPixels<P, Exchanged<Rgb888>>},
              {FrameToPixels<P, Argb32>, FrameToPixels<P, Exchanged<Argb32>>},
              {FrameToPixels<P, Rgb5551>, FrameToPixels<P, Exchanged<Rgb5551>>},
              {FrameToPixels<P, SpreadPixels>, FrameToPixels<P, Exchanged<SpreadPixels>>}},
             {{FrameToPixels<Q, Rgb565>, FrameToPixels<Q, Exchanged<Rgb565>>}}},
            {{FrameToPlanes<From565>, nullptr},
             {FrameToPlanes<From8888<false>>, FrameToPlanes<From8888<true>>}},
            BlendLines,
            AverageLines};
}
