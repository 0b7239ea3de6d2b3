#pragma once

// The arithmetic of the vector kernels, pixel by pixel in plain integers and in the published order
// of its steps, and the exported entries by name. Nothing here calls the library's own code.

#include <dlfcn.h>

#include <algorithm>
#include <cstdint>
#include <string>

namespace vec_model {

// Under the emulator the whole cube of samples would take minutes: every 15th there, edges
// included.
#if defined(__arm__)
constexpr int kCubeStep = 15;
#else
constexpr int kCubeStep = 1;
#endif

/// The program's own entry of that name (it exports its symbols), null if there is none.
template <class Function>
Function* Entry(const std::string& name) {
    return reinterpret_cast<Function*>(dlsym(RTLD_DEFAULT, name.c_str()));
}

inline int Sat16(int x) {
    return std::clamp(x, -32768, 32767);
}
inline int Int16(int x) {
    return static_cast<int16_t>(x);
}

struct RgbFactors {
    int gain, crR, cbG, crG, cbB, offR, offG, offB;
};
// [full range][matrix]
constexpr RgbFactors kRgbFactors[2][4] = {{{74, 102, 25, 52, 129, -14266, 8676, -17717},
                                           {74, 114, 13, 34, 135, -15878, 4920, -18497},
                                           {74, 114, 16, 34, 133, -15889, 5365, -18221},
                                           {74, 102, 24, 51, 129, -14248, 8541, -17792}},
                                          {{64, 89, 22, 45, 113, 0, 0, 0},
                                           {64, 100, 11, 29, 118, 0, 0, 0},
                                           {64, 100, 14, 30, 116, 0, 0, 0},
                                           {64, 89, 21, 45, 113, 0, 0, 0}}};

/// Channels as 16-bit numbers whose high byte is the 8-bit level.
struct Levels {
    uint32_t r, g, b;
};

inline uint32_t Level(int x) {
    return static_cast<uint32_t>(std::clamp(x * 4, 0, 65535));
}

inline Levels ToLevels(const RgbFactors& f, int y, int cb, int cr) {
    const int luma = y * f.gain;
    const int blue = Sat16(luma + Int16(f.offB + cb * f.cbB));
    const int red = Sat16(luma + Int16(f.offR + cr * f.crR));
    const int green = Sat16(Sat16(luma + Int16(f.offG - cr * f.crG)) - cb * f.cbG);
    return {Level(red), Level(green), Level(blue)};
}

/// A packed layout, read from the name of the format.
struct Layout {
    explicit Layout(const std::string& format)
        : bgr(format.find("BGR") != std::string::npos),  // also that of ABGR32
          keyed(format.find("5551") != std::string::npos),
          bytes(format.find("32") != std::string::npos    ? 4
                : format.find("888") != std::string::npos ? 3
                                                          : 2) {}
    bool bgr, keyed;
    int bytes;
};

/// The value that a pixel's bytes hold, lowest address in the lowest bits.
inline uint32_t Pack(const Layout& layout, Levels c, uint32_t extra) {
    if (layout.bgr) std::swap(c.r, c.b);
    const uint32_t r = c.r >> 8, g = c.g >> 8, b = c.b >> 8;
    if (layout.keyed) {
        const uint32_t pixel = r >> 3 << 11 | g >> 3 << 6 | b >> 3 << 1 | 1;
        return pixel == (extra & 0xFFFF) ? 0 : pixel;
    }
    if (layout.bytes == 2) return r >> 3 << 11 | g >> 2 << 5 | b >> 3;
    return b | g << 8 | r << 16 | (layout.bytes == 4 ? extra << 24 : 0);
}

inline uint32_t PackSpread(Levels c, bool bgr) {
    if (bgr) std::swap(c.r, c.b);
    return c.r >> 10 << 21 | c.g >> 10 << 10 | c.b >> 11;
}

struct YuvFactors {
    int r, g, b, cbR, cbG, cbB, crR, crG, crB, lumaOffset;
};
// [full range][matrix]
constexpr YuvFactors kYuvFactors[2][4] = {{{65, 129, 25, 38, 74, 112, 112, 94, 18, 16},
                                           {46, 157, 15, 25, 86, 112, 112, 102, 10, 16},
                                           {46, 154, 19, 26, 86, 112, 112, 100, 12, 16},
                                           {65, 129, 24, 37, 74, 112, 112, 94, 17, 16}},
                                          {{76, 150, 29, 43, 84, 128, 128, 107, 20, 0},
                                           {54, 183, 18, 29, 98, 128, 128, 116, 11, 0},
                                           {54, 179, 22, 29, 98, 128, 128, 113, 14, 0},
                                           {76, 151, 28, 43, 84, 128, 128, 107, 20, 0}}};

struct Bytes3 {
    int r, g, b;
};

inline uint8_t Narrow(int sum, int offset) {
    return static_cast<uint8_t>(std::clamp((Int16(sum) + 128) >> 8, -128, 127) + offset);
}
inline uint8_t LumaOf(const YuvFactors& f, Bytes3 p) {
    return Narrow(p.r * f.r + p.g * f.g + p.b * f.b, f.lumaOffset);
}
inline uint8_t CbOf(const YuvFactors& f, Bytes3 p) {
    return Narrow(p.b * f.cbB - p.r * f.cbR - p.g * f.cbG, 128);
}
inline uint8_t CrOf(const YuvFactors& f, Bytes3 p) {
    return Narrow(p.r * f.crR - p.g * f.crG - p.b * f.crB, 128);
}

/// The channels of a packed pixel at `p`.
inline Bytes3 Channels(const Layout& layout, const uint8_t* p) {
    if (layout.bytes == 2) {
        const int pixel = p[0] | p[1] << 8;
        return {pixel >> 8, pixel >> 3 & 0xFF, pixel << 3 & 0xFF};  // unmasked, on purpose
    }
    return layout.bgr ? Bytes3{p[0], p[1], p[2]} : Bytes3{p[2], p[1], p[0]};
}

}  // namespace vec_model
