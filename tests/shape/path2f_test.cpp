// Drawing, structure queries, closing, tangent locks, copying, transforms and the dump of
// ZvPath2f.
#include <zv/gc.h>
#include <zv/path2f.h>

#include <gtest/gtest.h>

#include <sstream>

#include "path_fixtures.h"

using Codeset = std::vector<int>;

// Points, segments, subpaths, nodes, largest degree and whether it is a polyline.
std::vector<unsigned int> Counts(const ZvPath2f& p) {
  return {p.NumPoints(),   p.NumNodes(),      p.NumSegments(),
          p.NumSubpaths(), p.LargestDegree(), unsigned(p.IsPolyline())};
}

TEST(Path2f, EmptyAndSinglePointPaths) {
  ZvPath2f empty(10);
  EXPECT_EQ(Counts(empty), (std::vector<unsigned int>{0, 0, 0, 0, 0, 0}));
  EXPECT_EQ(empty.Closeto(), 0);
  EXPECT_EQ(empty.GetBufferSize(), 16u);
  ZvPoint2<float> untouched = P(7, 7);
  unsigned int first = 99, last = 99;
  EXPECT_EQ(empty.GetPoint(0, untouched) + empty.GetSubpathIndices(0, first, last), 0);
  EXPECT_TRUE(untouched.x == 7.0f && first == 99);

  ZvPath2f one;
  one.Moveto(P(3, 4));
  EXPECT_EQ(Counts(one), (std::vector<unsigned int>{1, 1, 1, 1, 0, 1}));  // a lone start: a segment
  EXPECT_EQ(one.GetCurrentPoint().y, 4.0f);
  EXPECT_EQ(one.MaxDegreeForThisImplementation(), 8u);
}

TEST(Path2f, DrawingCodesAndStructure) {
  const ZvPath2f path = ThreeSubpaths();
  EXPECT_EQ(Codes(path), (Codeset{1, 3, 3, 1, 8, 9, 10, 8, 9, 11, 1}));
  EXPECT_TRUE(PathInvariantHolds(path));
  EXPECT_EQ(Counts(path), (std::vector<unsigned int>{11, 7, 5, 3, 3, 0}));
  EXPECT_EQ(path.NumNodesExceptLastNodeOfClosedSubpaths(), 6u);
  // A start answers for the segment behind it.
  EXPECT_TRUE(path.GetDegree(3) == 3 && path.GetDegree(10) == 0 && path.GetDegree(2) == 1);

  // Index asked, first and last of its segment.
  const unsigned int segments[][3] = {{5, 3, 6}, {3, 3, 6}, {9, 6, 9}, {10, 10, 10}};
  unsigned int first = 0, last = 0;
  for (const auto& s : segments) {
    ASSERT_EQ(path.GetSegmentIndices(s[0], first, last), 1);
    EXPECT_TRUE(first == s[1] && last == s[2]) << s[0];
  }
  path.GetSubpathIndices(8, first, last);
  EXPECT_TRUE(first == 3 && last == 9);

  int closed = -1;
  EXPECT_EQ(path.IsEndOfSubpath(1, closed), 0);
  EXPECT_EQ(closed, -1);
  EXPECT_EQ(path.IsEndOfSubpath(2, closed), 1);
  EXPECT_EQ(closed, 0);
  EXPECT_EQ(path.IsEndOfSubpath(9, closed), 1);
  EXPECT_EQ(closed, 1);
  EXPECT_TRUE(path.IsSubpathClosed(4) == 1 && path.IsSubpathClosed(0) == 0);
  EXPECT_TRUE(path.IsStartOfSubpath(3) == 1 && path.IsStartOfSubpath(4) == 0);

  ZvPath2fIter it(path);
  unsigned int expected[][2] = {{0, 2}, {3, 9}, {10, 10}};
  for (int pass = 0; pass < 2; ++pass) {
    for (const auto& e : expected) {
      ASSERT_EQ(it.GetNextSubPathIndices(first, last), 1);
      EXPECT_TRUE(first == e[0] && last == e[1]);
    }
    EXPECT_EQ(it.GetNextSubPathIndices(first, last), 0);
    it.Reset();
  }
}

