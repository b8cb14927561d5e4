// Storage, ownership, pixels, spans, raster-onto-raster operations, distance maps and the dump.
#include <zv/raster.h>

#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <string>
#include <vector>

TEST(Raster, PixelAccessAndRunningMinimum) {
  ZvRaster<short> r(3, 2, 7);
  EXPECT_EQ(r.GetSize(), 6);
  EXPECT_EQ(r.AllPixelValuesAre(7), 1);
  r.SetVal(2, 1, 9);
  EXPECT_EQ(r.GetVal(5), 9);  // row-major, no gap between rows
  r.GetValByRef(0, 1) = 4;
  r.SetValWhenSmaller(0, 1, 6);  // a running minimum: 4 stays
  EXPECT_EQ(r.GetValByConstRef(3), 4);
  r.SetValWhenSmaller(0, 1, 1);
  EXPECT_EQ(r.GetVal(0, 1), 1);
  EXPECT_EQ(r.ConvertBottomUpY(0), 0);
  r.SetOrientationFlag(5);
  EXPECT_EQ(r.ConvertBottomUpY(0), 1);
  const ZvExtent2<float> e = r.GetExtent2f();
  EXPECT_EQ(e.kind, ZvExtent2<float>::Regular);
  EXPECT_EQ(e.xmax, 3.0f);
  EXPECT_EQ(e.ymax, 2.0f);
}

TEST(Raster, FillValuesIncludingNegativeZeroAndNaN) {
  ZvRaster<float> r(4, 4, -0.0f);
  EXPECT_FALSE(std::signbit(r.GetVal(3)));  // cleared bytes: +0.0
  r.MemsetBuffer(0.5f);
  EXPECT_EQ(r.AllPixelValuesAre(0.5f), 1);
  EXPECT_EQ(r.AllPixelValuesAre(std::numeric_limits<float>::quiet_NaN()), 0);
  r.SetVal(7, std::numeric_limits<float>::quiet_NaN());
  EXPECT_EQ(r.AllPixelValuesAre(0.5f), 0);
  ZvRaster<unsigned char> b(5, 1, 200);
  EXPECT_EQ(b.AllPixelValuesAre(200), 1);
  ZvRaster<double> empty(0, 3, 1.0);
  EXPECT_EQ(empty.AllPixelValuesAre(2.0), 1);
}

TEST(Raster, WrappedMemoryIsOverwrittenAndSharedByCopies) {
  std::vector<int> memory(6, 42);
  {
    ZvRaster<int> wrap(memory.data(), 3, 2, 0, 5);
    EXPECT_EQ(memory[4], 5);  // the wrapper fills at once
    ZvRaster<int> copy(wrap);
    EXPECT_EQ(copy.GetRaster(), memory.data());  // a copy of a wrapper shares
    ZvRaster<int> assigned(1, 1, 0);
    assigned = wrap;
    EXPECT_NE(assigned.GetRaster(), memory.data());
    EXPECT_EQ(assigned.AllPixelValuesAre(5), 1);
    // The owner flag came over as 0, so this block is the caller's to free.
    int* orphan = assigned.GetRaster();
    assigned.Reconstruct(2, 2, 1);  // abandons it, then owns a fresh block
    delete[] orphan;
    EXPECT_EQ(assigned.AllPixelValuesAre(1), 1);
  }
  EXPECT_EQ(memory[0], 5);  // the wrapper did not free the vector's memory

  ZvRaster<int> owner(2, 2, 3);
  owner.SetOrientationFlag(1);
  ZvRaster<int> deep(owner);
  EXPECT_NE(deep.GetRaster(), owner.GetRaster());
  EXPECT_EQ(deep.GetOrientationFlag(), 1);
  const ZvRaster<int>& self = deep;
  deep = self;  // self-assignment keeps the pixels
  EXPECT_EQ(deep.AllPixelValuesAre(3), 1);

  // An owning wrapper hands its block over.
  ZvRaster<short> given(new short[4], 2, 2, 1, 8);
  EXPECT_EQ(given.AllPixelValuesAre(8), 1);
}

TEST(Raster, ReconstructKeepsOrientationAndAlwaysReallocates) {
  ZvRaster<unsigned char> r(2, 2, 1);
  r.SetOrientationFlag(1);
  r.Reconstruct(3, 1, 9);
  EXPECT_EQ(r.GetWidth(), 3);
  EXPECT_EQ(r.GetHeight(), 1);
  EXPECT_EQ(r.GetOrientationFlag(), 1);
  EXPECT_EQ(r.AllPixelValuesAre(9), 1);
}

