// The pressure builders: sample values that follow the pen's pressure, parallel arrays, closed
// subpaths, the two-step end and Reset; and the steps that build the property curve.
#include <zv/gc.h>
#include <zv/path2f_prop1d.h>
#include <zv/path_prop_builder.h>
#include <zv/polyline.h>
#include <zv/raw_fcurve.h>

#include <gtest/gtest.h>

#include <cmath>
#include <cstdlib>
#include <fstream>
#include <iterator>
#include <memory>
#include <random>
#include <string>
#include <vector>

#include "path_builder_feed.h"
#include "path_fixtures.h"
#include "tests/curvemath/bezier_fit_strokes.h"
#include "tests/support/byte_blocks.h"

namespace {
struct Sample {
  ZvPoint2<float> point;
  double value;
};

// Takes one batch, checking that it pairs every sample with a value.
void Take(const ZvPoint2fArray& batch, const ZvDoubleArray& values, std::vector<Sample>& out) {
  EXPECT_EQ(batch.size, values.size);
  for (unsigned int k = 0; k < batch.size && k < values.size; ++k)
    out.push_back(Sample{batch[k], values[k]});
}

// Feeds a stroke with its pressures as a live pen would: the trailing samples after every
// point with `live`, and the end in one call or, with `twoStep`, as EndSubpath and then
// GetTrailingSamples, checking that every commit keeps what the path held. Returns every
// sample of the subpath with its value.
std::vector<Sample> Feed(ZvBasePathPropBuilder& builder, const ZvPoint2fArray& stroke,
                         const std::vector<double>& pressure, bool live, int close = 0,
                         bool twoStep = false) {
  std::vector<Sample> out;
  ZvDoubleArray values;
  const auto commit = [&](const char* when) {
    const std::vector<ZvPoint2<float>> before = PointsOf(*builder.GetPath());
    Take(builder.GetTrailingSamples(values), values, out);
    EXPECT_TRUE(PathKeepsPrefix(*builder.GetPath(), before)) << when;
  };
  for (unsigned int i = 0; i + 1 < stroke.size; ++i) {
    builder.AddInputPoint(stroke[i], pressure[i], 0);
    if (live) commit("live");
  }
  const unsigned int last = stroke.size - 1;
  if (twoStep) {
    builder.EndSubpath(stroke[last], pressure[last], close);
    commit("at the end");
  } else {
    const std::vector<ZvPoint2<float>> before = PointsOf(*builder.GetPath());
    Take(builder.EndSubpathAndGetTrailingSamples(stroke[last], pressure[last], values, close),
         values, out);
    EXPECT_TRUE(PathKeepsPrefix(*builder.GetPath(), before)) << "at the end";
  }
  return out;
}

std::unique_ptr<ZvBasePathPropBuilder> MakeBuilder(int kind, const ZvGC& gc, ZvPath2fProp1d* path) {
  if (kind == 0)
    return std::unique_ptr<ZvBasePathPropBuilder>(new ZvLinearPathPropBuilder(gc, path));
  return std::unique_ptr<ZvBasePathPropBuilder>(
      new ZvBezierFitPathPropBuilder(gc, path, 32.0, 2.0, 0.5, 3));
}

// The arc length the curve of a path of one subpath covers, checked against the path's own
// length (to 1%, the fit's curves measured finely flattened).
double CurveSpanningThePath(const ZvPath2fProp1d& path) {
  double end = 0.0;
  EXPECT_TRUE(path.HasPropCurve(0));
  EXPECT_TRUE(path.GetPropCurve(0).GetLargestKeyParameter(end));
  ZvPoint2fArray flat;
  ZvPointTagArray tags;
  path.AltFlatten(0.01, flat, tags);
  EXPECT_NEAR(end, ZvPoint2fArraySingleComponent_ComputeLength(flat), 0.01 * end);
  return end;
}

// The pressure the pen had at the stroke's point nearest to q, searched a few edges on from
// `edge` (the samples come in order along the stroke), interpolated along that edge.
double PressureNear(const ZvPoint2<float>& q, const ZvPoint2fArray& stroke,
                    const std::vector<double>& pressure, unsigned int& edge) {
  double value = 0.0;
  Nearest(q, stroke, edge, edge + 12, &pressure, &value, &edge);
  return value;
}
}  // namespace

