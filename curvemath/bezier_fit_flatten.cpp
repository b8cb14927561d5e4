// General-degree flattening of ZvBezierTool: midpoint subdivision to a depth fixed up front,
// then ordered forward differencing of each piece.
#include <zv/bezier_fit.h>

#include <cmath>

#include "core/vec.h"
#include "curvemath/cubic_steps.h"

namespace {

// Level counts come from base-4 digits of a 31-bit integer, so at most 16 unless the deviation
// is beyond that range. A walk of 2^16 steps already resolves far below single precision; the
// cap keeps an absurdly small tolerance from asking for billions of points.
constexpr unsigned int kMaxLevels = 16;

// De Casteljau at t = 1/2 with factors of 0.5: left and right share left[d] == right[0].
void SplitAtHalf(const ZvPoint2<double>* p, unsigned int degree, ZvPoint2<double>* left,
                 ZvPoint2<double>* right) {
  ZvPoint2<double> work[9];
  for (unsigned int i = 0; i <= degree; ++i)
    work[i] = p[i];
  for (unsigned int level = 0; level <= degree; ++level) {
    left[level] = work[0];
    right[degree - level] = work[degree - level];
    for (unsigned int i = 0; i + level < degree; ++i)
      work[i] = (work[i] + work[i + 1]) * 0.5;
  }
}

}  // namespace

ZvBezierTool::ZvBezierTool()
    : degree(0),
      tolerance(0.0),
      numSteps(0),
      numAdded(0),
      numLevels(0),
      outFloat(nullptr),
      outDouble(nullptr),
      useDouble(0),
      differences(),
      forward(),
      fitTolerance(0.0),
      fitTolerance2(0.0),
      fitPoints(nullptr),
      fitChords(nullptr),
      fitPath(nullptr),
      fitCount(0) {}

ZvPoint2<double>* ZvBezierTool::Row(unsigned int k) {
  // Rows 0..k-1 hold d + 1, d, ..., d + 2 - k entries.
  return differences + k * (degree + 1) - k * (k - 1) / 2;
}

void ZvBezierTool::Emit(const ZvPoint2<double>& q) {
  if (useDouble) {
    outDouble->Add(q.x, q.y);
  } else {
    outFloat->Add(q.x, q.y);
  }
  ++numAdded;
}

void ZvBezierTool::ContextInitOne(const ZvPoint2<double>* p) {
  const unsigned int d = degree;
  ZvPoint2<double>* row = Row(0);
  for (unsigned int i = 0; i <= d; ++i)
    row[i] = p[i];
  for (unsigned int k = 1; k <= d; ++k) {
    const ZvPoint2<double>* above = Row(k - 1);
    ZvPoint2<double>* next = Row(k);
    for (unsigned int i = 0; i + k <= d; ++i)
      next[i] = above[i + 1] - above[i];
  }
  numLevels = 0;
  numSteps = 2;
  if (d < 2) return;

  const ZvPoint2<double> k = p[d] - p[0];
  const double chord = zvGuardedLength(k);
  double e = 0.0;
  if (std::fabs(chord) <= 1e-15) {
    // A closed piece has no chord direction: the spread of the inner controls stands in.
    for (unsigned int i = 1; i < d; ++i) {
      const double l = zvGuardedLength(p[i] - p[0]);
      if (l > e) e = l;
    }
  } else {
    // Each second difference bends the piece away from its chord; their sum, d(d - 1) / 2 of
    // them at most, bounds the deviation, hence the dd2 factor below.
    const ZvPoint2<double>* second = Row(2);
    for (unsigned int i = 0; i + 2 <= d; ++i) {
      const double c = std::fabs(ZvCross(second[i], k));
      if (c > e) e = c;
    }
    e /= chord;
  }
  numLevels = zvForwardDifferencingLevels(e, dd2[d] * 0.25 * (1.0 / tolerance));
  if (numLevels > kMaxLevels) numLevels = kMaxLevels;
  numSteps = (1u << numLevels) + 1;
}

void ZvBezierTool::ContextInitTwo() {
  const unsigned int d = degree;
  for (unsigned int i = 0; i <= d; ++i)
    forward[i] = ZvPoint2<double>{0.0, 0.0};
  // The power form of the curve at t = j h, h = 2^-numLevels, has coefficients
  // Blaise[d][k] h^k times the k-th Bezier difference; the i-th forward difference of j^k at 0
  // is i! S(k, i). The powers of two are exact, so the registers start exact up to rounding.
  for (unsigned int k = 1; k <= d; ++k) {
    const ZvPoint2<double> diff = Row(k)[0];
    const int shift = -static_cast<int>(k * numLevels);
    for (unsigned int i = 1; i <= k; ++i) {
      const double w = beta[d][k][i];
      forward[i] += ZvPoint2<double>{std::ldexp(w * diff.x, shift), std::ldexp(w * diff.y, shift)};
    }
  }
}

