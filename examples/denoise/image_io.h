// Reading and writing 8-bit grey and RGB images: PNG (through libpng, when built with it)
// and binary PGM/PPM.
#ifndef NAX_EXAMPLES_IMAGE_IO_H
#define NAX_EXAMPLES_IMAGE_IO_H

#include <cstdint>
#include <string>
#include <vector>

namespace demo {

/// An 8-bit image, pixel-interleaved: sample c of pixel (x, y) is at (y * width + x) * channels + c.
struct Image {
  int width = 0;
  int height = 0;
  int channels = 0;  // 1 (grey) or 3 (RGB)
  std::vector<std::uint8_t> pixels;
};

/// True when this build can read and write PNG files.
bool PngSupported();

/// Reads a PNG, PGM (P5) or PPM (P6) file, recognised by its first bytes. On failure returns
/// false and sets error to a one-line reason.
bool ReadImage(const std::string& path, Image& image, std::string& error);

/// Writes an image as PNG, or as PGM/PPM when the path ends in .pgm, .ppm or .pnm.
bool WriteImage(const std::string& path, const Image& image, std::string& error);

}  // namespace demo

#endif  // NAX_EXAMPLES_IMAGE_IO_H
