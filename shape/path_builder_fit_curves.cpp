// The three ways the fitting builder turns a run of input points into segments: a least-squares
// fit that splits where it fails, the points as a control polygon, and a cubic per edge.
#include <zv/path2f.h>

#include <algorithm>
#include <cmath>

#include "core/vec.h"
#include "shape/path_builder_steps.h"

namespace {
ZvPoint2<double> Widen(const ZvPoint2<float>& v) {
  return ZvPoint2<double>{v.x, v.y};
}
ZvPoint2<float> Narrow(const ZvPoint2<double>& v) {
  return ZvPoint2<float>{static_cast<float>(v.x), static_cast<float>(v.y)};
}

// Both axis differences of the edge k-1..k below e: the end is too dense to say its direction.
bool IsShortEdge(const ZvPoint2fArray& p, unsigned int k, double e) {
  return std::fabs(double(p[k].x) - p[k - 1].x) < e && std::fabs(double(p[k].y) - p[k - 1].y) < e;
}

// The direction the run starts in: its own at a corner or at the subpath's start, otherwise
// the direction the path already ends in, so that the joint is smooth.
ZvPoint2<double> StartTangent(const ZvPoint2fArray& points, unsigned int first, int startCorner,
                              const ZvPath2f* path) {
  if (startCorner || first == 0) return Widen(EstimateTangentDirection(points, first, 1, 0, 0));
  return GetTangentDirectionOnPath(points, path, 1);
}

// The end direction of a run that stops at a corner or at the last input point looks back only.
ZvPoint2<float> EndTangent(const ZvPoint2fArray& points, unsigned int last, int endCorner) {
  const int oneSided = endCorner || last + 1 == points.size;
  return EstimateTangentDirection(points, last, 0, oneSided, 0);
}

// Either half of a failed fit: a fit again when long enough, else one of the direct forms. The
// right half decides between the direct forms by the left half's length, as the left one does.
void FitHalf(const ZvPoint2fArray& points, const ZvDoubleArray& lengths, double e,
             unsigned int degree, unsigned int first, int startCorner, unsigned int last,
             int endCorner, int close, unsigned int left, ZvBezierTool& tool, ZvPath2f* path) {
  if (last - first >= degree)
    FitBezierCurve(points, lengths, e, degree, first, startCorner, last, endCorner, close, tool,
                   path);
  else if (left < 2)
    CubicInterpolation(points, lengths, e, first, startCorner, last, endCorner, close, path);
  else
    FindBezierCurve(points, degree, first, startCorner, last, endCorner, close, path);
}
}  // namespace

void FitBezierCurve(const ZvPoint2fArray& points, const ZvDoubleArray& lengths, double e,
                    unsigned int degree, unsigned int first, int startCorner, unsigned int last,
                    int endCorner, int close, ZvBezierTool& tool, ZvPath2f* path) {
  ZvPoint2<float> control[9];
  unsigned int split = 0;
  int fitted;
  if (!close) {
    const ZvPoint2<double> t0 = StartTangent(points, first, startCorner, path);
    if (last >= 2 && IsShortEdge(points, last, e) && IsShortEdge(points, last - 1, e)) {
      fitted = tool.SingleCurveFitG1C0(points, lengths, first, last, t0, e, degree, control, split);
    } else {
      const ZvPoint2<double> t1 = Widen(EndTangent(points, last, endCorner));
      fitted =
          tool.SingleCurveFitG1G1(points, lengths, first, last, t0, t1, e, degree, control, split);
    }
  } else if (first != 0) {
    // Closing: the end meets the subpath's start, whose direction the path holds.
    if (!startCorner && !endCorner)
      fitted = tool.SingleCurveFitG1G1(
          points, lengths, first, last, GetTangentDirectionOnPath(points, path, 1),
          GetTangentDirectionOnPath(points, path, 0), e, degree, control, split);
    else if (startCorner && !endCorner)
      fitted = tool.SingleCurveFitC0G1(points, lengths, first, last,
                                       GetTangentDirectionOnPath(points, path, 0), e, degree,
                                       control, split);
    else if (!startCorner)
      fitted = tool.SingleCurveFitG1C0(points, lengths, first, last,
                                       GetTangentDirectionOnPath(points, path, 1), e, degree,
                                       control, split);
    else
      fitted = tool.SingleCurveFitC0C0(points, lengths, first, last, e, degree, control, split);
  } else if (!startCorner && !endCorner) {
    // One curve closing on itself: one direction at both ends.
    const ZvPoint2<double> t = GetTangentDirectionOnPath(points, path, 1);
    fitted = tool.SingleCurveFitG1G1(points, lengths, first, last, t, t, e, degree, control, split);
  } else {
    fitted = tool.SingleCurveFitC0C0(points, lengths, first, last, e, degree, control, split);
  }
  if (fitted) {
    path->AltCurveto(control + 1, degree);
    if (close) path->Closeto();
    return;
  }
  const unsigned int mid = (first + last) / 2, left = mid - first;
  FitHalf(points, lengths, e, degree, first, startCorner, mid, 0, 0, left, tool, path);
  FitHalf(points, lengths, e, degree, mid, 0, last, endCorner, close, left, tool, path);
}

