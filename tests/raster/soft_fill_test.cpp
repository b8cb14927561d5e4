// Soft fills against a direct 2-D convolution of the plain fill, and the exact values the run
// lookups promise inside and far outside a shape.
#include <zv/gc.h>
#include <zv/oval2f.h>
#include <zv/path2f.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstring>
#include <random>
#include <string>
#include <vector>

namespace {

ZvPath2f Polygon(const std::vector<ZvPoint2<float>>& p) {
  ZvPath2f path;
  path.Moveto(p[0]);
  for (std::size_t i = 1; i < p.size(); ++i)
    path.Lineto(p[i]);
  path.Lineto(p[0]);
  path.Closeto();
  return path;
}

ZvPath2f Disc(float cx, float cy, float r) {
  return ZvPath2f(ZvOval2f({cx, cy}, 2 * r, 2 * r));
}

// The filter taps, sampled from the profile the way the fill is documented to sample it.
std::vector<double> Taps(const ZvGC& gc, int radius) {
  std::vector<double> f(2 * radius + 1);
  f[radius] = gc.featherProfile.Eval(0.0, 0);
  double sum = f[radius];
  for (int i = 1; i <= radius; ++i) {
    f[radius + i] = f[radius - i] = gc.featherProfile.Eval(i / (0.5 + radius), 0);
    sum += 2 * f[radius + i];
  }
  for (double& v : f)
    v /= sum;
  return f;
}

// Every pixel of the plain fill's coverage convolved with the outer product of the taps, then
// scaled by the opacity.
std::vector<double> Convolved(const ZvPath2f& path, const ZvGC& gc, int w, int h) {
  const int radius =
      std::max(static_cast<int>(std::ceil(gc.featherInner + gc.featherOuter - 0.5)), 1);
  const std::vector<double> f = Taps(gc, radius);
  ZvRaster<float> cover(w, h, 0);
  path.Fill(gc, cover, nullptr, nullptr);
  std::vector<double> out(static_cast<std::size_t>(w) * h, 0.0);
  for (int y = 0; y < h; ++y)
    for (int x = 0; x < w; ++x) {
      double sum = 0;
      for (int k = 0; k <= 2 * radius; ++k)
        for (int j = 0; j <= 2 * radius; ++j) {
          const int sx = x + j - radius, sy = y + k - radius;
          if (sx >= 0 && sy >= 0 && sx < w && sy < h) sum += f[j] * f[k] * cover.GetVal(sx, sy);
        }
      out[static_cast<std::size_t>(y) * w + x] = sum * gc.opacity;
    }
  return out;
}

// The clip step's fade of one pixel, with the roundings each pixel type is documented to use.
void Fade(unsigned char m, unsigned char& t) {
  if (m == 0) t = 0;
  if (m > 1)
    t = static_cast<unsigned char>(float(m * 0.003921569f * (t * 0.003921569f)) * 255.0 + 0.5);
}
void Fade(short m, short& t) {
  auto unit = [](short v) { return std::min(std::max(v * 6.1035156e-05, 0.0), 1.0); };
  if (m == 0) t = 0;
  if (m != 0 && m != 1) t = static_cast<short>(unit(m) * unit(t) * 16384.0 + 0.5);
}
void Fade(float m, float& t) {
  if (m == 0) t = 0;
  if (m != 0 && m != 1) t = t * m;
}

// The clipped soft fill must be the unclipped one faded by the shape's antialiased coverage over
// the whole raster, to the bit, whatever part of the raster the blur reached.
template <class T>
void ExpectClippedIsFadedEverywhere(const ZvPath2f& path, ZvGC gc, int w, int h, int orientation,
                                    const char* what) {
  ZvRaster<T> clipped(w, h, 3), expected(w, h, 3), mask(w, h, 0);
  clipped.SetOrientationFlag(orientation);
  expected.SetOrientationFlag(orientation);
  mask.SetOrientationFlag(orientation);
  gc.clipToShape = 1;
  const int drawn = path.SoftFill(gc, clipped, nullptr);
  gc.clipToShape = 0;
  ASSERT_EQ(path.SoftFill(gc, expected, nullptr), drawn) << what;
  gc.opacity = 1.0;
  path.AAFill(gc, mask, nullptr, nullptr);
  if (drawn)
    for (int i = 0; i < w * h; ++i)
      Fade(mask.GetRaster()[i], expected.GetRaster()[i]);
  EXPECT_EQ(std::memcmp(clipped.GetRaster(), expected.GetRaster(), sizeof(T) * w * h), 0) << what;
}

}  // namespace