TEST(PathPropBuilder, ValuesFollowThePressure) {
  std::mt19937 rng(21);
  ZvGC gc;
  for (int kind = 0; kind < 2; ++kind) {
    for (int live = 0; live < 2; ++live) {
      SCOPED_TRACE(::testing::Message() << "builder " << kind << ", live " << live);
      const ZvPoint2fArray stroke = PenStroke(rng, 150, 3.0, 0.1);
      std::vector<double> pressure;
      for (unsigned int k = 0; k < stroke.size; ++k)
        pressure.push_back(1.0 + 0.5 * std::sin(k / 12.0));
      ZvPath2fProp1d path(0);
      const std::unique_ptr<ZvBasePathPropBuilder> builder = MakeBuilder(kind, gc, &path);
      const std::vector<Sample> samples = Feed(*builder, stroke, pressure, live != 0);
      ASSERT_GT(samples.size(), 300u);
      // The first sample is the first point with the first pressure as it was given.
      EXPECT_EQ(samples[0].point.x, stroke[0].x);
      EXPECT_DOUBLE_EQ(samples[0].value, pressure[0]);
      // Each later one carries the pressure of the pen where it passed, to within the curve's
      // thinning tolerance and the smoothing of a stroke a few pixels off the raw one.
      unsigned int edge = 0;
      double worst = 0.0;
      for (const Sample& s : samples)
        worst = std::max(worst, std::fabs(s.value - PressureNear(s.point, stroke, pressure, edge)));
      EXPECT_LT(worst, gc.propertyTolerance + 0.03);
      EXPECT_GT(edge, stroke.size - 4) << "the samples reach the end of the stroke";
      // The finished curve spans the subpath's length and ends on the last pressure.
      const double end = CurveSpanningThePath(path);
      EXPECT_NEAR(path.EvalPropCurve(0, end), pressure.back(), gc.propertyTolerance);
    }
  }
}

TEST(PathPropBuilder, FittedStrokesReadTheCurveWhereTheSamplesAre) {
  // A pen shaking across a straight line: the input zigzags, much longer than the fitted path,
  // while the pressure rises with x. Read at the input's own arc lengths, the values would run
  // ahead of the samples.
  ZvPoint2fArray stroke;
  std::vector<double> pressure;
  for (int k = 0; k <= 50; ++k) {
    stroke.Add(4.0f * k, k % 2 ? 2.0f : -2.0f);
    pressure.push_back(1.0 + k / 50.0);
  }
  ZvGC gc;
  gc.propertyTolerance = 0.001;
  for (int live = 0; live < 2; ++live) {
    SCOPED_TRACE(::testing::Message() << "live " << live);
    ZvPath2fProp1d path(0);
    ZvBezierFitPathPropBuilder builder(gc, &path, 32.0, 2.0, 3.0, 3);
    const std::vector<Sample> samples = Feed(builder, stroke, pressure, live != 0);
    ASSERT_GT(samples.size(), 150u);
    double worst = 0.0;
    for (const Sample& s : samples)
      worst = std::max(worst, std::fabs(s.value - (1.0 + s.point.x / 200.0)));
    EXPECT_LT(worst, 0.05);
  }
}

TEST(PathPropBuilder, DensifiedPointsTakeThePressureBetweenPenEvents) {
  // Pen events 20 px apart, densified to 2 px for the fit: the pressure ramps between them
  // (1 up to 3 and down again), blunted only at the peak by the smoothing.
  ZvPoint2fArray stroke;
  stroke.Add(P(0, 0));
  stroke.Add(P(20, 0));
  stroke.Add(P(40, 0));
  const std::vector<double> pressure = {1.0, 3.0, 1.0};
  ZvGC gc;
  gc.propertyTolerance = 0.001;
  ZvPath2fProp1d path(0);
  ZvBezierFitPathPropBuilder builder(gc, &path, 32.0, 2.0, 0.5, 3);
  const std::vector<Sample> samples = Feed(builder, stroke, pressure, true);
  ASSERT_GE(samples.size(), 40u);
  for (const Sample& s : samples) {
    const double x = s.point.x, expected = x <= 20 ? 1.0 + x / 10.0 : 3.0 - (x - 20.0) / 10.0;
    EXPECT_NEAR(s.value, expected, std::fabs(x - 20.0) < 2.5 ? 0.15 : 0.01) << "at x " << x;
  }
}

