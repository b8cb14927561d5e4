// Rectangles and ovals as shapes: handles, sizes, outlines, hit tests, the handle drags, the
// blocks and the factory.
#include <zv/gc.h>
#include <zv/oval2f.h>
#include <zv/path2f.h>
#include <zv/rect2f.h>

#include <gtest/gtest.h>

#include <cmath>
#include <vector>

#include "path_fixtures.h"

namespace {

using Bytes = std::vector<unsigned char>;

void ExpectPoint(const ZvPoint2<float>& got, float x, float y, float tol = 1e-5f) {
  EXPECT_NEAR(got.x, x, tol);
  EXPECT_NEAR(got.y, y, tol);
}

template <class S>
std::vector<ZvPoint2<float>> Handles(const S& s) {
  std::vector<ZvPoint2<float>> h(9);
  s.GetPoints(0, 8, h.data());
  return h;
}

TEST(FrameShapes, HandlesFollowTheThreeCorners) {
  const ZvRect2f r(P(3, 4), 10, 4);
  ExpectPoint(r.GetPoint(0), 3, 4);
  ExpectPoint(r.GetPoint(2), 8, 6);
  ExpectPoint(r.GetPoint(6), -2, 2);
  // A skewed frame: a = (0, 0), b = (4, 0), c = (1, 2), so d = (5, 2).
  const ZvOval2f o(P(0, 0), P(4, 0), P(1, 2));
  const float want[9][2] = {{2.5f, 1}, {4.5f, 1}, {5, 2}, {3, 2}, {1, 2},
                            {0.5f, 1}, {0, 0},    {2, 0}, {4, 0}};
  const auto h = Handles(o);
  for (int i = 0; i < 9; ++i)
    ExpectPoint(h[i], want[i][0], want[i][1]);
  ZvPoint2<float> untouched = P(7, 7);
  EXPECT_EQ(o.GetPoint(9, untouched), 0);
  ExpectPoint(untouched, 7, 7);
  EXPECT_EQ(ZvRect2f().NumPoints(), 9u);
  // From one corner to the other.
  const ZvRect2f pq(P(1, 2), P(5, 7));
  ExpectPoint(pq.GetPoint(2), 5, 7);
  EXPECT_DOUBLE_EQ(pq.GetWidthd(), 4.0);
  EXPECT_DOUBLE_EQ(pq.GetHeightd(), 5.0);

  // Picking walks from the centre: on a tiny frame the centre wins over the corners.
  unsigned int index = 99;
  EXPECT_EQ(ZvRect2f(P(0, 0), 0.2f, 0.2f).GetClosePointIndex(P(0, 0), 1.0, &index), 1);
  EXPECT_EQ(index, 0u);
  EXPECT_EQ(r.GetClosePointIndex(P(8.1f, 6), 0.5, &index), 1);
  EXPECT_EQ(index, 2u);
  ZvULongArray found;
  ZvExtent2<float> box;
  box.AddPoint(P(7, 1));
  box.AddPoint(P(9, 7));
  EXPECT_EQ(r.GetPointsInExtentIndices(box, &found), 3u);  // handles 1, 2, 8
}

TEST(FrameShapes, SizesAndExtents) {
  ZvRect2f r(P(0, 0), P(3, 4), P(0, 1));
  EXPECT_DOUBLE_EQ(r.GetWidthd(), 5.0);
  r.SetWidth(10.0);
  ExpectPoint(r.GetPoint(8), 6, 8);  // along its own direction
  // A collapsed width edge grows along x whatever the rotation of the height edge.
  ZvRect2f flat(P(1, 1), P(1, 1), P(3, 4));
  flat.SetWidth(2.0f);
  ExpectPoint(flat.GetPoint(8), 3, 1);
  flat.SetHeight(0.5);
  EXPECT_NEAR(flat.GetHeightd(), 0.5, 1e-6);

  // The extent is the frame's, not the curve's: a circle of diameter 2 turned by 45 degrees.
  ZvOval2f circle(P(0, 0), 2, 2);
  circle.Rotate(45.0, P(0, 0));
  ZvExtent2<double> e;
  circle.GetExtent(e);
  EXPECT_EQ(e.kind, ZvExtent2<double>::Regular);
  EXPECT_NEAR(e.xmax, std::sqrt(2.0), 1e-6);
  EXPECT_NEAR(e.ymin, -std::sqrt(2.0), 1e-6);
}

TEST(FrameShapes, OutlinePaths) {
  const ZvRect2f r(P(0, 0), P(4, 0), P(1, 2));
  ZvPath2f fromRect(r);
  ASSERT_EQ(fromRect.NumPoints(), 5u);
  ExpectPoint(fromRect.GetPoint(0), 5, 2);  // corner 2 first
  EXPECT_EQ(fromRect.IsSubpathClosed(0), 1);
  ZvPath2f rep;
  r.SetupPathRep(rep);
  const float order[5][2] = {{0, 0}, {4, 0}, {5, 2}, {1, 2}, {0, 0}};
  for (int i = 0; i < 5; ++i)
    ExpectPoint(rep.GetPoint(i), order[i][0], order[i][1]);

  ZvOval2f o(P(10, 5), 8, 4);
  o.Rotate(20.0, P(10, 5));
  ZvPath2f fromOval(o), ovalRep;
  o.SetupPathRep(ovalRep);
  ASSERT_EQ(fromOval.NumPoints(), 13u);
  ASSERT_EQ(ovalRep.NumPoints(), 13u);
  for (unsigned int i = 0; i < 13; ++i) {
    EXPECT_EQ(fromOval.GetPoint(i).x, ovalRep.GetPoint(i).x);
    EXPECT_EQ(fromOval.GetPoint(i).y, ovalRep.GetPoint(i).y);
  }
  EXPECT_EQ(fromOval.LargestDegree(), 3u);
  EXPECT_EQ(fromOval.IsSubpathClosed(0), 1);
  // Middle handles on the flattened outline, corners well outside it.
  ZvGC gc;
  gc.flattenTolerance = 0.01;
  ZvPoint2fArray flat;
  ZvPointTagArray tags;
  ASSERT_GT(o.Flatten(gc, flat, tags), 8u);
  for (unsigned int h = 1; h <= 8; ++h) {
    double best = 1e9;
    for (unsigned int i = 0; i < flat.size; ++i)
      best = std::fmin(best, std::hypot(flat[i].x - o.GetPoint(h).x, flat[i].y - o.GetPoint(h).y));
    if (h & 1)
      EXPECT_LT(best, 0.02) << h;
    else
      EXPECT_GT(best, 0.5) << h;
  }
}

TEST(FrameShapes, HitTests) {
  ZvGC gc;
  const ZvRect2f r(P(0, 0), P(10, 0), P(0, 6));
  auto box = [](float x0, float y0, float x1, float y1) {
    ZvExtent2<float> e;
    e.AddPoint(P(x0, y0));
    e.AddPoint(P(x1, y1));
    return e;
  };
  EXPECT_EQ(r.IsIntersectingExtent(gc, box(9, 5, 12, 8), 0), 1);  // a corner inside
  EXPECT_EQ(r.IsIntersectingExtent(gc, box(4, -1, 5, 1), 0), 1);  // an edge through
  EXPECT_EQ(r.IsIntersectingExtent(gc, box(3, 2, 4, 3), 0), 0);   // wholly inside
  EXPECT_EQ(r.IsInteriorIntersectingExtent(gc, box(3, 2, 4, 3), 0), 1);
  EXPECT_EQ(r.IsInteriorIntersectingExtent(gc, box(11, 2, 12, 3), 0), 0);
  ZvExtent2<float> infinite;
  infinite.kind = ZvExtent2<float>::Infinite;
  EXPECT_EQ(r.IsIntersectingExtent(gc, infinite, 0), 1);
  EXPECT_EQ(r.IsIntersectingExtent(gc, ZvExtent2<float>(), 0), 0);
  // Through the context's transform: the corner moves with it.
  gc.transform.Translate(0.0, 100.0, 0.0);
  EXPECT_EQ(r.IsIntersectingExtent(gc, box(9, 5, 12, 8), 0), 0);
  EXPECT_EQ(r.IsIntersectingExtent(gc, box(9, 105, 12, 108), 0), 1);
  // A rectangle collapsed to a segment still holds a box centred on its diagonal.
  const ZvRect2f line(P(0, 0), P(4, 4), P(2, 2));
  EXPECT_EQ(line.IsInteriorIntersectingExtent(ZvGC(), box(2.9f, 2.9f, 3.1f, 3.1f), 0), 1);
  // The oval answers on its outline: a box in the frame's corner but outside the curve misses.
  const ZvOval2f o(P(0, 0), P(10, 0), P(0, 10));
  EXPECT_EQ(o.IsInteriorIntersectingExtent(ZvGC(), box(0.2f, 0.2f, 0.6f, 0.6f), 0), 0);
  EXPECT_EQ(o.IsInteriorIntersectingExtent(ZvGC(), box(4, 4, 6, 6), 0), 1);
}

TEST(FrameShapes, HandleDrags) {
  ZvRect2f r(P(0, 0), P(4, 0), P(0, 2));
  EXPECT_EQ(r.HandleTranslate(6, P(1, 1)), 1);
  ExpectPoint(r.GetPoint(6), 1, 1);
  ExpectPoint(r.GetPoint(2), 5, 3);

  // Dragging handle 8 a quarter turn about the centre (2, 1) turns the frame with it; the
  // centre as handle has no angle to give.
  ZvRect2f turn(P(0, 0), P(4, 0), P(0, 2));
  EXPECT_EQ(turn.HandleRotate(0, P(5, 5), ZvRect2f::CenterStyleCenter), 0);
  ASSERT_EQ(turn.HandleRotate(8, P(3, 3), ZvRect2f::CenterStyleCenter), 1);
  ExpectPoint(turn.GetPoint(8), 3, 3, 1e-4f);
  ExpectPoint(turn.GetPoint(6), 3, -1, 1e-4f);
  ExpectPoint(turn.GetPoint(0), 2, 1, 1e-4f);

  // A middle handle with the centre fixed: both sides move, the centre stays.
  ZvRect2f wide(P(0, 0), P(4, 0), P(0, 2));
  ASSERT_EQ(wide.HandleScale(1, P(6, 7), ZvRect2f::CenterStyleCenter), 1);
  ExpectPoint(wide.GetCenter(), 2, 1);
  EXPECT_NEAR(wide.GetWidthd(), 8.0, 1e-5);
  EXPECT_NEAR(wide.GetHeightd(), 2.0, 1e-5);
  // With the opposite side fixed, only the dragged side moves.
  ZvRect2f side(P(0, 0), P(4, 0), P(0, 2));
  ASSERT_EQ(side.HandleScale(1, P(6, 7), ZvRect2f::CenterStyleOpposite), 1);
  ExpectPoint(side.GetPoint(6), 0, 0);
  ExpectPoint(side.GetPoint(2), 6, 2);
  // A corner of a skewed frame with the opposite corner fixed: the edge directions stay.
  ZvRect2f skewed(P(0, 0), P(4, 0), P(1, 2));
  ASSERT_EQ(skewed.HandleScale(2, P(7, 4), ZvRect2f::CenterStyleOpposite), 1);
  ExpectPoint(skewed.GetPoint(6), 0, 0);
  ExpectPoint(skewed.GetPoint(2), 7, 4);
  ExpectPoint(skewed.GetPoint(8), 5, 0);
  ExpectPoint(skewed.GetPoint(4), 2, 4);
  // The same corner with the centre fixed: the opposite corner mirrors the drag.
  ZvRect2f mirrored(P(0, 0), P(4, 0), P(1, 2));
  ASSERT_EQ(mirrored.HandleScale(2, P(6, 3), ZvRect2f::CenterStyleCenter), 1);
  ExpectPoint(mirrored.GetCenter(), 2.5f, 1);
  ExpectPoint(mirrored.GetPoint(6), -1, -1);

  // About an explicit anchor: the anchor is a fixed point of the drag.
  ZvRect2f anchored(P(0, 0), P(4, 0), P(0, 2));
  ASSERT_EQ(anchored.HandleScale(2, P(8, 3), P(0, 1)), 1);
  ExpectPoint(anchored.GetPoint(2), 8, 3);
  ExpectPoint(anchored.GetPoint(5), 0, 1);  // the anchor was this handle: it stays
  ZvRect2f midAnchored(P(0, 0), P(4, 0), P(0, 2));
  ASSERT_EQ(midAnchored.HandleScale(1, P(6, 1.5f), P(0, 1)), 1);
  ExpectPoint(midAnchored.GetPoint(1), 6, 1);
  ExpectPoint(midAnchored.GetPoint(5), 0, 1);

  // Skews move the dragged side; the checked form refuses a collapse and keeps the frame.
  ZvRect2f skew(P(0, 0), P(4, 0), P(0, 2));
  EXPECT_EQ(skew.HandleSkew(3, P(3, 2)), 1);
  ExpectPoint(skew.GetPoint(4), 1, 2);
  EXPECT_EQ(skew.HandleSkew(3, P(6, 0), P(0, 0)), 0);
  ExpectPoint(skew.GetPoint(4), 1, 2);
  EXPECT_EQ(ZvRect2f(P(0, 0), P(0, 0), P(0, 2)).HandleSkew(3, P(1, 1), P(0, 0)), 0);
}

TEST(FrameShapes, HandleGeometry) {
  ZvPoint2<float> out = P(9, 9);
  // b at a quarter of a-d: out at a quarter of a-c, on b's side.
  ASSERT_EQ(ComputePointWithSameRatio(P(0, 0), P(1, 0), P(0, 8), P(4, 0), out), 1);
  ExpectPoint(out, 0, 2);
  ASSERT_EQ(ComputePointWithSameRatio(P(0, 0), P(-1, 0), P(0, 8), P(4, 0), out), 1);
  ExpectPoint(out, 0, -2);
  // Nothing to measure against: c when b has not moved either, refused when c is elsewhere.
  ASSERT_EQ(ComputePointWithSameRatio(P(0, 0), P(0, 0), P(3, 3), P(0, 0), out), 1);
  ExpectPoint(out, 3, 3);
  out = P(9, 9);
  EXPECT_EQ(ComputePointWithSameRatio(P(0, 0), P(1, 0), P(3, 3), P(0, 0), out), 0);
  ExpectPoint(out, 9, 9);

  ZvPoint2<float> h, o;
  // Anchor (0, 0), handle (2, 0) dragged to (4, 5) along the y direction, opposite at (-1, 0).
  ASSERT_EQ(ComputeMidPointNewPositions(P(0, 0), P(4, 5), P(0, 1), P(2, 0), P(-1, 0), h, o), 1);
  ExpectPoint(h, 4, 0);
  ExpectPoint(o, -2, 0);
  ASSERT_EQ(ComputeNewPosition(P(0, 0), P(0, 0), P(3, 0), P(0, 1), P(1, 0), P(2, 7), out), 1);
  ExpectPoint(out, 6, 0);
}

TEST(FrameShapes, BlocksAreExactAndReadBack) {
  const ZvRect2f r(P(1, -2), P(0.5f, 3), P(-4, 0.25f));
  Bytes block(r.GetBufferSize(), 0xee);
  ASSERT_EQ(r.WriteToBuffer(block.data()), 32u);
  const Bytes want = {0x1c, 0, 0, 0,    2, 0, 0,    0,    0, 0, 0x80, 0x3f, 0, 0, 0,    0xc0,
                      0,    0, 0, 0x3f, 0, 0, 0x40, 0x40, 0, 0, 0x80, 0xc0, 0, 0, 0x80, 0x3e};
  EXPECT_EQ(block, want);
  const ZvOval2f o(P(1, -2), P(0.5f, 3), P(-4, 0.25f));
  Bytes ovalBlock(32);
  o.WriteToBuffer(ovalBlock.data());
  Bytes wantOval = want;
  wantOval[4] = 3;
  EXPECT_EQ(ovalBlock, wantOval);

  // Each reader takes only its own kind and leaves itself alone otherwise.
  ZvOval2f target(P(7, 7), 1, 1);
  EXPECT_EQ(target.ReadFromBufferBody(block.data() + 4), 0u);
  ExpectPoint(target.GetCenter(), 7, 7);
  EXPECT_EQ(target.ReadFromBufferBody(ovalBlock.data() + 4), 28u);
  ExpectPoint(target.GetPoint(6), 1, -2);

  unsigned int consumed = 5;
  ZvShape2f* s = ZvShape2f_CreateFromBufferBody(block.data() + 4, consumed);
  ASSERT_NE(s, nullptr);
  EXPECT_EQ(consumed, 28u);
  ASSERT_NE(s->QueryShapeKind(ZvShape2f::KindRect), nullptr);
  EXPECT_EQ(s->QueryShapeKind(ZvShape2f::KindOval), nullptr);
  ExpectPoint(s->GetPoint(4), -4, 0.25f);
  delete s;
  // The bounded reader: whole blocks pass, a block cut anywhere is refused.
  for (std::size_t size = 0; size <= 32; ++size) {
    Bytes cut(ovalBlock.begin(), ovalBlock.begin() + size);
    if (size >= 4 && size < 32) cut[0] = static_cast<unsigned char>(size - 4);
    s = ZvShape2f_CreateFromBuffer(cut.data(), cut.size(), consumed);
    EXPECT_EQ(s != nullptr, size == 32) << size;
    EXPECT_EQ(consumed, size == 32 ? 32u : 0u);
    if (s) {
      EXPECT_NE(s->QueryShapeKind(ZvShape2f::KindOval), nullptr);
    }
    delete s;
  }
}

TEST(FrameShapes, FillsThroughTheShape) {
  ZvGC gc;
  gc.transform.Scale(2.0, 2.0, 1.0);
  // The plain fill maps the corners first: a 3 x 2 rectangle at (1, 1) covers 6 x 4 pixels.
  const ZvRect2f r(P(1, 1), P(4, 1), P(1, 3));
  ZvRaster<short> s(10, 8, 0);
  EXPECT_EQ(r.Fill(gc, s, nullptr, nullptr), 1);
  int painted = 0;
  for (int y = 0; y < 8; ++y)
    for (int x = 0; x < 10; ++x)
      if (s.GetVal(x, y) == 16384) {
        ++painted;
        EXPECT_TRUE(x >= 2 && x < 8 && y >= 2 && y < 6) << x << "," << y;
      }
  EXPECT_EQ(painted, 24);
  // The antialiased fill goes through the outline path; the soft fill is not there yet.
  ZvRaster<unsigned char> aa(10, 8, 0);
  EXPECT_EQ(r.AAFill(gc, aa, nullptr, nullptr), 1);
  EXPECT_EQ(aa.GetVal(4, 4), 255);
  EXPECT_EQ(aa.GetVal(0, 0), 0);
  EXPECT_EQ(ZvOval2f(P(5, 4), 6, 6).SoftFill(ZvGC(), aa, nullptr), 0);
}

}  // namespace