TEST(Path2f, HigherDegreesAndRefusedDegrees) {
  ZvPath2f path;
  path.Moveto(P(0, 0));
  const ZvPoint2<float> pts[9] = {P(1, 1), P(2, 2), P(3, 3), P(4, 4), P(5, 5),
                                  P(6, 6), P(7, 7), P(8, 8), P(9, 9)};
  path.AltCurveto(pts, 9);
  path.AltCurveto(pts, 0);
  EXPECT_EQ(path.NumPoints(), 1u);
  path.AltCurveto(pts, 5);
  path.Curveto(P(1, 0), P(0, 0));
  ZvPoint2fArray array(4);
  for (int i = 0; i < 8; ++i)
    array.Add(static_cast<double>(i), 0.0);
  path.AltAltCurveto(array, 0, 8);
  path.AltAltCurveto(array, 1, 8);            // past the array's end
  path.AltAltCurveto(array, 0xfffffffeu, 4);  // first + degree would wrap
  EXPECT_EQ(Codes(path), (Codeset{1, 17, 18, 19, 20, 21, 5, 6, 38, 39, 40, 41, 42, 43, 44, 45}));
  EXPECT_TRUE(path.LargestDegree() == 8 && path.NumSegments() == 3);
  path.Closeto();  // (7, 0) is not the start
  EXPECT_EQ(Codes(path).back(), 45);
}

TEST(Path2f, ClosetoNeedsCoincidentEnds) {
  ZvPath2f tri;
  tri.Moveto(P(0, 0));
  tri.Lineto(P(4, 0));
  tri.Lineto(P(4, 3));
  EXPECT_EQ(tri.Closeto(), 0);
  EXPECT_EQ(Codes(tri), (Codeset{1, 3, 3}));
  ZvPath2f copy(tri);
  EXPECT_EQ(tri.CloseSubpath(1), 1);  // adds the closing line
  EXPECT_EQ(Codes(tri), (Codeset{1, 3, 3, 4}));
  EXPECT_EQ(tri.GetPoint(3).x, 0.0f);
  EXPECT_EQ(tri.CloseSubpath(0), 0);  // already closed: no open end code left
  EXPECT_EQ(tri.OpenSubpath(2), 1);
  EXPECT_EQ(Codes(tri), (Codeset{1, 3, 3, 3}));
  EXPECT_EQ(tri.OpenSubpath(2), 0);
  EXPECT_EQ(tri.CloseSubpath(3), 1);  // ends coincide now: only the code changes
  EXPECT_EQ(Codes(tri), (Codeset{1, 3, 3, 4}));

  // Exactly 1e-7 apart in single precision is still closed; twice that is not.
  copy.Lineto(P(0, 1e-7f));
  EXPECT_EQ(copy.Closeto(), 1);
  EXPECT_EQ(Codes(copy).back(), 4);
  ZvPath2f apart;
  apart.Moveto(P(0, 0));
  apart.Lineto(P(1, 0));
  apart.Lineto(P(2e-7f, 0));
  EXPECT_EQ(apart.Closeto(), 0);

  // A lone start closes without a code to change.
  ZvPath2f lone;
  lone.Moveto(P(1, 1));
  EXPECT_EQ(lone.Closeto(), 1);
  EXPECT_EQ(Codes(lone), (Codeset{1}));
}

