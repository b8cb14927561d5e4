// Editing ZvPath2f: moving points under G1 locks, tangent directions, replacing segments and
// sections, removing subpaths and sections.
#include <zv/path2f.h>

#include <gtest/gtest.h>

#include <cmath>

#include "path_fixtures.h"

using Codeset = std::vector<int>;

namespace {

bool Same(const ZvPoint2<float>& a, const ZvPoint2<float>& b) {
  return a.x == b.x && a.y == b.y;
}

double Length(const ZvPoint2<float>& a, const ZvPoint2<float>& b) {
  return std::hypot(double(a.x) - b.x, double(a.y) - b.y);
}

// Two cubics meeting at node 3 with handles in line, locked there.
ZvPath2f LockedJoin() {
  ZvPath2f path;
  path.Moveto(P(0, 0));
  path.Curveto(P(2, 4), P(6, 2), P(10, 2));
  path.Curveto(P(12, 2), P(16, 6), P(20, 0));
  EXPECT_EQ(path.LockG1(3), 1);
  return path;
}

std::vector<unsigned char> Bytes(const ZvPath2f& path) {
  std::vector<unsigned char> b(path.GetBufferSize());
  path.WriteToBuffer(b.data());
  return b;
}

}  // namespace

TEST(PathReplacePoint, LockedNodeCarriesBothHandles) {
  ZvPath2f path = LockedJoin();
  path.ReplacePoint(3, P(11, 5), 1);
  EXPECT_TRUE(Same(path.GetPoint(3), P(11, 5)));
  EXPECT_TRUE(Same(path.GetPoint(2), P(7, 5)) && Same(path.GetPoint(4), P(13, 5)));
  EXPECT_TRUE(Same(path.GetPoint(1), P(2, 4)) && Same(path.GetPoint(5), P(16, 6)));

  // Unlocked, the node moves alone.
  path.UnlockG1(3);
  path.ReplacePoint(3, P(10, 2), 1);
  EXPECT_TRUE(Same(path.GetPoint(2), P(7, 5)) && Same(path.GetPoint(4), P(13, 5)));
  path.ReplacePointIgnoringLock(1, P(-1, -1));
  EXPECT_TRUE(Same(path.GetPoint(1), P(-1, -1)));
}

TEST(PathReplacePoint, RoundingThatBreaksTheLockIsProjectedOnTheIncomingHandle) {
  // An incoming handle a thousandth long, moved to where a float step is a sizeable part of it:
  // the rounded delta tilts it, and the long outgoing handle is put back on its line.
  ZvPath2f path;
  path.Moveto(P(-1, 0));
  path.Curveto(P(-0.5f, 0), P(-0.001f, 0.0003f), P(0, 0));
  path.Curveto(P(10, -3), P(20.5f, 0), P(21, 0));
  ASSERT_EQ(path.LockG1(3), 1);
  const ZvPoint2<float> to = P(100, 37);
  const ZvPoint2<float> in = P(-0.001f, 0.0003f) + to, out = P(10, -3) + to;
  path.ReplacePoint(3, to, 1);
  EXPECT_TRUE(Same(path.GetPoint(2), in));
  // The projection of `out` on the line from `in` through the node, in double.
  const double ax = double(to.x) - in.x, ay = double(to.y) - in.y;
  const double u =
      ((double(out.x) - in.x) * ax + (double(out.y) - in.y) * ay) / (ax * ax + ay * ay);
  EXPECT_FALSE(Same(out, path.GetPoint(4)));
  EXPECT_EQ(path.GetPoint(4).x, float(in.x * (1 - u) + to.x * u));
  EXPECT_EQ(path.GetPoint(4).y, float(in.y * (1 - u) + to.y * u));
  EXPECT_EQ(path.IsG1Continuous(3), 1);
}

TEST(PathReplacePoint, HandleTurnsItsPartnerAcrossALockedNode) {
  // Scale 1: the partner keeps its length ratio to the handle (here 4:2 = 2).
  ZvPath2f path = LockedJoin();
  path.ReplacePoint(4, P(10, 5), 1);  // the handle now points straight up, length 3
  EXPECT_TRUE(Same(path.GetPoint(4), P(10, 5)));
  EXPECT_NEAR(path.GetPoint(2).x, 10.0f, 1e-5f);
  EXPECT_NEAR(path.GetPoint(2).y, 2.0f - 6.0f, 1e-5f);

  // Scale 0: the partner keeps its own length, 4.
  path = LockedJoin();
  path.ReplacePoint(4, P(10, 5), 0);
  EXPECT_NEAR(path.GetPoint(2).x, 10.0f, 1e-5f);
  EXPECT_NEAR(path.GetPoint(2).y, 2.0f - 4.0f, 1e-5f);

  // The incoming handle turns the outgoing one the same way.
  path = LockedJoin();
  path.ReplacePoint(2, P(10, 0), 0);
  EXPECT_NEAR(path.GetPoint(4).x, 10.0f, 1e-5f);
  EXPECT_NEAR(path.GetPoint(4).y, 4.0f, 1e-5f);

  // A handle lying on its node has no length to compare: the new vector is scaled by the
  // partner's length (4).
  path = LockedJoin();
  path.ReplacePointIgnoringLock(4, P(10, 2));
  path.ReplacePoint(4, P(11, 2), 1);
  EXPECT_NEAR(path.GetPoint(2).x, 10.0f - 4.0f, 1e-5f);
  EXPECT_NEAR(path.GetPoint(2).y, 2.0f, 1e-5f);
}

