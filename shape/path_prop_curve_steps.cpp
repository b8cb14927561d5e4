// The steps that build a subpath's property curve from input points with values: recording a
// stretch as it is committed, the final fit, and reading the curve at the samples.
#include <zv/path2f_prop1d.h>
#include <zv/path_prop_builder.h>
#include <zv/raw_fcurve.h>

#include "core/vec.h"
#include "shape/path_builder_steps.h"

unsigned int AddPropCurveStretch(const ZvPoint2fArray& points, const ZvDoubleArray& lengths,
                                 ZvDoubleArray& properties, unsigned int first, unsigned int last,
                                 ZvPath2fProp1d* path, unsigned int pathIndex, double tolerance,
                                 int close) {
  if (last < first || last >= points.size || last >= lengths.size || last >= properties.size)
    return 0;
  // Pressure jitters from one pen event to the next; the same kernel as the points' keeps the
  // values in step with the smoothed positions.
  zvSmoothRun<double>(properties, first, last, [](double, unsigned int) { return true; });
  unsigned int k = first + 1;
  if (first == 0 && !path->HasPropCurve(pathIndex)) {
    ZvRawFCurve curve(0.0, properties[0]);
    if (last != 0) curve.AppendLinearSegment(ZvPoint2<double>{lengths[1], properties[1]});
    path->SetPropCurve(pathIndex, curve);
    k = 2;
  }
  for (; k <= last; ++k)
    path->AppendOrExtendLinearSegment(pathIndex, lengths[k], properties[k], tolerance);
  if (close && !zvBuilderCoincide(points[last], points[0])) {
    const double chord = zvGuardedLength2(double(points[0].x) - points[last].x,
                                          double(points[0].y) - points[last].y);
    path->AppendLinearSegment(pathIndex, lengths[last] + chord, properties[0]);
  }
  return 1;
}

unsigned int FitPropCurve(const ZvDoubleArray& lengths, const ZvDoubleArray& properties,
                          double tolerance, ZvPath2fProp1d* path, unsigned int pathIndex) {
  if (lengths.size == 0 || lengths.size != properties.size) return 0;
  // Forced repeats of a point measure no length; a curve cannot hold two values at one
  // parameter, so the first of them stays.
  ZvPoint2dArray pairs(lengths.size);
  pairs.Add(lengths[0], properties[0]);
  for (unsigned int k = 1; k < lengths.size; ++k)
    if (lengths[k] > pairs[pairs.size - 1].x) pairs.Add(lengths[k], properties[k]);
  if (pairs.size >= 3) {
    path->SetPropCurve(pathIndex, ZvRawFCurve(pairs, tolerance));
    return 1;
  }
  const ZvPoint2<double> end = pairs.size == 1 ? ZvPoint2<double>{1.0, pairs[0].y} : pairs[1];
  ZvRawFCurve curve(0.0, pairs[0].y);
  curve.AppendLinearSegment(end);
  path->SetPropCurve(pathIndex, curve);
  return 1;
}

unsigned int SamplePropCurve(ZvPath2fProp1d* path, unsigned int pathIndex, double from, double to,
                             double spacing, double residual, double tolerance, unsigned int count,
                             ZvDoubleArray& values) {
  if (count == 0) return 0;
  const unsigned int start = values.size;
  if (to - from + residual >= spacing) {
    ZvDoubleArray parameters, grid;
    if (path->GetPropCurve(pathIndex).EvalSequence(from + spacing - residual, to, spacing,
                                                   tolerance, parameters, grid, 0)) {
      for (unsigned int k = 0; k < grid.size && values.size - start < count; ++k)
        values.Add(grid[k]);
    }
  }
  // A sample at the very end (the last one of a finished subpath) lies off the grid.
  const double end = path->EvalPropCurve(pathIndex, to);
  while (values.size - start < count)
    values.Add(end);
  return count;
}