// AddPolyline must leave exactly what the calls it stands for would: points, codes and whether
// the last subpath is open, on a path that already holds a curve.
TEST(Path2f, AddPolylineEqualsItsDrawingCalls) {
  const ZvPoint2<float> ring[] = {P(0, 0), P(0, 2), P(3, 2), P(3, 0), P(1e-7f, 0)};
  const ZvPoint2<float> open[] = {P(5, 5), P(6, 5), P(6, 7)};
  struct Case {
    const ZvPoint2<float>* points;
    unsigned int count;
    int close;
  };
  const Case cases[] = {{ring, 5, 1}, {ring, 5, 0}, {open, 3, 1}, {open, 1, 1}, {open, 1, 0}};
  for (const Case& c : cases) {
    ZvPath2f base;
    base.Moveto(P(9, 9));
    base.Curveto(P(10, 9), P(10, 10), P(9, 10));
    ZvPath2f bulk(base), calls(base);
    bulk.AddPolyline(c.points, c.count, c.close);
    calls.Moveto(c.points[0]);
    for (unsigned int i = 1; i < c.count; ++i)
      calls.Lineto(c.points[i]);
    if (c.close) calls.Closeto();
    EXPECT_EQ(Codes(bulk), Codes(calls)) << c.count << " " << c.close;
    EXPECT_EQ(PathArrays::Open(bulk), PathArrays::Open(calls));
    ASSERT_EQ(bulk.NumPoints(), calls.NumPoints());
    for (unsigned int i = 0; i < bulk.NumPoints(); ++i)
      EXPECT_TRUE(bulk.GetPoint(i).x == calls.GetPoint(i).x &&
                  bulk.GetPoint(i).y == calls.GetPoint(i).y);
    EXPECT_TRUE(PathInvariantHolds(bulk));
  }
  // Nothing at all for no points.
  ZvPath2f empty;
  empty.AddPolyline(ring, 0, 1);
  EXPECT_EQ(empty.NumPoints(), 0u);
}

TEST(Path2f, AddPolylineFromItsOwnPoints) {
  // Appending a run of the path's own points when the arrays are full, so that growing moves
  // the block the source lies in.
  ZvPath2f path(4);
  path.Moveto(P(0, 0));
  path.Lineto(P(4, 0));
  path.Lineto(P(4, 3));
  path.Lineto(P(0, 0));
  ASSERT_EQ(PathArrays::Points(path).capacity, 4u);
  path.AddPolyline(PathArrays::Points(path).data, 4, 1);
  EXPECT_EQ(Codes(path), (Codeset{1, 3, 3, 3, 1, 3, 3, 4}));
  EXPECT_EQ(path.GetPoint(6).x, 4.0f);
  EXPECT_EQ(path.GetPoint(6).y, 3.0f);
  EXPECT_EQ(PathArrays::Open(path), 0u);
}

TEST(Path2f, CloseSubpathInsideThePathInserts) {
  ZvPath2f path = ThreeSubpaths();
  EXPECT_EQ(path.CloseSubpath(1), 1);
  EXPECT_EQ(Codes(path), (Codeset{1, 3, 3, 4, 1, 8, 9, 10, 8, 9, 11, 1}));
  EXPECT_TRUE(path.GetPoint(3).x == 0.0f && path.GetPoint(4).x == 20.0f);
  EXPECT_TRUE(PathInvariantHolds(path));
  EXPECT_EQ(path.OpenSubpath(7), 1);
  EXPECT_EQ(path.IsSubpathClosed(7), 0);
}

