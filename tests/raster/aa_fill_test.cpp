// Antialiased fill values that can be counted by hand.
#include "fill_polygons.h"

#include "raster/aa_output.h"
#include "raster/aa_table.h"

#include <gtest/gtest.h>

namespace {
ZvGC Context(int rate, int radius = 0, double opacity = 1.0, int rule = 1) {
  ZvGC gc;
  gc.samplingRate = rate;
  gc.featherRadius = radius;
  gc.opacity = opacity;
  gc.fillRule = rule;
  return gc;
}

// The value of n sub-samples out of S x S at weight w, by the stated formulas.
unsigned char ByteValue(unsigned int n, unsigned int w) {
  return static_cast<unsigned char>((n * w + 32768u) >> 16);
}
}  // namespace

TEST(AAFill, TableCountsBitsAndHoldsFourByFourValues) {
  EXPECT_EQ(gc_oABTable[65536 + 0xFFFF], 16);
  EXPECT_EQ(gc_oABTable[65536 + 0x8421], 4);
  EXPECT_EQ(gc_oABTable[0xFFFF], 255);
  EXPECT_EQ(gc_oABTable[0x00FF], 128);  // 8 bits: trunc(127.5 + 0.5)
  EXPECT_EQ(gc_oABTable[0x0001], 16);   // trunc(15.9375 + 0.5)
}

TEST(AAFill, FullCellsGiveTheFullValueOfEveryTypeAtBothRates) {
  for (int rate : {4, 8}) {
    for (int rule : {0, 1}) {
      const ZvGC gc = Context(rate, 0, 1.0, rule);
      ZvRaster<unsigned char> b(6, 6, 9);
      ZvRaster<short> s(6, 6, 9);
      ZvRaster<float> f(6, 6, 9);
      AAFillRings({Rect(1, 1, 5, 5)}, gc, b);
      AAFillRings({Rect(1, 1, 5, 5)}, gc, s);
      AAFillRings({Rect(1, 1, 5, 5)}, gc, f);
      for (int y = 1; y < 5; ++y)
        for (int x = 1; x < 5; ++x) {
          EXPECT_EQ(b.GetVal(x, y), 255);
          EXPECT_EQ(s.GetVal(x, y), 16384);
          EXPECT_EQ(f.GetVal(x, y), 1.0f);
        }
      // Untouched cells are not written without a radius.
      EXPECT_EQ(b.GetVal(0, 0), 9);
      EXPECT_EQ(s.GetVal(5, 5), 9);
    }
  }
}

TEST(AAFill, HalfCellsAndOpacityWeights) {
  ZvRaster<unsigned char> b(4, 4, 0);
  AAFillRings({Rect(1, 1, 1.5, 2)}, Context(4), b);
  EXPECT_EQ(b.GetVal(1, 1), 128);
  ZvRaster<short> s(4, 4, 0);
  AAFillRings({Rect(1, 1, 1.5, 2)}, Context(8), s);
  EXPECT_EQ(s.GetVal(1, 1), 8192);  // 32 * 256
  ZvRaster<float> f(4, 4, 0);
  AAFillRings({Rect(1, 1, 1.25, 2)}, Context(4), f);
  EXPECT_EQ(f.GetVal(1, 1), 0.25f);

  // Opacity 0.5 at 8x8: W = trunc(127.5 / 64 * 65536 + 0.5) = 130560, a full pixel 128.
  EXPECT_EQ(ZvAAPixel<unsigned char>::Weight(0.5, 8), 130560u);
  AAFillRings({Rect(1, 1, 2, 2)}, Context(8, 0, 0.5), b);
  EXPECT_EQ(b.GetVal(1, 1), 128);
  // Opacity 2 wraps in 8 bits: 510 & 255.
  AAFillRings({Rect(1, 1, 2, 2)}, Context(8, 0, 2.0), b);
  EXPECT_EQ(b.GetVal(1, 1), 254);
  // 1 - 1e-7 is within the unity bound; 1 + 1e-3 is not.
  AAFillRings({Rect(1, 1, 2, 2)}, Context(4, 0, 1.0 - 1e-7), f);
  EXPECT_EQ(f.GetVal(1, 1), 1.0f);
  AAFillRings({Rect(1, 1, 2, 2)}, Context(4, 0, 1.001), s);
  EXPECT_EQ(s.GetVal(1, 1), 16400);  // 16 * trunc(1.001 * 16384 / 16 * 16384 + 0.5) >> 14
}

// Unity weights for every box size S = N + 2 * radius, and the feathered values they give at
// an edge on a pixel boundary: the pixel just inside counts (N + radius) * S sub-samples, the
// one just outside radius * S.
TEST(AAFill, FeatheredEdgesForEveryBoxSize) {
  struct Weights {
    int s;
    unsigned int byteW;
    int shortW;
    float floatW;
  } table[] = {{6, 464213, 7456540, 0.027777778f},  {8, 261120, 4194304, 0.015625f},
               {10, 167117, 2684355, 0.01f},        {12, 116053, 1864135, 0.0069444445f},
               {14, 85264, 1369569, 0.0051020407f}, {16, 65280, 1048576, 0.00390625f},
               {18, 51579, 828504, 0.0030864198f},  {20, 41779, 671089, 0.0025f},
               {22, 34528, 554619, 0.0020661156f},  {24, 29013, 466034, 0.0017361111f}};
  for (const Weights& w : table) {
    EXPECT_EQ(ZvAAPixel<unsigned char>::Weight(1.0, w.s), w.byteW);
    EXPECT_EQ(ZvAAPixel<short>::Weight(1.0, w.s), w.shortW);
    EXPECT_EQ(ZvAAPixel<float>::Weight(1.0, w.s), w.floatW);
  }
  for (int rate : {4, 8}) {
    for (int radius = 1; radius <= rate; ++radius) {
      const int s = rate + 2 * radius;
      unsigned int w = 0;
      for (const Weights& t : table)
        if (t.s == s) w = t.byteW;
      ASSERT_NE(w, 0u);
      ZvRaster<unsigned char> b(12, 12, 7);
      AAFillRings({Rect(4, -20, 40, 40)}, Context(rate, radius), b);
      for (int y : {0, 5, 11}) {
        EXPECT_EQ(b.GetVal(6, y), 255) << rate << " " << radius;
        EXPECT_EQ(b.GetVal(4, y), ByteValue((rate + radius) * s, w)) << rate << " " << radius;
        EXPECT_EQ(b.GetVal(3, y), ByteValue(radius * s, w)) << rate << " " << radius;
        EXPECT_EQ(b.GetVal(2, y), 7);  // beyond the working box: untouched
      }
    }
  }
}

