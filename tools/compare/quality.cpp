#include "compare/quality.h"

#include <array>
#include <cmath>
#include <limits>

namespace vidshow::tools {

namespace {

constexpr int kWindow = 11;
constexpr double kDeviation = 1.5;

using Weights = std::array<double, kWindow>;

// One row of the window's weights; the window is the product of two, and sums to 1.
Weights gaussian() {
    Weights weights;
    double sum = 0;
    for (int i = 0; i < kWindow; ++i) {
        const double distance = i - kWindow / 2;
        weights[static_cast<size_t>(i)] =
            std::exp(-distance * distance / (2 * kDeviation * kDeviation));
        sum += weights[static_cast<size_t>(i)];
    }
    for (double& weight : weights)
        weight /= sum;
    return weights;
}

// Weighted sums over a window.
struct Moments {
    double a = 0;
    double b = 0;
    double aa = 0;
    double bb = 0;
    double ab = 0;

    void add(double weight, const Moments& other) {
        a += weight * other.a;
        b += weight * other.b;
        aa += weight * other.aa;
        bb += weight * other.bb;
        ab += weight * other.ab;
    }
};

Moments momentsAt(const Samples& a, const Samples& b, int x, int y) {
    const double left = a.at(x, y);
    const double right = b.at(x, y);
    return {left, right, left * left, right * right, left * right};
}

// The windows' rows that begin at (x, y), weighted.
std::vector<Moments> rowMoments(const Samples& a, const Samples& b, int y, const Weights& weights) {
    std::vector<Moments> row(static_cast<size_t>(a.width - kWindow + 1));
    for (int x = 0; x < a.width; ++x) {
        const Moments sample = momentsAt(a, b, x, y);
        for (int i = 0; i < kWindow; ++i) {
            const int start = x - i;
            if (start < 0 || start > a.width - kWindow) continue;
            row[static_cast<size_t>(start)].add(weights[static_cast<size_t>(i)], sample);
        }
    }
    return row;
}

double similarity(const Moments& m, double c1, double c2) {
    const double varianceA = m.aa - m.a * m.a;
    const double varianceB = m.bb - m.b * m.b;
    const double covariance = m.ab - m.a * m.b;
    return (2 * m.a * m.b + c1) * (2 * covariance + c2) /
           ((m.a * m.a + m.b * m.b + c1) * (varianceA + varianceB + c2));
}

}  // namespace

double squaredError(const Samples& a, const Samples& b) {
    double sum = 0;
    for (size_t i = 0; i < a.values.size(); ++i) {
        const double difference = static_cast<double>(a.values[i]) - b.values[i];
        sum += difference * difference;
    }
    return sum;
}

double psnr(double mean, int peak) {
    if (mean == 0) return std::numeric_limits<double>::infinity();
    return 10 * std::log10(static_cast<double>(peak) * peak / mean);
}

std::optional<double> ssim(const Samples& a, const Samples& b, int peak) {
    if (a.width < kWindow || a.height < kWindow) return std::nullopt;
    const Weights weights = gaussian();
    const double c1 = 0.01 * peak * 0.01 * peak;
    const double c2 = 0.03 * peak * 0.03 * peak;
    std::array<std::vector<Moments>, kWindow> rows;  // row y at y modulo the window's height
    double sum = 0;
    for (int y = 0; y < a.height; ++y) {
        rows[static_cast<size_t>(y % kWindow)] = rowMoments(a, b, y, weights);
        if (y < kWindow - 1) continue;
        for (size_t x = 0; x < rows[0].size(); ++x) {
            Moments window;
            for (int i = 0; i < kWindow; ++i) {
                const size_t row = static_cast<size_t>((y - kWindow + 1 + i) % kWindow);
                window.add(weights[static_cast<size_t>(i)], rows[row][x]);
            }
            sum += similarity(window, c1, c2);
        }
    }
    return sum / ((a.width - kWindow + 1.0) * (a.height - kWindow + 1.0));
}

}  // namespace vidshow::tools
