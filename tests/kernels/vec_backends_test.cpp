// Every back end of the vector kernels against the plain one, byte for byte, over sizes, strides
// and alignments; and that the back end asked for is the one that runs.

#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <vector>

#include "kernels/kernel_fixture.h"
#include "kernels/vec_backend.h"

#ifdef VIDSHOW_PORTABLE_AVX512
namespace vidshow {
extern const VectorBackend kPortableAvx512Backend;
}
#endif

namespace {

using namespace kernel_test;
using vidshow::FindVectorBackend;
using vidshow::kScalarBackend;
using vidshow::ToPixelsJob;
using vidshow::ToPlanesJob;
using vidshow::VectorBackend;

constexpr vidshow::ToRgbCoef kLimited = {74, 114, 13, 34, 135, -15878, 4920, -18497};
constexpr vidshow::ToRgbCoef kFull = {64, 100, 11, 29, 118, 0, 0, 0};
constexpr vidshow::ToYuvCoef kToLimited = {46, 157, 15, 25, 86, 112, 102, 10, 112, 16};
constexpr vidshow::ToYuvCoef kToFull = {54, 183, 18, 29, 98, 128, 116, 11, 128, 0};

/// The back ends that are built in, the plain one left out.
std::vector<const char*> BuiltIn() {
    return {
#ifdef VIDSHOW_VECTOR_NEON
        "neon",
#endif
#ifdef VIDSHOW_VECTOR_SSE41
        "sse41",
#endif
#ifdef VIDSHOW_VECTOR_AVX2
        "avx2",
#endif
#ifdef VIDSHOW_VECTOR_AVX512
        "avx512",
#endif
    };
}

/// What `name` stands for here; null when this processor cannot run it.
const VectorBackend* Find(const char* name) {
#ifdef VIDSHOW_PORTABLE_AVX512
    if (name == std::string("avx512Portable")) return &vidshow::kPortableAvx512Backend;
#endif
    return FindVectorBackend(name);
}

/// Those that are compared with the plain one.
std::vector<const char*> Compared() {
    std::vector<const char*> names = BuiltIn();
#ifdef VIDSHOW_PORTABLE_AVX512
    names.push_back("avx512Portable");
#endif
    return names;
}

constexpr int kBytesPerPixel[vidshow::vec::kPixels] = {2, 3, 4, 2, 4};

struct Size {
    int32_t w, h;
};

std::vector<Size> Sizes() {
    std::vector<Size> sizes;
    for (int32_t w = 1; w <= 70; ++w) {
        sizes.push_back({w, 2});
        sizes.push_back({w, 1 + w % 9});
    }
    for (int32_t h = 1; h <= 9; ++h)
        sizes.push_back({37, h});
    for (const int32_t around : {320, 640, 1920}) {
        for (int32_t w = around - 3; w <= around + 3; ++w)
            sizes.push_back({w, 3});
    }
    return sizes;
}

/// A block of bytes whose last byte lies in front of an unmapped page, or whose first one lies
/// behind one, or that starts at an odd address; sized for every test, filled as asked.
class Block {
  public:
    Block(size_t bytes, uint8_t fill, size_t variant)
        : m_buffer(bytes + Lead(variant), variant == 0 ? Placement::end : Placement::start, fill),
          m_lead(Lead(variant)) {}
    uint8_t* data() { return m_buffer.data() + m_lead; }
    const GuardedBuffer& buffer() const { return m_buffer; }
    void Randomise(std::mt19937& random) {
        testkit::FillSamples(random, m_buffer.data(), m_buffer.size());
    }

  private:
    static size_t Lead(size_t variant) { return variant == 2 ? 3 : 0; }
    GuardedBuffer m_buffer;
    size_t m_lead;
};

size_t Bytes(size_t stride, int32_t rows, int32_t rowBytes) {
    return stride * static_cast<size_t>(rows - 1) + static_cast<size_t>(rowBytes);
}

testing::AssertionResult SameBytes(const Block& got, const Block& want) {
    const GuardedBuffer& a = got.buffer();
    const GuardedBuffer& b = want.buffer();
    for (size_t i = 0; i < a.size(); ++i) {
        if (a[i] != b[i]) {
            return testing::AssertionFailure() << "byte " << i << " of " << a.size() << " is "
                                               << int{a[i]} << ", not " << int{b[i]};
        }
    }
    return testing::AssertionSuccess();
}

class VecBackends : public testing::TestWithParam<const char*> {
  protected:
    void SetUp() override {
        m_backend = Find(GetParam());
        if (m_backend == nullptr) GTEST_SKIP() << "this processor cannot run it";
    }

    void ComparePixels(Size size, size_t variant, uint32_t pad);
    void ComparePlanes(Size size, size_t variant, uint32_t pad);