TEST(Raster, ImpossibleSizesFailInTheAllocator) {
  EXPECT_THROW(ZvRaster<double>(-1, 1, 0.0), std::bad_alloc);
  ZvRaster<int> r(1, 1, 4);
  // 2^31 pixels is a negative 32-bit count.
  EXPECT_THROW(r.Reconstruct(65536, 32768, 0), std::bad_alloc);
  EXPECT_EQ(r.GetWidth(), 1);
  EXPECT_EQ(r.GetVal(0), 4);  // unchanged after the failure
}

TEST(Raster, Spans) {
  ZvRaster<int> r(6, 2, 0);
  r.SetValOnSpan(1, 3, 1, 5);
  r.SetValOnSpan(4, 3, 1, 9);  // x0 > x1: nothing
  EXPECT_EQ(r.GetVal(0, 1), 0);
  EXPECT_EQ(r.GetVal(3, 1), 5);
  EXPECT_EQ(r.GetVal(4, 1), 0);
  r.SetValOnSpanWhenSmaller(0, 5, 1, 2);
  EXPECT_EQ(r.GetVal(0, 1), 0);
  EXPECT_EQ(r.GetVal(2, 1), 2);
  EXPECT_EQ(r.EndOfSpanEqual(1, 1, 2), 3);
  EXPECT_EQ(r.EndOfSpanEqual(0, 1, 2), -1);  // differs at x
  EXPECT_EQ(r.EndOfSpanEqual(6, 1, 2), 5);   // x >= width
  EXPECT_EQ(r.EndOfSpanNotEqual(0, 1, 0), -1);
  EXPECT_EQ(r.EndOfSpanNotEqual(1, 1, 0), 3);
  EXPECT_EQ(r.EndOfSpanEqual(4, 1, 0), 5);  // runs to the end of the row
}

namespace {
ZvRaster<int> Numbered(int w, int h) {
  ZvRaster<int> r(w, h, 0);
  for (int i = 0; i < w * h; ++i)
    r.SetVal(i, 10 + i);
  return r;
}
}  // namespace

TEST(Raster, CopyRasterClipsOnAllSides) {
  const ZvRaster<int> src = Numbered(3, 3);  // rows: 10 11 12 / 13 14 15 / 16 17 18
  ZvRaster<int> dst(4, 4, 0);
  dst.CopyRaster(-1, 2, src);
  EXPECT_EQ(dst.GetVal(0, 2), 11);
  EXPECT_EQ(dst.GetVal(1, 2), 12);
  EXPECT_EQ(dst.GetVal(0, 3), 14);
  EXPECT_EQ(dst.GetVal(2, 2), 0);
  EXPECT_EQ(dst.GetVal(0, 1), 0);
  ZvRaster<int> untouched(4, 4, 0);
  untouched.CopyRaster(4, 0, src);   // clipped width 0
  untouched.CopyRaster(0, -3, src);  // clipped height 0
  untouched.CopyRaster(-9, 0, src);
  EXPECT_EQ(untouched.AllPixelValuesAre(0), 1);
}

TEST(Raster, RasterRunningMinimumFollowsOrientation) {
  const ZvRaster<int> src = Numbered(2, 2);  // 10 11 / 12 13
  ZvRaster<int> up(3, 3, 12);
  up.SetValWhenSmaller(1, 1, src);
  EXPECT_EQ(up.GetVal(1, 1), 10);
  EXPECT_EQ(up.GetVal(2, 1), 11);
  EXPECT_EQ(up.GetVal(1, 2), 12);
  EXPECT_EQ(up.GetVal(2, 2), 12);  // 13 is not smaller
  EXPECT_EQ(up.GetVal(0, 0), 12);

  // Bottom-up target: drawing row 0 is raw row 1, which clips the source to one row; its
  // source row is named from the target's height (1) and lands on raw row 0.
  ZvRaster<int> down(2, 2, 99);
  down.SetOrientationFlag(1);
  down.SetValWhenSmaller(0, 0, src);
  EXPECT_EQ(down.GetVal(0, 0), 12);
  EXPECT_EQ(down.GetVal(1, 0), 13);
  EXPECT_EQ(down.GetVal(0, 1), 99);
  // Both bottom-up and of one size: the layout carries over unchanged.
  ZvRaster<int> flipped = Numbered(2, 2);
  flipped.SetOrientationFlag(1);
  ZvRaster<int> both(2, 2, 99);
  both.SetOrientationFlag(1);
  both.SetValWhenSmaller(0, 1, flipped);
  EXPECT_EQ(both.GetVal(0, 0), 10);
  EXPECT_EQ(both.GetVal(1, 1), 13);
  // A smaller source under a bottom-up target would be read from rows it does not have; those
  // rows are skipped rather than read past the source.
  ZvRaster<int> tall(1, 4, 99);
  tall.SetOrientationFlag(1);
  tall.SetValWhenSmaller(0, 3, Numbered(1, 1));
  EXPECT_EQ(tall.AllPixelValuesAre(99), 1);
}

