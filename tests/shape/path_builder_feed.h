// Feeding pen strokes to the path builders as a live pen would, checking on the way that the
// target path only ever grows at its end.
#ifndef ZV_TESTS_SHAPE_PATH_BUILDER_FEED_H
#define ZV_TESTS_SHAPE_PATH_BUILDER_FEED_H

#include <zv/path2f.h>
#include <zv/path_builder.h>

#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <vector>

#include "path_fixtures.h"

// Every point of `before` is still in `path`, bit for bit (so a NaN stays the same NaN).
inline bool PathKeepsPrefix(const ZvPath2f& path, const std::vector<ZvPoint2<float>>& before) {
  if (path.NumPoints() < before.size()) return false;
  for (unsigned int i = 0; i < before.size(); ++i) {
    const ZvPoint2<float> p = path.GetPoint(i);
    if (std::memcmp(&p, &before[i], sizeof p) != 0) return false;
  }
  return true;
}

inline std::vector<ZvPoint2<float>> PointsOf(const ZvPath2f& path) {
  std::vector<ZvPoint2<float>> v(path.NumPoints());
  if (!v.empty()) path.GetPoints(0, path.NumPoints() - 1, v.data());
  return v;
}

// Starts a subpath at stroke[0], adds the inner points, and ends at the last one. With `live`,
// the trailing samples are taken after every point and the path is checked to keep what it
// held. Returns every sample of the subpath, in order.
inline std::vector<ZvPoint2<float>> Feed(ZvBasePathBuilder& builder, const ZvPoint2fArray& stroke,
                                         bool live, int close = 0) {
  std::vector<ZvPoint2<float>> samples;
  const auto take = [&](const ZvPoint2fArray& batch) {
    samples.insert(samples.end(), batch.data, batch.data + batch.size);
  };
  builder.StartSubpath(stroke[0]);
  for (unsigned int i = 1; i + 1 < stroke.size; ++i) {
    builder.AddInputPoint(stroke[i], 0);
    if (!live) continue;
    const std::vector<ZvPoint2<float>> before = PointsOf(*builder.GetPath());
    take(builder.GetTrailingSamples());
    EXPECT_TRUE(PathKeepsPrefix(*builder.GetPath(), before)) << "after point " << i;
  }
  const std::vector<ZvPoint2<float>> before = PointsOf(*builder.GetPath());
  take(builder.EndSubpath(stroke[stroke.size - 1], close));
  EXPECT_TRUE(PathKeepsPrefix(*builder.GetPath(), before)) << "at the end";
  return samples;
}

// The point of the polyline nearest to q, over edges from..to - 1: its distance; its arc length
// by the table `arc` (one entry per vertex) and its edge when asked.
inline double Nearest(const ZvPoint2<float>& q, const ZvPoint2fArray& line, unsigned int from,
                      unsigned int to, const std::vector<double>* arc = nullptr,
                      double* position = nullptr, unsigned int* edge = nullptr) {
  double best = HUGE_VAL;
  for (unsigned int k = from; k + 1 < line.size && k < to; ++k) {
    const double ax = line[k].x, ay = line[k].y, bx = line[k + 1].x, by = line[k + 1].y;
    const double l2 = (bx - ax) * (bx - ax) + (by - ay) * (by - ay);
    double t = l2 > 0 ? ((q.x - ax) * (bx - ax) + (q.y - ay) * (by - ay)) / l2 : 0.0;
    t = t < 0 ? 0 : (t > 1 ? 1 : t);
    const double d = std::hypot(ax + t * (bx - ax) - q.x, ay + t * (by - ay) - q.y);
    if (d >= best) continue;
    best = d;
    if (arc) *position = (*arc)[k] + t * ((*arc)[k + 1] - (*arc)[k]);
    if (edge) *edge = k;
  }
  return best;
}

// The samples of one open subpath run evenly along the final path: the first is its start, each
// lies within the flatten tolerance of the path, a chord between neighbours is never longer
// than the spacing, and walking the path (finely flattened) the neighbours lie the spacing
// apart, to within a tenth; the last is no farther than that from the end.
inline void ExpectEvenSamples(const std::vector<ZvPoint2<float>>& samples, const ZvPath2f& path,
                              double spacing, double tolerance) {
  ASSERT_GE(samples.size(), 2u);
  ZvPoint2fArray fine(1024);
  ZvPointTagArray tags(1024);
  path.AltFlatten(0.01, fine, tags);
  std::vector<double> arc(1, 0.0);
  for (unsigned int k = 1; k < fine.size; ++k)
    arc.push_back(arc.back() + std::hypot(fine[k].x - fine[k - 1].x, fine[k].y - fine[k - 1].y));
  EXPECT_EQ(samples[0].x, fine[0].x);
  EXPECT_EQ(samples[0].y, fine[0].y);
  unsigned int edge = 0;
  double position = 0.0;
  for (size_t k = 1; k < samples.size(); ++k) {
    EXPECT_LE(Nearest(samples[k], fine, 0, fine.size), tolerance + 1e-3) << "sample " << k;
    const double d = std::hypot(samples[k].x - samples[k - 1].x, samples[k].y - samples[k - 1].y);
    EXPECT_LE(d, spacing * 1.0001) << "sample " << k;
    // The next sample lies within a few spacings' worth of fine edges ahead.
    double next = 0.0;
    Nearest(samples[k], fine, edge, edge + 400, &arc, &next, &edge);
    if (k + 1 < samples.size()) {
      EXPECT_NEAR(next - position, spacing, 0.1 * spacing) << "sample " << k;
    }
    position = next;
  }
  EXPECT_LE(arc.back() - position, spacing * 1.1);
}

#endif