    const VectorBackend* m_backend = nullptr;
    std::mt19937 m_random = testkit::Random(3630);
};

void VecBackends::ComparePixels(Size size, size_t variant, uint32_t pad) {
    using namespace vidshow::vec;
    const int32_t halfW = (size.w + 1) / 2, halfH = (size.h + 1) / 2;
    const size_t lumaStride = static_cast<size_t>(size.w) + pad;
    const size_t cbStride = static_cast<size_t>(2 * halfW) + 2 * pad;  // room for pairs
    const size_t crStride = static_cast<size_t>(halfW) + 3 * pad;
    for (int kind = 0; kind < kChromas * kPixels * kOrders; ++kind) {
        const int chroma = kind / (kPixels * kOrders), pixels = kind / kOrders % kPixels;
        const int order = kind % kOrders;
        VectorBackend::ToPixels* const run = m_backend->toPixels[chroma][pixels][order];
        ASSERT_EQ(run == nullptr, chroma == pairs && pixels != rgb565);
        if (run == nullptr) continue;
        const int32_t cbBytes = chroma == pairs ? 2 * halfW : halfW;
        Block luma(Bytes(lumaStride, size.h, size.w), 0, variant);
        Block cb(Bytes(cbStride, halfH, cbBytes), 0, variant);
        Block cr(Bytes(crStride, halfH, halfW), 0, variant);
        for (Block* block : {&luma, &cb, &cr})
            block->Randomise(m_random);
        const int32_t rowBytes = size.w * kBytesPerPixel[pixels];
        const size_t outStride = static_cast<size_t>(rowBytes) + 5 * pad;
        Block got(Bytes(outStride, size.h, rowBytes), 0x65, variant);
        Block want(Bytes(outStride, size.h, rowBytes), 0x65, variant);
        ToPixelsJob job = {{luma.data(), luma.data() + lumaStride},
                           cb.data(),
                           chroma == pairs ? cb.data() : cr.data(),
                           {},
                           2 * lumaStride,
                           cbStride,
                           chroma == pairs ? cbStride : crStride,
                           2 * outStride,
                           size.w,
                           size.h,
                           static_cast<uint32_t>(m_random()) | 1,
                           kind % 3 == 0 ? &kFull : &kLimited};
        for (Block* out : {&got, &want}) {
            job.out[0] = out->data();
            job.out[1] = out->data() + outStride;
            (out == &got ? run : kScalarBackend.toPixels[chroma][pixels][order])(job);
        }
        ASSERT_TRUE(SameBytes(got, want)) << "chroma " << chroma << " pixels " << pixels
                                          << " order " << order << ' ' << size.w << " x " << size.h;
    }
}

void VecBackends::ComparePlanes(Size size, size_t variant, uint32_t pad) {
    using namespace vidshow::vec;
    const int32_t halfW = (size.w + 1) / 2, halfH = (size.h + 1) / 2;
    for (int kind = 0; kind < 4; ++kind) {
        VectorBackend::ToPlanes* const run = m_backend->toPlanes[kind / 2][kind % 2];
        ASSERT_EQ(run == nullptr, kind == 1) << "16-bit words have one order";
        if (run == nullptr) continue;
        const int32_t rowBytes = size.w * (kind < 2 ? 2 : 4);
        const size_t inStride = static_cast<size_t>(rowBytes) + pad;
        Block in(Bytes(inStride, size.h, rowBytes), 0, variant);
        in.Randomise(m_random);
        const size_t strides[3] = {static_cast<size_t>(size.w) + 2 * pad,
                                   static_cast<size_t>(halfW) + 3 * pad,
                                   static_cast<size_t>(halfW) + 5 * pad};
        const size_t bytes[3] = {Bytes(strides[0], size.h, size.w), Bytes(strides[1], halfH, halfW),
                                 Bytes(strides[2], halfH, halfW)};
        Block got[3] = {{bytes[0], 9, variant}, {bytes[1], 9, variant}, {bytes[2], 9, variant}};
        Block want[3] = {{bytes[0], 9, variant}, {bytes[1], 9, variant}, {bytes[2], 9, variant}};
        for (Block* out : {got, want}) {
            const ToPlanesJob job = {{in.data(), in.data() + inStride},
                                     {out[0].data(), out[0].data() + strides[0]},
                                     out[1].data(),
                                     out[2].data(),
                                     2 * inStride,
                                     2 * strides[0],
                                     strides[1],
                                     strides[2],
                                     size.w,
                                     size.h,
                                     size.w % 2 != 0 ? &kToLimited : &kToFull};
            (out == got ? run : kScalarBackend.toPlanes[kind / 2][kind % 2])(job);
        }
        for (int plane = 0; plane < 3; ++plane) {
            ASSERT_TRUE(SameBytes(got[plane], want[plane]))
                << "kind " << kind << " plane " << plane << ' ' << size.w << " x " << size.h;
        }
    }
}

TEST_P(VecBackends, PixelsEqualThePlainForm) {
    for (const Size size : Sizes()) {
        ComparePixels(size, static_cast<size_t>(size.w) % 2, 0);
    }
    for (const Size size : {Size{31, 3}, Size{64, 4}, Size{101, 5}, Size{640, 2}}) {
        for (const uint32_t pad : {0u, 1u, 7u, 32u})
            ComparePixels(size, 2, pad);
    }
}

TEST_P(VecBackends, PlanesEqualThePlainForm) {
    for (const Size size : Sizes()) {
        ComparePlanes(size, static_cast<size_t>(size.w) % 2, 0);
    }
    for (const Size size : {Size{31, 3}, Size{64, 4}, Size{101, 5}, Size{640, 2}}) {
        for (const uint32_t pad : {0u, 1u, 7u, 32u})
            ComparePlanes(size, 2, pad);
    }
}

TEST_P(VecBackends, LinesEqualThePlainForm) {
    std::vector<uint32_t> upper(83), lower(83), got(83), want(83);
    for (size_t i = 0; i < upper.size(); ++i) {
        upper[i] = static_cast<uint32_t>(m_random());
        lower[i] = static_cast<uint32_t>(m_random());
    }
    for (int32_t quads = 0; quads <= 20; ++quads) {
        for (int32_t w = 0; w <= 32; ++w) {
            m_backend->blend(&upper[1], &lower[2], &got[3], w, quads);
            kScalarBackend.blend(&upper[1], &lower[2], &want[3], w, quads);
            ASSERT_EQ(got, want) << "weight " << w << " quads " << quads;
        }
        m_backend->average(&upper[1], &lower[2], &got[3], quads);
        kScalarBackend.average(&upper[1], &lower[2], &want[3], quads);
        ASSERT_EQ(got, want) << quads;
    }
}

// On processors without a back end of their own the list is empty.
GTEST_ALLOW_UNINSTANTIATED_PARAMETERIZED_TEST(VecBackends);
INSTANTIATE_TEST_SUITE_P(Named, VecBackends, testing::ValuesIn(Compared()),
                         [](const auto& entry) { return std::string(entry.param); });

// ---- which one runs ----

int g_calls = 0;
const VectorBackend* g_counted = nullptr;

/// A stand-in that counts one kernel's calls and passes them on.
void CountedToRgb565(const ToPixelsJob& job) {
    ++g_calls;
    g_counted->toPixels[0][0][0](job);
}

uint16_t OnePixel() {
    uint8_t y = 200, cb = 128, cr = 128;
    uint8_t* const planes[3] = {&y, &cb, &cr};
    const uint32_t strides[3] = {1, 1, 1};
    uint16_t pixel = 0;
    _YCbCr420ToRGB565_P3C2_0(planes, strides, &pixel, 2, 1, 1);
    return pixel;
}

TEST(VecBackendChoice, TheOneAskedForIsTheOneThatRuns) {
    const uint16_t expected = OnePixel();
    int found = 0;
    std::vector<const char*> names = BuiltIn();
    names.push_back("scalar");
    for (const char* name : names) {
        g_counted = FindVectorBackend(name);
        if (g_counted == nullptr) continue;
        ++found;
        EXPECT_STREQ(g_counted->name, name);
        vidshow::UseVectorBackend(g_counted);
        EXPECT_EQ(&vidshow::ActiveVectorBackend(), g_counted);
        VectorBackend counting = *g_counted;
        counting.toPixels[0][0][0] = CountedToRgb565;
        vidshow::UseVectorBackend(&counting);
        g_calls = 0;
        EXPECT_EQ(OnePixel(), expected) << name;
        EXPECT_EQ(g_calls, 1) << "the exported entry went elsewhere than to " << name;
        vidshow::UseVectorBackend(nullptr);
    }
    EXPECT_GE(found, 1);
}

TEST(VecBackendChoice, BackEndsShareNoCode) {
    for (const char* name : BuiltIn()) {
        const VectorBackend* const backend = FindVectorBackend(name);
        if (backend == nullptr) continue;
        EXPECT_NE(backend->toPixels[0][0][0], kScalarBackend.toPixels[0][0][0]) << name;
        EXPECT_NE(backend->toPlanes[0][0], kScalarBackend.toPlanes[0][0]) << name;
        EXPECT_NE(backend->blend, kScalarBackend.blend) << name;
    }
}

TEST(VecBackendChoice, UnknownNamesFindNothing) {
    EXPECT_EQ(FindVectorBackend("mmx"), nullptr);
    EXPECT_EQ(FindVectorBackend(""), nullptr);
    EXPECT_EQ(FindVectorBackend("scalar"), &kScalarBackend);
}

TEST(VecBackendChoice, TheBestThatThisProcessorRunsIsChosen) {
    vidshow::UseVectorBackend(nullptr);
    const char* expected = "scalar";
#if defined(VIDSHOW_VECTOR_NEON)
    expected = "neon";
#endif
#if defined(VIDSHOW_VECTOR_SSE41)
    if (__builtin_cpu_supports("sse4.1")) expected = "sse41";
#endif
#if defined(VIDSHOW_VECTOR_AVX2)
    if (__builtin_cpu_supports("avx2")) expected = "avx2";
#endif
#if defined(VIDSHOW_VECTOR_AVX512)
    if (__builtin_cpu_supports("avx512bw")) expected = "avx512";
#endif
    EXPECT_STREQ(vidshow::ActiveVectorBackend().name, expected);
}

}  // namespace