TEST(PathReplacePoint, ClosedSubpathEndsMoveTogether) {
  ZvPath2f path = SmoothLoop();
  path.ReplacePoint(6, P(21, 1), 1);
  EXPECT_TRUE(Same(path.GetPoint(0), P(21, 1)) && Same(path.GetPoint(6), P(21, 1)));
  path.ReplacePoint(0, P(22, 0), 1);
  EXPECT_TRUE(Same(path.GetPoint(0), P(22, 0)) && Same(path.GetPoint(6), P(22, 0)));
  EXPECT_TRUE(Same(path.GetPoint(1), P(25, -5)) && Same(path.GetPoint(5), P(15, 5)));

  // Locked, both of its handles come along; the first handle of the loop turns the closing
  // segment's last handle.
  path = SmoothLoop();
  ASSERT_EQ(path.LockG1(0), 1);
  path.ReplacePoint(0, P(21, 2), 1);
  EXPECT_TRUE(Same(path.GetPoint(6), P(21, 2)));
  EXPECT_TRUE(Same(path.GetPoint(1), P(26, -3)) && Same(path.GetPoint(5), P(16, 7)));
  path.ReplacePoint(1, P(21, -3), 0);  // straight down, the partner keeps its length
  EXPECT_NEAR(path.GetPoint(5).x, 21.0f, 1e-5f);
  EXPECT_NEAR(path.GetPoint(5).y, 2.0f + Length(P(16, 7), P(21, 2)), 1e-4f);

  // An open subpath's ends are independent.
  ZvPath2f open = Segment(0, 0, 5, 0);
  open.ReplacePoint(0, P(1, 1), 1);
  EXPECT_TRUE(Same(open.GetPoint(1), P(5, 0)));
}

TEST(PathReplacePoint, TangentDirectionsSetBothHandles) {
  ZvPath2f path = SmoothLoop();
  EXPECT_EQ(path.ReplaceTangentVectorDirections(3, P(0, 2)), 1);
  EXPECT_TRUE(Same(path.GetPoint(2), P(35, -2)) && Same(path.GetPoint(4), P(35, 2)));
  EXPECT_EQ(path.ReplaceTangentVectorDirections(6, P(1, 0)), 1);  // closed: across the ends
  EXPECT_TRUE(Same(path.GetPoint(5), P(19, 0)) && Same(path.GetPoint(1), P(21, 0)));
  // Refused: a control point, the end of an open subpath, a node with a line beside it.
  const std::vector<unsigned char> before = Bytes(path);
  EXPECT_EQ(path.ReplaceTangentVectorDirections(2, P(1, 0)), 0);
  ZvPath2f three = ThreeSubpaths();
  EXPECT_EQ(three.ReplaceTangentVectorDirections(2, P(1, 0)), 0);
  EXPECT_EQ(three.ReplaceTangentVectorDirections(1, P(1, 0)), 0);
  EXPECT_TRUE(Bytes(path) == before);
}

