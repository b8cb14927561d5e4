// Edits of motion paths: growth rules, G1 locks through point edits, node insertion and
// removal, times, segment shaping, picking, rendering and projection.
#include <zv/motion_path.h>
#include <zv/path2f.h>

#include <gtest/gtest.h>

#include <cmath>

#include "motion_fixtures.h"

namespace {

const double kTol = 0.01;

P3 Cp(const ZvMotionPath3d& path, unsigned int i) {
  P3 p{};
  path.GetControlPoint(i, p);
  return p;
}

double Len(const P3& v) {
  return std::sqrt(v.x * v.x + v.y * v.y + v.z * v.z);
}

// |a x b| / (|a||b|): 0 for parallel vectors.
double Sine(const P3& a, const P3& b) {
  const P3 c{a.y * b.z - a.z * b.y, a.z * b.x - a.x * b.z, a.x * b.y - a.y * b.x};
  return Len(c) / (Len(a) * Len(b));
}

// Handles of inner node i point in opposite directions.
void ExpectCollinear(const ZvMotionPath3d& path, unsigned int i) {
  const P3 in = Cp(path, i - 1) - Cp(path, i), out = Cp(path, i + 1) - Cp(path, i);
  EXPECT_LT(Sine(in, out), 1e-12) << i;
  EXPECT_LT(in.x * out.x + in.y * out.y + in.z * out.z, 0.0) << i;
}

P3 Bezier(const P3* p, double u) {
  const double v = 1 - u;
  return p[0] * (v * v * v) + p[1] * (3 * v * v * u) + p[2] * (3 * v * u * u) + p[3] * (u * u * u);
}

}  // namespace

TEST(MotionEdit, GrowthRulesRefuseWithoutChange) {
  ZvMotionPath3d path;
  EXPECT_EQ(path.Lineto({1, 1, 1}, 1.0), 0);
  EXPECT_EQ(path.Moveto({0, 0, 0}, 1.0), 1);
  EXPECT_EQ(path.Moveto({0, 0, 0}, 2.0), 0);
  EXPECT_EQ(path.Lineto({1, 0, 0}, 1.0), 0);
  EXPECT_EQ(path.Curveto({1, 1, 0}, {2, 1, 0}, {3, 0, 0}, 2.0), 1);
  EXPECT_EQ(path.PreLineto({-1, 0, 0}, 1.0), 0);
  EXPECT_EQ(path.PreLineto({-1, 0, 0}, 0.5), 1);
  EXPECT_EQ(path.PreCurveto({-5, 0, 0}, {-4, 1, 0}, {-3, 1, 0}, 0.0), 1);
  ASSERT_EQ(path.NumPoints(), 10u);
  EXPECT_EQ(Cp(path, 0).x, -5.0);
  EXPECT_EQ(Cp(path, 3).x, -1.0);
  ZvMotionPath3d::PointKind kind;
  const int expected[] = {4, 5, 6, 0, 1, 2, 4, 5, 6, 7};
  for (unsigned int i = 0; i < 10; ++i) {
    ASSERT_EQ(path.GetControlPointKind(i, kind), 1);
    EXPECT_EQ(kind, expected[i]) << i;
  }
  ZvMotionPath3d::TangentInfo info;
  path.GetLeftTangentInfo(9, info);
  EXPECT_EQ(info, ZvMotionPath3d::Smooth);
  EXPECT_EQ(path.SetLeftTangentInfo(3, static_cast<ZvMotionPath3d::TangentInfo>(5)), 0);
  EXPECT_EQ(path.GetClientData(10), nullptr);
  int host = 0;
  EXPECT_EQ(path.SetClientData(4, &host), 1);
  EXPECT_EQ(path.GetClientData(4), &host);
}