TEST(Path2f, TangentContinuityAndLocks) {
  ZvPath2f loop = SmoothLoop();
  EXPECT_TRUE(loop.IsG1Continuous(3) && loop.IsG1Continuous(0) && loop.IsG1Continuous(6));
  EXPECT_EQ(loop.LockG1(3), 1);
  EXPECT_EQ(loop.LockG1(6), 1);  // marks start and end
  EXPECT_EQ(Codes(loop, 255), (Codeset{129, 8, 9, 138, 8, 9, 139}));
  EXPECT_EQ(loop.LockG1(1), 0);  // not a node
  EXPECT_EQ(loop.UnlockG1(0), 1);
  EXPECT_EQ(Codes(loop, 255), (Codeset{1, 8, 9, 138, 8, 9, 11}));
  loop.LockG1(0);
  EXPECT_EQ(loop.OpenSubpath(0), 1);  // reopening frees the end's lock
  EXPECT_EQ(Codes(loop, 255), (Codeset{1, 8, 9, 138, 8, 9, 10}));
  EXPECT_EQ(loop.IsG1Continuous(0), 0);  // an open subpath's start

  // A cubic into a line: the tangents agree but a line has no handle to keep in line.
  ZvPath2f mixed;
  mixed.Moveto(P(0, 0));
  mixed.Curveto(P(1, 0), P(2, 0), P(3, 0));
  mixed.Lineto(P(6, 0));
  EXPECT_EQ(mixed.IsG1Continuous(3), 1);
  EXPECT_EQ(mixed.LockG1(3), 0);

  // A cusp, a kink, and a zero-length handle.
  ZvPath2f cusp;
  cusp.Moveto(P(0, 0));
  cusp.Curveto(P(1, 0), P(2, 0), P(3, 0));
  cusp.Curveto(P(2, 0), P(3, 1), P(3, 1));
  cusp.Curveto(P(3, 1), P(4, 3), P(5, 1));
  EXPECT_EQ(cusp.IsG1Continuous(3), 0);
  EXPECT_EQ(cusp.IsG1Continuous(6), 1);  // handle of length zero
  ZvPath2f kink;
  kink.Moveto(P(0, 0));
  kink.Curveto(P(1, 0), P(2, 0), P(3, 0));
  kink.Curveto(P(4, 0.01f), P(5, 1), P(6, 1));
  EXPECT_EQ(kink.IsG1Continuous(3), 0);  // sin^2 of 0.01 rad is 1e-4
  kink.Moveto(P(0, 0));
  kink.Curveto(P(1, 0), P(2, 0), P(3, 0));
  kink.Curveto(P(4, 0.0005f), P(5, 1), P(6, 1));
  EXPECT_EQ(kink.IsG1Continuous(10), 1);  // sin^2 of 5e-4 rad is 2.5e-7

  // A closed polyline ending with a line refuses a lock at its start.
  ZvPath2f square;
  square.Moveto(P(0, 0));
  square.Curveto(P(1, 0), P(2, 0), P(3, 0));
  square.Lineto(P(-1, 0));
  square.Lineto(P(0, 0));
  square.Closeto();
  EXPECT_EQ(square.IsG1Continuous(0), 1);
  EXPECT_EQ(square.LockG1(0), 0);
}

TEST(Path2f, RangeConstructorMakesAWellFormedPath) {
  ZvPath2f loop = SmoothLoop();
  ASSERT_EQ(loop.LockG1(3), 1);
  ASSERT_EQ(loop.LockG1(0), 1);
  // Cut from the middle node to the closed end: opened, unlocked, starting with code 1.
  ZvPath2f cut(loop, 3, 6);
  EXPECT_EQ(Codes(cut, 255), (Codeset{1, 8, 9, 10}));
  EXPECT_EQ(cut.GetPoint(0).x, 35.0f);
  EXPECT_TRUE(PathInvariantHolds(cut));
  cut.Lineto(P(1, 1));  // open: drawing goes on
  // The whole closed subpath stays closed, with its locks.
  ZvPath2f whole(loop, 0, 6);
  EXPECT_EQ(Codes(whole, 255), Codes(loop, 255));
  // A range that is not inside the source gives an empty path.
  ZvPath2f none(loop, 5, 9);
  EXPECT_EQ(none.NumPoints(), 0u);
}

TEST(Path2f, RangeEndsInsideASegmentMoveToItsNodes) {
  ZvPath2f line;  // Moveto, then a cubic: a range ending on a control point keeps no part of it
  line.Moveto(P(0, 0));
  line.Curveto(P(1, 1), P(2, 1), P(3, 0));
  line.Lineto(P(4, 0));
  const struct {
    unsigned int first, last;
    Codeset codes;
  } ranges[] = {{0, 2, {1}}, {0, 1, {1}}, {1, 4, {1, 3}},
                {2, 3, {1}}, {1, 2, {}},  {0, 4, {1, 8, 9, 10, 3}}};
  for (const auto& r : ranges) {
    const ZvPath2f part(line, r.first, r.last);
    EXPECT_EQ(Codes(part), r.codes) << r.first << ".." << r.last;
    EXPECT_TRUE(PathInvariantHolds(part));
  }
  EXPECT_EQ(ZvPath2f(line, 1, 4).GetPoint(0).x, 3.0f);  // the cubic's end node starts the copy
}

