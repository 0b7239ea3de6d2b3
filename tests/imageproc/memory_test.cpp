// What a processor takes from the heap, what it does when there is nothing, and what a frame takes.
// A program of its own, because it replaces malloc, calloc and free.

#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>
#include <string>
#include <vector>

#include "imageproc/counted_heap.h"
#include "imageproc/support.h"
#include "testkit/capture.h"

namespace {

using imageproc_test::CountedHeap;
using imageproc_test::Params;

struct Attempt {
    HRESULT result;
    void* handle;
    std::string text;
    int allocations;
    int live;
};

Attempt Create(const QZ_IMAGEPROC_INIT_PARAMS& params, int failing) {
    Attempt attempt = {};
    testkit::StdoutCapture capture;
    {
        CountedHeap heap(failing);
        attempt.result = QZ_IMAGEPROC_Create(&attempt.handle, 0, &params);
        attempt.allocations = heap.allocations();
        attempt.live = heap.live();
    }
    attempt.text = capture.text();
    return attempt;
}

constexpr char kRecord[] = "Fail to allocate memory for image process parameter set!\n";
constexpr char kImage[] = "Fail to allocate memory for temp image buf for deinterlaced!\n";
constexpr char kInit[] = "Fail to init the platform dependent part wit ret = 0xfffffffe!\n";
constexpr char kWalker[] = "fail to init rotation param! \n";
constexpr char kLines[] = "fail to alloc line buffer!\n";

TEST(CreationWithoutMemory, EqualSizesTakeFourBlocksAndEachMayFail) {
    const QZ_IMAGEPROC_INIT_PARAMS params = Params(0, 16, 16, 16, 16);
    struct {
        HRESULT result;
        std::string text;
    } const expected[] = {
        {E_OUTOFMEMORY, kRecord},
        {E_OUTOFMEMORY, kImage},
        {E_OUTOFMEMORY, ""},
        {E_FAIL, std::string(kWalker) + kInit},
    };
    for (int i = 0; i < 4; ++i) {
        const Attempt a = Create(params, i);
        EXPECT_EQ(a.result, expected[i].result) << i;
        EXPECT_EQ(a.text, expected[i].text) << i;
        EXPECT_EQ(a.handle, nullptr) << i;
        EXPECT_EQ(a.allocations, i + 1) << "nothing more is asked for";
        EXPECT_EQ(a.live, 0) << "nothing is kept, after " << i;
    }
    const Attempt a = Create(params, 4);
    EXPECT_EQ(a.result, S_OK);
    EXPECT_EQ(a.live, 4);
    QZ_IMAGEPROC_Destroy(a.handle);
}

TEST(CreationWithoutMemory, OtherSizesTakeLineBuffersToo) {
    const QZ_IMAGEPROC_INIT_PARAMS params = Params(0, 16, 16, 36, 20);
    Attempt a = Create(params, 3);
    EXPECT_EQ(a.result, E_FAIL);
    EXPECT_EQ(a.text, std::string(kLines) + kInit);
    EXPECT_EQ(a.live, 0);
    a = Create(params, 4);
    EXPECT_EQ(a.result, E_FAIL);
    EXPECT_EQ(a.text, std::string(kWalker) + kInit);
    EXPECT_EQ(a.live, 0);
    a = Create(params, 5);
    EXPECT_EQ(a.result, S_OK);
    EXPECT_EQ(a.live, 5);
    QZ_IMAGEPROC_Destroy(a.handle);
}

TEST(CreationWithoutMemory, ThePatchingMessageComesFirst) {
    EXPECT_EQ(Create(Params(0, 17, 16, 16, 16), 1).text,
              std::string("mis-aligned resolution found, patching...\n") + kImage);
    EXPECT_EQ(Create(Params(0, 17, 16, 16, 16), 0).text, kRecord);
}

TEST(CreationWithoutMemory, TheKeyIsAnnouncedBeforeTheImageIsTaken) {
    constexpr char kKey[] = "QZ_IMAGEPROC_CSC_YCBCR420_TO_RGB5551 u32ColorKey = 0x101! \n";
    const QZ_IMAGEPROC_INIT_PARAMS params = Params(10, 16, 16, 16, 16);
    EXPECT_EQ(Create(params, 0).text, kRecord);
    EXPECT_EQ(Create(params, 1).text, std::string(kKey) + kImage);
    EXPECT_EQ(Create(params, 2).text, kKey);
}

TEST(CreationWithoutMemory, ARefusedConversionKeepsNothing) {
    const Attempt a = Create(Params(1, 16, 16, 16, 16), -1);
    EXPECT_EQ(a.result, E_FAIL);
    EXPECT_EQ(a.text,
              "Unsupport image format conversion! \n"
              "Fail to init the platform dependent part wit ret = 0xfffffffd!\n");
    EXPECT_EQ(a.handle, nullptr);
    EXPECT_EQ(a.live, 0);
}

// The step that creation calls last, on a record of one's own.
TEST(PipelineInitWithoutMemory, TellsTheCallerWhoFreesWhatIsThere) {
    for (int failing = 0; failing < 2; ++failing) {
        QZ_IMAGEPROC_PARAMSET p = {};
        p.u32InWidth = p.u32InHeight = 16;
        p.u32OutWidth = p.u32OutHeight = 36;
        p.u32ResizeCase = 2;
        testkit::StdoutCapture capture;
        CountedHeap heap(failing);
        EXPECT_EQ(_ImgPrcInit_depend(&p), -2);
        EXPECT_EQ(capture.text(), failing == 0 ? kLines : kWalker);
        EXPECT_EQ(p.pLineBlock != nullptr, failing == 1);
        EXPECT_EQ(p.pWalker, nullptr);
        std::free(p.pLineBlock);
        EXPECT_EQ(heap.live(), 0);
    }
}

TEST(ProcessorMemory, BlocksHaveTheirStatedSizes) {
    CountedHeap heap;
    void* handle = nullptr;
    const QZ_IMAGEPROC_INIT_PARAMS params = Params(0, 20, 12, 36, 24);
    ASSERT_EQ(QZ_IMAGEPROC_Create(&handle, 0, &params), S_OK);
    ASSERT_EQ(heap.allocations(), 5);
    EXPECT_EQ(heap.size(0), sizeof(QZ_IMAGEPROC_PARAMSET));
    EXPECT_EQ(heap.size(1), 4u * 32 * 12 + 15);  // in width rounded up to 16
    EXPECT_EQ(heap.size(2), 2564u);
    EXPECT_EQ(heap.size(3), 4u * 4 * (36 + 4) + 4);  // four lines of the wider picture
    EXPECT_EQ(heap.size(4), 13 * sizeof(void*));
    EXPECT_EQ(QZ_IMAGEPROC_Destroy(handle), S_OK);
    EXPECT_EQ(heap.live(), 0);
}

TEST(ProcessorMemory, ANearLinearEnlargementDoublesItsLines) {
    struct {
        uint32_t inWidth, outWidth, inHeight, outHeight, algorithm;
        size_t bytes;
    } const cases[] = {
        {20, 40, 12, 24, 3, 4 * 8 * 44 + 4}, {20, 40, 12, 24, 1, 4 * 4 * 44 + 4},
        {20, 40, 12, 24, 0, 4 * 4 * 44 + 4}, {20, 40, 12, 8, 3, 4 * 4 * 44 + 4},
        {40, 20, 24, 12, 3, 4 * 4 * 44 + 4}, {20, 40, 12, 24, 2, 4 * 4 * 44 + 4},
    };
    for (const auto& c : cases) {
        QZ_IMAGEPROC_INIT_PARAMS params = Params(0, c.inWidth, c.inHeight, c.outWidth, c.outHeight);
        params.u32ResizeAlgorithm = c.algorithm;
        CountedHeap heap;
        void* handle = nullptr;
        ASSERT_EQ(QZ_IMAGEPROC_Create(&handle, 0, &params), S_OK);
        EXPECT_EQ(heap.size(3), c.bytes) << "algorithm " << c.algorithm;
        const auto& p = *static_cast<const QZ_IMAGEPROC_PARAMSET*>(handle);
        const uintptr_t start = (reinterpret_cast<uintptr_t>(p.pLineBlock) + 3) / 4 * 4;
        for (size_t i = 0; i < 4; ++i) {
            EXPECT_EQ(reinterpret_cast<uintptr_t>(p.pLines[i]), start + i * (c.bytes - 4) / 4);
        }
        QZ_IMAGEPROC_Destroy(handle);
    }
}

TEST(ProcessorMemory, AdjustmentTakesItsTablesOnce) {
    CountedHeap heap;
    void* handle = nullptr;
    const QZ_IMAGEPROC_INIT_PARAMS params = Params(0, 16, 16, 16, 16);
    ASSERT_EQ(QZ_IMAGEPROC_Create(&handle, 0, &params), S_OK);
    uint32_t values[3] = {128, 128, 128};
    EXPECT_EQ(QZ_IMAGEPROC_Set(handle, 1, values, 12), S_OK);
    EXPECT_EQ(heap.allocations(), 4) << "neutral on a fresh processor";
    values[1] = 200;
    EXPECT_EQ(QZ_IMAGEPROC_Set(handle, 1, values, 12), S_OK);
    EXPECT_EQ(heap.allocations(), 5);
    EXPECT_EQ(heap.size(4), 512u);
    values[1] = 128;
    EXPECT_EQ(QZ_IMAGEPROC_Set(handle, 1, values, 12), S_OK);
    values[1] = 201;
    EXPECT_EQ(QZ_IMAGEPROC_Set(handle, 1, values, 12), S_OK);
    EXPECT_EQ(heap.allocations(), 5) << "kept while neutral";
    EXPECT_EQ(QZ_IMAGEPROC_Reset(handle), S_OK);
    EXPECT_EQ(heap.live(), 4);
    values[1] = 202;
    EXPECT_EQ(QZ_IMAGEPROC_Set(handle, 1, values, 12), S_OK);
    EXPECT_EQ(heap.live(), 5);
    EXPECT_EQ(QZ_IMAGEPROC_Destroy(handle), S_OK);
    EXPECT_EQ(heap.live(), 0);
}

TEST(ProcessorMemory, AdjustmentWithoutMemoryStoresNothing) {
    const imageproc_test::Processor p(Params(0, 16, 16, 16, 16));
    ASSERT_EQ(p.result, S_OK);
    const uint16_t before = p->pTransLuma[100];
    const uint32_t values[3] = {10, 20, 30};
    {
        CountedHeap heap(0);
        EXPECT_EQ(QZ_IMAGEPROC_Set(p.handle(), 1, values, 12), E_OUTOFMEMORY);
    }
    EXPECT_EQ(p->i32Brightness, 128);
    EXPECT_EQ(p->i32Contrast, 128);
    EXPECT_EQ(p->i32Saturation, 128);
    EXPECT_EQ(p->u32AdjustActive, 0u);
    EXPECT_EQ(p->pAdjustBlock, nullptr);
    EXPECT_EQ(p->pTransLuma[100], before);
    const int32_t again[3] = {10, 20, 30};
    {
        CountedHeap heap(0);
        EXPECT_EQ(SetImgColorAdjust(&p.record(), again), -1);
    }
    EXPECT_EQ(SetImgColorAdjust(&p.record(), again), 0) << "and the next attempt succeeds";
    EXPECT_EQ(p->i32Contrast, 20);
}

// A frame on a processor of any conversion, over planes that are large enough for all of them.
class FrameMemory : public testing::TestWithParam<uint32_t> {
  protected:
    FrameMemory() : m_in(3 * 96 * 256), m_out(3 * 96 * 256) {}

