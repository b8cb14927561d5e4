// Fills of paths through the shape interface: pixel box, clipping, box, callback, masks.
#include <zv/fill.h>
#include <zv/gc.h>
#include <zv/path2f.h>
#include <zv/rect2f.h>

#include <gtest/gtest.h>

namespace {
ZvPath2f Square(float x0, float y0, float x1, float y1) {
  return ZvPath2f(ZvRect2f({x0, y0}, {x1, y1}));
}

int calls = 0;
int Count() {
  ++calls;
  return 0;
}
int StopAtOnce() {
  ++calls;
  return 1;
}
}  // namespace

TEST(FillPath, ShapeOutsideTheRasterWritesNothingAndNeverCallsBack) {
  ZvGC gc;
  ZvRaster<unsigned char> r(10, 10, 0);
  calls = 0;
  EXPECT_EQ(Square(20, 20, 30, 30).Fill(gc, r, Count, nullptr), 0);
  EXPECT_EQ(Square(-30, 2, -20, 8).AAFill(gc, r, Count, nullptr), 0);
  EXPECT_EQ(calls, 0);
  EXPECT_TRUE(r.AllPixelValuesAre(0));
  EXPECT_EQ(Square(0, 0, 10, 10).Fill(gc, r, StopAtOnce, nullptr), 0);
  EXPECT_EQ(calls, 1);
  EXPECT_TRUE(r.AllPixelValuesAre(0));
}

TEST(FillPath, TransformedAndClippedShapeFillsTheRaster) {
  ZvGC gc;
  gc.transform.Translate(-5.0, -5.0, 0.0);
  gc.transform.Scale(4.0, 4.0, 1.0);
  ZvRaster<unsigned char> r(8, 8, 0);
  calls = 0;
  EXPECT_EQ(Square(0, 0, 10, 10).Fill(gc, r, Count, nullptr), 1);  // -5..35: clipped
  EXPECT_TRUE(r.AllPixelValuesAre(255));
  EXPECT_EQ(calls, 8);  // once per row
  ZvRaster<float> f(8, 8, 0);
  gc.samplingRate = 8;
  Square(0, 0, 10, 10).AAFill(gc, f, nullptr, nullptr);
  EXPECT_TRUE(f.AllPixelValuesAre(1.0f));
}

TEST(FillPath, BoxKeepsItsLastColumnAndRowUnpainted) {
  ZvGC gc;
  const IntBbox2l box{2, 3, 4, 5};  // columns 2..5, rows 3..7
  for (int flag : {0, 1}) {
    ZvRaster<unsigned char> r(10, 10, 0);
    r.SetOrientationFlag(flag);
    Square(-5, -5, 15, 15).Fill(gc, r, nullptr, &box);
    for (int y = 0; y < 10; ++y)
      for (int x = 0; x < 10; ++x) {
        const bool inside = x >= 2 && x <= 4 && y >= 3 && y <= 6;
        EXPECT_EQ(r.GetVal(x, flag ? 9 - y : y), inside ? 255 : 0) << x << "," << y;
      }
  }
}

TEST(FillPath, BooleanMasksCombineTwoFillsAndNeverClear) {
  ZvGC gc;
  const ZvPath2f a = Square(0, 0, 6, 4), b = Square(3, 0, 9, 4);
  struct Case {
    void (*mask)(const ZvGC&, const ZvShape2f*, const ZvShape2f*, ZvRaster<unsigned char>&);
    int first, last;  // columns set in every row
  } cases[] = {
      {ZvShape2f_IntersectionAB, 3, 5}, {ZvShape2f_UnionAB, 0, 8}, {ZvShape2f_DifferenceAB, 0, 2}};
  for (const Case& c : cases) {
    ZvRaster<unsigned char> t(10, 4, 0);
    t.SetVal(9, 0, 7);
    c.mask(gc, &a, &b, t);
    for (int x = 0; x < 9; ++x)
      EXPECT_EQ(t.GetVal(x, 2), x >= c.first && x <= c.last ? 255 : 0) << x;
    EXPECT_EQ(t.GetVal(9, 0), 7);
  }
}

TEST(FillPath, EmptyOrFarBoxesPaintNothing) {
  ZvGC gc;
  ZvRaster<unsigned char> r(10, 10, 0);
  const IntBbox2l boxes[] = {{2, 2, 1, 5}, {-2147483647 - 1, 0, 0, 10}, {20, 20, 5, 5}};
  for (const IntBbox2l& box : boxes)
    EXPECT_EQ(Square(0, 0, 10, 10).Fill(gc, r, nullptr, &box), 0);
  EXPECT_TRUE(r.AllPixelValuesAre(0));
}
