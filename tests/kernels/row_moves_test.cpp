#include "kernels/row_backend.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "kernels/vec_backend.h"
#include "testkit/guarded_buffer.h"
#include "testkit/random.h"

namespace {

using testkit::GuardedBuffer;
using Placement = GuardedBuffer::Placement;

/// The rows of the back end named, which every move is tried on; the plain one is among them.
class RowMoves : public testing::TestWithParam<const char*> {
  protected:
    void SetUp() override {
        const vidshow::VectorBackend* const backend = vidshow::FindVectorBackend(GetParam());
        if (backend == nullptr) GTEST_SKIP() << "not built in, or not for this processor";
        vidshow::UseVectorBackend(backend);
        m_rows = &vidshow::ActiveRowBackend();
    }
    void TearDown() override { vidshow::UseVectorBackend(nullptr); }

    /// Every count up to four steps of the widest back end, and around the widths of pictures.
    static std::vector<size_t> Counts() {
        std::vector<size_t> counts;
        for (size_t count = 0; count <= 130; ++count)
            counts.push_back(count);
        for (const size_t width : {320u, 640u, 1920u}) {
            for (size_t count = width - 2; count <= width + 2; ++count)
                counts.push_back(count);
        }
        return counts;
    }

    void Fill(GuardedBuffer* buffer) {
        for (size_t i = 0; i < buffer->size(); ++i)
            (*buffer)[i] = static_cast<uint8_t>(m_random());
    }

    void CheckReverse(vidshow::RowBackend::Reverse* reverse, size_t pixelBytes) {
        for (const size_t count : Counts()) {
            for (const Placement placement : {Placement::end, Placement::start}) {
                GuardedBuffer src(count * pixelBytes, placement);
                GuardedBuffer dst(count * pixelBytes, placement);
                Fill(&src);
                reverse(dst.data(), src.data(), count);
                for (size_t i = 0; i < count; ++i) {
                    for (size_t byte = 0; byte < pixelBytes; ++byte) {
                        ASSERT_EQ(src[(count - 1 - i) * pixelBytes + byte],
                                  dst[i * pixelBytes + byte])
                            << "byte " << byte << " of pixel " << i << " of " << count;
                    }
                }
            }
        }
    }

    const vidshow::RowBackend* m_rows = nullptr;
    std::mt19937 m_random = testkit::Random(91);
};

TEST_P(RowMoves, PixelsOfOneByteReversed) {
    CheckReverse(m_rows->reverse8, 1);
}
TEST_P(RowMoves, PixelsOfTwoBytesReversed) {
    CheckReverse(m_rows->reverse16, 2);
}
TEST_P(RowMoves, PixelsOfFourBytesReversed) {
    CheckReverse(m_rows->reverse32, 4);
}

TEST_P(RowMoves, BytesJoinedToPairs) {
    for (const size_t count : Counts()) {
        for (const Placement placement : {Placement::end, Placement::start}) {
            GuardedBuffer first(count, placement), second(count, placement);
            GuardedBuffer pairs(2 * count, placement);
            Fill(&first);
            Fill(&second);
            m_rows->join(pairs.data(), first.data(), second.data(), count);
            for (size_t i = 0; i < count; ++i) {
                ASSERT_EQ(first[i], pairs[2 * i]) << i << " of " << count;
                ASSERT_EQ(second[i], pairs[2 * i + 1]) << i << " of " << count;
            }
        }
    }
}

TEST_P(RowMoves, PairsSplit) {
    for (const size_t count : Counts()) {
        for (const Placement placement : {Placement::end, Placement::start}) {
            GuardedBuffer pairs(2 * count, placement);
            GuardedBuffer first(count, placement), second(count, placement);
            Fill(&pairs);
            m_rows->split(first.data(), second.data(), pairs.data(), count);
            for (size_t i = 0; i < count; ++i) {
                ASSERT_EQ(pairs[2 * i], first[i]) << i << " of " << count;
                ASSERT_EQ(pairs[2 * i + 1], second[i]) << i << " of " << count;
            }
        }
    }
}

INSTANTIATE_TEST_SUITE_P(Named, RowMoves, testing::Values("scalar", "sse41", "avx2", "neon"),
                         [](const auto& test) { return std::string(test.param); });

TEST(RowMovesChoice, EachBackEndHasItsOwn) {
    std::vector<const vidshow::RowBackend*> seen;
    for (const char* name : {"scalar", "sse41", "avx2", "neon"}) {
        const vidshow::VectorBackend* const backend = vidshow::FindVectorBackend(name);
        if (backend == nullptr) continue;
        vidshow::UseVectorBackend(backend);
        for (const vidshow::RowBackend* other : seen)
            EXPECT_NE(other, &vidshow::ActiveRowBackend()) << name;
        seen.push_back(&vidshow::ActiveRowBackend());
    }
    vidshow::UseVectorBackend(nullptr);
    EXPECT_GE(seen.size(), 1u);
}

}  // namespace
