// Strokes: outlines filled under the winding rule, joins, caps, limits and taper.
#include "raster/stroke_outline.h"

#include <zv/gc.h>
#include <zv/path2f.h>

#include <gtest/gtest.h>

namespace {
ZvPath2f Polyline(std::initializer_list<ZvPoint2<float>> points, bool close = false) {
  ZvPath2f path;
  bool first = true;
  for (const ZvPoint2<float>& p : points) {
    if (first)
      path.Moveto(p);
    else
      path.Lineto(p);
    first = false;
  }
  if (close) path.Closeto();
  return path;
}

ZvGC Pen(double width, int cap = 2, int join = 1) {
  ZvGC gc;
  gc.lineWidth = width;
  gc.capStyle = cap;
  gc.joinStyle = join;
  return gc;
}

int Painted(const ZvRaster<unsigned char>& r) {
  int n = 0;
  for (int i = 0; i < r.GetSize(); ++i)
    n += r.GetVal(i) == 255;
  return n;
}
}  // namespace

TEST(Stroke, LineCoversItsWidthAndCapsExtendIt) {
  const ZvPath2f line = Polyline({{4, 10.0f}, {24, 10.0f}});
  ZvRaster<unsigned char> flat(32, 20, 0), square(32, 20, 0);
  line.Stroke(Pen(4, 2), flat);
  line.Stroke(Pen(4, 1), square);
  // Rows 8..11 (centres 8.5..11.5 within 8..12); columns 4..23, or 2..25 with square caps.
  EXPECT_EQ(Painted(flat), 4 * 20);
  EXPECT_EQ(Painted(square), 4 * 24);
  for (int y = 8; y < 12; ++y) {
    EXPECT_EQ(flat.GetVal(4, y), 255);
    EXPECT_EQ(flat.GetVal(3, y), 0);
    EXPECT_EQ(square.GetVal(2, y), 255);
    EXPECT_EQ(square.GetVal(25, y), 255);
  }
  ZvRaster<unsigned char> round(32, 20, 0);
  line.Stroke(Pen(4, 0), round);
  EXPECT_EQ(round.GetVal(2, 10), 255);  // within the half disc
  EXPECT_EQ(round.GetVal(2, 8), 0);     // outside it, inside the square cap
}

TEST(Stroke, ClosedRectangleIsARingUnderTheWindingRule) {
  const ZvPath2f rect = Polyline({{5, 5}, {25, 5}, {25, 25}, {5, 25}, {5, 5}}, true);
  ASSERT_TRUE(rect.IsSubpathClosed(0));
  ZvRaster<unsigned char> r(30, 30, 0);
  rect.Stroke(Pen(4, 2, 1), r);
  EXPECT_EQ(r.GetVal(15, 15), 0);
  EXPECT_EQ(r.GetVal(15, 3), 255);
  EXPECT_EQ(r.GetVal(15, 6), 255);
  EXPECT_EQ(r.GetVal(15, 7), 0);
  EXPECT_EQ(r.GetVal(26, 15), 255);
  // The miter limit of 1 cuts every corner: the outer corner pixel stays empty.
  EXPECT_EQ(r.GetVal(3, 3), 0);
  ZvGC sharp = Pen(4, 2, 1);
  sharp.miterLimit = 2.0;
  ZvRaster<unsigned char> s(30, 30, 0);
  rect.Stroke(sharp, s);
  EXPECT_EQ(s.GetVal(3, 3), 255);
}

TEST(Stroke, LimitsBelowOneCountAsOneAndUnknownStylesKeepThePrevious) {
  const ZvPath2f zig = Polyline({{2, 20}, {12, 4}, {22, 20}, {30, 6}});
  ZvGC half = Pen(5, 2, 1);
  half.miterLimit = 0.5;
  ZvRaster<unsigned char> a(34, 26, 0), b(34, 26, 0);
  zig.Stroke(half, a);
  zig.Stroke(Pen(5, 2, 1), b);
  EXPECT_EQ(std::vector<unsigned char>(a.GetRaster(), a.GetRaster() + a.GetSize()),
            std::vector<unsigned char>(b.GetRaster(), b.GetRaster() + b.GetSize()));
  ZvRaster<unsigned char> r(34, 26, 0);
  zig.Stroke(Pen(5, 0, 2), r);
  zig.Stroke(Pen(5, 7, 7), r);
  EXPECT_EQ(pJoin, &JoinRound);
  EXPECT_EQ(pEndCap, &EndCapRound);
}

TEST(Stroke, RoundJoinBeyondOneHundredTwentyDegreesIsABevel) {
  ZvPath2f wide, sharp;
  wide.Moveto({0, 0});
  sharp.Moveto({0, 0});
  const ZvPoint2<double> c{10, 10};
  JoinRound({0, 2}, {2, 0}, c, 2, 1, wide);          // 90 degrees: a curve
  JoinRound({0, 2}, {1.0, -1.732}, c, 2, 1, sharp);  // 150 degrees: a bevel
  EXPECT_EQ(wide.GetDegree(wide.NumPoints() - 1), 2u);
  EXPECT_TRUE(sharp.IsPolyline());
  EXPECT_EQ(sharp.NumPoints(), 3u);
}

TEST(Stroke, DegenerateAndTaperedPathsPaintNothingOrLittle) {
  ZvPath2f dot = Polyline({{5, 5}, {5, 5}}, true);
  ZvRaster<unsigned char> r(10, 10, 0);
  dot.Stroke(Pen(4), r);
  EXPECT_TRUE(r.AllPixelValuesAre(0));

  ZvGC taper = Pen(6);
  taper.taper = 1;
  ZvRaster<unsigned char> t(30, 20, 0);
  Polyline({{2, 10}, {28, 10}}).Stroke(taper, t);
  EXPECT_EQ(Painted(t), 0);  // weights 0 at both ends of the only segment
  ZvRaster<unsigned char> bent(30, 20, 0);
  Polyline({{2, 10}, {15, 10}, {28, 10.5f}}).Stroke(taper, bent);
  EXPECT_GT(Painted(bent), 20);  // full width in the middle of the length
  EXPECT_EQ(bent.GetVal(3, 7), 0);
}

TEST(Stroke, FloatAndShortRastersGetOnlyTheFullValue) {
  ZvRaster<float> f(20, 20, 0.5f);
  ZvRaster<short> s(20, 20, 3);
  const ZvPath2f line = Polyline({{2, 10}, {18, 10}});
  line.Stroke(Pen(4), f);
  line.Stroke(Pen(4), s);
  for (int i = 0; i < f.GetSize(); ++i) {
    EXPECT_TRUE(f.GetVal(i) == 1.0f || f.GetVal(i) == 0.5f);
    EXPECT_TRUE(s.GetVal(i) == 16384 || s.GetVal(i) == 3);
  }
  EXPECT_EQ(f.GetVal(10, 10), 1.0f);
  EXPECT_EQ(s.GetVal(10, 10), 16384);
}
