// Thousands of random edits on random paths (lines, quadratics, cubics and higher degrees, open
// and closed subpaths, G1 locks): after each one the path must be well formed, and an edit that
// answered 0 must have left it byte for byte as it was.
#include <zv/path2f.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <random>
#include <vector>

#include "path_fixtures.h"

namespace {

struct Rng {
  std::mt19937 g;
  unsigned int Below(unsigned int n) { return g() % n; }
  float Near(float x, float spread) {
    return x + std::uniform_real_distribution<float>(-spread, spread)(g);
  }
  ZvPoint2<float> Around(const ZvPoint2<float>& p, float spread) {
    return P(Near(p.x, spread), Near(p.y, spread));
  }
  // Cubics most often, and up to degree 8.
  unsigned int Degree() {
    const unsigned int d = Below(8);
    return d < 2 ? d + 1 : d < 6 ? 3 : 4 + Below(5);
  }
};

// Random segments from a to b (closed when they are one point). Where two segments of degree 3
// or more meet, the start of a closed subpath included, their handles are mostly put in line so
// that the node can be locked.
void AppendStretch(ZvPath2f& path, Rng& r, const ZvPoint2<float>& a, const ZvPoint2<float>& b) {
  path.Moveto(a);
  const unsigned int s = path.NumPoints() - 1, segments = 1 + r.Below(5);
  ZvPoint2<float> node = a, handle = a;
  for (unsigned int k = 0, last = 0; k < segments; ++k) {
    const unsigned int d = r.Degree();
    std::vector<ZvPoint2<float>> pts;
    for (unsigned int j = 0; j < d; ++j)
      pts.push_back(r.Around(node, 30));
    const float t = 0.3f + float(r.Below(100)) / 50;
    if (d >= 3 && last >= 3 && r.Below(10)) pts[0] = node + (node - handle) * t;
    if (k + 1 == segments) {
      pts.back() = b;
      if (Coincide(a, b) && d >= 3 && path.GetDegree(s) >= 3 && r.Below(10))
        pts[d - 2] = a - (path.GetPoint(s + 1) - a) * t;
    }
    path.AltCurveto(pts.data(), d);
    handle = d >= 2 ? pts[d - 2] : node;
    node = pts.back();
    last = d;
  }
  path.Closeto();  // takes only where the ends meet
}

// LockG1, except at a closed subpath's start whose first segment is a line or a quadratic: that
// lock is accepted, but the line's end is a node that moves freely, so nothing keeps it in line.
void TryLock(ZvPath2f& path, unsigned int i) {
  unsigned int s = 0, e = 0;
  path.GetSubpathIndices(i, s, e);
  if ((i == s || i == e) && path.GetDegree(s) < 3) return;
  path.LockG1(i);
}

std::vector<unsigned char> Bytes(const ZvPath2f& path) {
  std::vector<unsigned char> b(path.GetBufferSize());
  path.WriteToBuffer(b.data());
  for (int c : Codes(path, 255))
    b.push_back(static_cast<unsigned char>(c));  // the lock bits, which buffers do not keep
  return b;
}

bool IsNodeCode(int c) {
  static const int nodes[] = {1, 3, 4, 6, 7, 10, 11, 15, 16, 21, 22, 28, 29, 36, 37, 45, 46};
  return std::find(std::begin(nodes), std::end(nodes), c) != std::end(nodes);
}

// Handles in line through their node and pointing apart, up to a few roundings of the stored
// coordinates; a handle (nearly) on its node counts as in line.
bool InLine(const ZvPoint2<float>& in, const ZvPoint2<float>& node, const ZvPoint2<float>& out) {
  const double ax = double(node.x) - in.x, ay = double(node.y) - in.y;
  const double bx = double(out.x) - node.x, by = double(out.y) - node.y;
  const double la = std::hypot(ax, ay), lb = std::hypot(bx, by);
  const double ulp = 1e-6 * std::max({1.0f, std::fabs(in.x), std::fabs(in.y), std::fabs(out.x),
                                      std::fabs(out.y), std::fabs(node.x), std::fabs(node.y)});
  if (la <= 4 * ulp || lb <= 4 * ulp) return true;
  return std::fabs(ax * by - ay * bx) <= ulp * (la + lb) && ax * bx + ay * by >= -ulp * (la + lb);
}

// Codes that parse, closed subpaths closed, lock bits only on nodes, a locked start or end only
// on a closed subpath with both marked, and every locked node's handles in line.
::testing::AssertionResult WellFormed(const ZvPath2f& path) {
  if (!PathInvariantHolds(path)) return ::testing::AssertionFailure() << "codes do not parse";
  const std::vector<int> codes = Codes(path, 255);
  ZvPath2fIter it(path);
  unsigned int s = 0, e = 0;
  while (it.GetNextSubPathIndices(s, e)) {
    const bool closed = path.IsSubpathClosed(s);
    if (closed && !Coincide(path.GetPoint(s), path.GetPoint(e)))
      return ::testing::AssertionFailure() << "subpath " << s << ".." << e << " came open";
    for (unsigned int i = s; i <= e; ++i) {
      if (!(codes[i] & 128)) continue;
      const bool end = i == s || i == e;
      if (!IsNodeCode(codes[i] & 63) ||
          (end && (!closed || !(codes[s] & codes[e] & 128) || e - s < 3)))
        return ::testing::AssertionFailure() << "lock at " << i << " in " << s << ".." << e;
      const unsigned int node = end ? s : i, in = end ? e - 1 : i - 1;
      if (!InLine(path.GetPoint(in), path.GetPoint(node), path.GetPoint(node + 1)))
        return ::testing::AssertionFailure() << "locked node " << i << " is not smooth";
    }
  }
  return ::testing::AssertionSuccess();
}

// Two nodes start < end of one subpath; now and then (or when there is none) a pair that must
// be refused, `mustFail` then set: equal, reversed or across subpaths.
void PickSection(const ZvPath2f& path, Rng& r, unsigned int& start, unsigned int& end,
                 bool& mustFail) {
  std::vector<unsigned int> nodes;
  for (unsigned int i = 0; i < path.NumPoints(); ++i)
    if (IsNodeCode(Codes(path)[i])) nodes.push_back(i);
  start = nodes[r.Below(nodes.size())];
  end = r.Below(4) ? nodes[r.Below(nodes.size())] : start;
  unsigned int s = 0, e = 0;
  path.GetSubpathIndices(start, s, e);
  if (start > end) std::swap(start, end);
  mustFail = start == end || end > e;
}

// One random edit; `mustFail` is set for an edit built to be refused. The result is 1 for the
// edits that answer nothing.
int RandomEdit(ZvPath2f& path, Rng& r, bool& mustFail) {
  const unsigned int i = r.Below(path.NumPoints());
  unsigned int start = 0, end = 0, a = 0, b = 0;
  mustFail = false;
  switch (r.Below(10)) {
    case 0:
      path.ReplacePoint(i, r.Around(path.GetPoint(i), 20), int(r.Below(2)));
      return 1;
    case 1:
      return path.ReplaceTangentVectorDirections(i, P(r.Near(0, 10), r.Near(0, 10)));
    case 2:
    case 3: {
      path.GetSegmentIndices(i, a, b);
      const unsigned int d = r.Below(10);
      std::vector<ZvPoint2<float>> pts(d + 1, path.GetPoint(a));
      for (unsigned int k = 1; k <= d; ++k)
        pts[k] = k == d ? path.GetPoint(b) : r.Around(pts[0], 30);
      mustFail = a < b && r.Below(8) == 0;
      if (mustFail) pts[0].x += 1;
      return path.ReplaceSegment(i, pts.data(), d);
    }
    case 4:
      PickSection(path, r, start, end, mustFail);
      return path.ReplaceSubpathSection(start, end);
    case 5:
      PickSection(path, r, start, end, mustFail);
      return path.ReplaceSubpathSection(start, end, r.Around(P(0, 0), 99), r.Around(P(0, 0), 99));
    case 6: {
      PickSection(path, r, start, end, mustFail);
      if (r.Below(8) == 0) return path.ReplaceSubpathSection(start, end, path, start, end);
      ZvPath2f source;
      AppendStretch(source, r, path.GetPoint(start), path.GetPoint(end));
      if (!mustFail && r.Below(8) == 0) {
        source.Translate(P(0.5f, 0));  // ends that no longer coincide
        mustFail = true;
      }
      return path.ReplaceSubpathSection(start, end, source, 0, source.NumPoints() - 1);
    }
    case 7:
      PickSection(path, r, start, end, mustFail);
      return path.RemoveSubpathSection(start, end);
    case 8:
      return path.RemoveSubpath(i);
    default:
      if (r.Below(3)) return r.Below(2) ? path.CloseSubpath(i) : path.OpenSubpath(i);
      for (unsigned int k = 0; k < path.NumPoints(); ++k)
        TryLock(path, k);
      return 1;
  }
}

TEST(PathEditProperty, RandomEditsKeepPathsWellFormed) {
  int refused = 0, built = 0;
  for (unsigned int seed = 1; seed <= 100; ++seed) {
    Rng r{std::mt19937(seed)};
    ZvPath2f path;
    for (int step = 0; step < 400; ++step) {
      while (path.NumSubpaths() < 2 || path.NumPoints() < 8) {
        const ZvPoint2<float> a = r.Around(P(0, 0), 99);
        AppendStretch(path, r, a, r.Below(2) ? a : r.Around(a, 50));
      }
      const std::vector<unsigned char> before = Bytes(path);
      bool mustFail = false;
      const int result = RandomEdit(path, r, mustFail);
      ASSERT_TRUE(WellFormed(path)) << "seed " << seed << " step " << step;
      ASSERT_TRUE(result != 0 || Bytes(path) == before) << "seed " << seed << " step " << step;
      ASSERT_TRUE(result == 0 || !mustFail) << "seed " << seed << " step " << step;
      refused += result == 0;
      built += mustFail;
    }
  }
  // The mix must exercise refusals as well as changes.
  EXPECT_GT(built, 2000);
  EXPECT_GT(refused, built);
}

}  // namespace
