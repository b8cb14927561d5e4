// The single-segment fits of ZvBezierTool, used by builders that pick their own split points.
//
// Each flattens its candidate at half the tolerance (finer than OpenFit does) before comparing
// it with the samples at the full tolerance, so that the flattening itself eats little of the
// error budget.
#include <zv/bezier_fit.h>
#include <zv/bezier_tool.h>
#include <zv/polyline.h>

#include "curvemath/bezier_fit_solve.h"

namespace {

enum EndCondition { C0, G1 };

// Sets up the controls for the end conditions; false when the degree cannot hold them.
template <class Array>
bool SetUp(const Array& points, const ZvDoubleArray& chords, unsigned int first, unsigned int last,
           unsigned int d, EndCondition start, const ZvPoint2<double>& t0, EndCondition end,
           const ZvPoint2<double>& t1, ZvFitControl* ctl) {
  const unsigned int g1 = (start == G1) + (end == G1);
  if (d > 8 || d < 1 + g1 || (d == 2 && g1 == 2)) return false;
  if (first >= last || last >= points.size || last >= chords.size) return false;
  const ZvPoint2<double> p0{points[first].x, points[first].y};
  const ZvPoint2<double> pn{points[last].x, points[last].y};
  for (unsigned int j = 0; j <= d; ++j)
    ctl[j] = ZvFitControl{ZvFitControl::Free, {0.0, 0.0}, {0.0, 0.0}};
  if (start == G1) ctl[1] = ZvFitControl{ZvFitControl::Along, p0, t0};
  if (end == G1) ctl[d - 1] = ZvFitControl{ZvFitControl::Along, pn, t1};
  ctl[0] = ZvFitControl{ZvFitControl::Fixed, p0, {0.0, 0.0}};
  ctl[d] = ZvFitControl{ZvFitControl::Fixed, pn, {0.0, 0.0}};
  return true;
}

int FitOne(ZvBezierTool& tool, const ZvPoint2fArray& points, const ZvDoubleArray& chords,
           unsigned int first, unsigned int last, EndCondition start, const ZvPoint2<double>& t0,
           EndCondition end, const ZvPoint2<double>& t1, double tolerance, unsigned int d,
           ZvPoint2<float>* control, unsigned int& splitIndex) {
  ZvFitControl ctl[9];
  if (!control || !SetUp(points, chords, first, last, d, start, t0, end, t1, ctl)) return 0;
  ZvPoint2<double> solved[9];
  double handle[9];
  if (!zvFitBezier(points, chords, first, last, d, ctl, solved, handle)) return 0;
  for (unsigned int j = 0; j <= d; ++j)
    control[j] = ZvPoint2<float>{static_cast<float>(solved[j].x), static_cast<float>(solved[j].y)};
  ZvPoint2fArray flat(128);
  ZvDoubleArray flatChords(128);
  tool.Flatten(control, 0, d, 0.5 * tolerance, &flat, 0);
  ZvPoint2fArray_ComputeChordLength(flat, 0, flat.size - 1, flatChords);
  return ZvPoint2fArray_PolylinesAreClose(flat, flatChords, 0, flat.size - 1, points, chords, first,
                                          last, tolerance, splitIndex);
}

const ZvPoint2<double> kNoTangent{0.0, 0.0};

}  // namespace

int ZvBezierTool::SingleCurveFitC0C0(const ZvPoint2fArray& points, const ZvDoubleArray& chords,
                                     unsigned int first, unsigned int last, double tol,
                                     unsigned int d, ZvPoint2<float>* control,
                                     unsigned int& splitIndex) {
  return FitOne(*this, points, chords, first, last, C0, kNoTangent, C0, kNoTangent, tol, d, control,
                splitIndex);
}

int ZvBezierTool::SingleCurveFitG1C0(const ZvPoint2fArray& points, const ZvDoubleArray& chords,
                                     unsigned int first, unsigned int last,
                                     const ZvPoint2<double>& startTangent, double tol,
                                     unsigned int d, ZvPoint2<float>* control,
                                     unsigned int& splitIndex) {
  return FitOne(*this, points, chords, first, last, G1, startTangent, C0, kNoTangent, tol, d,
                control, splitIndex);
}

int ZvBezierTool::SingleCurveFitC0G1(const ZvPoint2fArray& points, const ZvDoubleArray& chords,
                                     unsigned int first, unsigned int last,
                                     const ZvPoint2<double>& endTangent, double tol, unsigned int d,
                                     ZvPoint2<float>* control, unsigned int& splitIndex) {
  return FitOne(*this, points, chords, first, last, C0, kNoTangent, G1, endTangent, tol, d, control,
                splitIndex);
}

int ZvBezierTool::SingleCurveFitG1G1(const ZvPoint2fArray& points, const ZvDoubleArray& chords,
                                     unsigned int first, unsigned int last,
                                     const ZvPoint2<double>& startTangent,
                                     const ZvPoint2<double>& endTangent, double tol, unsigned int d,
                                     ZvPoint2<float>* control, unsigned int& splitIndex) {
  return FitOne(*this, points, chords, first, last, G1, startTangent, G1, endTangent, tol, d,
                control, splitIndex);
}

int ZvBezierTool::SingleCubicFitG1C0(const ZvPoint2dArray& points, const ZvDoubleArray& chords,
                                     unsigned int first, unsigned int last,
                                     const ZvPoint2<double>& startTangent, double tol,
                                     ZvPoint2<double>* control, unsigned int& splitIndex) {
  ZvFitControl ctl[4];
  if (!control || !SetUp(points, chords, first, last, 3, G1, startTangent, C0, kNoTangent, ctl))
    return 0;
  ZvPoint2<double> solved[4];
  double handle[4];
  if (!zvFitBezier(points, chords, first, last, 3, ctl, solved, handle)) return 0;
  for (unsigned int j = 0; j < 4; ++j)
    control[j] = solved[j];
  ZvPoint2dArray flat(128);
  ZvDoubleArray flatChords(128);
  ZvBezierTool_FlattenCubic2d(control, 0.5 * tol, &flat, 0);
  ZvPoint2dArray_ComputeChordLength(flat, 0, flat.size - 1, flatChords);
  return ZvPoint2dArray_PolylinesAreClose(flat, flatChords, 0, flat.size - 1, points, chords, first,
                                          last, tol, splitIndex);
}
