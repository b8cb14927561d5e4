// Lookups in sorted tables: positions by arc length and profiles y(x).
#include <zv/polyline.h>

#include <cmath>

namespace {

// Bisection over a non-decreasing key(0..n-1), n >= 2. Returns the index of a key equal to v if
// one is met on the way (exact = true); otherwise lo such that v lies between key(lo) and
// key(lo + 1).
template <class Key>
unsigned int Bracket(unsigned int n, double v, Key key, bool& exact) {
  unsigned int lo = 0, hi = n - 1;
  exact = false;
  while (hi - lo > 1) {
    const unsigned int mid = lo + (hi - lo) / 2;
    const double k = key(mid);
    if (k == v) {
      exact = true;
      return mid;
    }
    if (k < v) {
      lo = mid;
    } else {
      hi = mid;
    }
  }
  return lo;
}

// Where v falls between k0 and k1; the first end when they are equal.
double Fraction(double v, double k0, double k1) {
  return k1 != k0 ? (v - k0) / (k1 - k0) : 0.0;
}

}  // namespace

int ZvPoint3dArraySingleComponent_ComputePosition(const ZvPoint3dArray& a,
                                                  const ZvDoubleArray& chords, double s,
                                                  ZvPoint3<double>& out) {
  if (a.size == 0 || chords.size != a.size || std::isnan(s)) return 0;
  const unsigned int last = a.size - 1;
  if (std::fabs(s) <= 1e-9 || last == 0) {
    out = a[0];
    return 1;
  }
  if (s >= chords[last]) {
    out = a[last];
    return 1;
  }
  bool exact;
  const unsigned int lo = Bracket(
      a.size, s, [&chords](unsigned int i) { return chords[i]; }, exact);
  if (exact) {
    out = a[lo];
    return 1;
  }
  const double t = Fraction(s, chords[lo], chords[lo + 1]);
  out = a[lo] + (a[lo + 1] - a[lo]) * t;
  return 1;
}

double ZvPoint2dArray_EvalYInSortedArray(const ZvPoint2dArray& a, double x) {
  if (a.size == 0) return 0.0;
  const ZvPoint2<double>& first = a[0];
  const ZvPoint2<double>& last = a[a.size - 1];
  if (std::fabs(x - first.x) <= 1e-15 || x <= first.x || a.size == 1) return first.y;
  if (std::fabs(x - last.x) <= 1e-15 || x >= last.x) return last.y;
  bool exact;
  const unsigned int lo = Bracket(
      a.size, x, [&a](unsigned int i) { return a[i].x; }, exact);
  if (exact) return a[lo].y;
  const double t = Fraction(x, a[lo].x, a[lo + 1].x);
  return a[lo].y + (a[lo + 1].y - a[lo].y) * t;
}
