#include "core/convex_hull.h"

#include <zv/polyline.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <limits>
#include <random>
#include <set>
#include <utility>
#include <vector>

namespace {

// Test points carry integer coordinates; a double coordinate is the integer times 2^-scaleBits,
// so the brute force below can decide every orientation exactly in integers.
using IPoint = std::pair<long long, long long>;

// A signed product of two 64-bit integers below 2^63, as sign and 128-bit magnitude, so that
// the orientation below stays exact on 32-bit targets too.
struct WideProduct {
  bool negative;
  uint64_t hi, lo;
};

WideProduct Multiply(long long a, long long b) {
  const uint64_t x = a < 0 ? uint64_t(-a) : uint64_t(a), y = b < 0 ? uint64_t(-b) : uint64_t(b);
  const uint64_t x0 = x & 0xffffffffu, x1 = x >> 32, y0 = y & 0xffffffffu, y1 = y >> 32;
  const uint64_t p00 = x0 * y0, p01 = x0 * y1, p10 = x1 * y0, p11 = x1 * y1;
  const uint64_t mid = (p00 >> 32) + (p01 & 0xffffffffu) + (p10 & 0xffffffffu);
  return {x != 0 && y != 0 && (a < 0) != (b < 0), p11 + (p01 >> 32) + (p10 >> 32) + (mid >> 32),
          (mid << 32) | (p00 & 0xffffffffu)};
}

// Sign of p - q.
int CompareProducts(const WideProduct& p, const WideProduct& q) {
  if (p.negative != q.negative) return p.negative ? -1 : 1;
  int magnitude = 0;
  if (p.hi != q.hi) {
    magnitude = p.hi < q.hi ? -1 : 1;
  } else if (p.lo != q.lo) {
    magnitude = p.lo < q.lo ? -1 : 1;
  }
  return p.negative ? -magnitude : magnitude;
}

// Exact sign of the turn o -> a -> b.
int Cross(const IPoint& o, const IPoint& a, const IPoint& b) {
  return CompareProducts(Multiply(a.first - o.first, b.second - o.second),
                         Multiply(a.second - o.second, b.first - o.first));
}

bool OnSegment(const IPoint& p, const IPoint& a, const IPoint& b) {
  return Cross(a, b, p) == 0 && std::min(a.first, b.first) <= p.first &&
         p.first <= std::max(a.first, b.first) && std::min(a.second, b.second) <= p.second &&
         p.second <= std::max(a.second, b.second);
}

bool InTriangle(const IPoint& p, const IPoint& a, const IPoint& b, const IPoint& c) {
  const int d1 = Cross(a, b, p), d2 = Cross(b, c, p), d3 = Cross(c, a, p);
  const bool negative = d1 < 0 || d2 < 0 || d3<0, positive = d1> 0 || d2 > 0 || d3 > 0;
  return !(negative && positive);
}

// The corners of the hull: the distinct points that lie in no segment or proper triangle of the
// others (a point inside the hull of a set lies in the hull of three of its points).
std::set<IPoint> BruteForceCorners(const std::vector<IPoint>& input) {
  const std::set<IPoint> unique(input.begin(), input.end());
  const std::vector<IPoint> v(unique.begin(), unique.end());
  std::set<IPoint> corners;
  const size_t n = v.size();
  for (size_t i = 0; i < n; ++i) {
    bool inside = false;
    for (size_t a = 0; a < n && !inside; ++a)
      for (size_t b = a + 1; b < n && !inside; ++b) {
        if (a == i || b == i) continue;
        inside = OnSegment(v[i], v[a], v[b]);
        for (size_t c = b + 1; c < n && !inside; ++c)
          if (c != i && Cross(v[a], v[b], v[c]) != 0) inside = InTriangle(v[i], v[a], v[b], v[c]);
      }
    if (!inside) corners.insert(v[i]);
  }
  return corners;
}

// Runs the hull on the scaled points and checks it against the brute force: the same corners,
// starting at the smallest (x, y), turning strictly left, with every input point on the inner
// side of every edge (which rules out a polygon that winds twice).
void ExpectHullMatchesBruteForce(const std::vector<IPoint>& input, int scaleBits) {
  const double scale = std::ldexp(1.0, -scaleBits);
  std::vector<CQNVector2<double>> points, hull(input.size());
  for (const IPoint& p : input)
    points.emplace_back(double(p.first) * scale, double(p.second) * scale);
  int count = -1;
  ASSERT_EQ(
      CQNGeometry::BuildConvexHull<double>(int(points.size()), points.data(), count, hull.data()),
      1);
  std::vector<IPoint> got;
  got.reserve(count);
  for (int i = 0; i < count; ++i)
    got.emplace_back((long long)std::ldexp(hull[i][0], scaleBits),
                     (long long)std::ldexp(hull[i][1], scaleBits));
  const std::set<IPoint> expected = BruteForceCorners(input);
  ASSERT_EQ(std::set<IPoint>(got.begin(), got.end()), expected);
  ASSERT_EQ(got.size(), expected.size());
  EXPECT_EQ(got.front(), *expected.begin());
  if (got.size() < 3) return;
  for (size_t i = 0; i < got.size(); ++i) {
    const IPoint& a = got[i];
    const IPoint& b = got[(i + 1) % got.size()];
    ASSERT_GT(Cross(a, b, got[(i + 2) % got.size()]), 0);
    for (const IPoint& p : input)
      ASSERT_GE(Cross(a, b, p), 0);
  }
}

TEST(ConvexHull, AgreesWithBruteForceOnSmallGridsWithRepeatsAndCollinearPoints) {
  std::mt19937 rng(12345);
  for (int trial = 0; trial < 600; ++trial) {
    // A 5x5 grid makes repeated points and long collinear runs common.
    const int n = 1 + trial % 24;
    const int side = trial % 3 == 0 ? 3 : 5;
    std::uniform_int_distribution<int> coord(0, side - 1);
    std::vector<IPoint> input(n);
    for (IPoint& p : input)
      p = {coord(rng), coord(rng)};
    ExpectHullMatchesBruteForce(input, 0);
    if (HasFatalFailure()) return;
  }
}

// Points within a few units in the last place of the line y = x, at magnitudes from 0.5 to 32:
// a rounded orientation gets many such triples wrong, and a hull built on it can come out
// non-convex. Every double of [0.5, 32) is an integer number of 2^-53 units below 2^58.
std::vector<IPoint> NearlyCollinear(std::mt19937& rng, int n) {
  std::uniform_real_distribution<double> along(0.5, 32.0);
  std::uniform_int_distribution<int> wobble(-3, 3);
  auto nudge = [&](double c) {
    for (int k = wobble(rng); k != 0; k += k > 0 ? -1 : 1)
      c = std::nextafter(c, k > 0 ? 64.0 : 0.0);
    return (long long)std::ldexp(c, 53);
  };
  std::vector<IPoint> v;
  for (int i = 0; i < n; ++i) {
    const double c = along(rng);
    const long long x = nudge(c);  // x before y: argument order is unspecified
    v.emplace_back(x, nudge(c));
  }
  return v;
}

TEST(ConvexHull, ExactOnNearlyCollinearDoubles) {
  std::mt19937 rng(777);
  for (int trial = 0; trial < 150; ++trial) {
    ExpectHullMatchesBruteForce(NearlyCollinear(rng, 3 + trial % 20), 53);
    if (HasFatalFailure()) return;
  }
  // The orientation itself, on triples where a rounded one is sometimes wrong.
  const double scale = std::ldexp(1.0, -53);
  int roundedWrong = 0;
  for (int trial = 0; trial < 20000; ++trial) {
    const std::vector<IPoint> v = NearlyCollinear(rng, 3);
    CQNVector2<double> p[3];
    for (int i = 0; i < 3; ++i)
      p[i] = CQNVector2<double>(v[i].first * scale, v[i].second * scale);
    const int sign = Cross(v[0], v[1], v[2]);
    ASSERT_EQ(CQNGeometry::Orientation(p[0], p[1], p[2]), sign);
    const double rounded =
        (p[1][0] - p[0][0]) * (p[2][1] - p[0][1]) - (p[1][1] - p[0][1]) * (p[2][0] - p[0][0]);
    if ((rounded > 0 ? 1 : rounded < 0 ? -1 : 0) != sign) ++roundedWrong;
  }
  EXPECT_GT(roundedWrong, 0);
}

TEST(ConvexHull, BadInputFailsAndWritesNothing) {
  CQNVector2<double> in[2] = {{0, 0}, {1, std::numeric_limits<double>::quiet_NaN()}};
  CQNVector2<double> hull[2] = {{5, 5}, {5, 5}};
  int count = 42;
  EXPECT_EQ(CQNGeometry::BuildConvexHull<double>(2, in, count, hull), 0);
  EXPECT_EQ(CQNGeometry::BuildConvexHull<double>(0, in, count, hull), 0);
  EXPECT_TRUE(count == 42 && hull[0][0] == 5.0);
  ZvPoint2<float> pts[1] = {{1, 2}};
  EXPECT_EQ(ZvGetConvexHull2D(1, pts, nullptr), 0);
}

TEST(ConvexHull, FloatEntryAppendsCornersCounterClockwise) {
  ZvPoint2<float> pts[] = {{2, 2}, {0, 0}, {1, 1}, {2, 0}, {0, 2}, {1, 0}, {0, 0}};
  ZvPoint2fArray out(1);
  out.Add(9, 9);
  ASSERT_EQ(ZvGetConvexHull2D(7, pts, &out), 1);
  ASSERT_EQ(out.size, 5u);
  const float expected[4][2] = {{0, 0}, {2, 0}, {2, 2}, {0, 2}};
  for (int i = 0; i < 4; ++i)
    EXPECT_TRUE(out[i + 1].x == expected[i][0] && out[i + 1].y == expected[i][1]) << i;
}

// A large cloud: every point must end up inside. The time for a million points is measured by
// bench_hull, where the build is optimised.
TEST(ConvexHull, LargeRandomCloudLiesInside) {
  const int n = 50000;
  std::mt19937 rng(2024);
  std::uniform_real_distribution<float> coord(-1000.0f, 1000.0f);
  std::vector<ZvPoint2<float>> pts(n);
  for (auto& p : pts)
    p = {coord(rng), coord(rng)};
  ZvPoint2fArray hull(1);
  ASSERT_EQ(ZvGetConvexHull2D(n, pts.data(), &hull), 1);
  ASSERT_GE(hull.size, 3u);
  for (unsigned int i = 0; i < hull.size; ++i) {
    const CQNVector2<double> a(hull[i].x, hull[i].y);
    const ZvPoint2<float>& next = hull[(i + 1) % hull.size];
    const CQNVector2<double> b(next.x, next.y);
    for (const auto& p : pts)
      ASSERT_GE(CQNGeometry::Orientation(a, b, CQNVector2<double>(p.x, p.y)), 0);
  }
}

}  // namespace