TEST(Raster, DistanceMaps) {
  // One feature pixel at (1, 1) of a 4x3 raster; (3, 2) carries the negative label.
  ZvRaster<unsigned char> labels(4, 3, 0);
  labels.SetVal(1, 1, 1);
  labels.SetVal(3, 2, 2);
  ZvRaster<int> sq(4, 3, -7);
  sq.SetToSquaredEuclideanDistanceMap(labels);
  EXPECT_EQ(sq.GetVal(1, 1), 0);
  EXPECT_EQ(sq.GetVal(0, 0), 2);
  EXPECT_EQ(sq.GetVal(3, 0), 5);
  EXPECT_EQ(sq.GetVal(3, 2), -5);
  ZvRaster<unsigned char> bytes(4, 3, 0);
  bytes.SetToSquaredEuclideanDistanceMap(labels);
  EXPECT_EQ(bytes.GetVal(3, 2), 251);  // negation wraps modulo 256
  ZvRaster<float> cheb(4, 3, 0.0f);
  cheb.SetToLInfinityDistanceMap(labels);
  EXPECT_EQ(cheb.GetVal(3, 0), 2.0f);
  EXPECT_EQ(cheb.GetVal(3, 2), 2.0f);  // no sign in this map
  EXPECT_EQ(cheb.GetVal(0, 1), 1.0f);

  // With no feature the far value max(w, h) + 1 = 5 stays everywhere.
  ZvRaster<unsigned char> none(4, 3, 0);
  ZvRaster<double> far(4, 3, 0.0);
  far.SetToSquaredEuclideanDistanceMap(none);
  EXPECT_EQ(far.AllPixelValuesAre(50.0), 1);
  far.SetToLInfinityDistanceMap(none);
  EXPECT_EQ(far.AllPixelValuesAre(5.0), 1);
}

TEST(Raster, DistanceMapMatchesBruteForceOnAScatter) {
  const int w = 13, h = 9;
  ZvRaster<unsigned char> labels(w, h, 0);
  const int features[][2] = {{0, 0}, {12, 3}, {5, 8}, {7, 4}};
  for (const auto& f : features)
    labels.SetVal(f[0], f[1], 1);
  ZvRaster<unsigned int> map(w, h, 0);
  map.SetToSquaredEuclideanDistanceMap(labels);
  for (int y = 0; y < h; ++y)
    for (int x = 0; x < w; ++x) {
      unsigned int best = ~0u;
      for (const auto& f : features) {
        const unsigned int d = (x - f[0]) * (x - f[0]) + (y - f[1]) * (y - f[1]);
        if (d < best) best = d;
      }
      EXPECT_EQ(map.GetVal(x, y), best) << x << "," << y;
    }
}

TEST(Raster, EmptyRasterDistanceMapWritesNothing) {
  ZvRaster<unsigned char> labels(0, 0, 0);
  ZvRaster<short> map(0, 5, 0);
  map.SetToSquaredEuclideanDistanceMap(labels);
  map.SetToLInfinityDistanceMap(labels);
  EXPECT_EQ(map.GetSize(), 0);
}

TEST(Raster, PrintWritesTopRowFirst) {
  ZvRaster<unsigned char> b(2, 2, 'a');
  b.SetVal(0, 1, 'z');
  b.SetOrientationFlag(1);  // not consulted
  testing::internal::CaptureStdout();
  b.Print();
  EXPECT_EQ(testing::internal::GetCapturedStdout(),
            "Type raster W x H = 2 x 2\n   z   a\n   a   a\n");
  ZvRaster<float> f(3, 1, 0.5f);
  f.SetVal(2, 12345.0f);
  testing::internal::CaptureStdout();
  f.Print();
  EXPECT_EQ(testing::internal::GetCapturedStdout(), "Type raster W x H = 3 x 1\n 0.5 0.512345\n");
  ZvRaster<int> none(4, 0, 0);
  testing::internal::CaptureStdout();
  none.Print();
  EXPECT_EQ(testing::internal::GetCapturedStdout(), "Type raster W x H = 4 x 0\n");
}