TEST(Path2f, SegmentsNeedAStartPoint) {
  // On an empty path there is no point for a segment to start from: nothing is appended.
  ZvPath2f path;
  const ZvPoint2<float> pts[3] = {P(1, 1), P(2, 2), P(3, 3)};
  ZvPoint2fArray array;
  array.Add(pts, 3);
  path.Lineto(P(1, 1));
  path.Curveto(P(1, 1), P(2, 2));
  path.Curveto(P(1, 1), P(2, 2), P(3, 3));
  path.AltCurveto(pts, 3);
  path.AltAltCurveto(array, 0, 2);
  EXPECT_EQ(path.NumPoints(), 0u);
  path.Moveto(P(0, 0));
  path.Lineto(P(1, 1));
  EXPECT_EQ(Codes(path), (Codeset{1, 3}));
}

TEST(Path2f, CopiesAreIndependentAndSiblingsShareTopology) {
  ZvPath2f path = ThreeSubpaths();
  path.LockG1(6);
  ZvPath2f copy(path);
  EXPECT_EQ(Codes(copy, 255), Codes(path, 255));
  copy.Translate(P(1, 2));
  EXPECT_TRUE(path.GetPoint(0).x == 0.0f && copy.GetPoint(0).y == 2.0f);
  EXPECT_EQ(path.IsSiblingOf(copy), 1);
  copy.UnlockG1(6);
  EXPECT_EQ(path.IsSiblingOf(copy), 1);  // lock bits do not count
  copy.Lineto(P(0, 0));
  EXPECT_EQ(path.IsSiblingOf(copy), 0);

  ZvPath2f assigned;
  assigned = path;
  EXPECT_EQ(Codes(assigned, 255), Codes(path, 255));
  const ZvPath2f& self = assigned;
  assigned = self;
  EXPECT_EQ(assigned.NumPoints(), 11u);
  ZvShape2f& asShape = assigned;
  asShape = static_cast<const ZvShape2f&>(copy);  // through the slot
  EXPECT_EQ(assigned.NumPoints(), 12u);

  ZvShape2f* clone = path.Clone();
  ASSERT_NE(clone, nullptr);
  EXPECT_EQ(clone->QueryShapeKind(ZvShape2f::KindPath), clone);
  EXPECT_EQ(clone->QueryShapeKind(ZvShape2f::KindRect), nullptr);
  EXPECT_EQ(static_cast<ZvPath2f*>(clone)->IsSiblingOf(path), 1);
  delete clone;

  path.Clear();
  EXPECT_EQ(path.NumPoints(), 0u);
  EXPECT_TRUE(PathInvariantHolds(path));
  path.Moveto(P(1, 1));
  EXPECT_EQ(path.NumPoints(), 1u);
}

TEST(Path2f, LocksAreCountedRecursiveAndNotCopied) {
  ZvPath2f path;
  EXPECT_EQ(path.GetLockCount(), 0u);
  path.Lock();
  path.Lock();
  EXPECT_EQ(path.GetLockCount(), 2u);
  path.Moveto(P(0, 0));  // re-enters the held lock
  ZvPath2f copy(path);
  EXPECT_EQ(copy.GetLockCount(), 0u);
  path.Unlock();
  path.Unlock();
  EXPECT_EQ(path.GetLockCount(), 0u);
}

TEST(Path2f, TransformsMoveEveryPoint) {
  ZvPath2f path;
  path.Moveto(P(2, 1));
  path.Lineto(P(0, 4));
  path.Lineto(P(4, 0));
  const auto near = [&](unsigned int i, float x, float y) {
    EXPECT_NEAR(path.GetPoint(i).x, x, 1e-5f) << i;
    EXPECT_NEAR(path.GetPoint(i).y, y, 1e-5f) << i;
  };
  path.Rotate(90.0, P(1, 1));
  near(0, 1, 2);
  path.Rotate(-90.0, P(1, 1));
  path.Scale(2.0, 3.0, P(1, 1));
  near(0, 3, 1);
  near(1, -1, 10);
  path.Scale(0.5, 1.0 / 3.0, P(1, 1));
  path.ShearX(0.5, 2.0);  // x += 0.5 (y - 2)
  near(1, 1, 4);
  path.ShearX(-0.5, 2.0);
  path.ShearY(0.5, 2.0);  // y += 0.5 (x - 2)
  near(2, 4, 1);
  EXPECT_EQ(Codes(path), (Codeset{1, 3, 3}));
}

