// Polylines of property paths with their values, and the edits that keep curves on their
// subpaths.
#include <gtest/gtest.h>
#include <zv/gc.h>
#include <zv/path2f_prop1d.h>

#include <random>

#include "path_fixtures.h"
#include "path_prop_fixtures.h"

namespace {

struct Polyline {
  ZvPoint2fArray points;
  ZvPointTagArray tags;
  ZvDoubleArray values;
};

// A polyline along the x axis through the given x coordinates.
ZvPath2fProp1d AlongX(std::initializer_list<float> xs) {
  ZvPath2fProp1d path;
  bool first = true;
  for (float x : xs) {
    if (first)
      path.Moveto(P(x, 0));
    else
      path.Lineto(P(x, 0));
    first = false;
  }
  return path;
}

}  // namespace

TEST(PathPropSample, FlattenPutsAVertexOnEachBreakpoint) {
  // Breakpoints at 4 of 8 curve units land at 5 of the path's 10: the curve is stretched.
  ZvPath2fProp1d path = AlongX({0, 2, 10});
  ZvPoint2dArray keys;
  for (double k : {0.0, 4.0, 8.0})
    keys.Add(ZvPoint2<double>{k, k == 4.0 ? 3.0 : 1.0});
  path.SetPropCurve(0, keys, 1e-9);
  path.Moveto(P(0, 5));
  path.Lineto(P(3, 5));  // no curve: values 0, not the default property
  ZvGC gc;
  Polyline out;
  ASSERT_EQ(6u, path.Flatten(gc, out.points, out.tags, out.values));
  ASSERT_EQ(6u, out.values.size);
  const float xs[] = {0, 2, 5, 10, 0, 3};
  const double values[] = {1.0, 1.8, 3.0, 1.0, 0.0, 0.0};
  const int tags[] = {0, 1, 1, 2, 0, 2};
  for (int i = 0; i < 6; ++i) {
    EXPECT_FLOAT_EQ(xs[i], out.points[i].x) << i;
    EXPECT_NEAR(values[i], out.values[i], 1e-12) << i;
    EXPECT_EQ(tags[i], out.tags[i]) << i;
  }

  // A breakpoint within the merge distance of the vertex before it gets none of its own.
  ZvPath2fProp1d near = AlongX({0, 4.8f, 10});
  near.SetPropCurve(0, keys, 1e-9);
  Polyline merged;
  near.Flatten(gc, merged.points, merged.tags, merged.values);
  EXPECT_EQ(3u, merged.points.size);

  // Shorter than the merge distance: its two ends.
  ZvPath2fProp1d tiny = AlongX({0, 0.1f, 0.2f});
  tiny.SetPropCurve(0, keys, 1e-9);
  Polyline ends;
  EXPECT_EQ(2u, tiny.Flatten(gc, ends.points, ends.tags, ends.values));
  EXPECT_DOUBLE_EQ(1.0, ends.values[1]);
}

TEST(PathPropSample, EvenSamplesSpreadTheCurveOverTheirCount) {
  ZvPath2fProp1d path = AlongX({0, 10});
  path.SetPropCurve(0, ZvRawFCurve(0.0, 0.0, 5.0, 10.0));
  path.Moveto(P(0, 5));
  path.Lineto(P(4, 5));
  ZvGC gc;
  gc.sampleSpacing = 2.0;
  gc.defaultProperty = 0.25;
  Polyline out, plain;
  const unsigned int n = path.Sample(gc, out.points, out.tags, out.values);
  path.ZvPath2f::Sample(gc, plain.points, plain.tags);
  ASSERT_EQ(plain.points.size, n);
  ASSERT_EQ(n, out.values.size);
  // The first subpath's k samples take the curve at k even steps over its 5 units.
  unsigned int k = 0;
  while (out.tags[k] != ZvPointTag_Last)
    ++k;
  ++k;
  for (unsigned int i = 0; i < k; ++i)
    EXPECT_NEAR(10.0 * i / (k - 1), out.values[i], 1e-9) << i;
  for (unsigned int i = k; i < n; ++i)
    EXPECT_EQ(0.25, out.values[i]);
}

