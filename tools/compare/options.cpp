#include "compare/options.h"

#include "common/command_line.h"

namespace vidshow::tools {

namespace {

constexpr int64_t kFarthest = 1'000'000;

const ProgramText kText = {
    "vidshow-compare",
    VIDSHOW_COMPARE_VERSION,
    "Tells how far two clips or pictures are from each other, component by component",
    {{"Measures",
      "Frame n of A is held against frame n of B, sample by sample; sizes, components, their "
      "resolution and their depth must agree, how they lie in memory need not (nv12 compares with "
      "yuv420p).\n\n"
      "MSE is the mean squared difference of all samples of all frames; PSNR = 10 log10(peak^2 / "
      "MSE) in dB, peak = 2^depth - 1, and the line \"all\" counts every sample of every "
      "component alike.\n\n"
      "SSIM is that of Wang, Bovik, Sheikh and Simoncelli (2004): windows of 11 x 11 samples with "
      "Gaussian weights of deviation 1.5, K1 = 0.01, K2 = 0.03, the mean over every place where "
      "the whole window is in the picture, without scaling down first, and then over the frames. "
      "A component of less than 11 samples across or down has none."},
     {"Difference picture",
      "Of the frame with the largest squared difference (the first of equals): the absolute "
      "differences in eight bits, times the gain, at most 255; of RGB in their own channels, else "
      "of Cr in red, Y in green and Cb in blue, chroma repeated for its pixels; Y alone as grey."},
     {"Exit status",
      "0 compared, whatever the result; 1 cannot be compared, read or written; 2 wrong use; 3 one "
      "ends before the other, is cut off or damaged, and what both have was compared."}}};

}  // namespace

std::optional<int> readOptions(int argc, char** argv, Options* options) {
    CommandLine line(kText);
    CLI::App& app = line.options();
    app.add_option("A", options->clips[0], "any file that FFmpeg reads")->required();
    app.add_option("B", options->clips[1], "another")->required();
    app.add_option("--difference", options->difference, "write a picture (PNG) of what differs")
        ->type_name("FILE");
    app.add_option("--gain", options->gain, "of the difference picture; 8 if not given")
        ->check(CLI::Range(1, 255))
        ->type_name("N");
    app.add_option("--offset", options->offset,
                   "leave out so many frames at the beginning of B, or of A for a negative number")
        ->check(CLI::Range(-kFarthest, kFarthest))
        ->type_name("N");
    declareFrames(&app, &options->frames);
    app.add_flag("--json", options->json, "tell the result as one JSON object");
    return line.read(argc, argv);
}

}  // namespace vidshow::tools