TEST(MotionEdit, G1LocksHoldThroughPointEdits) {
  ZvMotionPath3d path = Wave();
  EXPECT_EQ(path.LockG1Continuity(4), 0);
  const double before = Len(Cp(path, 2) - Cp(path, 3)), after = Len(Cp(path, 4) - Cp(path, 3));
  ASSERT_EQ(path.LockG1Continuity(3), 1);
  ExpectCollinear(path, 3);
  EXPECT_NEAR(Len(Cp(path, 2) - Cp(path, 3)), before, 1e-12);
  EXPECT_NEAR(Len(Cp(path, 4) - Cp(path, 3)), after, 1e-12);

  // Turning the outgoing handle turns the incoming one; its length stays or scales.
  const double inLength = Len(Cp(path, 2) - Cp(path, 3));
  path.ReplaceControlPoint(4, Cp(path, 3) + P3{0, 0, 10}, 0);
  ExpectCollinear(path, 3);
  EXPECT_NEAR(Len(Cp(path, 2) - Cp(path, 3)), inLength, 1e-12);
  path.ReplaceControlPoint(4, Cp(path, 3) + P3{0, 0, 20}, 1);
  EXPECT_NEAR(Len(Cp(path, 2) - Cp(path, 3)), 2 * inLength, 1e-12);
  path.ReplaceControlPoint(5, Cp(path, 6) + P3{0, 3, 0}, 0);  // node 6 is not locked
  EXPECT_EQ(Cp(path, 7).y, 25.0);

  // A locked node carries its handles; an unlocked one moves alone.
  const P3 h2 = Cp(path, 2);
  path.TranslateControlPoint(3, {1, 1, 1}, 0);
  EXPECT_EQ(Cp(path, 2).x, h2.x + 1);
  path.UnlockG1Continuity(3);
  path.TranslateControlPoint(3, {1, 1, 1}, 0);
  EXPECT_EQ(Cp(path, 2).x, h2.x + 1);
  path.ReplaceControlPointIgnoringLock(2, {0, 0, 0});
  EXPECT_EQ(Cp(path, 2).x, 0.0);

  // No lock next to a straight segment; a Curveto relocks the former last node.
  ZvMotionPath3d mixed({0, 0, 0}, {10, 0, 0}, 0.0, 1.0);
  mixed.Curveto({15, 5, 0}, {20, 5, 0}, {25, 0, 0}, 2.0);
  EXPECT_EQ(mixed.LockG1Continuity(3), 0);
  ZvMotionPath3d grown({0, 0, 0}, {10, 0, 0}, 0.0, 1.0, {3, 3, 0}, {7, 3, 0});
  ASSERT_EQ(grown.LockG1Continuity(3), 1);
  grown.Curveto({10, -3, 0}, {15, -3, 0}, {20, 0, 0}, 2.0);
  EXPECT_TRUE(grown.IsG1ContinuityLocked(3));
  ExpectCollinear(grown, 3);
  EXPECT_EQ(grown.LockG1ContinuityAtAllNodes(), 1);
}

TEST(MotionEdit, InsertNodeKeepsTheShapeAndRefusesNearNodes) {
  ZvMotionPath3d path = Wave();
  P3 old[4];
  path.GetControlPoints(3, 6, old, nullptr);
  P3 at;
  path.Eval(1.8, kTol, at);
  unsigned int index = 0;
  int existing = -1;
  ASSERT_EQ(path.InsertNode(1.8, 0.05, kTol, index, existing), 1);
  EXPECT_EQ(index, 6u);
  EXPECT_EQ(existing, 0);
  EXPECT_EQ(path.NumNodes(), 5u);
  P3 node;
  double t;
  path.GetNode(6, node, t);
  EXPECT_EQ(t, 1.8);
  EXPECT_LT(Len(node - at), 0.05);  // on the curve, where the path was at that time
  // Both halves trace the old cubic.
  P3 left[4], right[4];
  path.GetControlPoints(3, 6, left, nullptr);
  path.GetControlPoints(6, 9, right, nullptr);
  for (double u = 0; u <= 1; u += 0.125) {
    const P3 a = Bezier(left, u), b = Bezier(right, u);
    double da = 1e9, db = 1e9;
    for (double w = 0; w <= 1; w += 1.0 / 4096) {
      da = std::fmin(da, Len(Bezier(old, w) - a));
      db = std::fmin(db, Len(Bezier(old, w) - b));
    }
    EXPECT_LT(da, 0.05);
    EXPECT_LT(db, 0.05);
  }
  EXPECT_EQ(path.InsertNode(1.83, 0.05, kTol, index, existing), 0);
  EXPECT_EQ(existing, 1);
  EXPECT_EQ(index, 6u);
  EXPECT_EQ(path.InsertNode(5.0, 0.05, kTol, index, existing), 0);
  EXPECT_EQ(existing, 0);

  ZvMotionPath3d line({0, 0, 0}, {10, 0, 0}, 0.0, 1.0);
  ASSERT_EQ(line.InsertNode(0.25, 0.0, kTol, index, existing), 1);
  EXPECT_EQ(Cp(line, 3).x, 2.5);
  EXPECT_EQ(line.GetNodeFlags(3), ZvMotionPath3d::sm_LINENODE);
}

