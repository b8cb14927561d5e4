// The direct conversions of ovals and rectangles against per-pixel references, their distance
// rasters, the degenerate and sliver cases, and the radial fills.
#include "raster/oval_scan.h"

#include <zv/gc.h>
#include <zv/oval2f.h>
#include <zv/rect2f.h>

#include <gtest/gtest.h>

#include <cmath>
#include <random>

#include "oval_reference.h"

namespace {

using P = ZvPoint2<float>;

template <class T>
Mask Painted(const ZvRaster<T>& r, T full) {
  Mask m(r.GetWidth(), r.GetHeight());
  for (int y = 0; y < r.GetHeight(); ++y)
    for (int x = 0; x < r.GetWidth(); ++x)
      m.px[static_cast<std::size_t>(y) * m.w + x] = r.GetVal(x, r.ConvertBottomUpY(y)) == full;
  return m;
}

// The first differing pixel, for a readable failure.
std::string Diff(const Mask& got, const Mask& want) {
  for (int y = 0; y < got.h; ++y)
    for (int x = 0; x < got.w; ++x)
      if (got.At(x, y) != want.At(x, y))
        return "pixel (" + std::to_string(x) + ", " + std::to_string(y) + ") is " +
               std::to_string(got.At(x, y));
  return "";
}

// A frame with sides u and v about a centre, as the three corners a, b, c.
void Frame(double cx, double cy, double ux, double uy, double vx, double vy, P (&p)[3]) {
  p[0] = {static_cast<float>(cx - ux - vx), static_cast<float>(cy - uy - vy)};
  p[1] = {static_cast<float>(cx + ux - vx), static_cast<float>(cy + uy - vy)};
  p[2] = {static_cast<float>(cx - ux + vx), static_cast<float>(cy - uy + vy)};
}

struct Random {
  std::mt19937 rng{20261124};
  double U(double lo, double hi) { return std::uniform_real_distribution<double>(lo, hi)(rng); }
};

TEST(OvalScan, AxisAlignedWalkMatchesTheEllipticTestAtEveryCentre) {
  Random r;
  ZvRaster<float> distance(1, 1, 0.0f);
  int checked = 0;
  for (int trial = 0; trial < 400; ++trial) {
    // Centres inside and off the raster; radii from a pixel to past the raster's size.
    P p[3];
    const double a = r.U(0.2, trial % 4 == 0 ? 90 : 25), b = r.U(0.2, trial % 5 == 0 ? 90 : 25);
    Frame(r.U(-30, 90), r.U(-30, 80), a, 0, 0, b, p);
    ZvRaster<unsigned char> raster(61, 47, 0);
    raster.SetOrientationFlag(trial & 1);
    Mask want(61, 47);
    if (!IsotheticReference(p[0], p[1], p[2], want)) continue;
    ScanConvertIsothetic(p[0], p[1], p[2], 0.5, raster, (unsigned char)255, distance, 0,
                         OvalFillPlain);
    const Mask got = Painted(raster, (unsigned char)255);
    ASSERT_EQ(got.px, want.px) << "trial " << trial << ": " << Diff(got, want);
    ++checked;
  }
  EXPECT_GT(checked, 380);
}

TEST(OvalScan, QuadraticFormMatchesCentresPlusRowsAndWidening) {
  Random r;
  ZvRaster<float> distance(1, 1, 0.0f);
  int checked = 0;
  for (int trial = 0; trial < 600; ++trial) {
    // Rotated ovals of every shape: round, long, thin (a side under a pixel), off the raster.
    const double angle = r.U(0, 6.283185307179586);
    const double len = r.U(0.5, trial % 3 == 0 ? 70 : 20);
    const double wid = trial % 4 == 0 ? r.U(0.05, 0.8) : r.U(0.5, 20);
    const double skew = trial % 5 == 0 ? r.U(-0.8, 0.8) : 0;
    P p[3];
    Frame(r.U(-20, 70), r.U(-20, 60), len * std::cos(angle), len * std::sin(angle),
          wid * (-std::sin(angle) + skew * std::cos(angle)),
          wid * (std::cos(angle) + skew * std::sin(angle)), p);
    ZvRaster<short> raster(53, 41, 0);
    raster.SetOrientationFlag(trial & 1);
    Mask want(53, 41);
    if (!GeneralReference(p[0], p[1], p[2], want)) continue;
    ScanConvert(p[0], p[1], p[2], 0.5, raster, (short)16384, distance, 0, OvalFillPlain);
    const Mask got = Painted(raster, (short)16384);
    ASSERT_EQ(got.px, want.px) << "trial " << trial << ": " << Diff(got, want);
    ++checked;
  }
  EXPECT_GT(checked, 560);
}

TEST(OvalScan, RectangleMatchesItsParallelogramAtEveryCentre) {
  Random r;
  ZvRaster<float> distance(1, 1, 0.0f);
  int checked = 0;
  for (int trial = 0; trial < 400; ++trial) {
    const double angle = trial % 3 == 0 ? 0.0 : r.U(0, 6.283185307179586);
    const double len = r.U(0.3, 40), wid = r.U(0.3, 30), skew = trial % 2 ? r.U(-1, 1) : 0;
    P p[3];
    Frame(r.U(-20, 70), r.U(-20, 60), len * std::cos(angle), len * std::sin(angle),
          wid * (-std::sin(angle) + skew * std::cos(angle)),
          wid * (std::cos(angle) + skew * std::sin(angle)), p);
    ZvRaster<float> raster(49, 43, 0.0f);
    raster.SetOrientationFlag(trial & 1);
    Mask want(49, 43);
    if (!RectReference(p[0], p[1], p[2], want)) continue;
    ScanConvert(p[0], p[1], p[2], 0.5, raster, 1.0f, distance, RectFillPlain);
    const Mask got = Painted(raster, 1.0f);
    ASSERT_EQ(got.px, want.px) << "trial " << trial << ": " << Diff(got, want);
    ++checked;
  }
  EXPECT_GT(checked, 380);
}

TEST(OvalScan, FillChoosesTheWalkThatFitsTheOval) {
  ZvGC gc;
  ZvRaster<float> distance(1, 1, 0.0f);
  // Large and axis-aligned: the symmetric walk about the snapped centre.
  const ZvOval2f big(P{20.3f, 17.8f}, 31.0f, 22.0f);
  P p[3];
  big.SetupPointRep(p[0], p[1], p[2]);
  ZvRaster<unsigned char> viaFill(40, 36, 0), direct(40, 36, 0);
  EXPECT_EQ(big.Fill(gc, viaFill, nullptr, nullptr), 1);
  ScanConvertIsothetic(p[0], p[1], p[2], 0.5, direct, (unsigned char)255, distance, 0,
                       OvalFillPlain);
  EXPECT_EQ(Painted(viaFill, (unsigned char)255).px, Painted(direct, (unsigned char)255).px);

  // Mapped by the context's transform first: a rotated oval takes the quadratic form.
  gc.transform.Rotate(30.0, ZvPoint3<double>{20, 18, 0}, ZvPoint3<double>{20, 18, 1});
  ZvRaster<unsigned char> rotated(40, 36, 0), expected(40, 36, 0);
  big.Fill(gc, rotated, nullptr, nullptr);
  for (P& q : p)
    gc.transform.MapInPlace(q);
  ScanConvert(p[0], p[1], p[2], 0.5, expected, (unsigned char)255, distance, 0, OvalFillPlain);
  EXPECT_EQ(Painted(rotated, (unsigned char)255).px, Painted(expected, (unsigned char)255).px);

  // Entirely off the raster: nothing, and 0.
  ZvRaster<unsigned char> untouched(40, 36, 7);
  EXPECT_EQ(ZvOval2f(P{-50, -50}, 10, 10).Fill(ZvGC(), untouched, nullptr, nullptr), 0);
  EXPECT_TRUE(untouched.AllPixelValuesAre(7));
}

TEST(OvalScan, SymmetryDegeneracyAndSlivers) {
  ZvGC gc;
  // A circle of radius 10 at the centre of a 40 x 40 raster: mirror images about the snapped
  // centre's row and column, and the centre of the raster is a pixel corner.
  ZvRaster<unsigned char> circle(40, 40, 0);
  ZvOval2f(P{20.2f, 19.9f}, 20, 20).Fill(gc, circle, nullptr, nullptr);
  for (int y = 0; y < 40; ++y)
    for (int x = 0; x < 40; ++x) {
      ASSERT_EQ(circle.GetVal(x, y), circle.GetVal(39 - x, y)) << x << "," << y;
      ASSERT_EQ(circle.GetVal(x, y), circle.GetVal(x, 39 - y)) << x << "," << y;
    }
  EXPECT_EQ(circle.GetVal(20, 20), 255);
  EXPECT_EQ(circle.GetVal(20, 29), 255);
  EXPECT_EQ(circle.GetVal(20, 30), 0);

  // Half sides of 9e-05 draw nothing in the plain mode; the degenerate mode keeps a pixel.
  ZvRaster<float> distance(1, 1, 0.0f);
  P p[3];
  Frame(10.3, 10.6, 9e-05, 0, 0, 9e-05, p);
  ZvRaster<unsigned char> tiny(20, 20, 0);
  ScanConvertIsothetic(p[0], p[1], p[2], 0.5, tiny, (unsigned char)255, distance, 0, OvalFillPlain);
  ScanConvert(p[0], p[1], p[2], 0.5, tiny, (unsigned char)255, distance, 0, OvalFillPlain);
  EXPECT_TRUE(tiny.AllPixelValuesAre(0));
  ScanConvertIsothetic(p[0], p[1], p[2], 0.5, tiny, (unsigned char)255, distance, 0,
                       OvalFillDegenerate);
  EXPECT_EQ(tiny.GetVal(10, 10), 255);

  // Slivers 100 long and under a pixel wide, slightly tilted, along y and along x (between two
  // row centres, where a row walk alone would find nothing): every row, respectively every
  // column, they span is painted, in one connected run.
  for (int along = 0; along < 2; ++along) {
    ZvRaster<unsigned char> sliver(along ? 120 : 30, along ? 30 : 120, 0);
    const P a{14.9f, 10.2f}, b{15.6f, 10.2f}, c{18.4f, 110.2f};
    const ZvOval2f thin =
        along ? ZvOval2f(P{a.y, a.x}, P{b.y, b.x}, P{c.y, c.x}) : ZvOval2f(a, b, c);
    thin.Fill(gc, sliver, nullptr, nullptr);
    int prevLo = -1, prevHi = -1;
    for (int i = 11; i < 110; ++i) {
      int lo = -1, hi = -1;
      for (int j = 0; j < 30; ++j)
        if ((along ? sliver.GetVal(i, j) : sliver.GetVal(j, i)) == 255) {
          if (lo < 0) lo = j;
          hi = j;
        }
      ASSERT_GE(lo, 0) << along << ": line " << i;
      if (prevLo >= 0) {
        EXPECT_LE(lo, prevHi + 1) << along << ": line " << i;
        EXPECT_GE(hi, prevLo - 1) << along << ": line " << i;
      }
      prevLo = lo;
      prevHi = hi;
    }
  }
}

TEST(OvalScan, OrientationAndClippingOffTheRaster) {
  // Partly off the top-left corner: the flag puts drawing row 0 in the last row of memory.
  ZvGC gc;
  const ZvOval2f oval(P{-5.5f, -3.2f}, P{12.5f, 9.8f});
  ZvRaster<unsigned char> up(16, 12, 0), down(16, 12, 0);
  down.SetOrientationFlag(1);
  oval.Fill(gc, up, nullptr, nullptr);
  oval.Fill(gc, down, nullptr, nullptr);
  for (int y = 0; y < 12; ++y)
    for (int x = 0; x < 16; ++x)
      ASSERT_EQ(up.GetVal(x, y), down.GetVal(x, 11 - y));
  EXPECT_EQ(up.GetVal(0, 0), 255);
  EXPECT_EQ(up.GetVal(15, 11), 0);
}

TEST(OvalScan, HugeAndNonNumericFramesStayBounded) {
  // Frames far larger than the raster cover it whole, quickly, whatever their rotation.
  ZvGC gc;
  for (int turn = 0; turn < 2; ++turn) {
    ZvOval2f oval(P{50, 40}, 2e7f, 1e7f);
    ZvRect2f rect(P{50, 40}, 2e7f, 1e7f);
    oval.Rotate(turn * 30.0, P{50, 40});
    rect.Rotate(turn * 30.0, P{50, 40});
    ZvRaster<unsigned char> o(64, 48, 0), r(64, 48, 0);
    oval.Fill(gc, o, nullptr, nullptr);
    rect.Fill(gc, r, nullptr, nullptr);
    EXPECT_TRUE(o.AllPixelValuesAre(255)) << turn;
    EXPECT_TRUE(r.AllPixelValuesAre(255)) << turn;
  }
  // Centred 4e8 pixels to the left, reaching to x = 64: the edge is found without walking there.
  ZvRaster<unsigned char> edge(100, 48, 0);
  ZvOval2f(P{-4e8f, 24}, 800000128.0f, 1e9f).Fill(gc, edge, nullptr, nullptr);
  for (int y = 0; y < 48; ++y) {
    ASSERT_EQ(edge.GetVal(63, y), 255) << y;
    ASSERT_EQ(edge.GetVal(64, y), 0) << y;
  }
  ZvRaster<unsigned char> below(48, 100, 0);
  ZvOval2f(P{24, -4e8f}, 1e9f, 800000128.0f).Fill(gc, below, nullptr, nullptr);
  for (int x = 0; x < 48; ++x) {
    ASSERT_EQ(below.GetVal(x, 63), 255) << x;
    ASSERT_EQ(below.GetVal(x, 64), 0) << x;
  }
  ZvRaster<float> far(100, 48, 2.0f);
  FillDistanceRasterIsothetic(P{-800000064.0f, -5e8f}, P{64, -5e8f}, P{-800000064.0f, 5e8f}, 0.5,
                              far);
  EXPECT_EQ(far.GetVal(63, 10), 1.0f);  // within a float's rounding of the outline
  EXPECT_EQ(far.GetVal(64, 10), 2.0f);
  EXPECT_NEAR(far.GetVal(0, 10), 1 - 64 / 4e8, 1e-7);

  // Corners that are not numbers paint nothing (and nothing outside the raster).
  const float nan = std::nanf(""), inf = HUGE_VALF;
  ZvRaster<unsigned char> none(16, 16, 0);
  ZvOval2f(P{1, 1}, P{nan, 3}, P{1, 9}).Fill(gc, none, nullptr, nullptr);
  ZvRect2f(P{1, 1}, P{9, 3}, P{nan, 9}).Fill(gc, none, nullptr, nullptr);
  ZvOval2f(P{1, 1}, P{inf, 1}, P{1, 9}).RadialFill(gc, none);
  EXPECT_TRUE(none.AllPixelValuesAre(0));
}

TEST(OvalDistance, AxisAlignedRadiusAtEveryReachedPixelAndSymmetric) {
  Random r;
  for (int trial = 0; trial < 40; ++trial) {
    const double a = r.U(3, 30), b = r.U(3, 30);
    P p[3];
    Frame(r.U(5, 55), r.U(5, 45), a, 0, 0, b, p);
    ZvRaster<float> d(60, 50, 2.0f);
    d.SetOrientationFlag(trial & 1);
    FillDistanceRasterIsothetic(p[0], p[1], p[2], 0.5, d);
    const double cx = std::floor((double(p[1].x) + p[2].x) / 2 + 0.5);
    const double cy = std::floor((double(p[1].y) + p[2].y) / 2 + 0.5);
    const double ha = 0.5 * (double(p[1].x) - p[0].x), hb = 0.5 * (double(p[2].y) - p[0].y);
    for (int y = 0; y < 50; ++y)
      for (int x = 0; x < 60; ++x) {
        const double dx = x + 0.5 - cx, dy = y + 0.5 - cy;
        const double e = hb * hb * dx * dx + ha * ha * dy * dy;
        const float got = d.GetVal(x, d.ConvertBottomUpY(y));
        if (std::fabs(e - ha * ha * hb * hb) < 1e-6 * ha * ha * hb * hb) continue;
        if (e > ha * ha * hb * hb) {
          ASSERT_EQ(got, 2.0f) << x << "," << y;
        } else {
          ASSERT_NEAR(got, std::min(1.0, std::sqrt(e) / (ha * hb)), 1e-5) << x << "," << y;
          // The mirror images about the snapped centre hold the same value.
          const int mx = static_cast<int>(2 * cx) - 1 - x, my = static_cast<int>(2 * cy) - 1 - y;
          if (mx >= 0 && mx < 60 && my >= 0 && my < 50) {
            EXPECT_EQ(got, d.GetVal(mx, d.ConvertBottomUpY(my)));
          }
        }
      }
  }
}

TEST(OvalDistance, RotatedRadiusIsTheUnitCircleRadius) {
  P p[3];
  Frame(30.2, 24.7, 18 * std::cos(0.6), 18 * std::sin(0.6), -9 * std::sin(0.6), 9 * std::cos(0.6),
        p);
  ZvRaster<float> d(60, 50, 5.0f);
  FillDistanceRaster(p[0], p[1], p[2], 0.5, d);
  const UnitCircle f(p[0], p[1], p[2]);
  int inside = 0;
  for (int y = 0; y < 50; ++y)
    for (int x = 0; x < 60; ++x) {
      const double q = f.Q(x + 0.5, y + 0.5);
      if (q > 1.000002) {
        ASSERT_EQ(d.GetVal(x, y), 5.0f);
      } else if (q < 0.999999) {
        ASSERT_NEAR(d.GetVal(x, y), std::sqrt(q), 1e-5);
        ++inside;
      }
    }
  EXPECT_GT(inside, 400);
}

TEST(OvalScan, OutlineDisksHoldTheDistanceToTheOutline) {
  ZvRaster<float> disk(5, 5, 3.4028235e+38f);
  DiskRasterSetup(disk, 2);
  EXPECT_EQ(disk.GetVal(2, 2), 0.0f);
  EXPECT_FLOAT_EQ(disk.GetVal(3, 3), static_cast<float>(std::sqrt(2.0)));
  EXPECT_EQ(disk.GetVal(4, 2), 2.0f);
  EXPECT_EQ(disk.GetVal(4, 4), 3.4028235e+38f);  // beyond the radius

  // Every outline pixel of the fill is at distance 0, pixels deep inside stay untouched.
  P p[3];
  Frame(20, 20, 12, 0, 0, 8, p);
  ZvRaster<unsigned char> fill(40, 40, 0);
  ZvRaster<float> distance(40, 40, 100.0f);
  ScanConvertIsothetic(p[0], p[1], p[2], 0.5, fill, (unsigned char)255, distance, 2,
                       OvalFillOutlineDisks);
  for (int y = 0; y < 40; ++y)
    for (int x = 0; x < 40; ++x) {
      if (fill.GetVal(x, y) != 255) continue;
      const bool edge = x == 0 || fill.GetVal(x - 1, y) != 255 || fill.GetVal(x + 1, y) != 255;
      if (edge) {
        EXPECT_EQ(distance.GetVal(x, y), 0.0f) << x << "," << y;
      }
    }
  EXPECT_EQ(distance.GetVal(20, 20), 100.0f);
  EXPECT_LE(distance.GetVal(20, 13), 2.0f);
}

TEST(OvalScan, QuadraticRootsAvoidCancellation) {
  double lo = 7, hi = 7;
  ASSERT_EQ(SolveQuadraticEquation(lo, hi, 1, 3, 0), 1);
  EXPECT_EQ(lo, -3.0);
  EXPECT_EQ(hi, 0.0);
  // Roots 1e-8 and 1e8: the small one keeps its digits.
  ASSERT_EQ(SolveQuadraticEquation(lo, hi, 1, -(1e8 + 1e-8), 1), 1);
  EXPECT_NEAR(lo, 1e-8, 1e-20);
  EXPECT_NEAR(hi, 1e8, 1e-6);
  lo = hi = 7;
  EXPECT_EQ(SolveQuadraticEquation(lo, hi, 1, 0, 1), 0);
  EXPECT_EQ(lo, 7.0);
}

TEST(RadialFill, ProfileByDistanceFromTheCentre) {
  ZvGC gc;
  // A profile over 0..2, falling linearly from 1 to 0: the outline evaluates it at 2.
  gc.featherProfile = ZvStdFCurve(0.0, 1.0, 2.0, 0.0);
  const ZvOval2f oval(P{20, 20}, 20, 10);
  ZvRaster<unsigned char> r(40, 40, 9);
  ASSERT_EQ(oval.RadialFill(gc, r), 1);
  for (int y = 0; y < 40; ++y)
    for (int x = 0; x < 40; ++x) {
      const double u = (x + 0.5 - 20) / 10, v = (y + 0.5 - 20) / 5;
      const double d = std::sqrt(u * u + v * v);
      const int want = d >= 1 ? 0 : static_cast<int>(std::trunc((1 - d) * 255 + 0.5));
      ASSERT_NEAR(r.GetVal(x, y), want, 1) << x << "," << y;
    }

  // The rectangle measures by the larger axis distance in its frame: the same value along the
  // whole of a smaller concentric rectangle's outline.
  const ZvRect2f rect(P{20, 20}, 20, 10);
  ZvRaster<float> f(40, 40, 9.0f);
  ASSERT_EQ(rect.RadialFill(gc, f), 1);
  EXPECT_NEAR(f.GetVal(24, 20), 1 - 4.5 / 10, 1e-3);
  EXPECT_NEAR(f.GetVal(20, 22), 1 - 2.5 / 5, 1e-3);
  EXPECT_NEAR(f.GetVal(24, 22), f.GetVal(20, 22), 1e-3);
  EXPECT_EQ(f.GetVal(5, 5), 0.0f);

  ZvRaster<short> s(40, 40, 1);
  ASSERT_EQ(oval.RadialFill(gc, s), 1);
  EXPECT_NEAR(s.GetVal(20, 20), 16384 * (1 - std::hypot(0.05, 0.1)), 40);
}

}  // namespace