TEST(SoftFill, ClippedResultIsTheUnclippedOneFadedEverywhere) {
  std::mt19937 rng(17);
  std::uniform_real_distribution<float> coord(-10.0f, 70.0f);
  std::vector<ZvPath2f> shapes = {Disc(30, 25, 14), Disc(4, 50, 20), Disc(58, 2, 9)};
  for (int n = 0; n < 6; ++n) {
    std::vector<ZvPoint2<float>> corners;
    for (int i = 0; i < 3 + n % 3; ++i)
      corners.push_back({coord(rng), coord(rng)});
    shapes.push_back(Polygon(corners));
  }
  // Opacities below 0 leave -0.0 outside the blur in float rasters, which the fade rewrites.
  const double opacities[] = {1.0, 0.55, -0.5};
  for (std::size_t k = 0; k < shapes.size(); ++k)
    for (int orientation = 0; orientation < 2; ++orientation) {
      ZvGC gc;
      gc.featherInner = 1.0 + 2.5 * (k % 4);
      gc.opacity = opacities[k % 3];
      gc.fillRule = static_cast<int>(k % 2);
      const std::string what = std::to_string(k) + "/" + std::to_string(orientation);
      ExpectClippedIsFadedEverywhere<float>(shapes[k], gc, 61, 53, orientation, what.c_str());
      ExpectClippedIsFadedEverywhere<unsigned char>(shapes[k], gc, 61, 53, orientation,
                                                    what.c_str());
      ExpectClippedIsFadedEverywhere<short>(shapes[k], gc, 61, 53, orientation, what.c_str());
    }
}

TEST(SoftFill, UnclippedResultIsTheConvolutionOfThePlainFill) {
  std::mt19937 rng(5);
  std::uniform_real_distribution<float> coord(-4.0f, 28.0f);
  for (int n = 0; n < 40; ++n) {
    std::vector<ZvPoint2<float>> corners;
    for (int i = 0; i < 3 + n % 4; ++i)
      corners.push_back({coord(rng), coord(rng)});
    const ZvPath2f path = Polygon(corners);
    ZvGC gc;
    gc.clipToShape = 0;
    gc.fillRule = n % 2;
    gc.featherInner = 1.0 + (n % 5);
    gc.featherOuter = 0.5 * (n % 3);
    gc.opacity = n % 3 ? 1.0 : 0.7;
    const std::vector<double> expected = Convolved(path, gc, 24, 24);
    ZvRaster<float> f(24, 24, 0.5f);
    ZvRaster<unsigned char> b(24, 24, 7);
    ZvRaster<short> s(24, 24, 7);
    const int drawn = path.SoftFill(gc, f, nullptr);
    EXPECT_EQ(path.SoftFill(gc, b, nullptr), drawn);
    EXPECT_EQ(path.SoftFill(gc, s, nullptr), drawn);
    if (!drawn) {
      // A polygon that covers no pixel centre leaves the raster as it was.
      EXPECT_TRUE(f.AllPixelValuesAre(0.5f)) << n;
      continue;
    }
    for (int i = 0; i < 24 * 24; ++i) {
      ASSERT_NEAR(f.GetVal(i), expected[i], 1e-5) << n << " at " << i;
      ASSERT_NEAR(b.GetVal(i), expected[i] * 255, 1.0) << n << " at " << i;
      ASSERT_NEAR(s.GetVal(i), expected[i] * 16384, 1.0) << n << " at " << i;
    }
  }
}

