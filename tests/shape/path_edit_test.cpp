// Editing ZvPath2f: what each edit makes of known paths. Refusals and well-formedness under any
// edit are the random test's (path_edit_property_test.cpp).
#include <zv/path2f.h>

#include <gtest/gtest.h>

#include <cmath>

#include "path_fixtures.h"

using Codeset = std::vector<int>;

namespace {

bool Same(const ZvPoint2<float>& a, const ZvPoint2<float>& b) {
  return a.x == b.x && a.y == b.y;
}

void ExpectNear(const ZvPoint2<float>& p, float x, float y) {
  EXPECT_NEAR(p.x, x, 1e-5f);
  EXPECT_NEAR(p.y, y, 1e-5f);
}

// Two cubics meeting at node 3 with handles in line (lengths 4 in, 2 out), locked there.
ZvPath2f LockedJoin() {
  ZvPath2f path;
  path.Moveto(P(0, 0));
  path.Curveto(P(2, 4), P(6, 2), P(10, 2));
  path.Curveto(P(12, 2), P(16, 6), P(20, 0));
  EXPECT_EQ(path.LockG1(3), 1);
  return path;
}

}  // namespace

TEST(PathReplacePoint, LockedNodeCarriesBothHandles) {
  ZvPath2f path = LockedJoin();
  path.ReplacePoint(3, P(11, 5), 1);
  EXPECT_TRUE(Same(path.GetPoint(2), P(7, 5)) && Same(path.GetPoint(4), P(13, 5)));
  EXPECT_TRUE(Same(path.GetPoint(1), P(2, 4)) && Same(path.GetPoint(5), P(16, 6)));
  path.ReplacePointIgnoringLock(3, P(10, 2));
  EXPECT_TRUE(Same(path.GetPoint(2), P(7, 5)));

  // A thousandth-long incoming handle moved where a float step is a sizeable part of it: the
  // rounded delta tilts it, and the long outgoing handle is projected back on its line.
  ZvPath2f fine;
  fine.Moveto(P(-1, 0));
  fine.Curveto(P(-0.5f, 0), P(-0.001f, 0.0003f), P(0, 0));
  fine.Curveto(P(10, -3), P(20.5f, 0), P(21, 0));
  ASSERT_EQ(fine.LockG1(3), 1);
  const ZvPoint2<float> to = P(100, 37), in = P(-0.001f, 0.0003f) + to, out = P(10, -3) + to;
  fine.ReplacePoint(3, to, 1);
  EXPECT_TRUE(Same(fine.GetPoint(2), in));
  const double ax = double(to.x) - in.x, ay = double(to.y) - in.y;
  const double u =
      ((double(out.x) - in.x) * ax + (double(out.y) - in.y) * ay) / (ax * ax + ay * ay);
  EXPECT_FALSE(Same(fine.GetPoint(4), out));
  EXPECT_TRUE(Same(fine.GetPoint(4),
                   P(float(in.x * (1 - u) + to.x * u), float(in.y * (1 - u) + to.y * u))));
}

TEST(PathReplacePoint, HandleTurnsItsPartnerAcrossALockedNode) {
  ZvPath2f path = LockedJoin();
  path.ReplacePoint(4, P(10, 5), 1);  // straight up, length 3: the partner keeps the ratio 2
  ExpectNear(path.GetPoint(2), 10, 2 - 6);
  path = LockedJoin();
  path.ReplacePoint(4, P(10, 5), 0);  // scale 0: the partner keeps its length 4
  ExpectNear(path.GetPoint(2), 10, 2 - 4);
  path = LockedJoin();
  path.ReplacePoint(2, P(10, 0), 0);  // the incoming handle turns the outgoing one
  ExpectNear(path.GetPoint(4), 10, 4);
  // A handle lying on its node has no length to compare: the new vector is scaled by the
  // partner's length.
  path = LockedJoin();
  path.ReplacePointIgnoringLock(4, P(10, 2));
  path.ReplacePoint(4, P(11, 2), 1);
  ExpectNear(path.GetPoint(2), 10 - 4, 2);
}