TEST(PathPropSample, PropertySamplesAreSpacedByTheValue) {
  ZvGC gc;
  gc.sampleSpacing = 4.0;
  gc.pointMergeDistance = 0.5;
  ZvPath2fProp1d path = AlongX({0, 10});
  path.SetPropCurve(0, ZvRawFCurve(0.0, 0.5, 10.0, 0.5));  // steps of 2
  Polyline out;
  ASSERT_EQ(5u, path.PropertySample(gc, out.points, out.tags, out.values));
  for (unsigned int i = 0; i < 5; ++i) {
    EXPECT_FLOAT_EQ(2.0f * i, out.points[i].x);
    EXPECT_EQ(0.5, out.values[i]);
  }
  EXPECT_EQ(ZvPointTag_First, out.tags[0]);
  EXPECT_EQ(ZvPointTag_Last, out.tags[4]);

  // A value of 0 steps by the merge distance, a large one by the spacing: the walk ends.
  path.SetPropCurve(0, ZvRawFCurve(0.0, 0.0, 10.0, 0.0));
  Polyline zero;
  EXPECT_EQ(20u, path.PropertySample(gc, zero.points, zero.tags, zero.values));
  path.SetPropCurve(0, ZvRawFCurve(0.0, 9.0, 10.0, 9.0));
  Polyline big;
  EXPECT_EQ(3u, path.PropertySample(gc, big.points, big.tags, big.values));

  // Points and values stay paired on every subpath, closed ones included, with or without a
  // curve; the extent filter keeps each kept point's value.
  std::mt19937 rng(5);
  for (int round = 0; round < 50; ++round) {
    const ZvPath2fProp1d random = RandomPropPath(rng);
    Polyline all;
    random.PropertySample(gc, all.points, all.tags, all.values);
    ASSERT_EQ(all.points.size, all.values.size);
    ASSERT_EQ(all.points.size, all.tags.size);
    Polyline kept;
    const ZvExtent2<float> half(0, -50, 50, 50);
    random.IntersectPropertySamplePointsExtent(gc, half, kept.points, kept.tags, kept.values, 1);
    unsigned int j = 0;
    for (unsigned int i = 0; i < all.points.size; ++i) {
      if (all.points[i].x < 0) continue;
      ASSERT_LT(j, kept.points.size);
      EXPECT_EQ(all.values[i], kept.values[j]);
      ++j;
    }
    EXPECT_EQ(j, kept.points.size);
    Polyline even;
    random.IntersectSamplePointsExtent(gc, half, even.points, even.tags, even.values, 1);
    EXPECT_EQ(even.points.size, even.values.size);
  }
}

TEST(PathPropSample, FittedCopiesCarryTheirCurves) {
  ZvGC gc;
  ZvPath2fProp1d source = TwoLinesWithCurves();
  source.SetPropCurve(0, ZvRawFCurve(0.0, 1.0));
  ZvPath2fProp1d copy = AlongX({-5, -1});
  const unsigned int added = copy.AddFittedSamplesFromPath(gc, source);
  EXPECT_EQ(copy.NumPoints() - 2, added);
  ASSERT_EQ(3u, copy.NumSubpaths());
  ZvPath2fIter it(copy);
  unsigned int first = 0, last = 0;
  it.GetNextSubPathIndices(first, last);
  EXPECT_EQ(0, copy.HasPropCurve(first));
  it.GetNextSubPathIndices(first, last);
  EXPECT_DOUBLE_EQ(1.0, copy.EvalPropCurve(first, 3.0));
  it.GetNextSubPathIndices(first, last);
  EXPECT_DOUBLE_EQ(0.5, copy.EvalPropCurve(first, 10.0));
}

TEST(PathPropEdit, RandomEditsKeepEachCurveOnItsSubpath) {
  // Each subpath's curve is told apart by its value; edits inside one subpath must leave the
  // sequence of values as it was, removing a subpath must drop exactly its value, and a split
  // must repeat it.
  std::mt19937 rng(11);
  int succeeded[6] = {};
  for (int round = 0; round < 600; ++round) {
    ZvPath2fProp1d path = RandomPropPath(rng);
    ZvPath2fIter it(path);
    unsigned int first = 0, last = 0;
    double tag = 1.0;
    while (it.GetNextSubPathIndices(first, last))
      if (rng() % 3) path.SetPropCurve(first, ZvRawFCurve(0.0, tag++));
    std::vector<double> before = StartValues(path);
    const unsigned int n = path.NumPoints();
    const unsigned int index = static_cast<unsigned int>(rng() % n);
    unsigned int ordinal = 0;
    for (ZvPath2fIter walk(path); walk.GetNextSubPathIndices(first, last) && last < index;)
      ++ordinal;
    path.GetSubpathIndices(index, first, last);
    unsigned int a = 0, b = 0;  // the segment holding `index`
    path.GetSegmentIndices(index, a, b);
    const ZvPoint2<float> ends[] = {path.GetPoint(a), path.GetPoint(b)};
    const ZvPoint2<float> bend[] = {ends[0], P(ends[0].x + 1, ends[1].y - 2), ends[1]};
    ZvPath2f source;
    source.Moveto(ends[0]);
    source.Lineto(bend[1]);
    source.Lineto(ends[1]);
    const unsigned int op = rng() % 6;
    int done = 0;
    switch (op) {
      case 0:
        done = path.RemoveSubpath(index);
        if (done) before.erase(before.begin() + ordinal);
        break;
      case 1:
        done = path.CloseSubpath(index);
        break;
      case 2:
        done = path.ReplaceSubpathSection(first, last);
        break;
      case 3:
        done = a < b && path.ReplaceSegment(b, bend, 2);
        break;
      case 4:
        done = a < b && path.ReplaceSubpathSection(a, b, source, 0, 2);
        break;
      default: {
        a = first + static_cast<unsigned int>(rng() % (last - first + 1));
        b = a + static_cast<unsigned int>(rng() % (last - a + 1));
        done = path.RemoveSubpathSection(a, b);
        // A cut that keeps points on both sides splits the subpath: both halves keep its curve.
        if (done && first < a && b < last) before.insert(before.begin() + ordinal, before[ordinal]);
        break;
      }
    }
    succeeded[op] += done ? 1 : 0;
    ASSERT_TRUE(PropRecordsHold(path)) << round;
    ASSERT_TRUE(PathInvariantHolds(path)) << round;
    EXPECT_EQ(before, StartValues(path)) << round;
  }
  for (int count : succeeded)
    EXPECT_GT(count, 10);
}
