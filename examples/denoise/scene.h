// The demo's built-in test scene and the measures it reports.
#ifndef NAX_EXAMPLES_SCENE_H
#define NAX_EXAMPLES_SCENE_H

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <vector>

#include "image_io.h"

namespace demo {

/// An RGB scene of smooth gradients, sharp-edged shapes and fine stripes, as floats in [0, 255].
inline std::vector<float> MakeScene(int width, int height) {
  std::vector<float> rgb(static_cast<size_t>(width) * height * 3);
  const float cx = 0.68f * width, cy = 0.35f * height, radius = 0.18f * std::min(width, height);
  for (int y = 0; y < height; ++y) {
    for (int x = 0; x < width; ++x) {
      const float u = float(x) / width, v = float(y) / height;
      float r = 40 + 160 * u, g = 60 + 120 * v, b = 200 - 150 * u * v;  // smooth gradients
      if (x > width / 10 && x < width * 4 / 10 && y > height / 8 && y < height / 2) {  // a dark box
        r = 30, g = 30, b = 90;
      }
      const float dx = x - cx, dy = y - cy;
      if (dx * dx + dy * dy < radius * radius) r = 235, g = 200, b = 40;  // a bright disc
      if (y > height * 6 / 10 && y < height * 9 / 10) {  // stripes whose period shrinks to the right
        const float period = 16.0f - 12.0f * u;
        const float stripe = std::fmod(float(x), period) < period / 2 ? 1.0f : 0.0f;
        r = g = b = 50 + 160 * stripe;
      }
      float* p = &rgb[(static_cast<size_t>(y) * width + x) * 3];
      p[0] = r, p[1] = g, p[2] = b;
    }
  }
  return rgb;
}

/// Rounds and clamps float samples into an 8-bit image.
inline Image ToImage(int width, int height, int channels, const std::vector<float>& samples) {
  Image image{width, height, channels, std::vector<std::uint8_t>(samples.size())};
  for (size_t i = 0; i < samples.size(); ++i)
    image.pixels[i] = static_cast<std::uint8_t>(std::clamp(std::lround(samples[i]), 0L, 255L));
  return image;
}

/// Peak signal-to-noise ratio in dB of a against the reference, for 8-bit data.
template <typename A, typename B>
double Psnr(const std::vector<A>& reference, const std::vector<B>& a) {
  double sum = 0;
  for (size_t i = 0; i < reference.size(); ++i) {
    const double d = double(reference[i]) - double(a[i]);
    sum += d * d;
  }
  const double mse = sum / double(reference.size());
  return mse == 0 ? 99.0 : 10.0 * std::log10(255.0 * 255.0 / mse);
}

/// Places images side by side, separated by a white bar, into one RGB image.
inline Image SideBySide(const std::vector<const Image*>& parts) {
  const int gap = 4;
  Image out;
  out.height = 0;
  out.width = -gap;
  for (const Image* p : parts) {
    out.width += p->width + gap;
    out.height = std::max(out.height, p->height);
  }
  out.channels = 3;
  out.pixels.assign(static_cast<size_t>(out.width) * out.height * 3, 255);
  int left = 0;
  for (const Image* p : parts) {
    for (int y = 0; y < p->height; ++y)
      for (int x = 0; x < p->width; ++x)
        for (int c = 0; c < 3; ++c)
          out.pixels[(static_cast<size_t>(y) * out.width + left + x) * 3 + c] =
              p->pixels[(static_cast<size_t>(y) * p->width + x) * p->channels + (p->channels == 3 ? c : 0)];
    left += p->width + gap;
  }
  return out;
}

}  // namespace demo

#endif  // NAX_EXAMPLES_SCENE_H
