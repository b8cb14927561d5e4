#include "png_read.h"

#include <png.h>

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <vector>

namespace {
// libpng reports errors by longjmp; its message is kept for the caller.
void OnError(png_structp png, png_const_charp message) {
  std::string* error = static_cast<std::string*>(png_get_error_ptr(png));
  *error = message;
  png_longjmp(png, 1);
}
void OnWarning(png_structp, png_const_charp) {}

// Everything libpng touches between setjmp and longjmp lives here, outside the jumping frame.
struct Reader {
  std::FILE* in = nullptr;
  png_structp png = nullptr;
  png_infop info = nullptr;
  std::vector<unsigned char> pixels;
  std::vector<png_bytep> rows;
  png_uint_32 width = 0, height = 0;
  int channels = 0;
  ~Reader() {
    png_destroy_read_struct(png ? &png : nullptr, info ? &info : nullptr, nullptr);
    if (in) std::fclose(in);
  }
};

// Decodes into r.pixels; false after a libpng error.
bool Decode(Reader& r) {
  if (setjmp(png_jmpbuf(r.png))) return false;
  png_init_io(r.png, r.in);
  png_set_sig_bytes(r.png, 8);
  png_read_info(r.png, r.info);
  const int colour = png_get_color_type(r.png, r.info);
  const int depth = png_get_bit_depth(r.png, r.info);
  if (colour == PNG_COLOR_TYPE_PALETTE) png_set_palette_to_rgb(r.png);
  if (colour == PNG_COLOR_TYPE_GRAY && depth < 8) png_set_expand_gray_1_2_4_to_8(r.png);
  if (png_get_valid(r.png, r.info, PNG_INFO_tRNS)) png_set_tRNS_to_alpha(r.png);
  if (depth == 16) png_set_strip_16(r.png);
  if (colour & PNG_COLOR_MASK_COLOR || colour == PNG_COLOR_TYPE_PALETTE)
    png_set_rgb_to_gray_fixed(r.png, 1, -1, -1);
  png_set_interlace_handling(r.png);
  png_read_update_info(r.png, r.info);
  r.width = png_get_image_width(r.png, r.info);
  r.height = png_get_image_height(r.png, r.info);
  r.channels = png_get_channels(r.png, r.info);
  const std::size_t stride = png_get_rowbytes(r.png, r.info);
  r.pixels.resize(stride * r.height);
  r.rows.resize(r.height);
  for (png_uint_32 y = 0; y < r.height; ++y)
    r.rows[y] = r.pixels.data() + y * stride;
  png_read_image(r.png, r.rows.data());
  png_read_end(r.png, nullptr);
  return true;
}
}  // namespace

bool ZvReadPng(const std::string& file, ZvRaster<unsigned char>& raster, std::string& error) {
  Reader r;
  r.in = std::fopen(file.c_str(), "rb");
  if (!r.in) {
    error = "cannot read '" + file + "': " + std::strerror(errno);
    return false;
  }
  unsigned char signature[8];
  if (std::fread(signature, 1, 8, r.in) != 8 || png_sig_cmp(signature, 0, 8)) {
    error = "'" + file + "' is not a PNG file";
    return false;
  }
  std::string pngError;
  r.png = png_create_read_struct(PNG_LIBPNG_VER_STRING, &pngError, OnError, OnWarning);
  r.info = r.png ? png_create_info_struct(r.png) : nullptr;
  if (!r.info || !Decode(r)) {
    error = "cannot read '" + file + "': " + (pngError.empty() ? "out of memory" : pngError);
    return false;
  }
  // The tracer's corners are 16-bit.
  if (r.width > 32767 || r.height > 32767) {
    error = "'" + file + "' is larger than 32767 pixels on a side";
    return false;
  }
  raster.Reconstruct(static_cast<int>(r.width), static_cast<int>(r.height), 0);
  for (png_uint_32 y = 0; y < r.height; ++y)
    for (png_uint_32 x = 0; x < r.width; ++x) {
      const unsigned char* p = r.rows[y] + x * r.channels;
      // Grey with alpha: laid over white, rounded.
      const unsigned int v =
          r.channels == 2 ? (p[0] * p[1] + 255u * (255u - p[1]) + 127u) / 255u : p[0];
      raster.SetVal(static_cast<int>(x), static_cast<int>(y), static_cast<unsigned char>(v));
    }
  return true;
}
