// nax-denoise: wavelet denoising of 8-bit grey or RGB images with CNaxWaveletDecomposition.
//
// With no arguments it runs the built-in demonstration: a synthetic scene with Gaussian
// noise of known sigma, denoised by several threshold methods, with a table of the results
// and the images written to the current directory.
#include <nax/nax.h>

#include <chrono>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <string>
#include <vector>

#include "image_io.h"
#include "scene.h"

namespace {

using Clock = std::chrono::steady_clock;

const char* const kWaveletNames[] = {"1_1", "1_3", "1_5", "2_2", "2_4", "2_6",
                                     "3_1", "3_3", "3_5", "4_2", "4_4", "4_6"};

struct MethodName {
  const char* name;
  naxWaveletDenoising method;
  const char* label;
};

const MethodName kMethods[] = {
    {"given", naxDenoisingByGivenThresholds, "given threshold"},
    {"universal", naxDenoisingUniversal, "universal"},
    {"levels", naxDenoisingUniversalByLevels, "universal by levels"},
    {"band-deviation", naxDenoisingByBandDeviation, "band deviation"},
    {"band-signal", naxDenoisingByBandSignal, "band signal"},
    {"neighbours", naxDenoisingByBandSignalAndNeighbours, "band signal + neighbours"},
};

struct Options {
  std::string input, output;
  naxWaveletType wavelet = naxWavelet2_2;
  int depth = 0;  // 0: the largest the image allows
  naxWaveletDenoising method = naxDenoisingUniversal;
  float threshold = -1, ratio = 1;
  int soft = 1;
  int shifts = 0;
};

struct Result {
  std::vector<float> samples;
  float sigma = 0, threshold = 0;  // of plane 0
  double seconds = 0;
};

const char kUsage[] =
    "usage: nax-denoise [IN OUT [options]]\n"
    "\n"
    "Denoises an 8-bit grey or RGB image (PNG, binary PGM or PPM) by thresholding its wavelet\n"
    "decomposition, and writes the result to OUT (PNG, or PGM/PPM by extension). The input file\n"
    "is never modified. Without arguments, runs the built-in demonstration.\n"
    "\n"
    "options:\n"
    "  --wavelet W     filter: 1_1 1_3 1_5 2_2 2_4 2_6 3_1 3_3 3_5 4_2 4_4 4_6 (default 2_2)\n"
    "  --depth N       levels of decomposition, 1 or more (default: the largest possible)\n"
    "  --method M      threshold rule: universal (default), levels, band-deviation,\n"
    "                  band-signal, neighbours, or given (needs --threshold)\n"
    "  --threshold T   first-level threshold for --method given, in grey levels\n"
    "  --ratio R       factor applied to the threshold on each further level (default 1)\n"
    "  --soft          soft shrinkage: coefficients above the threshold shrink (default)\n"
    "  --hard          hard shrinkage: coefficients above the threshold stay\n"
    "  --shifts N      cycle spinning: average over N random circular shifts (default 0)\n"
    "  --help          this text\n";

[[noreturn]] void Fail(int code, const std::string& message) {
  std::fprintf(stderr, "nax-denoise: %s\n", message.c_str());
  if (code == 2) std::fprintf(stderr, "Try 'nax-denoise --help'.\n");
  std::exit(code);
}

int ParseInt(const std::string& option, const char* text, int low, int high) {
  char* end = nullptr;
  const long value = std::strtol(text, &end, 10);
  if (*text == '\0' || *end != '\0' || value < low || value > high)
    Fail(2, option + " expects an integer from " + std::to_string(low) + " to " + std::to_string(high) +
                ", not '" + text + "'");
  return static_cast<int>(value);
}

float ParseFloat(const std::string& option, const char* text) {
  char* end = nullptr;
  const float value = std::strtof(text, &end);
  if (*text == '\0' || *end != '\0' || !(value >= 0))
    Fail(2, option + " expects a non-negative number, not '" + text + "'");
  return value;
}

Options ParseOptions(int argc, char** argv) {
  Options options;
  std::vector<std::string> files;
  for (int i = 1; i < argc; ++i) {
    const std::string arg = argv[i];
    auto value = [&]() -> const char* {
      if (i + 1 >= argc) Fail(2, "option " + arg + " needs a value");
      return argv[++i];
    };
    if (arg == "--help" || arg == "-h") {
      std::fputs(kUsage, stdout);
      std::exit(0);
    } else if (arg == "--wavelet") {
      const std::string name = value();
      int found = -1;
      for (int k = 0; k < 12; ++k)
        if (name == kWaveletNames[k]) found = k;
      if (found < 0) Fail(2, "unknown wavelet '" + name + "'");
      options.wavelet = static_cast<naxWaveletType>(found);
    } else if (arg == "--depth") {
      options.depth = ParseInt(arg, value(), 1, 30);
    } else if (arg == "--method") {
      const std::string name = value();
      bool found = false;
      for (const MethodName& m : kMethods)
        if (name == m.name) options.method = m.method, found = true;
      if (!found) Fail(2, "unknown method '" + name + "'");
    } else if (arg == "--threshold") {
      options.threshold = ParseFloat(arg, value());
    } else if (arg == "--ratio") {
      options.ratio = ParseFloat(arg, value());
    } else if (arg == "--soft" || arg == "--hard") {
      options.soft = arg == "--soft";
    } else if (arg == "--shifts") {
      options.shifts = ParseInt(arg, value(), 0, 1000);
    } else if (arg.size() > 1 && arg[0] == '-') {
      Fail(2, "unknown option '" + arg + "'");
    } else {
      files.push_back(arg);
    }
  }
  if (files.size() != 2) Fail(2, "expected an input and an output file");
  options.input = files[0];
  options.output = files[1];
  if (options.method == naxDenoisingByGivenThresholds && options.threshold < 0)
    Fail(2, "--method given needs --threshold");
  if (options.method != naxDenoisingByGivenThresholds && options.threshold >= 0)
    Fail(2, "--threshold applies to --method given only");
  return options;
}

float EstimateSigma(int width, int height, int channels, const std::vector<float>& samples,
                    naxWaveletType wavelet) {
  CNaxWaveletDecomposition<float> image(wavelet);
  image.SetDecompositionTypes(wavelet, naxNormalizationBySecondNorms);
  image.SetImage(width, height, channels, samples.data());
  CNaxWaveletDecomposition<float>* decomposed = image.FWT(1, naxChannel2D);
  const float sigma = (*decomposed)[0]->EstimateNoise();
  delete decomposed;
  return sigma;
}

// Denoises an image of float samples (pixel-interleaved) and reports plane 0's figures.
Result Denoise(int width, int height, int channels, const std::vector<float>& samples,
               const Options& options, bool showProgress) {
  const auto start = Clock::now();
  CNaxWaveletDecomposition<float> image(options.wavelet);
  image.SetDecompositionTypes(options.wavelet, naxNormalizationBySecondNorms);
  image.SetImage(width, height, channels, samples.data());
  std::vector<float> first(channels, options.method == naxDenoisingByGivenThresholds ? options.threshold : 0.0f);
  std::vector<float> ratios(channels, options.method == naxDenoisingByGivenThresholds ? options.ratio : 0.0f);
  const int maxDepth = naxCalculateMaximumDepth(std::min(width, height));
  const int depth = options.depth > 0 ? std::min(options.depth, maxDepth) : maxDepth;

  Result result;
  result.samples.resize(samples.size());
  if (options.shifts > 0) {
    // Cycle spinning plane by plane, so that long runs can show their progress.
    if (showProgress) std::printf("    cycle spinning with %d shifts: plane", options.shifts);
    for (int c = 0; c < channels; ++c) {
      CNaxChannel<float>* plane = image[c];
      CNaxChannel<float>* cleaned = plane->CleanWithCircularShifts(
          first[c], ratios[c], options.shifts, image.GetFilter(), depth, options.soft, options.method);
      image.SetChannel(cleaned, c);
      delete cleaned;
      if (showProgress) {
        std::printf(" %d/%d", c + 1, channels);
        std::fflush(stdout);
      }
    }
    if (showProgress) std::printf(" done\n");
    image.GetImageInPixelForm(result.samples.data());
  } else {
    CNaxWaveletDecomposition<float>* decomposed = image.FWT(depth, naxChannel2D);
    if (decomposed == nullptr || depth < 1) Fail(1, "the image is too small to decompose");
    decomposed->ReduceNoise(first.data(), ratios.data(), options.soft, options.method);
    decomposed->GetImageInPixelForm(result.samples.data());
    delete decomposed;
  }
  result.seconds = std::chrono::duration<double>(Clock::now() - start).count();
  result.threshold = first[0];  // for the band rules, the mean over the first level's bands
  if (options.method == naxDenoisingUniversal || options.method == naxDenoisingUniversalByLevels) {
    // The universal rules don't report their threshold: it is sigma sqrt(2 ln N), divided
    // by sqrt(2^(depth - 1)) on the first level of the rule by levels.
    result.sigma = EstimateSigma(width, height, channels, samples, options.wavelet);
    result.threshold = result.sigma * std::sqrt(2.0f * std::log(float(width) * float(height)));
    if (options.method == naxDenoisingUniversalByLevels) result.threshold /= std::sqrt(std::pow(2.0f, depth - 1.0f));
  }
  return result;
}

void Save(const std::string& path, const demo::Image& image) {
  std::string error;
  if (!demo::WriteImage(path, image, error)) Fail(1, error);
}

int RunDemo() {
  const int width = 512, height = 512, channels = 3;
  const float sigma = 20;
  const std::vector<float> clean = demo::MakeScene(width, height);
  std::vector<float> noisy(clean.size());
  CNaxRandom<float> random;
  random.SetAlgorithm(naxRandomAlgorithmXorshift32);
  random.SetXorshift32Seed(2026);
  random.SetNormal(0, sigma);
  random.Initialize();
  random.GetArrayNumbers(static_cast<int32>(noisy.size()), noisy.data());
  for (size_t i = 0; i < noisy.size(); ++i) noisy[i] += clean[i];

  const demo::Image cleanImage = demo::ToImage(width, height, channels, clean);
  const demo::Image noisyImage = demo::ToImage(width, height, channels, noisy);
  const std::string ext = demo::PngSupported() ? ".png" : ".ppm";
  Save("scene-clean" + ext, cleanImage);
  Save("scene-noisy" + ext, noisyImage);

  std::printf("nax-denoise demo: a %dx%d RGB scene with Gaussian noise of sigma %.0f\n", width, height, sigma);
  std::printf("(smooth gradients, sharp edges, fine stripes); wavelet 2_2, maximum depth.\n\n");
  std::printf("%-34s %10s %10s %11s %11s %9s\n", "method", "est.sigma", "threshold", "PSNR in", "PSNR out",
              "time");
  const double psnrNoisy = demo::Psnr(cleanImage.pixels, noisyImage.pixels);
  const float estimated = EstimateSigma(width, height, channels, noisy, naxWavelet2_2);

  struct Run {
    const char* label;
    const char* file;
    naxWaveletDenoising method;
    int soft, shifts;
    naxWaveletType wavelet;
  };
  const Run runs[] = {
      {"universal, soft", "universal-soft", naxDenoisingUniversal, 1, 0, naxWavelet2_2},
      {"universal, hard", "universal-hard", naxDenoisingUniversal, 0, 0, naxWavelet2_2},
      {"universal by levels, soft", "levels-soft", naxDenoisingUniversalByLevels, 1, 0, naxWavelet2_2},
      {"band deviation, soft", "band-deviation", naxDenoisingByBandDeviation, 1, 0, naxWavelet2_2},
      {"band signal, soft", "band-signal", naxDenoisingByBandSignal, 1, 0, naxWavelet2_2},
      {"band signal + neighbours, soft", "neighbours", naxDenoisingByBandSignalAndNeighbours, 1, 0,
       naxWavelet2_2},
      {"band signal, soft, wavelet 4_4", "band-signal-4_4", naxDenoisingByBandSignal, 1, 0, naxWavelet4_4},
      {"band signal, soft, 16 shifts", "band-signal-shifts", naxDenoisingByBandSignal, 1, 16, naxWavelet2_2},
  };
  double bestPsnr = 0;
  demo::Image best;
  std::string bestLabel;
  for (const Run& run : runs) {
    Options options;
    options.method = run.method;
    options.soft = run.soft;
    options.shifts = run.shifts;
    options.wavelet = run.wavelet;
    const Result result = Denoise(width, height, channels, noisy, options, true);
    const demo::Image out = demo::ToImage(width, height, channels, result.samples);
    const double psnr = demo::Psnr(cleanImage.pixels, out.pixels);
    std::printf("%-34s %10.2f %10.2f %8.2f dB %8.2f dB %6.0f ms\n", run.label, estimated, result.threshold,
                psnrNoisy, psnr, result.seconds * 1000);
    Save(std::string("scene-denoised-") + run.file + ext, out);
    if (psnr > bestPsnr) bestPsnr = psnr, best = out, bestLabel = run.label;
  }
  Save("scene-comparison" + ext, demo::SideBySide({&cleanImage, &noisyImage, &best}));
  std::printf("\nest.sigma is the noise estimate of the red plane in the normalized finest band; threshold\n");
  std::printf("is the red plane's first-level threshold (the mean over its bands for the band rules).\n");
  std::printf("Wrote scene-clean, scene-noisy, scene-denoised-* and scene-comparison%s (clean | noisy |\n",
              ext.c_str());
  std::printf("best: %s) to %s\n", bestLabel.c_str(), std::filesystem::current_path().c_str());
  return 0;
}

int RunOnFile(const Options& options) {
  std::error_code ec;
  if (std::filesystem::exists(options.output, ec) && std::filesystem::equivalent(options.input, options.output, ec))
    Fail(1, "the output would overwrite the input '" + options.input + "'");
  demo::Image input;
  std::string error;
  if (!demo::ReadImage(options.input, input, error)) Fail(1, error);
  std::vector<float> samples(input.pixels.begin(), input.pixels.end());
  if (std::min(input.width, input.height) < 2) Fail(1, options.input + ": the image is too small to denoise");
  const Result result = Denoise(input.width, input.height, input.channels, samples, options, options.shifts > 0);
  Save(options.output, demo::ToImage(input.width, input.height, input.channels, result.samples));
  std::printf("%s: %dx%d, %d channel%s, first-level threshold %.2f, %.0f ms -> %s\n", options.input.c_str(),
              input.width, input.height, input.channels, input.channels > 1 ? "s" : "", result.threshold,
              result.seconds * 1000, options.output.c_str());
  return 0;
}

}  // namespace

int main(int argc, char** argv) {
  if (argc == 1) return RunDemo();
  return RunOnFile(ParseOptions(argc, argv));
}
