// The plain back end of the vector kernels: eight lanes in an array, every operation spelt out. It
// is what the others are compared with, and runs where no instruction set of theirs is at hand.

#include <cstring>

#include "kernels/vec_backend.h"

namespace vidshow {
namespace {
namespace lanes_scalar {

using std::memcpy;

constexpr int kLanes = 8, kQuadStep = 16, kAhead = 0;
struct V {
    uint16_t lane[kLanes];
};
struct B {
    uint8_t lane[kLanes];
};
struct Wide {
    V lo, hi;
    uint16_t operator[](int i) const { return (i < kLanes ? lo : hi).lane[i % kLanes]; }
};

int Signed(uint16_t x) {
    return static_cast<int16_t>(x);
}
int Clamp(int x, int low, int high) {
    return x < low ? low : x > high ? high : x;
}

/// A V whose lane i is f(i), cut to 16 bits.
template <class F>
V Make(F f) {
    V v;
    for (int i = 0; i < kLanes; ++i)
        v.lane[i] = static_cast<uint16_t>(f(i));
    return v;
}

/// A Wide whose pixel i is f(i).
template <class F>
Wide MakeWide(F f) {
    return {Make(f), Make([&](int i) { return f(i + kLanes); })};
}

/// A B whose lane i is the low byte of f(i).
template <class F>
B MakeBytes(F f) {
    B b;
    for (int i = 0; i < kLanes; ++i)
        b.lane[i] = static_cast<uint8_t>(f(i));
    return b;
}

V Set(uint16_t x) {
    return Make([=](int) { return x; });
}
B SetBytes(uint8_t x) {
    return MakeBytes([=](int) { return x; });
}
V Times(B a, B b) {
    return Make([&](int i) { return a.lane[i] * b.lane[i]; });
}
V MinusTimes(V v, B a, B b) {
    return Make([&](int i) { return v.lane[i] - a.lane[i] * b.lane[i]; });
}

B LoadChroma(const uint8_t* p) {
    return MakeBytes([=](int i) { return p[i]; });
}
void LoadPairs(const uint8_t* p, B& first, B& second) {
    first = MakeBytes([=](int i) { return p[2 * i]; });
    second = MakeBytes([=](int i) { return p[2 * i + 1]; });
}
Wide LoadLuma(const uint8_t* p, B k) {
    return {Times(LoadChroma(p), k), Times(LoadChroma(p + kLanes), k)};
}
template <class Form>
V Offset(int16_t x, Form) {
    return Set(static_cast<uint16_t>(x));
}
template <class Form>
V AddTerm(V term, B a, B b, Form) {
    return Make([&](int i) { return term.lane[i] + a.lane[i] * b.lane[i]; });
}
Wide Double(V v) {
    return MakeWide([&](int i) { return v.lane[i / 2]; });
}
V AddSat(V a, V b) {
    return Make(
        [&](int i) { return Clamp(Signed(a.lane[i]) + Signed(b.lane[i]), INT16_MIN, INT16_MAX); });
}
/// Signed to unsigned, shifted left by 2 with saturation: the level stands in the high byte.
V Level(V x) {
    return Make([&](int i) { return Clamp(Signed(x.lane[i]) * 4, 0, UINT16_MAX); });
}
template <class Form>
V Channel(V y, V term, Form) {
    return Level(AddSat(y, term));
}

void StoreWord(uint8_t* out, int i, uint32_t pixel) {
    const uint16_t word = static_cast<uint16_t>(pixel);
    memcpy(out + 2 * i, &word, sizeof word);
}

void Store565(uint8_t* out, Wide a, Wide b, Wide c) {
    for (int i = 0; i < 2 * kLanes; ++i) {
        StoreWord(out, i, (a[i] & 0xF800u) | (b[i] >> 10 << 5) | (c[i] >> 11));
    }
}
void Store5551(uint8_t* out, Wide a, Wide b, Wide c, V key) {
    for (int i = 0; i < 2 * kLanes; ++i) {
        const uint32_t pixel = (a[i] & 0xF800u) | (b[i] >> 11 << 6) | (c[i] >> 11 << 1) | 1u;
        StoreWord(out, i, pixel == key.lane[0] ? 0 : pixel);
    }
}
void Store888(uint8_t* out, Wide a, Wide b, Wide c) {
    for (int i = 0; i < 2 * kLanes; ++i) {
        out[3 * i] = static_cast<uint8_t>(a[i] >> 8);
        out[3 * i + 1] = static_cast<uint8_t>(b[i] >> 8);
        out[3 * i + 2] = static_cast<uint8_t>(c[i] >> 8);
    }
}
void Store8888(uint8_t* out, Wide a, Wide b, Wide c, V d) {
    for (int i = 0; i < 2 * kLanes; ++i) {
        out[4 * i] = static_cast<uint8_t>(a[i] >> 8);
        out[4 * i + 1] = static_cast<uint8_t>(b[i] >> 8);
        out[4 * i + 2] = static_cast<uint8_t>(c[i] >> 8);
        out[4 * i + 3] = static_cast<uint8_t>(d.lane[0]);
    }
}
void StoreSpread(uint8_t* out, Wide a, Wide b, Wide c) {
    for (int i = 0; i < 2 * kLanes; ++i) {
        const uint32_t pixel = (a[i] >> 10 << 21) | (b[i] >> 10 << 10) | (c[i] >> 11);
        memcpy(out + 4 * i, &pixel, sizeof pixel);
    }
}

struct Words {
    uint16_t pixel[2 * kLanes];
};
struct Quads {
    uint8_t pixel[2 * kLanes][4];
};
template <class Pixels>
Pixels Load(const uint8_t*& p) {
    Pixels pixels;
    memcpy(pixels.pixel, p, sizeof pixels.pixel);
    p += sizeof pixels.pixel;
    return pixels;
}

struct Weights {
    int a, b, c;
    int Sum(const uint8_t (&pixel)[4]) const { return pixel[0] * a + pixel[1] * b + pixel[2] * c; }
    int Sum(uint16_t pixel) const {
        return (pixel >> 8) * a + (pixel >> 3 & 0xFF) * b + (pixel << 3 & 0xFF) * c;
    }
};
struct WordWeights : Weights {};
struct QuadWeights : Weights {};
WordWeights LumaWords(int a, int b, int c) {
    return {{a, b, c}};
}
WordWeights ChromaWords(int a, int b, int c) {
    return {{a, b, c}};
}
QuadWeights LumaQuads(int a, int b, int c) {
    return {{a, b, c}};
}
QuadWeights ChromaQuads(int a, int b, int c) {
    return {{a, b, c}};
}
Words LoadPixels(const uint8_t*& p, const WordWeights&) {
    return Load<Words>(p);
}
Quads LoadPixels(const uint8_t*& p, const QuadWeights&) {
    return Load<Quads>(p);
}

template <class Pixels>
Wide LumaSums(const Pixels& pixels, const Weights& w) {
    return MakeWide([&](int i) { return w.Sum(pixels.pixel[i]); });
}
template <class Pixels>
V EvenSums(const Pixels& pixels, const Weights& w) {
    return Make([&](int i) { return w.Sum(pixels.pixel[2 * i]); });
}

void StoreNarrow(uint8_t*& out, V sums, V offset) {
    for (int i = 0; i < kLanes; ++i) {
        const int rounded = Clamp((Signed(sums.lane[i]) + 128) >> 8, INT8_MIN, INT8_MAX);
        *out++ = static_cast<uint8_t>(rounded + offset.lane[0] % 256);
    }
}
void StoreLuma(uint8_t*& out, Wide sums, V offset) {
    StoreNarrow(out, sums.lo, offset);
    StoreNarrow(out, sums.hi, offset);
}
void StoreChroma(uint8_t*& cbOut, uint8_t*& crOut, V cb, V cr, V offset) {
    StoreNarrow(cbOut, cb, offset);
    StoreNarrow(crOut, cr, offset);
}

constexpr uint32_t kSpreadMask = 0x07E0FC1F;

void BlendQuad(const uint32_t* upper, const uint32_t* lower, uint32_t* out, int32_t w) {
    const uint32_t below = static_cast<uint32_t>(w);
    for (int i = 0; i < 4; ++i) {
        out[i] = (upper[i] * (32 - below) + lower[i] * below) >> 5 & kSpreadMask;
    }
}
void AverageQuad(const uint32_t* upper, const uint32_t* lower, uint32_t* out) {
    for (int i = 0; i < 4; ++i)
        out[i] = (upper[i] + lower[i]) >> 1 & kSpreadMask;
}

#include "kernels/vec_body.h"

}  // namespace lanes_scalar
}  // namespace

constexpr VectorBackend kScalarBackend = lanes_scalar::MakeBackend("scalar");

}  // namespace vidshow
