// The tool's default rendering against a 16x16 supersampled rendering of the same path data.
#include "tools/zv/render.cpp"
#include "tools/zv/svg_path.h"

#include <gtest/gtest.h>

#include <zv/gc.h>

#include <cmath>
#include <cstdlib>
#include <string>

namespace {
constexpr int kSize = 64;
constexpr int kSuper = 16;

// Each pixel's share of 16x16 sub-pixel centres inside the path (non-zero rule), 0-255.
ZvRaster<unsigned char> Truth(const ZvPath2f& path) {
  ZvPath2f big(path);
  big.Scale(kSuper, kSuper, ZvPoint2<float>{0, 0});
  ZvGC gc;
  gc.fillRule = 1;
  gc.flattenTolerance = 0.25;  // 1/64 of a final pixel
  ZvRaster<unsigned char> fine(kSize * kSuper, kSize * kSuper, 0);
  big.Fill(gc, fine, nullptr, nullptr);
  ZvRaster<unsigned char> out(kSize, kSize, 0);
  for (int y = 0; y < kSize; ++y)
    for (int x = 0; x < kSize; ++x) {
      int inside = 0;
      for (int j = 0; j < kSuper; ++j)
        for (int i = 0; i < kSuper; ++i)
          inside += fine.GetVal((y * kSuper + j) * kSize * kSuper + x * kSuper + i) != 0;
      out.SetVal(y * kSize + x, static_cast<unsigned char>(std::lround(inside * 255.0 / 256)));
    }
  return out;
}

double MeanDifference(const ZvRaster<unsigned char>& a, const ZvRaster<unsigned char>& b) {
  double sum = 0;
  for (int i = 0; i < a.GetSize(); ++i)
    sum += std::abs(a.GetVal(i) - b.GetVal(i));
  return sum / a.GetSize();
}
}  // namespace

TEST(RenderAccuracy, DefaultOutputMatchesSupersampledTruth) {
  // Every subpath is closed by the tool before filling, so open data fills as SVG fills it.
  const char* shapes[] = {
      // circles of two arcs and of four cubics
      "M32 4 A28 28 0 1 1 32 60 A28 28 0 1 1 32 4Z",
      "M32 12C43 12 52 21 52 32S43 52 32 52 12 43 12 32 21 12 32 12z",
      // rounded rectangles, absolute and relative, one with compact numbers
      "M10 4h44a6 6 0 0 1 6 6v44a6 6 0 0 1-6 6H10a6 6 0 0 1-6-6V10a6 6 0 0 1 6-6z",
      "M8.5 8.5H55.5A3.5 3.5 0 0 1 59 12V52A3.5 3.5 0 0 1 55.5 55.5H8.5A3.5 3.5 0 0 1 5 52V12A3.5 "
      "3.5 0 0 1 8.5 8.5Z",
      // arcs of every flag combination, rotated ellipses
      "M10 32a30 18 30 0 0 44 0z", "M10 32a30 18 30 0 1 44 0z", "M10 32a30 18 30 1 0 44 0z",
      "M10 32a30 18 30 1 1 44 0z", "M6 40a30 10-20 1052-30z",
      // glyph-like shapes: an O with a hole, an S of quadratics, a heart
      "M32 6C48 6 58 18 58 32S48 58 32 58 6 46 6 32 16 6 32 6ZM32 16C24 16 18 23 18 32s6 16 14 16 "
      "14-7 14-16-6-16-14-16Z",
      "M46 14Q32 4 20 12T22 30 44 40 40 54 18 52v-6Q32 56 36 48T22 36 16 20 30 8 46 8z",
      "M32 56C12 40 4 30 4 20 4 12 10 6 18 6c6 0 11 4 14 9 3-5 8-9 14-9 8 0 14 6 14 14 0 10-8 "
      "20-28 "
      "36z",
      // thin curved strokes as outlines
      "M4 60Q32-20 60 60l-2 0Q32-14 6 60z"};
  ZvRenderOptions options;  // the tool's defaults
  for (const char* d : shapes) {
    ZvPath2f path;
    std::string error;
    ASSERT_TRUE(ZvParseSvgPath(d, path, error)) << d << ": " << error;
    ZvRaster<unsigned char> raster(kSize, kSize, 0);
    ZvRenderPath(path, options, raster);
    const double mean = MeanDifference(raster, Truth(path));
    EXPECT_LE(mean, 0.5) << d;
  }
}

TEST(RenderAccuracy, ArbitraryPathDataFailsCleanlyOrDraws) {
  // Path-data letters, digits and separators in random order: each text either reads, and then
  // draws, or fails with one line that names an offset inside the text.
  const std::string alphabet = "MmLlHhVvCcSsQqTtAaZz0123456789.-+eE, 1010";
  std::srand(7);
  for (int n = 0; n < 3000; ++n) {
    std::string d = n % 2 ? "M1 2" : "";
    const int length = std::rand() % 40;
    for (int i = 0; i < length; ++i)
      d += alphabet[static_cast<std::size_t>(std::rand()) % alphabet.size()];
    ZvPath2f path;
    std::string error;
    if (ZvParseSvgPath(d, path, error)) {
      ZvRaster<unsigned char> raster(16, 16, 0);
      ZvRenderOptions options;
      options.strokeWidth = 1;
      ZvRenderPath(path, options, raster);
    } else {
      const std::size_t at = error.rfind("at offset ");
      ASSERT_NE(at, std::string::npos) << d << ": " << error;
      EXPECT_LE(std::stoul(error.substr(at + 10)), d.size()) << d;
      EXPECT_EQ(error.find('\n'), std::string::npos);
    }
  }
}