TEST(MotionEdit, RemoveNodesJoinsNeighboursAndEmptiesWholly) {
  ZvMotionPath3d path = Wave();
  EXPECT_EQ(path.RemoveNodes(3, 4), 0u);
  EXPECT_EQ(path.RemoveNodes(3, 3), 3u);
  ASSERT_EQ(path.NumPoints(), 7u);
  EXPECT_EQ(Cp(path, 1).y, 20.0);   // node 0's outgoing handle stays
  EXPECT_EQ(Cp(path, 2).y, -25.0);  // and meets the old node 6's incoming one
  EXPECT_EQ(path.GetFirstTime(), 0.0);
  EXPECT_EQ(path.RemoveNodes(6, 6), 3u);
  EXPECT_EQ(path.RemoveNodes(0, 0), 3u);
  EXPECT_EQ(Cp(path, 0).x, 80.0);
  EXPECT_EQ(path.RemoveNodes(0, 0), 1u);
  EXPECT_EQ(path.NumPoints(), 0u);
  EXPECT_EQ(path.Moveto({1, 2, 3}, 0.0), 1);
}

TEST(MotionEdit, TimesScaleOrRefuse) {
  ZvMotionPath3d path = Wave();
  const Bytes before = Block(path);
  EXPECT_EQ(path.ScaleAndOffsetInitialTimes(-1.0, 0.0), 0);
  EXPECT_EQ(Block(path), before);
  EXPECT_EQ(path.ScaleAndOffsetInitialTimes(2.0, 1.0), 1);
  EXPECT_EQ(path.GetLastTime(), 7.0);
  EXPECT_EQ(path.ScaleAndOffsetInitialTimes(0.0, -1.0), 1);
  EXPECT_EQ(path.GetFirstTime(), 0.0);

  EXPECT_EQ(path.ReplaceNode(3, {1, 1, 1}, 0.5, 1.0), 0);  // within minGap of node 0
  EXPECT_EQ(path.ReplaceNode(3, {1, 1, 1}, 5.0, 0.0), 0);  // past node 6 at 5
  EXPECT_EQ(path.ReplaceNode(3, {1, 1, 1}, 2.5, 1.0), 1);
  P3 node;
  double t;
  path.GetNode(3, node, t);
  EXPECT_EQ(t, 2.5);
  EXPECT_EQ(node.z, 1.0);
}

TEST(MotionEdit, LinearizeSmoothAndEndAdjustments) {
  ZvMotionPath3d path = Wave();
  EXPECT_EQ(path.IsCubicSegmentLinearlyParameterized(3), 0);
  ASSERT_EQ(path.LinearizeSegment(3), 1);
  EXPECT_EQ(path.IsCubicSegmentLinearlyParameterized(3), 1);
  EXPECT_EQ(path.SmoothSegment(3), 1);
  EXPECT_TRUE(path.IsG1ContinuityLocked(3));
  EXPECT_TRUE(path.IsG1ContinuityLocked(6));
  ExpectCollinear(path, 3);
  ExpectCollinear(path, 6);
  const double chord = Len(Cp(path, 6) - Cp(path, 3));
  EXPECT_NEAR(Len(Cp(path, 4) - Cp(path, 3)), chord / 3, 1e-9);

  // Next to a straight segment, smoothing is refused and changes nothing.
  ZvMotionPath3d mixed({0, 0, 0}, {10, 0, 0}, 0.0, 1.0);
  mixed.Curveto({15, 5, 0}, {20, 5, 0}, {25, 0, 0}, 2.0);
  mixed.Curveto({30, -5, 0}, {35, -5, 0}, {40, 0, 0}, 3.0);
  const Bytes before = Block(mixed);
  EXPECT_EQ(mixed.SmoothSegment(3), 0);
  EXPECT_EQ(Block(mixed), before);

  // The tangent at the second node parallels the chord between its neighbour nodes.
  P3 tangent{0, 0, 0};
  ASSERT_EQ(path.AdjustFirstTwoCubics(tangent), 1);
  const P3 want = Cp(path, 0) - Cp(path, 6);
  EXPECT_LT(Sine(tangent, want), 1e-12);
  EXPECT_LT(Sine(Cp(path, 2) - Cp(path, 3), want), 1e-12);
  ExpectCollinear(path, 3);  // node 3 was locked by the smoothing
  ASSERT_EQ(path.AdjustLastTwoCubics(tangent), 1);
  EXPECT_LT(Sine(Cp(path, 7) - Cp(path, 6), Cp(path, 9) - Cp(path, 3)), 1e-12);
  EXPECT_EQ(mixed.AdjustFirstTwoCubics(tangent), 0);
}