TEST(PathReplaceSegment, DegreesChangeInPlace) {
  ZvPath2f path = ThreeSubpaths();  // codes 1 3 3 | 1 8 9 10 8 9 11 | 1
  const ZvPoint2<float> quartic[5] = {P(10, 0), P(11, 1), P(12, 2), P(13, 3), P(10, 10)};
  EXPECT_EQ(path.ReplaceSegment(2, quartic, 4), 1);  // a line becomes a quartic
  EXPECT_EQ(Codes(path), (Codeset{1, 3, 12, 13, 14, 15, 1, 8, 9, 10, 8, 9, 11, 1}));
  EXPECT_TRUE(Same(path.GetPoint(3), P(12, 2)) && Same(path.GetPoint(5), P(10, 10)));

  const ZvPoint2<float> quad[3] = {P(35, 0), P(30, 8), P(20, 0)};
  EXPECT_EQ(path.ReplaceSegment(11, quad, 2), 1);  // the closing cubic becomes a quadratic
  EXPECT_EQ(Codes(path), (Codeset{1, 3, 12, 13, 14, 15, 1, 8, 9, 10, 5, 7, 1}));
  EXPECT_TRUE(Same(path.GetPoint(10), P(30, 8)));

  const ZvPoint2<float> quintic[6] = {P(20, 0), P(21, 1), P(22, 2), P(23, 3), P(24, 4), P(35, 0)};
  EXPECT_EQ(path.ReplaceSegment(7, quintic, 5), 1);  // a cubic becomes a quintic
  EXPECT_EQ(Codes(path), (Codeset{1, 3, 12, 13, 14, 15, 1, 17, 18, 19, 20, 21, 5, 7, 1}));
  for (unsigned int k = 1; k < 5; ++k)
    EXPECT_TRUE(Same(path.GetPoint(6 + k), quintic[k])) << k;

  const ZvPoint2<float> line[2] = {P(20, 0), P(35, 0)};
  EXPECT_EQ(path.ReplaceSegment(6, line, 1), 1);  // asked by its start point
  EXPECT_EQ(Codes(path), (Codeset{1, 3, 12, 13, 14, 15, 1, 3, 5, 7, 1}));
  EXPECT_TRUE(PathInvariantHolds(path));
}

TEST(PathReplaceSegment, RefusalsChangeNothing) {
  ZvPath2f path = LockedJoin();
  const std::vector<int> codes = Codes(path, 255);
  const std::vector<unsigned char> before = Bytes(path);
  const ZvPoint2<float> apart[4] = {P(0, 0.001f), P(1, 1), P(2, 2), P(10, 2)};
  EXPECT_EQ(path.ReplaceSegment(1, apart, 3), 0);  // the start does not coincide
  const ZvPoint2<float> line[2] = {P(0, 0), P(10, 2)};
  EXPECT_EQ(path.ReplaceSegment(1, line, 1), 0);  // a line at the locked node
  EXPECT_EQ(path.ReplaceSegment(5, line, 0), 0);  // degree 0 over a segment of some length
  ZvPath2f lone;
  lone.Moveto(P(1, 1));
  const ZvPoint2<float> here[2] = {P(1, 1), P(1, 1)};
  EXPECT_EQ(lone.ReplaceSegment(0, here, 1), 0);  // no segment behind a lone start
  EXPECT_EQ(lone.NumPoints(), 1u);
  EXPECT_TRUE(Bytes(path) == before && Codes(path, 255) == codes);

  // A new handle beside the locked node turns the partner handle across it.
  const ZvPoint2<float> cubic[4] = {P(0, 0), P(1, 1), P(10, -1), P(10, 2)};
  EXPECT_EQ(path.ReplaceSegment(1, cubic, 3), 1);
  EXPECT_NEAR(path.GetPoint(4).x, 10.0f, 1e-5f);
  EXPECT_NEAR(path.GetPoint(4).y, 2.0f + 3.0f * 0.5f, 1e-5f);  // the ratio 2:4 kept
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
  // Only the outer handles of the quintic remain, as a cubic.
  EXPECT_EQ(Codes(path), (Codeset{1, 8, 9, 10, 4}));
  EXPECT_TRUE(Same(path.GetPoint(1), P(1, 1)) && Same(path.GetPoint(2), P(4, 4)));
}

TEST(PathReplaceSubpathSection, LinesAndCubics) {
  ZvPath2f path = ThreeSubpaths();
  EXPECT_EQ(path.ReplaceSubpathSection(3, 9), 1);  // the whole closed loop: a closing line
  EXPECT_EQ(Codes(path), (Codeset{1, 3, 3, 1, 4, 1}));
  EXPECT_EQ(path.ReplaceSubpathSection(0, 1), 1);                    // already a line
  EXPECT_EQ(path.ReplaceSubpathSection(0, 2, P(1, 5), P(9, 5)), 1);  // two lines to a cubic
  EXPECT_EQ(Codes(path), (Codeset{1, 8, 9, 10, 1, 4, 1}));
  EXPECT_TRUE(Same(path.GetPoint(1), P(1, 5)) && Same(path.GetPoint(2), P(9, 5)));
  EXPECT_EQ(path.ReplaceSubpathSection(4, 5, P(30, 5), P(25, 5)), 1);  // a line to a cubic
  EXPECT_EQ(Codes(path), (Codeset{1, 8, 9, 10, 1, 8, 9, 11, 1}));
  EXPECT_TRUE(Same(path.GetPoint(6), P(25, 5)) && Same(path.GetPoint(7), P(20, 0)));

  // Refused: across subpaths, equal or reversed nodes, a control point, a locked node.
  const std::vector<unsigned char> before = Bytes(path);
  EXPECT_EQ(path.ReplaceSubpathSection(0, 4), 0);
  EXPECT_EQ(path.ReplaceSubpathSection(3, 3, P(1, 1), P(2, 2)), 0);
  EXPECT_EQ(path.ReplaceSubpathSection(3, 0), 0);
  EXPECT_EQ(path.ReplaceSubpathSection(1, 3), 0);
  ZvPath2f locked = LockedJoin();
  EXPECT_EQ(locked.ReplaceSubpathSection(0, 3), 0);
  EXPECT_TRUE(Bytes(path) == before);
}

