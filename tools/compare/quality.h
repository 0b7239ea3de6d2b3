#pragma once

#include <cstdint>
#include <optional>
#include <vector>

namespace vidshow::tools {

/// The samples of one component of a picture, rows without gaps.
struct Samples {
    std::vector<uint16_t> values;
    int width = 0;
    int height = 0;

    uint16_t at(int x, int y) const {
        return values[static_cast<size_t>(y) * static_cast<size_t>(width) + static_cast<size_t>(x)];
    }
};

/// Sum of the squared differences. Both have one size.
double squaredError(const Samples& a, const Samples& b);

/// 10 log10(peak^2 / mean), in dB; infinite for a mean of 0.
/// @param mean squared difference of a sample
double psnr(double mean, int peak);

/// Structural similarity after Wang, Bovik, Sheikh and Simoncelli, "Image Quality Assessment: From
/// Error Visibility to Structural Similarity", IEEE Transactions on Image Processing 13 (4), 2004:
/// windows of 11 x 11 samples with Gaussian weights of deviation 1.5, K1 = 0.01, K2 = 0.03, the
/// mean over every place where the whole window is in the picture; nothing is scaled down first.
/// @return none where no window fits
std::optional<double> ssim(const Samples& a, const Samples& b, int peak);

}  // namespace vidshow::tools