TEST(PathPropBuilder, ClosedSubpathsCarryThePropertyBackToTheStart) {
  // Five sixths of a circle, pressure rising from 1 to 2, closed by the chord back (48 px).
  ZvPoint2fArray stroke;
  std::vector<double> pressure;
  for (int k = 0; k <= 50; ++k) {
    stroke.Add(100 + 40 * std::cos(k * 0.1), 100 + 40 * std::sin(k * 0.1));
    pressure.push_back(1.0 + k / 50.0);
  }
  const ZvPoint2<float> start = stroke[0], last = stroke[stroke.size - 1];
  ZvGC gc;
  for (int kind = 0; kind < 2; ++kind) {
    for (int twoStep = 0; twoStep < 2; ++twoStep) {
      SCOPED_TRACE(::testing::Message() << "builder " << kind << ", two steps " << twoStep);
      ZvPath2fProp1d path(0);
      const std::unique_ptr<ZvBasePathPropBuilder> builder = MakeBuilder(kind, gc, &path);
      const std::vector<Sample> samples = Feed(*builder, stroke, pressure, true, 1, twoStep != 0);
      EXPECT_TRUE(path.IsSubpathClosed(0));
      // The curve runs over the closing part too, back to the first value.
      const double end = CurveSpanningThePath(path);
      EXPECT_NEAR(path.EvalPropCurve(0, end), 1.0, 1e-9);
      // The closing part is sampled: from the sample nearest the last pen point on, the values
      // fall from (about) the last pressure to the first one, the samples reaching the start.
      // The last pen value is smoothed with the first one, which closing appends after it.
      size_t from = 0;
      for (size_t k = 0; k < samples.size(); ++k)
        if (std::hypot(samples[k].point.x - last.x, samples[k].point.y - last.y) <
            std::hypot(samples[from].point.x - last.x, samples[from].point.y - last.y))
          from = k;
      ASSERT_GT(samples.size() - from, 40u);
      EXPECT_GT(samples[from].value, 1.7);
      for (size_t k = from + 1; k < samples.size(); ++k)
        EXPECT_LE(samples[k].value, samples[k - 1].value + 1e-9) << "sample " << k;
      const Sample& final = samples.back();
      EXPECT_LE(std::hypot(final.point.x - start.x, final.point.y - start.y), gc.sampleSpacing);
      EXPECT_NEAR(final.value, 1.0, 0.05);
    }
  }
}