TEST(PathReplacePoint, ClosedSubpathEndsMoveTogether) {
  ZvPath2f path = SmoothLoop();
  path.ReplacePoint(6, P(21, 1), 1);
  EXPECT_TRUE(Same(path.GetPoint(0), P(21, 1)) && Same(path.GetPoint(5), P(15, 5)));
  path.ReplacePoint(0, P(22, 0), 1);
  EXPECT_TRUE(Same(path.GetPoint(6), P(22, 0)) && Same(path.GetPoint(1), P(25, -5)));

  // Locked, both handles come along, and the loop's first handle turns the closing one.
  path = SmoothLoop();
  ASSERT_EQ(path.LockG1(0), 1);
  path.ReplacePoint(0, P(21, 2), 1);
  EXPECT_TRUE(Same(path.GetPoint(6), P(21, 2)));
  EXPECT_TRUE(Same(path.GetPoint(1), P(26, -3)) && Same(path.GetPoint(5), P(16, 7)));
  path.ReplacePoint(1, P(21, -3), 0);
  ExpectNear(path.GetPoint(5), 21, 2 + float(std::hypot(5, 5)));

  EXPECT_EQ(path.ReplaceTangentVectorDirections(3, P(0, 2)), 1);
  EXPECT_TRUE(Same(path.GetPoint(2), P(35, -2)) && Same(path.GetPoint(4), P(35, 2)));
  EXPECT_EQ(path.ReplaceTangentVectorDirections(6, P(1, 0)), 1);  // across the closed ends
  EXPECT_TRUE(Same(path.GetPoint(5), P(20, 2)) && Same(path.GetPoint(1), P(22, 2)));
  ZvPath2f square = ClosedSquare(0, 0, 10, 10);  // lines have no handles to set
  EXPECT_EQ(square.ReplaceTangentVectorDirections(0, P(1, 0)), 0);
}

TEST(PathReplaceSegment, DegreesChangeInPlace) {
  ZvPath2f path = ThreeSubpaths();  // codes 1 3 3 | 1 8 9 10 8 9 11 | 1
  const ZvPoint2<float> quartic[5] = {P(10, 0), P(11, 1), P(12, 2), P(13, 3), P(10, 10)};
  EXPECT_EQ(path.ReplaceSegment(2, quartic, 4), 1);
  EXPECT_EQ(Codes(path), (Codeset{1, 3, 12, 13, 14, 15, 1, 8, 9, 10, 8, 9, 11, 1}));
  EXPECT_TRUE(Same(path.GetPoint(3), P(12, 2)) && Same(path.GetPoint(5), P(10, 10)));
  const ZvPoint2<float> quad[3] = {P(35, 0), P(30, 8), P(20, 0)};
  EXPECT_EQ(path.ReplaceSegment(11, quad, 2), 1);  // the closing cubic stays closing
  EXPECT_EQ(Codes(path), (Codeset{1, 3, 12, 13, 14, 15, 1, 8, 9, 10, 5, 7, 1}));
  const ZvPoint2<float> quintic[6] = {P(20, 0), P(21, 1), P(22, 2), P(23, 3), P(24, 4), P(35, 0)};
  EXPECT_EQ(path.ReplaceSegment(7, quintic, 5), 1);
  EXPECT_EQ(Codes(path), (Codeset{1, 3, 12, 13, 14, 15, 1, 17, 18, 19, 20, 21, 5, 7, 1}));
  for (unsigned int k = 1; k < 5; ++k)
    EXPECT_TRUE(Same(path.GetPoint(6 + k), quintic[k])) << k;
  const ZvPoint2<float> line[2] = {P(20, 0), P(35, 0)};
  EXPECT_EQ(path.ReplaceSegment(6, line, 1), 1);  // asked by its start point
  EXPECT_EQ(Codes(path), (Codeset{1, 3, 12, 13, 14, 15, 1, 3, 5, 7, 1}));

  // Beside a locked node the new handle turns the partner (ratio 2:4 kept); a line is refused.
  ZvPath2f locked = LockedJoin();
  const ZvPoint2<float> cubic[4] = {P(0, 0), P(1, 1), P(10, -1), P(10, 2)};
  EXPECT_EQ(locked.ReplaceSegment(1, cubic, 3), 1);
  ExpectNear(locked.GetPoint(4), 10, 2 + 1.5f);
  const ZvPoint2<float> toLock[2] = {P(0, 0), P(10, 2)};
  EXPECT_EQ(locked.ReplaceSegment(1, toLock, 1), 0);
}

TEST(PathReplaceSegment, DegreeBeyondEightCutsTheSegmentDown) {
  ZvPath2f path;
  path.Moveto(P(0, 0));
  const ZvPoint2<float> quintic[5] = {P(1, 1), P(2, 2), P(3, 3), P(4, 4), P(5, 0)};
  path.AltCurveto(quintic, 5);
  path.Lineto(P(0, 0));
  path.Closeto();
  ZvPoint2<float> nine[10];
  for (int k = 0; k < 10; ++k)
    nine[k] = P(float(k), 7);
  nine[0] = P(0, 0);
  nine[9] = P(5, 0);
  EXPECT_EQ(path.ReplaceSegment(2, nine, 9), 1);
  EXPECT_EQ(Codes(path), (Codeset{1, 8, 9, 10, 4}));  // the quintic's outer handles, as a cubic
  EXPECT_TRUE(Same(path.GetPoint(1), P(1, 1)) && Same(path.GetPoint(2), P(4, 4)));
}

