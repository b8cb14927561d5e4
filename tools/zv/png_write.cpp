#include "png_write.h"

#include <png.h>

#include <cerrno>
#include <cstdio>
#include <cstring>

namespace {
// libpng reports errors by longjmp; its message is kept for the caller.
void OnError(png_structp png, png_const_charp message) {
  std::string* error = static_cast<std::string*>(png_get_error_ptr(png));
  *error = message;
  png_longjmp(png, 1);
}
void OnWarning(png_structp, png_const_charp) {}
}  // namespace

bool ZvWritePng(const std::string& file, const ZvRaster<unsigned char>& raster,
                std::string& error) {
  std::FILE* out = std::fopen(file.c_str(), "wb");
  if (!out) {
    error = "cannot write '" + file + "': " + std::strerror(errno);
    return false;
  }
  std::string pngError;
  png_structp png = png_create_write_struct(PNG_LIBPNG_VER_STRING, &pngError, OnError, OnWarning);
  png_infop info = png ? png_create_info_struct(png) : nullptr;
  bool ok = png && info;
  if (ok && setjmp(png_jmpbuf(png)) == 0) {
    png_init_io(png, out);
    png_set_IHDR(png, info, static_cast<png_uint_32>(raster.GetWidth()),
                 static_cast<png_uint_32>(raster.GetHeight()), 8, PNG_COLOR_TYPE_GRAY,
                 PNG_INTERLACE_NONE, PNG_COMPRESSION_TYPE_DEFAULT, PNG_FILTER_TYPE_DEFAULT);
    png_write_info(png, info);
    for (int y = 0; y < raster.GetHeight(); ++y)
      png_write_row(png, raster.GetRaster() + raster.CalculateOffsetForPos(0, y));
    png_write_end(png, info);
  } else {
    ok = false;
  }
  png_destroy_write_struct(png ? &png : nullptr, info ? &info : nullptr);
  if (std::fclose(out) != 0 && ok) {
    ok = false;
    pngError = std::strerror(errno);
  }
  if (!ok) {
    error = "cannot write '" + file + "': " + (pngError.empty() ? "out of memory" : pngError);
    std::remove(file.c_str());
  }
  return ok;
}