TEST(PathPropBuilder, SubpathsEndInTwoStepsOrAreResetAndStartAfresh) {
  ZvGC gc;
  for (int kind = 0; kind < 2; ++kind) {
    SCOPED_TRACE(::testing::Message() << "builder " << kind);
    ZvPath2fProp1d path(0);
    const std::unique_ptr<ZvBasePathPropBuilder> builder = MakeBuilder(kind, gc, &path);
    ZvDoubleArray values;
    for (int k = 0; k < 10; ++k)
      builder->AddInputPoint(P(5.0f * k, 0), 2.0, 0);
    builder->GetTrailingSamples(values);
    unsigned int committed = path.NumPoints();
    // EndSubpath only takes the point: the path waits for the next GetTrailingSamples.
    builder->EndSubpath(P(50, 10), 4.0, 0);
    EXPECT_EQ(path.NumPoints(), committed);
    const ZvPoint2fArray& last = builder->GetTrailingSamples(values);
    ASSERT_GT(last.size, 0u);
    EXPECT_EQ(last.size, values.size);
    EXPECT_EQ(last[last.size - 1].y, 10.0f);
    EXPECT_NEAR(values[values.size - 1], 4.0, 1e-9);
    EXPECT_EQ(builder->GetTrailingSamples(values).size, 0u);
    EXPECT_EQ(values.size, 0u);
    const double firstEnd = path.EvalPropCurve(0, 1e9);

    // The next point starts a subpath of its own. Reset drops what it did not commit; the path
    // keeps the rest.
    for (int k = 0; k < 6; ++k)
      builder->AddInputPoint(P(5.0f * k, 30), 9.0, 0);
    builder->GetTrailingSamples(values);
    committed = path.NumPoints();
    const ZvPoint2<float> end = path.GetCurrentPoint();
    for (int k = 6; k < 12; ++k)
      builder->AddInputPoint(P(5.0f * k, 33), 9.0, 0);
    builder->Reset();
    EXPECT_EQ(path.NumPoints(), committed);
    EXPECT_EQ(path.GetCurrentPoint().x, end.x);

    // A third stroke has nothing of the dropped input, and a curve of its own.
    std::vector<Sample> third;
    for (int k = 0; k < 5; ++k)
      builder->AddInputPoint(P(100, 20.0f + 5.0f * k), 7.0, 0);
    Take(builder->EndSubpathAndGetTrailingSamples(P(100, 45), 7.0, values, 0), values, third);
    EXPECT_EQ(path.NumSubpaths(), 3u);
    EXPECT_EQ(path.GetPoint(committed).x, 100.0f);
    EXPECT_EQ(path.GetPoint(committed).y, 20.0f);
    ASSERT_GT(third.size(), 20u);
    EXPECT_EQ(third[0].point.y, 20.0f);
    for (const Sample& s : third)
      EXPECT_DOUBLE_EQ(s.value, 7.0);
    EXPECT_EQ(path.EvalPropCurve(0, 1e9), firstEnd);
    EXPECT_DOUBLE_EQ(path.EvalPropCurve(path.NumPoints() - 1, 0.0), 7.0);
  }
}

TEST(PathPropCurveSteps, StretchesAreSmoothedAndExtended) {
  ZvPath2fProp1d path(0);
  path.Moveto(P(0, 0));
  for (int k = 1; k <= 5; ++k)
    path.Lineto(P(float(k), 0));
  const ZvPoint2fArray points = [] {
    ZvPoint2fArray a;
    for (int k = 0; k <= 5; ++k)
      a.Add(P(float(k), k == 5 ? 1.0f : 0.0f));
    return a;
  }();
  ZvDoubleArray lengths, properties;
  for (int k = 0; k <= 5; ++k)
    lengths.Add(k);
  for (double v : {0.0, 4.0, 0.0, 4.0, 0.0, 0.0})
    properties.Add(v);
  // Inner values mix their unsmoothed neighbours: 0 4 0 4 0 becomes 0 2 2 2 0.
  ASSERT_EQ(AddPropCurveStretch(points, lengths, properties, 0, 4, &path, 3, 0.0, 0), 1u);
  EXPECT_EQ(properties[1], 2.0);
  EXPECT_EQ(properties[2], 2.0);
  EXPECT_EQ(properties[3], 2.0);
  EXPECT_EQ(properties[4], 0.0);
  // (2, 2) and (3, 2) lie on one line: the last key moves instead of a new one.
  EXPECT_EQ(path.GetPropCurve(0).GetNumKeys(), 4u);
  EXPECT_DOUBLE_EQ(path.EvalPropCurve(0, 0.5), 1.0);
  EXPECT_DOUBLE_EQ(path.EvalPropCurve(0, 3.5), 1.0);
  // A further stretch continues the curve; closing adds the chord back to the first point
  // (from (5, 1): sqrt(26)) with the first value.
  properties[5] = 6.0;
  ASSERT_EQ(AddPropCurveStretch(points, lengths, properties, 4, 5, &path, 0, 0.0, 1), 1u);
  double end = 0.0;
  path.GetPropCurve(0).GetLargestKeyParameter(end);
  EXPECT_DOUBLE_EQ(end, 5.0 + std::sqrt(26.0));
  EXPECT_DOUBLE_EQ(path.EvalPropCurve(0, 5.0), 6.0);
  EXPECT_DOUBLE_EQ(path.EvalPropCurve(0, end), 0.0);
  EXPECT_EQ(AddPropCurveStretch(points, lengths, properties, 4, 6, &path, 0, 0.0, 0), 0u);
}