TEST(AAFill, FeatherCornerCountsTheNineCells) {
  // A single full pixel at 4x4 with radius 2: the diagonal neighbour sees a 2x2 corner.
  ZvRaster<short> s(5, 5, 0);
  AAFillRings({Rect(2, 2, 3, 3)}, Context(4, 2), s);
  EXPECT_EQ(s.GetVal(2, 2), (16u * 4194304u + 8192u) >> 14);  // S = 8: 16 of 64
  EXPECT_EQ(s.GetVal(1, 1), (4u * 4194304u + 8192u) >> 14);
  EXPECT_EQ(s.GetVal(2, 1), (8u * 4194304u + 8192u) >> 14);
}

TEST(AAFill, RadiusIsClampedToTheCell) {
  ZvRaster<unsigned char> a(10, 10, 0), b(10, 10, 0), c(10, 10, 0), d(10, 10, 0);
  const std::vector<Ring> shape = {Ring{{2.3, 1.1}, {8.6, 4.2}, {3.1, 8.9}}};
  AAFillRings(shape, Context(8, 9), a);
  AAFillRings(shape, Context(8, 8), b);
  EXPECT_EQ(std::vector<unsigned char>(a.GetRaster(), a.GetRaster() + 100),
            std::vector<unsigned char>(b.GetRaster(), b.GetRaster() + 100));
  AAFillRings(shape, Context(4, -3), c);
  AAFillRings(shape, Context(4, 0), d);
  EXPECT_EQ(std::vector<unsigned char>(c.GetRaster(), c.GetRaster() + 100),
            std::vector<unsigned char>(d.GetRaster(), d.GetRaster() + 100));
}

TEST(AAFill, RuleOrientationAndRowZeroWithRadius) {
  // Even-odd hole versus winding fill of a same-direction inner ring.
  ZvRaster<unsigned char> eo(10, 10, 0), nz(10, 10, 0);
  AAFillRings({Rect(1, 1, 9, 9), Rect(3, 3, 7, 7)}, Context(8, 0, 1.0, 0), eo);
  AAFillRings({Rect(1, 1, 9, 9), Rect(3, 3, 7, 7)}, Context(8, 0, 1.0, 1), nz);
  EXPECT_EQ(eo.GetVal(5, 5), 0);
  EXPECT_EQ(nz.GetVal(5, 5), 255);
  // Flipped rows; a shape touching row 0 with a radius counts the empty row above it.
  ZvRaster<unsigned char> r(4, 4, 0);
  r.SetOrientationFlag(1);
  AAFillRings({Rect(0, 0, 4, 1)}, Context(4, 4), r);
  const unsigned int w = 116053;                    // S = 12
  EXPECT_EQ(r.GetVal(1, 3), ByteValue(12 * 4, w));  // rows -1 and 1 empty: 4 of 12 rows
  EXPECT_EQ(r.GetVal(1, 2), ByteValue(12 * 4, w));
  EXPECT_EQ(r.GetVal(1, 1), 0);  // below the working box
}

TEST(AAFill, FeatheredRangeWritesZeroCountsBetweenTouchedCells) {
  ZvRaster<unsigned char> b(10, 4, 7);
  AAFillRings({Rect(1, 1, 2, 2), Rect(8, 1, 9, 2)}, Context(4, 1), b);
  EXPECT_EQ(b.GetVal(5, 1), 0);
  EXPECT_EQ(b.GetVal(1, 1), ByteValue(16, 464213));  // its own 16 of 36 samples
}

namespace {
int callbacks = 0;
int CountCallback() {
  ++callbacks;
  return 0;
}
int StopAtFifth() {
  return ++callbacks == 5;
}
}  // namespace

TEST(AAFill, CallbackPerSubSampleRowExceptFourByFourEvenOdd) {
  struct Case {
    int rate, rule, perRow;
  } cases[] = {{4, 0, 1}, {4, 1, 4}, {8, 0, 8}, {8, 1, 8}};
  for (const Case& c : cases) {
    ZvRaster<unsigned char> r(8, 8, 0);
    callbacks = 0;
    EXPECT_EQ(AAFillRings({Rect(1, 2, 7, 5)}, Context(c.rate, 0, 1.0, c.rule), r, CountCallback),
              1);
    EXPECT_EQ(callbacks, 8 * c.perRow) << c.rate << " " << c.rule;  // the box is the raster
  }
  // Stopped in the second pixel row of 4x4 non-zero: only the first row is written.
  ZvRaster<unsigned char> r(8, 8, 0);
  callbacks = 0;
  EXPECT_EQ(AAFillRings({Rect(1, 0, 7, 3)}, Context(4), r, StopAtFifth), 0);
  EXPECT_EQ(r.GetVal(3, 0), 255);
  EXPECT_EQ(r.GetVal(3, 1), 0);
}
