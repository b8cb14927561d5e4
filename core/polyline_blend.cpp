// Blending of two polylines: by positions (lerp) and by headings (turtle walk).
#include <zv/polyline.h>

#include <cmath>

#include "core/polyline_edge.h"

namespace {

ZvPoint2<double> Widen(const ZvPoint2<float>& p) {
  return {p.x, p.y};
}

ZvPoint2<float> Narrow(const ZvPoint2<double>& p) {
  return {float(p.x), float(p.y)};
}

ZvPoint2<double> Mix(const ZvPoint2<double>& p, const ZvPoint2<double>& q, double t) {
  return {p.x * (1.0 - t) + q.x * t, p.y * (1.0 - t) + q.y * t};
}

// Element by element, so that out may be one of the inputs.
void CopyPoints(const ZvPoint2<float>* from, unsigned int count, ZvPoint2<float>* to) {
  for (unsigned int i = 0; i < count; ++i)
    to[i] = from[i];
}

// Heading of an edge in radians. A null edge has none; it counts as heading along x rather than
// spreading NaN through every later step of the walk.
double Heading(const ZvPoint2<float>& p, const ZvPoint2<float>& q) {
  const double dx = double(q.x) - p.x, dy = double(q.y) - p.y;
  if (dx == 0.0 && dy == 0.0) return 0.0;
  return AngleWithFirstAxisRadian(dx, dy);
}

// Position along a vertex range as a fraction of its length. A range of no length is spaced by
// vertex count instead, so its ends still meet the other range's ends.
double VertexFraction(double lengthSoFar, double length, unsigned int i, unsigned int count) {
  if (length > 0.0) return lengthSoFar / length;
  return count > 1 ? double(i) / (count - 1) : 0.0;
}

double RangeLength(const ZvPoint2<float>* p, unsigned int count) {
  double length = 0.0;
  for (unsigned int i = 1; i < count; ++i)
    length += zvEdgeLength(p[i - 1], p[i]);
  return length;
}

// Finds the points of a vertex range at increasing fractions of its length, walking forwards.
class FractionCursor {
 public:
  FractionCursor(const ZvPoint2<float>* p, unsigned int count)
      : p_(p), count_(count), length_(RangeLength(p, count)) {}

  ZvPoint2<double> At(double f) {
    if (count_ == 1 || f <= 0.0) return Widen(p_[0]);
    if (f >= 1.0) return Widen(p_[count_ - 1]);
    for (;;) {
      const double edge = zvEdgeLength(p_[j_], p_[j_ + 1]);
      const double next = VertexFraction(lengthSoFar_ + edge, length_, j_ + 1, count_);
      if (next >= f || j_ + 2 >= count_) {
        const double span = next - fraction_;
        const double u = span > 0.0 ? (f - fraction_) / span : 1.0;
        return Mix(Widen(p_[j_]), Widen(p_[j_ + 1]), u < 1.0 ? u : 1.0);
      }
      lengthSoFar_ += edge;
      fraction_ = next;
      ++j_;
    }
  }

 private:
  const ZvPoint2<float>* p_;
  unsigned int count_;
  double length_;
  unsigned int j_ = 0;
  double lengthSoFar_ = 0.0;
  double fraction_ = 0.0;
};

}  // namespace

int ZvPoint2fArraySingleComponent_Lerp(const ZvPoint2fArray& a, const ZvPoint2fArray& b, double t,
                                       ZvPoint2fArray& out) {
  if (b.size != a.size || out.size != a.size) return 0;
  // Near 0 the blend is a; near 1 only an exact 1 (up to rounding) gives b.
  if (std::fabs(t) <= 1e-9) {
    CopyPoints(a.data, a.size, out.data);
  } else if (std::fabs(t - 1.0) <= 1e-15) {
    CopyPoints(b.data, b.size, out.data);
  } else {
    for (unsigned int i = 0; i < a.size; ++i)
      out[i] = Narrow(Mix(Widen(a[i]), Widen(b[i]), t));
  }
  return 1;
}

int ZvPoint2fArraySingleComponent_Lerp(const ZvPoint2fArray& a, unsigned int a0, unsigned int a1,
                                       const ZvPoint2fArray& b, unsigned int b0, unsigned int b1,
                                       double t, ZvPoint2fArray& out) {
  if (a0 > a1 || a1 >= a.size || b0 > b1 || b1 >= b.size) return 0;
  // out is resized, which would pull the ranges from under the walk.
  if (&out == &a || &out == &b) return 0;
  const unsigned int n = a1 - a0 + 1;
  const ZvPoint2<float>* pa = a.data + a0;
  out.Resize(n);
  if (std::fabs(t) <= 1e-9) {
    CopyPoints(pa, n, out.data);
    return 1;
  }
  FractionCursor partner(b.data + b0, b1 - b0 + 1);
  const bool atB = std::fabs(t - 1.0) <= 1e-15;
  const double lengthA = RangeLength(pa, n);
  double lengthSoFar = 0.0;
  for (unsigned int i = 0; i < n; ++i) {
    if (i > 0) lengthSoFar += zvEdgeLength(pa[i - 1], pa[i]);
    const ZvPoint2<double> q = partner.At(VertexFraction(lengthSoFar, lengthA, i, n));
    out[i] = Narrow(atB ? q : Mix(Widen(pa[i]), q, t));
  }
  return 1;
}

int ZvPoint2fArraySingleComponent_TurtleInterp(const ZvPoint2fArray& a, const ZvPoint2fArray& b,
                                               double t, ZvPoint2fArray& out) {
  if (b.size != a.size || out.size != a.size) return 0;
  if (std::fabs(t) <= 1e-9) {
    CopyPoints(a.data, a.size, out.data);
    return 1;
  }
  if (std::fabs(t - 1.0) <= 1e-15) {
    CopyPoints(b.data, b.size, out.data);
    return 1;
  }
  if (a.size == 0) return 1;
  const double u = 1.0 - t;
  // Every step takes the first edges' blended length: the inputs are evenly subdivided, and
  // equal steps keep the walk from drifting in scale.
  const double step =
      a.size > 1 ? zvEdgeLength(a[0], a[1]) * u + zvEdgeLength(b[0], b[1]) * t : 0.0;
  // out may be a or b: each input vertex is read before its slot is written.
  ZvPoint2<float> prevA = a[0], prevB = b[0];
  out[0] = {float(prevA.x * u) + float(prevB.x * t), float(prevA.y * u) + float(prevB.y * t)};
  for (unsigned int i = 1; i < a.size; ++i) {
    const ZvPoint2<float> curA = a[i], curB = b[i];
    const double heading = Heading(prevA, curA) * u + Heading(prevB, curB) * t;
    const ZvPoint2<float>& from = out[i - 1];
    out[i] = {float(from.x + step * std::cos(heading)), float(from.y + step * std::sin(heading))};
    prevA = curA;
    prevB = curB;
  }
  return 1;
}
