// The exported line operations: what each has of its own, and the rest by the back end in use.

#include <cstring>

#include "kernels/deint_backend.h"
#include "kernels/deinterlace.h"

namespace vidshow {
namespace {

/// True if the destination begins shortly behind a source, so that a long step would read what a
/// shorter one has written already.
bool RunsInto(const uint8_t* dst, const uint8_t* source) {
    constexpr uintptr_t kLongestStep = 64;
    const uintptr_t behind = reinterpret_cast<uintptr_t>(dst) - reinterpret_cast<uintptr_t>(source);
    return behind != 0 && behind < kLongestStep;
}

/// Averages step by step: a step reads its bytes, then it writes.
void AverageStepwise(uint8_t* dst, const uint8_t* a, const uint8_t* b, int32_t count,
                     int32_t step) {
    for (int32_t i = 0; i < count; i += step) {
        const int32_t bytes = count - i < step ? count - i : step;
        uint8_t out[16];
        for (int32_t k = 0; k < bytes; ++k)
            out[k] = static_cast<uint8_t>((a[i + k] + b[i + k]) >> 1);
        std::memcpy(dst + i, out, static_cast<size_t>(bytes));
    }
}

int32_t Merge(uint8_t* dst, const uint8_t* a, const uint8_t* b, int32_t count, int32_t step) {
    if (count <= 0) return 0;
    if (RunsInto(dst, a) || RunsInto(dst, b)) {
        AverageStepwise(dst, a, b, count, step);
    } else {
        ActiveDeintBackend().average(dst, a, b, count);
    }
    return 0;
}

/// Bytes of whole groups, at least one.
int32_t WholeGroups(int32_t size) {
    return size < kFilterGroup ? kFilterGroup : size / kFilterGroup * kFilterGroup;
}

}  // namespace
}  // namespace vidshow

using namespace vidshow;

extern "C" {

int32_t MergeGeneric(uint8_t* dst, const uint8_t* a, const uint8_t* b, int32_t count) {
    return Merge(dst, a, b, count, 8);
}

// Sixteen bytes a step while the count falls by eight: clients rely on the spill.
int32_t MergeNeon(uint8_t* dst, const uint8_t* a, const uint8_t* b, int32_t count) {
    return Merge(dst, a, b, (count + 7) / 8 * 16, 16);
}

int32_t deinterlace_line(uint8_t* dst, const uint8_t* a, const uint8_t* b, const uint8_t* c,
                         const uint8_t* d, const uint8_t* e, int32_t size) {
    ActiveDeintBackend().filter(dst, a, b, c, d, e, WholeGroups(size));
    return 0;
}

int32_t deinterlace_line_inplace(uint8_t* buf, const uint8_t* b, uint8_t* c, const uint8_t* d,
                                 const uint8_t* e, int32_t size) {
    ActiveDeintBackend().filterInPlace(buf, b, c, d, e, WholeGroups(size));
    return 0;
}

}  // extern "C"
