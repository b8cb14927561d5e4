// Position from time: nodes, the arc-length timing of each tangent pair against a model of it
// written here from scratch, straight and held segments, the ends, sequences, the searches,
// and the segment cache against fresh evaluation after random edits.
#include <zv/bezier_tool.h>
#include <zv/motion_path.h>
#include <zv/transfo4.h>

#include <gtest/gtest.h>

#include <cmath>
#include <cstring>

#include "motion_fixtures.h"

namespace {

using TI = ZvMotionPath3d::TangentInfo;
const double kTol = 0.01;

bool SameBits(const P3& a, const P3& b) {
  return std::memcmp(&a, &b, sizeof a) == 0;
}

double Dist(const P3& a, const P3& b) {
  return std::sqrt((a.x - b.x) * (a.x - b.x) + (a.y - b.y) * (a.y - b.y) +
                   (a.z - b.z) * (a.z - b.z));
}

// A segment flattened and measured independently of the library's tables.
struct Flat {
  std::vector<P3> pts;
  std::vector<double> run;
  double Length() const { return run.back(); }
  P3 At(double s) const {
    for (size_t k = 1; k < pts.size(); ++k) {
      if (s <= run[k]) {
        const double f = run[k] > run[k - 1] ? (s - run[k - 1]) / (run[k] - run[k - 1]) : 0.0;
        return pts[k - 1] + (pts[k] - pts[k - 1]) * f;
      }
    }
    return pts.back();
  }
};

Flat Flatten(const ZvMotionPath3d& path, unsigned int i) {
  P3 cp[4];
  path.GetControlPoints(i, i + 3, cp, nullptr);
  ZvPoint3dArray poly;
  ZvBezierTool_FlattenCubic3d(cp, kTol, &poly, 0);
  Flat f;
  for (unsigned int k = 0; k < poly.size; ++k) {
    f.pts.push_back(poly[k]);
    f.run.push_back(k ? f.run.back() + Dist(poly[k - 1], poly[k]) : 0.0);
  }
  return f;
}

double NodeTime(const ZvMotionPath3d& path, unsigned int node) {
  P3 p;
  double t = 0;
  path.GetNode(3 * node, p, t);
  return t;
}

// The expected position on the cubic segment leaving `node`: end speeds by the rules of the
// tangent information, then the Hermite cubic in local time.
P3 Expected(const ZvMotionPath3d& path, unsigned int node, double time) {
  TI r, l;
  path.GetRightTangentInfo(3 * node, r);
  path.GetLeftTangentInfo(3 * node + 3, l);
  const Flat seg = Flatten(path, 3 * node);
  const double t0 = NodeTime(path, node), t1 = NodeTime(path, node + 1), h = t1 - t0;
  const double L = seg.Length(), u = (time - t0) / h;
  if (r == ZvMotionPath3d::Constant && l == ZvMotionPath3d::Constant) return seg.At(u * L);
  double vs = 0, ve = 0;
  if (r != ZvMotionPath3d::Ease && node > 0)
    vs = (Flatten(path, 3 * node - 3).Length() + L) / (t1 - NodeTime(path, node - 1));
  if (l == ZvMotionPath3d::Constant)
    ve = L / h;
  else if (l != ZvMotionPath3d::Ease && node + 2 < path.NumNodes())
    ve = (Flatten(path, 3 * node + 3).Length() + L) / (NodeTime(path, node + 2) - t0);
  const double u2 = u * u, u3 = u2 * u;
  double s = (u3 - 2 * u2 + u) * h * vs + (-2 * u3 + 3 * u2) * L + (u3 - u2) * h * ve;
  return seg.At(std::fmin(std::fmax(s, 0.0), L));
}

}  // namespace

TEST(MotionTiming, EveryTangentPairFollowsItsArcLengthCubic) {
  const TI infos[] = {ZvMotionPath3d::Hold, ZvMotionPath3d::Constant, ZvMotionPath3d::Smooth,
                      ZvMotionPath3d::Ease, ZvMotionPath3d::Undefined};
  for (TI r : infos) {
    for (TI l : infos) {
      ZvMotionPath3d path = Wave();
      // Both the first segment (no neighbour before) and an inner one, whose speeds come
      // from both neighbours.
      for (unsigned int node : {0u, 1u}) {
        path.SetRightTangentInfo(3 * node, r);
        path.SetLeftTangentInfo(3 * node + 3, l);
        const double t0 = NodeTime(path, node), t1 = NodeTime(path, node + 1);
        for (int k = 1; k < 40; ++k) {
          const double t = t0 + (t1 - t0) * k / 40.0;
          P3 got;
          ASSERT_EQ(path.Eval(t, kTol, got), 1);
          P3 node0;
          double ignored;
          path.GetNode(3 * node, node0, ignored);
          const P3 want = r == ZvMotionPath3d::Hold ? node0 : Expected(path, node, t);
          EXPECT_LT(Dist(got, want), 1e-9)
              << "r " << r << " l " << l << " node " << node << " t " << t;
        }
      }
    }
  }
}