void FindBezierCurve(const ZvPoint2fArray& points, unsigned int degree, unsigned int first,
                     int startCorner, unsigned int last, int endCorner, int close, ZvPath2f* path) {
  if (first == last) return;
  const unsigned int d = last - first + 1;
  const ZvPoint2<float> t0 = Narrow(StartTangent(points, first, startCorner, path));
  const ZvPoint2<float>&p0 = points[first], &pn = points[last];
  const float h = static_cast<float>(zvGuardedLength2(double(pn.x) - p0.x, double(pn.y) - p0.y)) /
                  static_cast<float>(d);
  ZvPoint2<float> control[10];
  control[0] = p0;
  control[1] = p0 + t0 * h;
  for (unsigned int k = 2; k < d; ++k)
    control[k] = points[first + k - 1];
  unsigned int degreeOut = d;
  if (close) {
    // The end handle turns into the subpath's start. At an end corner the direction is taken
    // at the run's first point.
    const ZvPoint2<float> t1 = endCorner ? EstimateTangentDirection(points, first, 0, 1, 0)
                                         : Narrow(GetTangentDirectionOnPath(points, path, 0));
    if (d + 1 <= degree) degreeOut = d + 1;
    control[degreeOut - 1] = pn - t1 * h;
  }
  control[degreeOut] = pn;
  path->AltCurveto(control + 1, degreeOut);
  if (close) path->Closeto();
}

void CubicInterpolation(const ZvPoint2fArray& points, const ZvDoubleArray& lengths, double e,
                        unsigned int first, int startCorner, unsigned int last, int endCorner,
                        int close, ZvPath2f* path) {
  if (first == last) return;
  // Handles of a third of the edge, shortened where a tangent strays more than 8e from the
  // chord, so that the curve bulges no further than about e from it.
  const auto draw = [&](unsigned int j, const ZvPoint2<float>& t0, const ZvPoint2<float>& t1) {
    const ZvPoint2<float> c = points[j + 1] - points[j];
    const float u = std::fabs(ZvCross(t0, c)), v = std::fabs(ZvCross(t1, c));
    const double r =
        u > 8.0 * e || v > 8.0 * e ? (2.6666666666666665 * e) / std::max(u, v) : 0.3333333333333333;
    const float h = static_cast<float>((lengths[j + 1] - lengths[j]) * r);
    path->Curveto(points[j] + t0 * h, points[j + 1] - t1 * h, points[j + 1]);
  };
  ZvPoint2<float> t = Narrow(StartTangent(points, first, startCorner, path));
  unsigned int j = first;
  for (; j + 1 < last; ++j) {
    const ZvPoint2<float> next = zvSafeNormalize(points[j + 2] - points[j]);
    draw(j, t, next);
    t = next;
  }
  const ZvPoint2<float> end = !close || endCorner
                                  ? EndTangent(points, last, endCorner)
                                  : Narrow(GetTangentDirectionOnPath(points, path, 0));
  draw(j, t, end);
  if (close) path->Closeto();
}