TEST(PathReplaceSubpathSection, StretchOfAnotherPath) {
  // The closed loop of a source replaces the open triangle of ThreeSubpaths between (0, 0) and
  // (10, 10): its closing end code is opened to fit.
  ZvPath2f path = ThreeSubpaths();
  ZvPath2f source;
  source.Moveto(P(0, 0));
  source.Curveto(P(5, -5), P(15, 5), P(10, 10));
  source.Curveto(P(5, 15), P(-5, 5), P(0, 0));
  source.Closeto();
  ZvPath2f stretch(source, 3, 6);  // (10, 10) .. (0, 0), which keeps the closed end code 11
  stretch.Translate(P(0, 0));
  EXPECT_EQ(path.ReplaceSubpathSection(0, 2, source, 0, 3), 1);
  EXPECT_EQ(Codes(path), (Codeset{1, 8, 9, 10, 1, 8, 9, 10, 8, 9, 11, 1}));
  EXPECT_TRUE(Same(path.GetPoint(1), P(5, -5)) && Same(path.GetPoint(2), P(15, 5)));
  // The other way: into the closed loop at its end, from the open part of the source.
  ZvPath2f into = ThreeSubpaths();
  ZvPath2f open;
  open.Moveto(P(35, 0));
  open.Lineto(P(20, 0));
  EXPECT_EQ(into.ReplaceSubpathSection(6, 9, open, 0, 1), 1);
  EXPECT_EQ(Codes(into), (Codeset{1, 3, 3, 1, 8, 9, 10, 4, 1}));
  EXPECT_EQ(into.ReplaceSubpathSection(3, 7, source, 0, 6), 0);  // ends that do not coincide
  // A locked end needs a handle from the source.
  ZvPath2f locked = LockedJoin();
  ZvPath2f line = Segment(10, 2, 20, 0);
  EXPECT_EQ(locked.ReplaceSubpathSection(3, 6, line, 0, 1), 0);
  EXPECT_EQ(Codes(locked), (Codeset{1, 8, 9, 10, 8, 9, 10}));
}

TEST(PathRemove, SectionsSplitAndOpenSubpaths) {
  ZvPath2f path = ClosedSquare(0, 0, 10, 10);     // 1 3 3 3 4
  EXPECT_EQ(path.RemoveSubpathSection(1, 2), 1);  // the middle of a closed subpath
  EXPECT_EQ(Codes(path), (Codeset{1, 3, 1, 3, 3}));
  EXPECT_EQ(path.NumSubpaths(), 2u);
  EXPECT_TRUE(Same(path.GetPoint(2), P(10, 10)) && Same(path.GetPoint(4), P(0, 0)));
  EXPECT_EQ(path.RemoveSubpathSection(3, 4), 1);  // at the end: the subpath ends at 3
  EXPECT_EQ(Codes(path), (Codeset{1, 3, 1, 3}));
  EXPECT_EQ(path.RemoveSubpathSection(0, 1), 1);  // a lone first part vanishes
  EXPECT_EQ(Codes(path), (Codeset{1, 1, 3}));

  // Locks at the cut are released; a loop cut at its start opens.
  ZvPath2f loop = SmoothLoop();
  ASSERT_EQ(loop.LockG1(0) + loop.LockG1(3), 2);
  EXPECT_EQ(loop.RemoveSubpathSection(0, 3), 1);
  EXPECT_EQ(Codes(loop, 255), (Codeset{1, 8, 9, 10}));
  EXPECT_EQ(PathArrays::Open(loop), 1u);
  EXPECT_EQ(loop.RemoveSubpathSection(0, 2), 0);  // a control point
}

TEST(PathRemove, WholeSubpaths) {
  ZvPath2f path = ThreeSubpaths();
  EXPECT_EQ(path.RemoveSubpath(10), 1);  // the lone start: the closed loop is now last
  EXPECT_EQ(PathArrays::Open(path), 0u);
  EXPECT_EQ(path.RemoveSubpath(1), 1);
  EXPECT_EQ(Codes(path), (Codeset{1, 8, 9, 10, 8, 9, 11}));
  EXPECT_EQ(PathArrays::Open(path), 0u);
  EXPECT_EQ(path.RemoveSubpath(4), 1);  // the only one: the flag stays
  EXPECT_EQ(path.NumPoints(), 0u);
  EXPECT_EQ(path.RemoveSubpath(0), 0);
}