TEST(PathPropCurveSteps, FinalFitsAndSampleCounts) {
  ZvPath2fProp1d path(0);
  path.Moveto(P(0, 0));
  path.Lineto(P(10, 0));
  ZvDoubleArray lengths, properties;
  lengths.Add(0.0);
  properties.Add(3.0);
  // One entry: a constant piece; repeats of a length (forced points) are left out.
  ASSERT_EQ(FitPropCurve(lengths, properties, 0.1, &path, 1), 1u);
  EXPECT_DOUBLE_EQ(path.EvalPropCurve(0, 0.5), 3.0);
  lengths.Add(0.0);
  properties.Add(8.0);
  lengths.Add(10.0);
  properties.Add(5.0);
  ASSERT_EQ(FitPropCurve(lengths, properties, 0.1, &path, 0), 1u);
  EXPECT_DOUBLE_EQ(path.EvalPropCurve(0, 5.0), 4.0);
  properties.Add(1.0);
  EXPECT_EQ(FitPropCurve(lengths, properties, 0.1, &path, 0), 0u);
  EXPECT_DOUBLE_EQ(path.EvalPropCurve(0, 5.0), 4.0);

  // Samples at 1.5, 3.5, 5.5, ... (half a spacing carried in): the count decides, the grid
  // is cut short or the value at the end fills up.
  ZvDoubleArray values;
  values.Add(-1.0);
  EXPECT_EQ(SamplePropCurve(&path, 0, 0.0, 10.0, 2.0, 0.5, 0.01, 3, values), 3u);
  ASSERT_EQ(values.size, 4u);
  EXPECT_EQ(values[0], -1.0);
  EXPECT_DOUBLE_EQ(values[1], 3.3);
  EXPECT_DOUBLE_EQ(values[3], 4.1);
  values.Chop(0);
  EXPECT_EQ(SamplePropCurve(&path, 0, 9.0, 10.0, 2.0, 0.0, 0.01, 2, values), 2u);
  ASSERT_EQ(values.size, 2u);
  EXPECT_DOUBLE_EQ(values[1], 5.0);
  EXPECT_EQ(SamplePropCurve(&path, 0, 0.0, 10.0, 2.0, 0.0, 0.01, 0, values), 0u);
  EXPECT_EQ(values.size, 2u);
}

// The seed corpus of the fuzz target is written by the layout below (ZV_WRITE_FUZZ_SEEDS=1
// rewrites it): byte 0 builder and degree, three parameter bytes, then per point x, y in
// eighths of a pixel, pressure in sixty-fourths, and an action.
TEST(PathPropBuilder, FuzzSeedsAreTheWrittenStreams) {
  using Bytes = std::vector<unsigned char>;
  const auto stream = [](unsigned char head, int count, double radius, unsigned char endAction) {
    Bytes b = {head, 24, 64, 8};
    for (int k = 0; k < count; ++k) {
      const double a = k * 0.2;
      const int x = int(std::lround((100 + radius * std::cos(a)) * 8));
      const int y = int(std::lround((100 + radius * std::sin(a) + k) * 8));
      const unsigned char action = k + 1 == count ? endAction : (k % 4 == 3 ? 2 : 0);
      for (int v : {x & 255, x >> 8, y & 255, y >> 8, 32 + (k * 7) % 160, int(action)})
        b.push_back(static_cast<unsigned char>(v));
    }
    return b;
  };
  const struct {
    const char* name;
    Bytes bytes;
  } seeds[] = {{"linear_open", stream(0, 40, 30, 3)},
               {"fit_closed_two_steps", stream(1 | (2 << 1), 50, 40, 3 | 4 | 8)},
               {"fit_reset", stream(1 | (4 << 1), 30, 20, 0x33)}};
  for (const auto& seed : seeds)
    ExpectFuzzSeed("fuzz_path_prop_builder", seed.name, seed.bytes);
}
