#include "bench/deinterlace_clips.h"

#include <algorithm>
#include <cmath>
#include <cstring>
#include <random>

namespace bench {
namespace {

constexpr int kWidth = 640, kHeight = 480, kFrames = 40;
constexpr double kPi = 3.14159265358979323846;

// Capital letters, five columns of seven dots each, the top one in the lowest bit.
constexpr uint8_t kLetters[26][5] = {
    {0x7e, 0x11, 0x11, 0x11, 0x7e}, {0x7f, 0x49, 0x49, 0x49, 0x36}, {0x3e, 0x41, 0x41, 0x41, 0x22},
    {0x7f, 0x41, 0x41, 0x22, 0x1c}, {0x7f, 0x49, 0x49, 0x49, 0x41}, {0x7f, 0x09, 0x09, 0x09, 0x01},
    {0x3e, 0x41, 0x49, 0x49, 0x7a}, {0x7f, 0x08, 0x08, 0x08, 0x7f}, {0x00, 0x41, 0x7f, 0x41, 0x00},
    {0x20, 0x40, 0x41, 0x3f, 0x01}, {0x7f, 0x08, 0x14, 0x22, 0x41}, {0x7f, 0x40, 0x40, 0x40, 0x40},
    {0x7f, 0x02, 0x0c, 0x02, 0x7f}, {0x7f, 0x04, 0x08, 0x10, 0x7f}, {0x3e, 0x41, 0x41, 0x41, 0x3e},
    {0x7f, 0x09, 0x09, 0x09, 0x06}, {0x3e, 0x41, 0x51, 0x21, 0x5e}, {0x7f, 0x09, 0x19, 0x29, 0x46},
    {0x46, 0x49, 0x49, 0x49, 0x31}, {0x01, 0x01, 0x7f, 0x01, 0x01}, {0x3f, 0x40, 0x40, 0x40, 0x3f},
    {0x1f, 0x20, 0x40, 0x20, 0x1f}, {0x3f, 0x40, 0x38, 0x40, 0x3f}, {0x63, 0x14, 0x08, 0x14, 0x63},
    {0x07, 0x08, 0x70, 0x08, 0x07}, {0x61, 0x51, 0x49, 0x45, 0x43},
};

/// The page is drawn four times as large, and every frame is a window of it made smaller.
constexpr int kOver = 4;
constexpr int kPageWidth = (kWidth + 40) * kOver, kPageHeight = (kHeight + 20) * kOver;

void FillRectangle(Plane& page, double x, double y, double size, uint8_t level) {
    const int left = static_cast<int>(std::lround(x * kOver)),
              top = static_cast<int>(std::lround(y * kOver));
    const int right = static_cast<int>(std::lround((x + size) * kOver)),
              bottom = static_cast<int>(std::lround((y + size) * kOver));
    for (int row = top; row < std::min(bottom, page.h); ++row)
        std::fill(page.line(row) + left, page.line(row) + std::min(right, page.w), level);
}

void DrawLetter(Plane& page, int letter, double x, double y, double dot) {
    for (int column = 0; column < 5; ++column) {
        for (int row = 0; row < 7; ++row) {
            if (kLetters[letter][column] >> row & 1)
                FillRectangle(page, x + column * dot, y + row * dot, dot, 30);
        }
    }
}

/// Letters of 10 to 18 lines, in the left half.
void DrawPrint(Plane& page) {
    std::mt19937 random(7);
    double y = 4;
    for (int line = 0; y < kPageHeight / kOver; ++line) {
        const double dot = 1.5 + 0.25 * (line % 5);
        for (double x = 6; x < kPageWidth / kOver * 0.55; x += 6 * dot) {
            const int letter = static_cast<int>(random() % 30);
            if (letter < 26) DrawLetter(page, letter, x, y, dot);
        }
        y += 10 * dot;
    }
}

/// Lines of many slopes out of one point, in the right half.
void DrawFan(Plane& page) {
    constexpr double kX = kPageWidth * 0.78, kY = kPageHeight * 0.5;
    for (int k = 0; k < 14; ++k) {
        const double angle = (k * 13 - 88) * kPi / 180, c = std::cos(angle), s = std::sin(angle);
        const double thickness = (0.8 + 0.15 * (k % 6)) * kOver;
        for (int y = 0; y < page.h; ++y) {
            for (int x = static_cast<int>(kPageWidth * 0.57); x < page.w; ++x) {
                const double dx = x - kX, dy = y - kY;
                const bool near = std::fabs(dx * s - dy * c) < thickness;
                if (near && dx * c + dy * s > 30 * kOver) page.line(y)[x] = k % 2 ? 40 : 120;
            }
        }
    }
}

Plane Window(const Plane& page, int left, int top) {
    Plane frame(kWidth, kHeight);
    for (int y = 0; y < kHeight; ++y) {
        for (int x = 0; x < kWidth; ++x) {
            int sum = 0;
            for (int i = 0; i < kOver * kOver; ++i)
                sum += page.line(y * kOver + top + i / kOver)[x * kOver + left + i % kOver];
            frame.line(y)[x] = static_cast<uint8_t>((sum + 8) / 16);
        }
    }
    return frame;
}

using Field = std::vector<double>;

/// Every value becomes the mean of those around it; the edges go on at the other side.
Field Smoothed(const Field& in, int w, int h, int radius) {
    Field out(in.size());
    const double count = (2 * radius + 1) * (2 * radius + 1);
    for (int y = 0; y < h; ++y) {
        for (int x = 0; x < w; ++x) {
            double sum = 0;
            for (int j = -radius; j <= radius; ++j) {
                for (int i = -radius; i <= radius; ++i)
                    sum += in[static_cast<size_t>((y + j + h) % h * w + (x + i + w) % w)];
            }
            out[static_cast<size_t>(y * w + x)] = sum / count;
        }
    }
    return out;
}

/// A rough surface: noise, smoothed twice, around `level`, its deviation `contrast`.
Plane Texture(int w, int h, double level, double contrast, int radius, uint32_t seed) {
    std::mt19937 random(seed);
    Field noise(static_cast<size_t>(w * h));
    for (double& value : noise)
        value = static_cast<double>(random() % 65536) / 32768 - 1;
    noise = Smoothed(Smoothed(noise, w, h, radius), w, h, radius);
    double squares = 0;
    for (const double value : noise)
        squares += value * value;
    const double scale = contrast / std::sqrt(squares / static_cast<double>(noise.size()));
    Plane texture(w, h);
    for (size_t i = 0; i < noise.size(); ++i)
        texture.bytes[i] = static_cast<uint8_t>(std::clamp(level + noise[i] * scale, 0.0, 255.0));
    return texture;
}

void Mix(uint8_t& sample, double level, double share) {
    const double part = std::clamp(share, 0.0, 1.0);
    sample = static_cast<uint8_t>(std::lround(part * level + (1 - part) * sample));
}

struct Disc {
    double from, speed;  // of its centre, samples and samples a frame
    double y, radius;
    int level;  // -1: textured
};

void DrawDisc(Plane& frame, const Disc& disc, const Plane& texture, int t) {
    const double range = kWidth + 200;
    const double x0 = std::fmod(std::fmod(disc.from + disc.speed * t, range) + range, range) - 100;
    for (int y = 0; y < frame.h; ++y) {
        for (int x = 0; x < frame.w; ++x) {
            const double share = disc.radius - std::hypot(x - x0, y - disc.y) + 0.5;
            if (share <= 0) continue;
            const int column = (x - static_cast<int>(x0) + 4 * texture.w) % texture.w;
            Mix(frame.line(y)[x], disc.level < 0 ? texture.line(y)[column] : disc.level, share);
        }
    }
}

void DrawBar(Plane& frame, int t) {
    const double x0 = std::fmod(100 + 15.0 * t, kWidth + 300) - 150;
    for (int y = 0; y < frame.h; ++y) {
        for (int x = 0; x < frame.w; ++x)
            Mix(frame.line(y)[x], 245, 7.5 - std::fabs((x - x0) * 0.8 + (y - kHeight / 2) * 0.6));
    }
}

}  // namespace

Plane Clip::woven(int picture) const {
    Plane result = truth(picture);
    for (int y = 1; y < result.h; y += 2)
        std::memcpy(result.line(y), other(picture).line(y), static_cast<size_t>(result.w));
    return result;
}

Clip SlowPan() {
    Plane page(kPageWidth, kPageHeight, 210);
    DrawPrint(page);
    DrawFan(page);
    Clip clip = {"slow pan", {}};
    for (int t = 0; t < kFrames; ++t)
        clip.frames.push_back(Window(page, 3 * t, t));
    return clip;
}

Clip FastMotion() {
    constexpr int kBackground = 4;  // samples a frame
    const Plane background = Texture(kWidth + kBackground * kFrames, kHeight, 110, 30, 2, 11);
    const Plane surface = Texture(kWidth, kHeight, 150, 40, 2, 12);
    constexpr Disc kDiscs[] = {
        {60, 13, 120, 70, 235}, {700, -17, 250, 90, -1}, {300, 9, 390, 60, 128}};
    Clip clip = {"fast motion", {}};
    for (int t = 0; t < kFrames; ++t) {
        Plane frame(kWidth, kHeight);
        for (int y = 0; y < kHeight; ++y)
            std::memcpy(frame.line(y), background.line(y) + kBackground * t, kWidth);
        for (const Disc& disc : kDiscs)
            DrawDisc(frame, disc, surface, t);
        DrawBar(frame, t);
        clip.frames.push_back(frame);
    }
    return clip;
}

}  // namespace bench