void ZvBezierTool::OFDInnerLoop() {
  const unsigned int d = degree;
  // Pieces are walked one at a time here, so the cap is checked piece by piece.
  const unsigned int size = useDouble ? outDouble->size : outFloat->size;
  if (size > kZvMaxFlattenPoints || numSteps - 2 > kZvMaxFlattenPoints - size)
    throw std::bad_alloc();
  ZvPoint2<double> q = Row(0)[0];
  for (unsigned int i = 2; i < numSteps; ++i) {
    q += forward[1];
    for (unsigned int j = 1; j < d; ++j)
      forward[j] += forward[j + 1];
    Emit(q);
  }
}

void ZvBezierTool::PMSOFD(const ZvPoint2<double>* p, unsigned int depth) {
  if (depth == 0) {
    ContextInitOne(p);
    ContextInitTwo();
    OFDInnerLoop();
    return;
  }
  ZvPoint2<double> left[9], right[9];
  SplitAtHalf(p, degree, left, right);
  PMSOFD(left, depth - 1);
  Emit(left[degree]);
  PMSOFD(right, depth - 1);
}

unsigned int ZvBezierTool::FlattenPoints(const ZvPoint2<double>* p, unsigned int d, int skipFirst) {
  degree = d;
  numAdded = 0;
  if (d <= 1) {
    if (!skipFirst) Emit(p[0]);
    Emit(p[d]);
    return numAdded;
  }
  ContextInitOne(p);
  if (!skipFirst) Emit(p[0]);
  // The third differences measure what a chord-based step count cannot see; the depth is
  // floor(log8) of their size in tolerances, as for cubics.
  double l = 0.0;
  if (d >= 3) {
    const ZvPoint2<double>* third = Row(3);
    for (unsigned int i = 0; i + 3 <= d; ++i) {
      const double len = zvGuardedLength(third[i]);
      if (len > l) l = len;
    }
  }
  PMSOFD(p, zvSubdivisionDepth(zvTruncateToCount(l * (1.0 / tolerance) + 0.5)));
  Emit(p[d]);
  return numAdded;
}

unsigned int ZvBezierTool::Flatten(const ZvPoint2<float>* p, unsigned int first, unsigned int d,
                                   double tol, ZvPoint2fArray* out, int skipFirst) {
  if (!p || !out || d > 8) return 0;
  // Widened copies: the points may live in the array being appended to.
  ZvPoint2<double> q[9];
  for (unsigned int i = 0; i <= d; ++i)
    q[i] = ZvPoint2<double>{p[first + i].x, p[first + i].y};
  tolerance = tol;
  outFloat = out;
  outDouble = nullptr;
  useDouble = 0;
  return FlattenPoints(q, d, skipFirst);
}

unsigned int ZvBezierTool::Flatten(const ZvPoint2fArray& a, unsigned int first, unsigned int d,
                                   double tol, ZvPoint2fArray* out, int skipFirst) {
  if (first >= a.size || d >= a.size - first) return 0;
  return Flatten(a.data, first, d, tol, out, skipFirst);
}

unsigned int ZvBezierTool::Flatten(const ZvPoint2<double>* p, unsigned int first, unsigned int d,
                                   double tol, ZvPoint2dArray* out, int skipFirst) {
  if (!p || !out || d > 8) return 0;
  ZvPoint2<double> q[9];
  for (unsigned int i = 0; i <= d; ++i)
    q[i] = p[first + i];
  tolerance = tol;
  outFloat = nullptr;
  outDouble = out;
  useDouble = 1;
  return FlattenPoints(q, d, skipFirst);
}

unsigned int ZvBezierTool::FlatPolylineSizeUpperBound(const ZvPoint2<float>* p, unsigned int first,
                                                      unsigned int d, double tol) {
  if (!p || d > 8) return 0;
  if (d < 2) return d + 1;
  ZvPoint2<double> q[9];
  for (unsigned int i = 0; i <= d; ++i)
    q[i] = ZvPoint2<double>{p[first + i].x, p[first + i].y};
  degree = d;
  tolerance = tol;
  ContextInitOne(q);
  return numSteps;
}