TEST(Path2f, RectAndOvalOutlines) {
  struct Builder : ZvPath2f {
    using ZvPath2f::SetToOvalOutline;
    using ZvPath2f::SetToRectOutline;
  };
  // Nine handles: the centre, then the frame's edge middles and corners in turn.
  ZvPath2f handles;
  handles.Moveto(P(0, 0));
  const ZvPoint2<float> h[8] = {P(1, 0),  P(1, 1),   P(0, 1),  P(-1, 1),
                                P(-1, 0), P(-1, -1), P(0, -1), P(1, -1)};
  for (const auto& p : h)
    handles.Lineto(p);
  Builder rect;
  rect.SetToRectOutline(handles);
  EXPECT_EQ(Codes(rect), (Codeset{1, 3, 3, 3, 4}));
  EXPECT_TRUE(rect.GetPoint(0).x == 1.0f && rect.GetPoint(1).x == -1.0f);
  Builder oval;
  oval.SetToOvalOutline(handles);
  EXPECT_EQ(Codes(oval), (Codeset{1, 8, 9, 10, 8, 9, 10, 8, 9, 10, 8, 9, 11}));
  const float k = static_cast<float>(0.5522847498307935);
  EXPECT_TRUE(oval.GetPoint(1).y == k && oval.GetPoint(2).x == k && oval.GetPoint(3).y == 1.0f);
}

TEST(Path2f, ExtentOfControlPoints) {
  ZvExtent2<double> e(1, 1, 2, 2);
  ZvPath2f empty;
  empty.GetExtent(e);
  EXPECT_TRUE(e.kind == ZvExtent2<double>::Empty && e.xmax == 0.0);
  ZvExtent2<float> f;
  ThreeSubpaths().GetExtent(f);
  EXPECT_EQ(f.kind, ZvExtent2<float>::Regular);
  EXPECT_TRUE(f.xmin == 0 && f.ymin == -5 && f.xmax == 50 && f.ymax == 50);
}

TEST(Path2f, TextDump) {
  ZvPath2f path;
  path.Moveto(P(0, 0));
  path.Curveto(P(1.5f, 2), P(-3, 0.25f));
  std::ostringstream out;
  out << path;
  EXPECT_EQ(out.str(),
            "Statistics for this path: \n"
            "NumPoints: 3\n"
            "NumSegments: 1\n"
            "NumSubpaths: 1\n"
            "LargestDegree: 2\n"
            "The points: \n"
            "Index: 0 X: 0 Y: 0 First: 0 Last: 2\n"
            "Index: 1 X: 1.5 Y: 2 First: 0 Last: 2\n"
            "Index: 2 X: -3 Y: 0.25 First: 0 Last: 2\n");
}

TEST(Path2f, RasterExtentQuickTest) {
  ZvPath2f path = Segment(0, 0, 10, 10);
  ZvGC gc;
  gc.transform.Translate(5.0, 0.0, 0.0);  // the path spans 5..15 by 0..10 on the raster
  EXPECT_EQ(path.IsRasterExtentIntersecting(gc, ZvExtent2<float>(15, 10, 20, 20)), 1);  // touch
  EXPECT_EQ(path.IsRasterExtentIntersecting(gc, ZvExtent2<float>(15.5f, 0, 20, 20)), 0);
  EXPECT_EQ(path.IsRasterExtentIntersecting(gc, ZvExtent2<float>(0, -5, 5, 0)), 1);
  ZvExtent2<float> infinite(0, 0, 0, 0, ZvExtent2<float>::Infinite);
  EXPECT_EQ(path.IsRasterExtentIntersecting(gc, infinite), 1);
  EXPECT_EQ(path.IsRasterExtentIntersecting(gc, ZvExtent2<float>()), 0);
  EXPECT_EQ(ZvPath2f().IsRasterExtentIntersecting(gc, infinite), 0);  // nothing to draw
}
