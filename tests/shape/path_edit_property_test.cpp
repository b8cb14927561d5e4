// Thousands of random edits on random paths (lines, quadratics, cubics and higher degrees, open
// and closed subpaths, G1 locks), checking after each one that the path is still well formed,
// and that every edit answering 0 left it byte for byte as it was.
#include <zv/path2f.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <random>
#include <sstream>
#include <vector>

#include "path_fixtures.h"

namespace {

class Rng {
 public:
  explicit Rng(unsigned int seed) : g_(seed) {}
  unsigned int Below(unsigned int n) {
    return std::uniform_int_distribution<unsigned int>(0, n - 1)(g_);
  }
  float Coord() { return std::uniform_real_distribution<float>(-100.0f, 100.0f)(g_); }
  float Near(float x, float spread) {
    return x + std::uniform_real_distribution<float>(-spread, spread)(g_);
  }
  bool Chance(double p) { return std::uniform_real_distribution<double>(0.0, 1.0)(g_) < p; }
  ZvPoint2<float> Point() { return P(Coord(), Coord()); }
  ZvPoint2<float> Around(const ZvPoint2<float>& p, float spread) {
    return P(Near(p.x, spread), Near(p.y, spread));
  }

 private:
  std::mt19937 g_;
};

unsigned int RandomDegree(Rng& r) {
  const unsigned int d = r.Below(8);
  return d < 2 ? d + 1 : d < 6 ? 3 : 4 + r.Below(5);  // cubics most often, and up to degree 8
}

// One subpath: random segments from a random start; a closed one comes back to its start, and
// where two segments of degree 3 or more meet (the start of a closed one included) the handles
// are put in line so that the node may be locked.
void AppendSubpath(ZvPath2f& path, Rng& r) {
  const bool closed = r.Chance(0.5);
  const unsigned int segments = 1 + r.Below(5);
  const ZvPoint2<float> start = r.Point();
  path.Moveto(start);
  const unsigned int s = path.NumPoints() - 1;
  ZvPoint2<float> node = start, lastHandle = start;
  unsigned int lastDegree = 0, firstDegree = 0;
  for (unsigned int k = 0; k < segments; ++k) {
    const unsigned int d = RandomDegree(r);
    if (k == 0) firstDegree = d;
    std::vector<ZvPoint2<float>> pts;
    for (unsigned int j = 0; j < d; ++j)
      pts.push_back(r.Around(node, 30.0f));
    const bool closing = closed && k + 1 == segments;
    if (closing) pts.back() = start;
    if (d >= 3 && lastDegree >= 3 && r.Chance(0.9)) {
      const float t = 0.3f + static_cast<float>(r.Below(100)) / 50.0f;
      pts[0] = P(node.x + (node.x - lastHandle.x) * t, node.y + (node.y - lastHandle.y) * t);
    }
    if (closing && d >= 3 && firstDegree >= 3 && r.Chance(0.9)) {
      const ZvPoint2<float> h = path.GetPoint(s + 1);
      const float t = 0.3f + static_cast<float>(r.Below(100)) / 50.0f;
      pts[d - 2] = P(start.x - (h.x - start.x) * t, start.y - (h.y - start.y) * t);
    }
    path.AltCurveto(pts.data(), d);
    lastHandle = d >= 2 ? pts[d - 2] : node;
    node = pts.back();
    lastDegree = d;
  }
  if (closed) path.Closeto();
}

// LockG1 wherever it is allowed, except at a closed subpath's start whose first segment is a
// line or a quadratic: that lock is accepted, but the line's end is a node that moves freely,
// so nothing keeps such a start in line and the invariant below would not be owed.
void TryLock(ZvPath2f& path, unsigned int i) {
  unsigned int first = 0, last = 0;
  path.GetSubpathIndices(i, first, last);
  int closed = 0;
  if ((path.IsStartOfSubpath(i) || path.IsEndOfSubpath(i, closed)) && path.GetDegree(first) < 3)
    return;
  path.LockG1(i);
}

ZvPath2f RandomPath(Rng& r) {
  ZvPath2f path;
  const unsigned int subpaths = 1 + r.Below(3);
  for (unsigned int k = 0; k < subpaths; ++k)
    AppendSubpath(path, r);
  for (unsigned int i = 0; i < path.NumPoints(); ++i)
    if (r.Chance(0.7)) TryLock(path, i);
  return path;
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
bool IsClosedCode(int c) {
  return c == 4 || c == 7 || c == 11 || c == 16 || c == 22 || c == 29 || c == 37 || c == 46;
}

// The two handles of a locked node lie on one line through it, pointing apart, up to what
// single-precision storage of the coordinates can hold; a handle on its node counts as in line.
bool HandlesInLine(const ZvPoint2<float>& in, const ZvPoint2<float>& node,
                   const ZvPoint2<float>& out) {
  const double ax = double(node.x) - in.x, ay = double(node.y) - in.y;
  const double bx = double(out.x) - node.x, by = double(out.y) - node.y;
  const double la = std::hypot(ax, ay), lb = std::hypot(bx, by);
  const double m = std::max({1.0f, std::fabs(in.x), std::fabs(in.y), std::fabs(node.x),
                             std::fabs(node.y), std::fabs(out.x), std::fabs(out.y)});
  const double ulp = 6e-8 * m * 16;  // a few roundings of each stored coordinate
  if (la <= 4 * ulp || lb <= 4 * ulp) return true;
  return std::fabs(ax * by - ay * bx) <= ulp * (la + lb) && ax * bx + ay * by >= -ulp * (la + lb);
}

// What every edit must keep, beyond the codes parsing: closed subpaths closed, lock bits only on
// nodes, a locked start or end of a subpath only on a closed one with both ends marked, and the
// handles of every locked node in line.
::testing::AssertionResult WellFormed(const ZvPath2f& path) {
  if (!PathInvariantHolds(path)) return ::testing::AssertionFailure() << "codes do not parse";
  const std::vector<int> codes = Codes(path, 255);
  ZvPath2fIter it(path);
  unsigned int s = 0, e = 0;
  while (it.GetNextSubPathIndices(s, e)) {
    const bool closed = IsClosedCode(codes[e] & 63);
    if (closed && !Coincide(path.GetPoint(s), path.GetPoint(e)))
      return ::testing::AssertionFailure() << "closed subpath " << s << ".." << e << " is open";
    for (unsigned int i = s; i <= e; ++i) {
      if (!(codes[i] & 128)) continue;
      if (!IsNodeCode(codes[i] & 63))
        return ::testing::AssertionFailure() << "lock on the control point " << i;
      const bool boundary = i == s || i == e;
      if (boundary && (!closed || !(codes[s] & 128) || !(codes[e] & 128) || e - s < 3))
        return ::testing::AssertionFailure() << "lock at the end " << i << " of " << s << ".." << e;
      const unsigned int node = boundary ? s : i;
      const unsigned int in = boundary ? e - 1 : i - 1, out = node + 1;
      if (!HandlesInLine(path.GetPoint(in), path.GetPoint(node), path.GetPoint(out)))
        return ::testing::AssertionFailure() << "locked node " << i << " is not smooth";
    }
  }
  return ::testing::AssertionSuccess();
}

struct Nodes {
  std::vector<unsigned int> all;
  // Two nodes start < end of one subpath, if the path has any.
  bool PickSection(const ZvPath2f& path, Rng& r, unsigned int& start, unsigned int& end) const {
    for (int tries = 0; tries < 8; ++tries) {
      start = all[r.Below(all.size())];
      unsigned int first = 0, last = 0;
      path.GetSubpathIndices(start, first, last);
      std::vector<unsigned int> after;
      for (unsigned int n : all)
        if (n > start && n <= last) after.push_back(n);
      if (after.empty()) continue;
      end = after[r.Below(after.size())];
      return true;
    }
    return false;
  }
};

Nodes NodesOf(const ZvPath2f& path) {
  Nodes n;
  const std::vector<int> codes = Codes(path);
  for (unsigned int i = 0; i < codes.size(); ++i)
    if (IsNodeCode(codes[i])) n.all.push_back(i);
  return n;
}

// A stretch from a to b: random segments, the last ending on b; closed when a and b are one.
ZvPath2f Stretch(Rng& r, const ZvPoint2<float>& a, const ZvPoint2<float>& b) {
  ZvPath2f s;
  s.Moveto(a);
  const unsigned int segments = 1 + r.Below(3);
  for (unsigned int k = 0; k < segments; ++k) {
    const unsigned int d = RandomDegree(r);
    std::vector<ZvPoint2<float>> pts;
    for (unsigned int j = 0; j < d; ++j)
      pts.push_back(r.Around(a, 30.0f));
    if (k + 1 == segments) pts.back() = b;
    s.AltCurveto(pts.data(), d);
  }
  if (Coincide(a, b)) s.Closeto();
  return s;
}

// Two nodes start < end of one subpath, or now and then a pair that must be refused: across
// subpaths, equal, or the wrong way round. False when neither came out.
bool PickSection(const ZvPath2f& path, const Nodes& nodes, Rng& r, unsigned int& start,
                 unsigned int& end, bool& mustFail) {
  if (nodes.PickSection(path, r, start, end) && !r.Chance(0.15)) return true;
  start = nodes.all[r.Below(nodes.all.size())];
  end = r.Chance(0.3) ? start : nodes.all[r.Below(nodes.all.size())];
  unsigned int first = 0, last = 0;
  path.GetSubpathIndices(start, first, last);
  mustFail = end <= start || end > last;
  return mustFail;
}

// Applies one random edit; `mustFail` is set for an edit built to be refused. Returns the edit's
// result (1 for the edits that answer nothing).
int RandomEdit(ZvPath2f& path, Rng& r, bool& mustFail, std::string& what) {
  mustFail = false;
  const unsigned int n = path.NumPoints();
  const Nodes nodes = NodesOf(path);
  const unsigned int i = r.Below(n);
  std::ostringstream name;
  int result = 1;
  unsigned int start = 0, end = 0;
  switch (r.Below(12)) {
    case 0:
    case 1: {
      const ZvPoint2<float> p = r.Around(path.GetPoint(i), 20.0f);
      const int scale = static_cast<int>(r.Below(2));
      name << "ReplacePoint(" << i << ", " << scale << ")";
      path.ReplacePoint(i, p, scale);
      break;
    }
    case 2: {
      const unsigned int node = nodes.all[r.Below(nodes.all.size())];
      name << "ReplaceTangentVectorDirections(" << node << ")";
      result = path.ReplaceTangentVectorDirections(node, P(r.Near(0, 10), r.Near(0, 10)));
      break;
    }
    case 3:
    case 4: {
      unsigned int a = 0, b = 0;
      path.GetSegmentIndices(i, a, b);
      const unsigned int degree = r.Below(10);
      std::vector<ZvPoint2<float>> pts;
      for (unsigned int k = 0; k <= degree; ++k)
        pts.push_back(r.Around(path.GetPoint(a), 30.0f));
      pts[0] = path.GetPoint(a);
      if (degree > 0) pts[degree] = path.GetPoint(b);
      if (a < b && r.Chance(0.15)) {
        pts[0].x += 1.0f;
        mustFail = true;
      }
      name << "ReplaceSegment(" << i << ", degree " << degree << ")";
      result = path.ReplaceSegment(i, pts.data(), degree);
      break;
    }
    case 5:
    case 6:
    case 7: {
      const int kind = static_cast<int>(r.Below(3));
      if (!PickSection(path, nodes, r, start, end, mustFail)) break;
      name << "ReplaceSubpathSection" << kind << "(" << start << ", " << end << ")";
      if (kind == 0) {
        result = path.ReplaceSubpathSection(start, end);
      } else if (kind == 1) {
        result = path.ReplaceSubpathSection(start, end, r.Point(), r.Point());
      } else if (r.Chance(0.15)) {
        name << " from itself";
        result = path.ReplaceSubpathSection(start, end, path, start, end);
      } else {
        const ZvPath2f source = Stretch(r, path.GetPoint(start), path.GetPoint(end));
        const unsigned int last = source.NumPoints() - 1;
        if (!mustFail && r.Chance(0.1)) {
          ZvPath2f moved(source);
          moved.Translate(P(0.5f, 0));
          mustFail = true;
          result = path.ReplaceSubpathSection(start, end, moved, 0, last);
        } else {
          result = path.ReplaceSubpathSection(start, end, source, 0, last);
        }
      }
      break;
    }
    case 8: {
      if (!PickSection(path, nodes, r, start, end, mustFail)) break;
      name << "RemoveSubpathSection(" << start << ", " << end << ")";
      result = path.RemoveSubpathSection(start, end);
      break;
    }
    case 9:
      name << "RemoveSubpath(" << i << ")";
      result = path.RemoveSubpath(i);
      break;
    case 10:
      name << "Lock everywhere / Unlock(" << i << ")";
      if (r.Chance(0.7)) {
        for (unsigned int k = 0; k < n; ++k)
          TryLock(path, k);
      } else {
        path.UnlockG1(i);
      }
      break;
    default:
      name << "Close/Open(" << i << ")";
      result = r.Chance(0.5) ? path.CloseSubpath(i) : path.OpenSubpath(i);
      break;
  }
  what = name.str();
  return result;
}

TEST(PathEditProperty, RandomEditsKeepPathsWellFormed) {
  int edits = 0, refused = 0, built = 0;
  for (unsigned int seed = 1; seed <= 100; ++seed) {
    Rng r(seed);
    ZvPath2f path = RandomPath(r);
    ASSERT_TRUE(WellFormed(path)) << "seed " << seed;
    for (int step = 0; step < 400; ++step) {
      while (path.NumSubpaths() < 2 || path.NumPoints() < 8) {
        AppendSubpath(path, r);
        for (unsigned int i = 0; i < path.NumPoints(); ++i)
          if (r.Chance(0.3)) TryLock(path, i);
      }
      const std::vector<unsigned char> before = Bytes(path);
      bool mustFail = false;
      std::string what;
      const int result = RandomEdit(path, r, mustFail, what);
      ++edits;
      ASSERT_TRUE(WellFormed(path)) << "seed " << seed << " step " << step << ": " << what;
      if (mustFail) {
        ++built;
        ASSERT_EQ(result, 0) << "seed " << seed << " step " << step << ": " << what;
      }
      if (result == 0) {
        ++refused;
        ASSERT_TRUE(Bytes(path) == before) << "seed " << seed << " step " << step << ": " << what;
      }
    }
  }
  // The mix must exercise refusals as well as changes.
  EXPECT_EQ(edits, 100 * 400);
  EXPECT_GT(built, 2000);
  EXPECT_GT(refused, built);
}

}  // namespace