TEST(SoftFill, InteriorsAreFullFarOutsideZeroAndSymmetricShapesStaySymmetric) {
  const ZvPath2f disc = Disc(64, 64, 40);
  for (int clip = 0; clip < 2; ++clip) {
    ZvGC gc;
    gc.clipToShape = clip;
    gc.featherInner = 3;
    gc.featherOuter = 3;
    ZvRaster<float> f(128, 128, 0.5f);
    ZvRaster<unsigned char> b(128, 128, 9);
    disc.SoftFill(gc, f, nullptr);
    disc.SoftFill(gc, b, nullptr);
    EXPECT_EQ(f.GetVal(64, 64), 1.0f);
    EXPECT_EQ(f.GetVal(64, 64 - 32), 1.0f);  // 8 px inside: the whole 13-tap footprint is in
    EXPECT_EQ(b.GetVal(64, 64 - 32), 255);
    EXPECT_EQ(f.GetVal(2, 2), 0.0f);  // every pixel is written, far outside with 0
    EXPECT_EQ(b.GetVal(2, 2), 0);
    EXPECT_EQ(f.GetVal(64, 64 - 47), 0.0f);  // 7 px out: nothing reaches it
    // The blur spreads past the edge only when it is not clipped to the shape.
    EXPECT_EQ(f.GetVal(64, 64 - 42) > 0.0f, clip == 0);
    for (int y = 0; y < 128; ++y)
      for (int x = 0; x < 128; ++x) {
        ASSERT_NEAR(f.GetVal(x, y), f.GetVal(127 - x, y), 1e-6) << x << "," << y;
        ASSERT_NEAR(f.GetVal(x, y), f.GetVal(y, x), 1e-6) << x << "," << y;
        ASSERT_EQ(b.GetVal(x, y), b.GetVal(127 - x, 127 - y)) << x << "," << y;
      }
  }
}

TEST(SoftFill, NarrowFeatherIsTheAntialiasedFillAndOpacityIsGivenBack) {
  const ZvPath2f disc = Disc(20, 20, 12);
  ZvGC gc;
  gc.featherInner = 0.4;
  gc.featherOuter = 0.5;  // 0.9 < 1: nothing to blur
  gc.opacity = 0.6;
  ZvRaster<unsigned char> soft(40, 40, 0), aa(40, 40, 0);
  EXPECT_EQ(disc.SoftFill(gc, soft, nullptr), 1);
  disc.AAFill(gc, aa, nullptr, nullptr);
  for (int i = 0; i < 40 * 40; ++i)
    ASSERT_EQ(soft.GetVal(i), aa.GetVal(i)) << i;
  // The clip step lends the context's opacity to its mask and restores it.
  gc.featherInner = 2;
  EXPECT_EQ(disc.SoftFill(gc, soft, nullptr), 1);
  EXPECT_EQ(gc.opacity, 0.6);
  EXPECT_EQ(soft.GetVal(20, 20), static_cast<int>(0.6 * 255 + 0.5));
}

TEST(SoftFill, CallbackEndsTheFillAndAMissedRasterIsLeftAlone) {
  static int calls;
  static int allowed;
  auto stopper = []() { return ++calls > allowed ? 1 : 0; };
  const ZvPath2f disc = Disc(20, 20, 12);
  ZvGC gc;
  gc.featherInner = 2;
  ZvRaster<unsigned char> r(40, 40, 77);
  calls = 0;
  allowed = 5;  // inside the horizontal pass: nothing is written yet
  EXPECT_EQ(disc.SoftFill(gc, r, stopper), 0);
  EXPECT_TRUE(r.AllPixelValuesAre(77));
  calls = 0;
  allowed = 24 + 10;  // the 24 rows of the disc, then ten columns of the vertical pass
  EXPECT_EQ(disc.SoftFill(gc, r, stopper), 0);
  EXPECT_EQ(r.GetVal(3, 20), 0);
  EXPECT_EQ(r.GetVal(10, 20), 77);
  ZvRaster<unsigned char> far(40, 40, 5);
  EXPECT_EQ(Disc(200, 200, 10).SoftFill(gc, far, nullptr), 0);
  EXPECT_TRUE(far.AllPixelValuesAre(5));
  // A feather too wide for the filter's counts, or no number, is refused untouched.
  for (double width : {1e300, std::nan("")}) {
    gc.featherInner = width;
    EXPECT_EQ(disc.SoftFill(gc, far, nullptr), 0);
    EXPECT_TRUE(far.AllPixelValuesAre(5));
  }
}
