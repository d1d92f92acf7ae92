#include "image_io.h"

#include <cctype>
#include <cstdio>
#include <fstream>
#include <memory>

#ifdef NAX_HAVE_PNG
#include <png.h>
#endif

namespace demo {
namespace {

bool EndsWith(const std::string& s, const char* suffix) {
  const std::string t(suffix);
  if (s.size() < t.size()) return false;
  for (size_t i = 0; i < t.size(); ++i)
    if (std::tolower(static_cast<unsigned char>(s[s.size() - t.size() + i])) != t[i]) return false;
  return true;
}

// Reads the next header token of a PNM file, skipping white space and comments.
bool ReadPnmToken(std::istream& in, std::string& token) {
  token.clear();
  int c;
  while ((c = in.get()) != EOF) {
    if (c == '#') {
      while ((c = in.get()) != EOF && c != '\n') {
      }
    } else if (!std::isspace(c)) {
      token.push_back(static_cast<char>(c));
      break;
    }
  }
  while ((c = in.peek()) != EOF && !std::isspace(c) && c != '#') token.push_back(static_cast<char>(in.get()));
  return !token.empty();
}

bool ParsePositive(const std::string& token, int limit, int& value) {
  if (token.empty() || token.size() > 9) return false;
  for (char ch : token)
    if (!std::isdigit(static_cast<unsigned char>(ch))) return false;
  value = std::stoi(token);
  return value > 0 && value <= limit;
}

bool ReadPnm(const std::string& path, Image& image, std::string& error) {
  std::ifstream in(path, std::ios::binary);
  std::string magic, w, h, maxval;
  if (!ReadPnmToken(in, magic) || (magic != "P5" && magic != "P6")) {
    error = path + ": not a binary PGM/PPM image";
    return false;
  }
  int width, height, max;
  if (!ReadPnmToken(in, w) || !ReadPnmToken(in, h) || !ReadPnmToken(in, maxval) ||
      !ParsePositive(w, 1 << 16, width) || !ParsePositive(h, 1 << 16, height) ||
      !ParsePositive(maxval, 65535, max)) {
    error = path + ": malformed PGM/PPM header";
    return false;
  }
  if (max > 255) {
    error = path + ": unsupported image: only 8-bit PGM/PPM (maxval up to 255) is read";
    return false;
  }
  in.get();  // the single white-space character after the header
  image.width = width;
  image.height = height;
  image.channels = magic == "P5" ? 1 : 3;
  image.pixels.resize(static_cast<size_t>(width) * height * image.channels);
  in.read(reinterpret_cast<char*>(image.pixels.data()), static_cast<std::streamsize>(image.pixels.size()));
  if (in.gcount() != static_cast<std::streamsize>(image.pixels.size())) {
    error = path + ": truncated PGM/PPM data";
    return false;
  }
  return true;
}

bool WritePnm(const std::string& path, const Image& image, std::string& error) {
  std::ofstream out(path, std::ios::binary);
  if (!out) {
    error = path + ": cannot open for writing";
    return false;
  }
  out << (image.channels == 1 ? "P5" : "P6") << "\n" << image.width << " " << image.height << "\n255\n";
  out.write(reinterpret_cast<const char*>(image.pixels.data()), static_cast<std::streamsize>(image.pixels.size()));
  if (!out) {
    error = path + ": write failed";
    return false;
  }
  return true;
}

#ifdef NAX_HAVE_PNG
bool ReadPng(const std::string& path, Image& image, std::string& error) {
  png_image png{};
  png.version = PNG_IMAGE_VERSION;
  if (!png_image_begin_read_from_file(&png, path.c_str())) {
    error = path + ": unreadable PNG: " + png.message;
    return false;
  }
  // Colour images become RGB, grey ones grey; alpha is composed onto black; 16 bits become 8.
  png.format = (png.format & PNG_FORMAT_FLAG_COLOR) ? PNG_FORMAT_RGB : PNG_FORMAT_GRAY;
  image.width = static_cast<int>(png.width);
  image.height = static_cast<int>(png.height);
  image.channels = (png.format & PNG_FORMAT_FLAG_COLOR) ? 3 : 1;
  image.pixels.resize(PNG_IMAGE_SIZE(png));
  png_color black{0, 0, 0};
  if (!png_image_finish_read(&png, &black, image.pixels.data(), 0, nullptr)) {
    error = path + ": unreadable PNG: " + png.message;
    png_image_free(&png);
    return false;
  }
  return true;
}

bool WritePng(const std::string& path, const Image& image, std::string& error) {
  png_image png{};
  png.version = PNG_IMAGE_VERSION;
  png.width = static_cast<png_uint_32>(image.width);
  png.height = static_cast<png_uint_32>(image.height);
  png.format = image.channels == 1 ? PNG_FORMAT_GRAY : PNG_FORMAT_RGB;
  if (!png_image_write_to_file(&png, path.c_str(), 0, image.pixels.data(), 0, nullptr)) {
    error = path + ": cannot write PNG: " + png.message;
    return false;
  }
  return true;
}
#endif

}  // namespace

bool PngSupported() {
#ifdef NAX_HAVE_PNG
  return true;
#else
  return false;
#endif
}

bool ReadImage(const std::string& path, Image& image, std::string& error) {
  std::ifstream probe(path, std::ios::binary);
  if (!probe) {
    error = path + ": no such file or not readable";
    return false;
  }
  unsigned char head[8] = {};
  probe.read(reinterpret_cast<char*>(head), 8);
  const bool isPng = probe.gcount() == 8 && head[0] == 0x89 && head[1] == 'P' && head[2] == 'N' && head[3] == 'G';
  probe.close();
  if (isPng) {
#ifdef NAX_HAVE_PNG
    return ReadPng(path, image, error);
#else
    error = path + ": PNG is not supported by this build (libpng was not found)";
    return false;
#endif
  }
  if (head[0] == 'P' && (head[1] == '5' || head[1] == '6')) return ReadPnm(path, image, error);
  error = path + ": unsupported image format (expected PNG, binary PGM or PPM)";
  return false;
}

bool WriteImage(const std::string& path, const Image& image, std::string& error) {
  if (EndsWith(path, ".pgm") || EndsWith(path, ".ppm") || EndsWith(path, ".pnm")) {
    if (EndsWith(path, ".pgm") && image.channels != 1) {
      error = path + ": a PGM file holds grey images only; use .ppm or .png";
      return false;
    }
    return WritePnm(path, image, error);
  }
#ifdef NAX_HAVE_PNG
  return WritePng(path, image, error);
#else
  error = path + ": PNG is not supported by this build; write .pgm or .ppm";
  return false;
#endif
}

}  // namespace demo