TEST(MotionTiming, NodesEndsHoldsAndLines) {
  ZvMotionPath3d path = Wave();
  path.SetRightTangentInfo(0, ZvMotionPath3d::Hold);
  for (unsigned int i = 0; i < path.NumPoints(); i += 3) {
    P3 node, got;
    double t;
    path.GetNode(i, node, t);
    path.SetLeftTangentInfo(i, ZvMotionPath3d::Ease);
    ASSERT_EQ(path.Eval(t, kTol, got), 1);
    EXPECT_TRUE(SameBits(got, node)) << i;
  }
  P3 got, first, last;
  path.GetControlPoint(0, first);
  path.GetControlPoint(9, last);
  path.Eval(-5.0, kTol, got);
  EXPECT_TRUE(SameBits(got, first));
  path.Eval(99.0, kTol, got);
  EXPECT_TRUE(SameBits(got, last));
  // A hold keeps the node up to, not including, the next node time.
  path.Eval(1.0 - 1e-9, kTol, got);
  EXPECT_TRUE(SameBits(got, first));
  path.Eval(1.0, kTol, got);
  EXPECT_EQ(got.x, 40.0);

  // A straight segment runs linearly, whatever its tangents.
  ZvMotionPath3d line({0, 0, 0}, {10, 20, 30}, 1.0, 3.0);
  line.SetRightTangentInfo(0, ZvMotionPath3d::Ease);
  ASSERT_EQ(line.Eval(1.5, kTol, got), 1);
  EXPECT_DOUBLE_EQ(got.x, 2.5);
  EXPECT_DOUBLE_EQ(got.z, 7.5);

  // One point: that point at any time. Empty: nothing written.
  ZvMotionPath3d one;
  one.Moveto({7, 8, 9}, 2.0);
  EXPECT_EQ(one.NumNodes(), 1u);
  one.Eval(5.0, kTol, got);
  EXPECT_EQ(got.z, 9.0);
  ZvMotionPath3d empty;
  P3 untouched{1, 2, 3};
  EXPECT_EQ(empty.Eval(0.0, kTol, untouched), 0);
  EXPECT_EQ(untouched.x, 1.0);
  EXPECT_EQ(empty.GetFirstTime(), 0.0);
}

TEST(MotionTiming, EasedSegmentIsHalfwayAtMidTimeAndDegenerateOneGivesItsStart) {
  ZvMotionPath3d path({0, 0, 0}, {30, 0, 0}, 0.0, 2.0, {0, 10, 0}, {30, 10, 0});
  path.SetRightTangentInfo(0, ZvMotionPath3d::Ease);
  path.SetLeftTangentInfo(3, ZvMotionPath3d::Ease);
  const Flat f = Flatten(path, 0);
  P3 got;
  path.Eval(1.0, kTol, got);
  EXPECT_LT(Dist(got, f.At(f.Length() / 2)), 1e-9);

  ZvMotionPath3d point({1, 1, 1}, {1, 1, 1}, 0.0, 1.0, {1, 1, 1}, {1, 1, 1});
  EXPECT_EQ(point.Eval(0.5, kTol, got), 0);
  EXPECT_EQ(got.x, 1.0);
}

TEST(MotionTiming, SequenceMatchesEvalBitForBit) {
  std::mt19937 rng(7);
  const ZvMotionPath3d path = RandomPath(rng, 12);
  const double from = path.GetFirstTime() - 0.3, to = path.GetLastTime() + 0.3, step = 0.037;
  ZvPoint3dArray seq;
  ASSERT_EQ(path.EvalSequence(from, to, step, kTol, seq), 1);
  unsigned int k = 0;
  for (double t = from; t <= to; t += step, ++k) {
    P3 p;
    path.Eval(t, kTol, p);
    ASSERT_LT(k, seq.size);
    EXPECT_TRUE(SameBits(seq[k], p)) << t;
  }
  EXPECT_EQ(k, seq.size);
  EXPECT_EQ(path.EvalSequence(to, from, step, kTol, seq), 1);
  EXPECT_EQ(seq.size, k);
  EXPECT_EQ(path.EvalSequence(from, to, 0.0, kTol, seq), 0);
}