TEST(MotionEdit, PickingSkipsLineHandles) {
  ZvMotionPath3d path({0, 0, 0}, {10, 0, 0}, 0.0, 1.0);
  path.Curveto({12, 0, 0}, {14, 1, 0}, {20, 0, 0}, 2.0);
  unsigned int index = 99;
  // The line's handles sit on its end node; the node is picked, never them.
  EXPECT_EQ(path.GetClosestControlPointIndex({10.1, 0, 0}, 0.5, index), 1);
  EXPECT_EQ(index, 3u);
  EXPECT_EQ(path.GetClosestControlPointIndex({11.4, 0, 0}, 1.0, index), 1);
  EXPECT_EQ(index, 4u);
  EXPECT_EQ(path.GetClosestControlPointIndex({50, 0, 0}, 1.0, index), 0);
}

TEST(MotionEdit, RenderTicksLieOnTheEvaluatedPath) {
  ZvMotionPath3d path = Wave();
  path.SetRightTangentInfo(6, ZvMotionPath3d::Hold);
  ZvPoint3dArray points;
  ZvUByteArray kinds;
  ZvDoubleArray times;
  ZvULongArray segments;
  ASSERT_EQ(path.Render(0.1, kTol, 1000, points, kinds, times, segments), 1);
  ASSERT_GT(points.size, 30u);
  ASSERT_EQ(kinds.size, points.size);
  EXPECT_EQ(kinds[0], ZvMotionPath3d::RenderFirstTick);
  EXPECT_EQ(kinds[kinds.size - 1], ZvMotionPath3d::RenderLastVertex);
  unsigned int ticks = 0;
  for (unsigned int k = 0; k < points.size; ++k) {
    if (kinds[k] != ZvMotionPath3d::RenderTick && kinds[k] != ZvMotionPath3d::RenderFirstTick)
      continue;
    // Ticks on the even grid, and where evaluation puts the path (a tick may snap to a
    // polyline vertex within 1e-7 of arc length), except at the held segment's start.
    EXPECT_NEAR(times[k] / 0.1, std::round(times[k] / 0.1), 1e-9);
    if (segments[k] == 2) continue;
    P3 at;
    path.Eval(times[k], kTol, at);
    EXPECT_LT(Len(at - points[k]), 1e-6) << times[k];
    ++ticks;
  }
  EXPECT_EQ(ticks, 25u);  // 0.0 .. 2.4 before the hold
  EXPECT_EQ(segments[segments.size - 1], 2u);

  ZvMotionPath3d one;
  one.Moveto({1, 2, 3}, 4.0);
  ZvPoint3dArray p1;
  ZvUByteArray k1;
  ZvDoubleArray t1;
  ZvULongArray s1;
  ASSERT_EQ(one.Render(0.1, kTol, 10, p1, k1, t1, s1), 1);
  ASSERT_EQ(k1.size, 2u);
  EXPECT_EQ(k1[0], 3);
  EXPECT_EQ(k1[1], 5);
  EXPECT_EQ(t1[1], 4.0);
}

TEST(MotionEdit, ProjectionKeepsSegmentKinds) {
  ZvMotionPath3d path({1, 2, 3}, {4, 5, 6}, 0.0, 1.0);
  path.Curveto({7, 8, 9}, {10, 11, 12}, {13, 14, 15}, 2.0);
  ZvPath2f flat;
  ASSERT_EQ(path.GetProjectedPath(ZvMotionPath3d::ProjectZY, flat), 1);
  ASSERT_EQ(flat.NumPoints(), 5u);
  EXPECT_EQ(flat.GetPoint(0).x, -3.0f);
  EXPECT_EQ(flat.GetPoint(0).y, 2.0f);
  EXPECT_EQ(flat.GetDegree(1), 1u);
  EXPECT_EQ(flat.GetDegree(4), 3u);
  ASSERT_EQ(path.GetProjectedPath(ZvMotionPath3d::ProjectXZ, flat), 1);
  EXPECT_EQ(flat.GetPoint(4).y, -15.0f);
  EXPECT_EQ(path.GetProjectedPath(static_cast<ZvMotionPath3d::Projection>(3), flat), 0);
  EXPECT_EQ(flat.NumPoints(), 5u);
}
