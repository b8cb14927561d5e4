// OpenFit and ClosedFit: polylines to chains of Bezier segments, cut at corners and refined by
// halving at the middle vertex.
#include <zv/bezier_fit.h>
#include <zv/path2f.h>
#include <zv/polyline.h>

#include <cmath>

#include "curvemath/bezier_fit_solve.h"

namespace {

// Unit vector, or the vector itself when it is within 1e-9 of zero on both axes.
ZvPoint2<double> Unit(const ZvPoint2<double>& v) {
  if (std::fabs(v.x) <= 1e-9 && std::fabs(v.y) <= 1e-9) return v;
  return v / std::sqrt(ZvDot(v, v));
}

ZvPoint2<double> Widen(const ZvPoint2<float>& p) {
  return ZvPoint2<double>{p.x, p.y};
}

ZvPoint2<float> Narrow(const ZvPoint2<double>& p) {
  return ZvPoint2<float>{static_cast<float>(p.x), static_cast<float>(p.y)};
}

}  // namespace

void ZvBezierTool::ClearFitContext() {
  fitPoints = nullptr;
  fitChords = nullptr;
  fitPath = nullptr;
}

ZvPoint2<double> ZvBezierTool::UnitTangentVectorFirst(unsigned int i) const {
  if (!fitPoints || i + 1 >= fitPoints->size) return ZvPoint2<double>{0.0, 0.0};
  return Unit(Widen((*fitPoints)[i + 1]) - Widen((*fitPoints)[i]));
}

ZvPoint2<double> ZvBezierTool::UnitTangentVectorLast(unsigned int i) const {
  if (!fitPoints || i == 0 || i >= fitPoints->size) return ZvPoint2<double>{0.0, 0.0};
  return Unit(Widen((*fitPoints)[i - 1]) - Widen((*fitPoints)[i]));
}

ZvPoint2<double> ZvBezierTool::UnitTangentVectorCenter(unsigned int i) const {
  if (!fitPoints || i == 0 || i + 1 >= fitPoints->size) return ZvPoint2<double>{0.0, 0.0};
  return Unit(Widen((*fitPoints)[i + 1]) - Widen((*fitPoints)[i - 1]));
}

void ZvBezierTool::OpenFit2DPrivate(unsigned int first, const ZvPoint2<double>& t0,
                                    unsigned int last, const ZvPoint2<double>& t1, unsigned int d) {
  const ZvPoint2fArray& q = *fitPoints;
  const unsigned int n = last - first;
  // Too few samples to pin the inner control points of a high degree: a cubic will do.
  if (n + 1 < d + 3) d = 3;
  if (n == 1) {
    fitPath->Lineto(q[last]);
    ++fitCount;
    return;
  }
  if (n == 2) {
    fitPath->Curveto(q[first + 1], q[first + 1], q[last]);
    ++fitCount;
    return;
  }

  ZvFitControl ctl[9];
  for (unsigned int j = 0; j <= d; ++j)
    ctl[j] = ZvFitControl{ZvFitControl::Free, {0.0, 0.0}, {0.0, 0.0}};
  ctl[0] = ZvFitControl{ZvFitControl::Fixed, Widen(q[first]), {0.0, 0.0}};
  ctl[1] = ZvFitControl{ZvFitControl::Along, Widen(q[first]), t0};
  ctl[d - 1] = ZvFitControl{ZvFitControl::Along, Widen(q[last]), t1};
  ctl[d] = ZvFitControl{ZvFitControl::Fixed, Widen(q[last]), {0.0, 0.0}};
  ZvPoint2<double> solved[9];
  double handle[9] = {};
  // The start handle must point along t0 and the end handle back against t1: a fit that folds
  // a handle over is no fit, whatever its error.
  if (zvFitBezier(q, *fitChords, first, last, d, ctl, solved, handle) && handle[1] > 0.0 &&
      handle[d - 1] < 0.0) {
    ZvPoint2<float> control[9];
    for (unsigned int j = 0; j <= d; ++j)
      control[j] = Narrow(solved[j]);
    control[0] = q[first];
    control[d] = q[last];
    ZvPoint2fArray flat(128);
    ZvDoubleArray flatChords(128);
    Flatten(control, 0, d, fitTolerance, &flat, 0);
    ZvPoint2fArray_ComputeChordLength(flat, 0, flat.size - 1, flatChords);
    unsigned int where = 0;
    if (ZvPoint2fArray_PolylinesAreClose(flat, flatChords, 0, flat.size - 1, q, *fitChords, first,
                                         last, fitTolerance, where)) {
      fitPath->AltCurveto(control + 1, d);
      ++fitCount;
      return;
    }
  }
  // Halve at the middle vertex; both halves take the direction across it, so they meet G1.
  const unsigned int m = (first + last) / 2;
  const ZvPoint2<double> tm = UnitTangentVectorCenter(m);
  OpenFit2DPrivate(first, t0, m, tm, d);
  OpenFit2DPrivate(m, tm, last, t1, d);
}