TEST(MotionTiming, CachedEvaluationEqualsFreshAfterRandomEdits) {
  std::mt19937 rng(11);
  ZvMotionPath3d path = RandomPath(rng, 9);
  std::uniform_real_distribution<double> unit(0.0, 1.0), coord(-50, 50);
  double tolerances[] = {kTol, 0.3};
  for (int round = 0; round < 120; ++round) {
    const unsigned int n = path.NumPoints();
    const unsigned int i = static_cast<unsigned int>(unit(rng) * n) % n;
    const P3 p{coord(rng), coord(rng), coord(rng)};
    unsigned int index;
    int existing;
    ZvTransfo4 move;
    move.Translate(1.0, -2.0, 0.5);
    switch (round % 8) {
      case 0:
        path.ReplaceControlPoint(i, p, round & 1);
        break;
      case 1:
        path.TranslateControlPoint(i, p * 0.01, 0);
        break;
      case 2:
        path.LockG1Continuity(i - i % 3);
        break;
      case 3:
        path.InsertNode(
            path.GetFirstTime() + unit(rng) * (path.GetLastTime() - path.GetFirstTime()), 0.01,
            kTol, index, existing);
        break;
      case 4:
        if (path.NumNodes() > 5) path.RemoveNodes(3, 3);
        break;
      case 5:
        path.Transform(move);
        break;
      case 6:
        path.LinearizeSegment(i - i % 3);
        break;
      default:
        path.ReplaceControlPointIgnoringLock(i, p);
        break;
    }
    // Tolerances change now and then, not every round, so stale entries would be met.
    const double tol = tolerances[(round / 16) % 2];
    for (int k = 0; k < 25; ++k) {
      const double t = path.GetFirstTime() + unit(rng) * (path.GetLastTime() - path.GetFirstTime());
      P3 cached, fresh;
      path.Eval(t, tol, cached);
      ZvMotionPath3d(path).Eval(t, tol, fresh);
      ASSERT_TRUE(SameBits(cached, fresh)) << "round " << round << " t " << t;
    }
  }
}

TEST(MotionTiming, BracketsAndNodeSearch) {
  const ZvMotionPath3d path = Wave();  // times 0, 1, 2.5, 3
  unsigned int low = 99, high = 99;
  int lowOk = 9, highOk = 9;
  path.GetBracketingIndices(-1.0, 0, low, lowOk, high, highOk);
  EXPECT_EQ(lowOk, 0);
  EXPECT_EQ(high, 0u);
  path.GetBracketingIndices(1.7, 0, low, lowOk, high, highOk);
  EXPECT_EQ(low, 3u);
  EXPECT_EQ(high, 6u);
  EXPECT_EQ(lowOk + highOk, 2);
  path.GetBracketingIndices(2.5, 0, low, lowOk, high, highOk);
  EXPECT_EQ(low, 6u);
  EXPECT_EQ(high, 6u);
  path.GetBracketingIndices(3.0, 0, low, lowOk, high, highOk);
  EXPECT_EQ(low, 9u);
  path.GetBracketingIndices(4.0, 0, low, lowOk, high, highOk);
  EXPECT_EQ(low, 9u);
  EXPECT_EQ(highOk, 0);

  unsigned int index = 77;
  EXPECT_EQ(path.GetNodeIndexFromInitialTime(1.2, 0.1, index), 0);
  EXPECT_EQ(index, 77u);
  EXPECT_EQ(path.GetNodeIndexFromInitialTime(1.05, 0.1, index), 1);
  EXPECT_EQ(index, 3u);
  EXPECT_EQ(path.GetNodeIndexFromInitialTime(2.45, 0.1, index), 1);
  EXPECT_EQ(index, 6u);
  // Both neighbours in reach: the nearer wins, the earlier on a tie.
  EXPECT_EQ(path.GetNodeIndexFromInitialTime(2.8, 0.3, index), 1);
  EXPECT_EQ(index, 9u);
  EXPECT_EQ(path.GetNodeIndexFromInitialTime(2.75, 0.3, index), 1);
  EXPECT_EQ(index, 6u);
  EXPECT_EQ(path.GetNodeIndexFromInitialTime(-0.05, 0.1, index), 1);
  EXPECT_EQ(index, 0u);
  EXPECT_EQ(path.GetNodeIndexFromInitialTime(3.2, 0.1, index), 0);

  EXPECT_TRUE(CanBeAdjacentTimeValues(1.0, 2.0));
  EXPECT_FALSE(CanBeAdjacentTimeValues(0.0, 1e-31));
}
