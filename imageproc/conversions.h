#pragma once

#include <cstddef>

#include "imageproc/pipeline.h"

namespace vidshow {

/// One way to run a conversion. The conditions are sets: bit n stands for value n.
struct Row {
    uint32_t rotations;
    uint32_t cases;
    uint32_t algorithms;
    uint32_t adjust;
    int32_t (*run)(const FrameJob& f);
    const char* name;  ///< `run`, as the table writes it
};

/// A condition that every value meets.
constexpr uint32_t kAny = 0xFFFFFFFF;

/// A look-up in the vector kernel table, with the first argument that the conversion gives it.
struct Lookup {
    void* (*find)(uint32_t key, uint32_t m, uint32_t r);
    uint32_t key;

    void* operator()(const QZ_IMAGEPROC_PARAMSET& p) const {
        return find ? find(key, p.u32ColorMatrix, p.u32FullRange) : nullptr;
    }
};

/// A conversion that exists: its two entries of the vector kernel table, if any, and its rows.
struct Conversion {
    template <size_t n>
    constexpr Conversion(uint32_t conversion, Lookup main, Lookup line, const Row (&table)[n])
        : code(conversion), mainKernel(main), lineKernel(line), rows(table), rowCount(n) {}

    uint32_t code;
    Lookup mainKernel;
    Lookup lineKernel;
    const Row* rows;
    size_t rowCount;
};

/// @return null when the conversion does not exist
const Conversion* FindConversion(uint32_t code);

/// The first row whose conditions hold. @return null when there is none
const Row* ChooseRow(const Conversion& conversion, const QZ_IMAGEPROC_PARAMSET& p);

}  // namespace vidshow