    HRESULT Run(void* handle) {
        uint8_t* const src[3] = {&m_in[0], &m_in[96 * 256], &m_in[2 * 96 * 256]};
        uint8_t* const dst[3] = {&m_out[0], &m_out[96 * 256], &m_out[2 * 96 * 256]};
        const uint32_t stride[3] = {256, 256, 256};
        const QZ_IMAGEPROC_FRAME_PARAMS frame = {12, 0, 0};
        return QZ_IMAGEPROC_ProcessFrame(handle, src, stride, dst, stride, &frame);
    }
    bool FromRgbToPlanes() const {
        return GetParam() == 768 || GetParam() == 1280 || GetParam() == 2304;
    }

  private:
    std::vector<uint8_t> m_in;
    std::vector<uint8_t> m_out;
};

TEST_P(FrameMemory, AFrameTakesNoneButTemporaryPlanesOfRgbSources) {
    for (uint32_t rotation = 0; rotation <= 5; ++rotation) {
        for (const uint32_t outWidth : {16u, 24u, 32u, 40u}) {
            QZ_IMAGEPROC_INIT_PARAMS params =
                Params(GetParam(), 16, 12, outWidth, outWidth == 16 ? 12 : 24);
            params.u32RotationType = rotation;
            testkit::StdoutCapture capture;
            const imageproc_test::Processor p(params);
            if (GetParam() == 10 && (rotation != 0 || outWidth != 16)) continue;
            ASSERT_EQ(p.result, S_OK);
            CountedHeap heap;
            EXPECT_EQ(Run(p.handle()), S_OK);
            EXPECT_EQ(heap.live(), 0);
            if (!FromRgbToPlanes()) {
                EXPECT_EQ(heap.allocations(), 0) << rotation << ' ' << outWidth;
                continue;
            }
            ASSERT_EQ(heap.allocations(), 3) << "also when they are not used";
            EXPECT_EQ(heap.size(0), 16u * 12);
            EXPECT_EQ(heap.size(1), 16u * 12 / 4);
            EXPECT_EQ(heap.size(2), 16u * 12 / 4);
        }
    }
}

INSTANTIATE_TEST_SUITE_P(EveryConversion, FrameMemory,
                         testing::Values(0, 3, 4, 5, 6, 7, 8, 10, 259, 515, 516, 517, 768, 771, 773,
                                         1027, 1028, 1280, 2048, 2051, 2304),
                         testing::PrintToStringParamName());

class FrameWithoutMemory : public FrameMemory {};

TEST_P(FrameWithoutMemory, EachTemporaryPlaneMayFailAndNothingIsKept) {
    for (uint32_t rotation = 0; rotation <= 5; ++rotation) {
        QZ_IMAGEPROC_INIT_PARAMS params = Params(GetParam(), 16, 16, 16, 16);
        params.u32RotationType = rotation;
        const imageproc_test::Processor p(params);
        ASSERT_EQ(p.result, S_OK);
        for (int failing = 0; failing < 3; ++failing) {
            CountedHeap heap(failing);
            EXPECT_EQ(Run(p.handle()), E_OUTOFMEMORY);
            EXPECT_EQ(heap.live(), 0);
        }
        EXPECT_EQ(Run(p.handle()), S_OK);
    }
}

INSTANTIATE_TEST_SUITE_P(RgbSources, FrameWithoutMemory, testing::Values(768, 1280, 2304),
                         testing::PrintToStringParamName());

}  // namespace