TEST(PathReplaceSubpathSection, LinesCubicsAndStretches) {
  ZvPath2f path = ThreeSubpaths();
  EXPECT_EQ(path.ReplaceSubpathSection(3, 9), 1);  // the whole closed loop: a closing line
  EXPECT_EQ(Codes(path), (Codeset{1, 3, 3, 1, 4, 1}));
  EXPECT_EQ(path.ReplaceSubpathSection(0, 2, P(1, 5), P(9, 5)), 1);    // two lines to a cubic
  EXPECT_EQ(path.ReplaceSubpathSection(4, 5, P(30, 5), P(25, 5)), 1);  // the closing line too
  EXPECT_EQ(Codes(path), (Codeset{1, 8, 9, 10, 1, 8, 9, 11, 1}));
  EXPECT_TRUE(Same(path.GetPoint(1), P(1, 5)) && Same(path.GetPoint(6), P(25, 5)));

  // A stretch ending on a closed end code is opened to fit an open subpath...
  ZvPath2f into = ThreeSubpaths();
  const ZvPath2f loop = SmoothLoop();
  into.Translate(P(20, 0));  // the triangle now runs from (20, 0) to (30, 10)
  into.ReplacePointIgnoringLock(2, P(20, 0));
  EXPECT_EQ(into.ReplaceSubpathSection(0, 2, loop, 0, 6), 1);
  EXPECT_EQ(Codes(into), (Codeset{1, 8, 9, 10, 8, 9, 10, 1, 8, 9, 10, 8, 9, 11, 1}));
  // ... and an open one closed to fit a closed subpath.
  ZvPath2f closing = ThreeSubpaths();
  EXPECT_EQ(closing.ReplaceSubpathSection(6, 9, Segment(35, 0, 20, 0), 0, 1), 1);
  EXPECT_EQ(Codes(closing), (Codeset{1, 3, 3, 1, 8, 9, 10, 4, 1}));
  // A locked end needs a handle from the source.
  ZvPath2f locked = LockedJoin();
  EXPECT_EQ(locked.ReplaceSubpathSection(3, 6, Segment(10, 2, 20, 0), 0, 1), 0);
}

TEST(PathRemove, SectionsSplitAndOpenSubpaths) {
  ZvPath2f path = ClosedSquare(0, 0, 10, 10);     // 1 3 3 3 4
  EXPECT_EQ(path.RemoveSubpathSection(1, 2), 1);  // the middle of a closed subpath
  EXPECT_EQ(Codes(path), (Codeset{1, 3, 1, 3, 3}));
  EXPECT_TRUE(Same(path.GetPoint(2), P(10, 10)) && Same(path.GetPoint(4), P(0, 0)));
  EXPECT_EQ(path.RemoveSubpathSection(3, 4), 1);  // at the end: the subpath ends at 3
  EXPECT_EQ(path.RemoveSubpathSection(0, 1), 1);  // a lone first part vanishes
  EXPECT_EQ(Codes(path), (Codeset{1, 1, 3}));

  ZvPath2f loop = SmoothLoop();
  ASSERT_EQ(loop.LockG1(0) + loop.LockG1(3), 2);
  EXPECT_EQ(loop.RemoveSubpathSection(0, 3), 1);  // locks at the cut are released
  EXPECT_EQ(Codes(loop, 255), (Codeset{1, 8, 9, 10}));
  EXPECT_EQ(PathArrays::Open(loop), 1u);
}

TEST(PathRemove, WholeSubpathsAndTheOpenFlag) {
  ZvPath2f path = ThreeSubpaths();
  EXPECT_EQ(path.RemoveSubpath(10), 1);  // the closed loop is now last
  EXPECT_EQ(PathArrays::Open(path), 0u);
  EXPECT_EQ(path.RemoveSubpath(1), 1);
  EXPECT_EQ(Codes(path), (Codeset{1, 8, 9, 10, 8, 9, 11}));
  EXPECT_EQ(path.RemoveSubpath(4), 1);  // the only one: the flag stays
  EXPECT_TRUE(path.NumPoints() == 0 && PathArrays::Open(path) == 0u);
}