unsigned int ZvBezierTool::Fit(const ZvPoint2fArray& input, double cornerCos2, unsigned int d,
                               double tol, int skipCleanup, ZvPath2f* path, int continuing,
                               int closed) {
  if (!path || d < 3 || d > 8 || !(tol > 0.0)) return 0;
  // Repeated points give edges of no direction; the fit needs none of them.
  ZvPoint2fArray cleaned(skipCleanup ? 1 : input.size);
  if (!skipCleanup) {
    for (unsigned int i = 0; i < input.size; ++i) {
      if (cleaned.size > 0) {
        const ZvPoint2<float>& prev = cleaned[cleaned.size - 1];
        const float dx = input[i].x - prev.x, dy = input[i].y - prev.y;
        if (std::fabs(dx) <= 1e-15f && std::fabs(dy) <= 1e-15f) continue;
      }
      cleaned.Add(input[i]);
    }
  }
  const ZvPoint2fArray& q = skipCleanup ? input : cleaned;
  const unsigned int n = q.size;
  if (n == 0) return 0;
  if (closed && n <= 2) {
    path->Moveto(q[0]);
    if (n == 2) {
      path->Lineto(q[1]);
      path->Lineto(q[0]);
    }
    path->Closeto();
    return n;
  }
  if (n <= 2) {
    if (n == 1 && continuing) return 0;
    if (!continuing) path->Moveto(q[0]);
    if (n == 2) path->Lineto(q[1]);
    return 1;
  }

  ZvDoubleArray chords(n);
  ZvPoint2fArray_ComputeChordLength(q, 0, n - 1, chords);
  struct ContextGuard {
    ZvBezierTool* tool;
    ~ContextGuard() { tool->ClearFitContext(); }
  } guard{this};
  fitTolerance = tol;
  fitTolerance2 = tol * tol;
  fitPoints = &q;
  fitChords = &chords;
  fitPath = path;
  fitCount = 0;
  if (closed || !continuing) path->Moveto(q[0]);

  // A corner turns back by more than a right angle (negative cosine) with a squared cosine
  // above cornerCos2; a right angle itself never is one.
  unsigned int start = 0;
  for (unsigned int i = 1; i + 1 < n; ++i) {
    const ZvPoint2<double> u = Widen(q[i]) - Widen(q[i - 1]);
    const ZvPoint2<double> w = Widen(q[i + 1]) - Widen(q[i]);
    const double c = ZvDot(u, w);
    if (c < 0.0 && c * c > ZvDot(u, u) * ZvDot(w, w) * cornerCos2) {
      OpenFit2DPrivate(start, UnitTangentVectorFirst(start), i, -UnitTangentVectorLast(i), d);
      start = i;
    }
  }
  OpenFit2DPrivate(start, UnitTangentVectorFirst(start), n - 1, -UnitTangentVectorLast(n - 1), d);
  if (closed) path->Closeto();
  return fitCount;
}

unsigned int ZvBezierTool::OpenFit(const ZvPoint2fArray& points, double cornerCos2, unsigned int d,
                                   double tol, int skipCleanup, ZvPath2f* path, int continuing) {
  return Fit(points, cornerCos2, d, tol, skipCleanup, path, continuing, 0);
}

unsigned int ZvBezierTool::ClosedFit(const ZvPoint2fArray& points, double cornerCos2,
                                     unsigned int d, double tol, int skipCleanup, ZvPath2f* path) {
  return Fit(points, cornerCos2, d, tol, skipCleanup, path, 0, 1);
}
