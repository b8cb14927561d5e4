// Property tests of OpenFit on random noisy pen strokes: whatever the stroke, every segment of
// the output follows its stretch of the input within the tolerance.
#include <gtest/gtest.h>
#include <zv/bezier_fit.h>
#include <zv/path2f.h>
#include <zv/polyline.h>

#include <cmath>
#include <random>
#include <vector>

#include "tests/curvemath/bezier_fit_strokes.h"

namespace {

using P2d = ZvPoint2<double>;

// The corner rule, restated: turning back beyond a right angle with a squared cosine above
// cornerCos2.
bool IsCorner(const ZvPoint2fArray& q, unsigned int i, double cornerCos2) {
  const P2d u{double(q[i].x) - q[i - 1].x, double(q[i].y) - q[i - 1].y};
  const P2d w{double(q[i + 1].x) - q[i].x, double(q[i + 1].y) - q[i].y};
  const double c = ZvDot(u, w);
  return c < 0.0 && c * c > ZvDot(u, u) * ZvDot(w, w) * cornerCos2;
}

struct Segment {
  unsigned int first, last;  // input indices of its end nodes
  std::vector<P2d> control;
};

// Reads the path back as segments and finds each node in the input, in order. Fails the test
// when a node is not an input vertex.
std::vector<Segment> Segments(const ZvPath2f& path, const ZvPoint2fArray& input) {
  std::vector<Segment> out;
  unsigned int j = 0;
  EXPECT_TRUE(input[0].x == path.GetPoint(0).x && input[0].y == path.GetPoint(0).y);
  for (unsigned int i = 1; i < path.NumPoints();) {
    unsigned int a, b;
    path.GetSegmentIndices(i, a, b);
    Segment s;
    s.first = j;
    for (unsigned int k = a; k <= b; ++k)
      s.control.push_back(P2d{path.GetPoint(k).x, path.GetPoint(k).y});
    const ZvPoint2<float> node = path.GetPoint(b);
    while (j < input.size && !(input[j].x == node.x && input[j].y == node.y))
      ++j;
    if (j == input.size) {
      ADD_FAILURE() << "node " << b << " is not an input vertex after " << s.first;
      return out;
    }
    s.last = j;
    out.push_back(s);
    i = b + 1;
  }
  return out;
}

TEST(BezierFitProperty, EverySegmentFollowsItsStretchOfANoisyStroke) {
  std::mt19937 rng(20240611);
  ZvBezierTool tool;
  unsigned int segments = 0;
  for (int trial = 0; trial < 60; ++trial) {
    const double spacing = 1.5 + 4.0 * (trial % 5) / 4.0;
    const ZvPoint2fArray input = PenStroke(rng, 120 + 10 * (trial % 9), spacing, 0.3);
    const unsigned int degree = 3 + trial % 4;
    const double tolerance = trial % 3 == 0 ? 0.5 : (trial % 3 == 1 ? 1.0 : 2.0);
    ZvPath2f path;
    const unsigned int made = tool.OpenFit(input, 0.5, degree, tolerance, 0, &path, 0);
    const std::vector<Segment> segs = Segments(path, input);
    ASSERT_TRUE(made == segs.size() && segs.back().last == input.size - 1) << trial;
    segments += made;

    ZvDoubleArray chords;
    ZvPoint2fArray_ComputeChordLength(input, 0, input.size - 1, chords);
    for (std::size_t k = 0; k < segs.size(); ++k) {
      const Segment& s = segs[k];
      const unsigned int d = static_cast<unsigned int>(s.control.size()) - 1;
      const unsigned int n = s.last - s.first;
      ASSERT_GE(n, 1u);
      if (n <= 2) {
        // Stretches this short are emitted directly: a line, or a cubic pulled to the middle.
        EXPECT_EQ(n == 1 ? 1u : 3u, d) << trial << " " << k;
        continue;
      }
      EXPECT_TRUE(d == degree || d == 3) << trial << " " << k;
      // The sense of the fit itself: flattened, the segment matches the stretch vertex by vertex
      // at equal arc lengths.
      std::vector<ZvPoint2<float>> cf;
      for (const P2d& c : s.control)
        cf.push_back(ZvPoint2<float>{float(c.x), float(c.y)});
      ZvPoint2fArray flat;
      ZvDoubleArray flatChords;
      tool.Flatten(cf.data(), 0, d, tolerance, &flat, 0);
      ZvPoint2fArray_ComputeChordLength(flat, 0, flat.size - 1, flatChords);
      unsigned int where = 0;
      EXPECT_EQ(1, ZvPoint2fArray_PolylinesAreClose(flat, flatChords, 0, flat.size - 1, input,
                                                    chords, s.first, s.last, tolerance, where))
          << trial << " segment " << k << " strays at " << where;
      // And geometrically, on the curve evaluated afresh: no input vertex of the stretch lies
      // farther than twice the tolerance (the fit's tolerance plus the flattening it was
      // judged on).
      std::vector<P2d> dense;
      for (int t = 0; t <= 256; ++t)
        dense.push_back(EvalBezier(s.control.data(), d, t / 256.0));
      for (unsigned int v = s.first; v <= s.last; ++v) {
        const P2d q{input[v].x, input[v].y};
        double best = HUGE_VAL;
        for (std::size_t t = 0; t + 1 < dense.size(); ++t)
          best = std::fmin(best, DistanceToSegment(q, dense[t], dense[t + 1]));
        EXPECT_LE(best, 2.0 * tolerance) << trial << " segment " << k << " vertex " << v;
      }
      // Inside a stretch the segments meet G1 where both sides were fitted.
      if (k + 1 < segs.size() && segs[k + 1].last - segs[k + 1].first > 2 &&
          !IsCorner(input, s.last, 0.5)) {
        const P2d in = s.control[d] - s.control[d - 1];
        const P2d out = segs[k + 1].control[1] - segs[k + 1].control[0];
        const double li = std::sqrt(ZvDot(in, in)), lo = std::sqrt(ZvDot(out, out));
        if (li > 0.5 && lo > 0.5) {
          EXPECT_NEAR(0.0, ZvCross(in, out) / (li * lo), 1e-3) << trial << " node " << k;
          EXPECT_GT(ZvDot(in, out), 0.0) << trial << " node " << k;
        }
      }
    }
  }
  EXPECT_GT(segments, 60u);
}

}  // namespace
