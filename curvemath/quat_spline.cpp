// The rotation spline: Kochanek-Bartels tangents in the log space of relative rotations, built
// once, then evaluated by segment with extrapolation on both sides.
#include <zv/quat.h>

#include "curvemath/quat_ops.h"

#include <algorithm>
#include <cmath>
#include <vector>

namespace {

// The rotation reached by going on from `from` past `to` as far again: the slerp from `from`
// to `to` at parameter 2. The keys' own rotations all pass through Euler angles, so this one
// does too, which keeps a phantom key indistinguishable from a keyed one.
ZvQuat Beyond(const ZvQuat& to, const ZvQuat& from) {
  double d = QuatDot(to, from);
  const double sign = d < 0.0 ? -1.0 : 1.0;
  d *= sign;
  double wTo = 2.0, wFrom = -1.0;
  if (1.0 - d >= 1e-12) {
    const double theta = std::acos(d), s = std::sin(theta);
    wTo = std::sin(2.0 * theta) / s;
    wFrom = std::sin(theta - 2.0 * theta) / s;
  }
  ZvQuat q = QuatSum(QuatScaled(to, sign * wTo), QuatScaled(from, wFrom));
  q.Normalize();
  ZvPoint3<double> angles;
  q.Get(angles);
  return ZvQuat(angles);
}

// Spherical interpolation on the shorter arc; s may lie beyond [0, 1].
ZvQuat Slerp(const ZvQuat& p, ZvQuat q, double s) {
  double d = QuatDot(p, q);
  if (d < 0.0) {
    q = QuatScaled(q, -1.0);
    d = -d;
  }
  double wp = 1.0 - s, wq = s;
  if (1.0 - d >= 1e-12) {
    const double theta = std::acos(d > 1.0 ? 1.0 : d), sn = std::sin(theta);
    wp = std::sin((1.0 - s) * theta) / sn;
    wq = std::sin(s * theta) / sn;
  }
  return QuatSum(QuatScaled(p, wp), QuatScaled(q, wq));
}

// A count of periods as an integer; 0 for a count that is not finite (times not increasing),
// and at most 2^52, beyond which a double no longer tells the periods apart.
long long Periods(double count) {
  if (!(std::fabs(count) <= 4503599627370496.0)) return 0;
  return static_cast<long long>(count);
}

// q to an integer power, by squaring so that far periods cost a logarithmic number of products.
ZvQuat Power(ZvQuat q, long long k) {
  if (k < 0) {
    q = QuatInverse(q);
    k = -k;
  }
  ZvQuat r;
  while (k > 0) {
    if (k & 1) r = r * q;
    q = q * q;
    k >>= 1;
  }
  return r;
}

}  // namespace

ZvQuat ZvQuatSpline::Segment::Eval(double u) const {
  return PreComputedHermite(start, a, m, b, u);
}

ZvQuatSpline::ZvQuatSpline(int numKeys, const ZvQuatKey* keys, unsigned int method)
    : numSegments(numKeys > 1 ? static_cast<unsigned int>(numKeys - 1) : 0),
      segments(nullptr),
      extrapolation(method),
      ordered(true) {
  if (numSegments == 0) return;
  const unsigned int n = static_cast<unsigned int>(numKeys);
  // Rotations and times with a phantom key on each side: index i + 1 is key i.
  std::vector<ZvQuat> q(n + 2);
  std::vector<double> t(n + 2);
  for (unsigned int i = 0; i < n; ++i) {
    q[i + 1] = ZvQuat(keys[i].angles);
    t[i + 1] = keys[i].time;
    if (i > 0 && !(t[i + 1] > t[i])) ordered = false;
  }
  q[0] = Beyond(q[1], q[2]);
  t[0] = 2.0 * t[1] - t[2];
  // Each rotation on the same side as the one before it, so that every step takes the shorter
  // arc.
  for (unsigned int i = 1; i <= n; ++i) {
    if (QuatDot(q[i], q[i - 1]) < 0.0) q[i] = QuatScaled(q[i], -1.0);
  }
  q[n + 1] = Beyond(q[n], q[n - 1]);
  t[n + 1] = 2.0 * t[n] - t[n - 1];
  if (QuatDot(q[n + 1], q[n]) < 0.0) q[n + 1] = QuatScaled(q[n + 1], -1.0);

  segments = new Segment[numSegments];
  ZvQuat before = QuatLog(QuatInverse(q[0]) * q[1]);
  ZvQuat across = QuatLog(QuatInverse(q[1]) * q[2]);
  for (unsigned int s = 0; s < numSegments; ++s) {
    const unsigned int A = s + 1, B = s + 2;  // the segment's keys in the extended arrays
    const ZvQuatKey& ka = keys[s];
    const ZvQuatKey& kb = keys[s + 1];
    const ZvQuat after = QuatLog(QuatInverse(q[B]) * q[B + 1]);
    const double span = t[B] - t[A];

    const double k0 = (2.0 * span / (t[B] - t[A - 1])) * (1.0 - ka.tension) * 0.5;
    const double k1 = (2.0 * span / (t[B + 1] - t[A])) * (1.0 - kb.tension) * 0.5;
    // The incoming tangent's first weight takes the continuity of the segment's first key, not
    // of its own key. Curves were keyed against this shape, so it stays.
    const ZvQuat out = QuatSum(QuatScaled(across, k0 * (1.0 - ka.continuity) * (1.0 - ka.bias)),
                               QuatScaled(before, k0 * (1.0 + ka.continuity) * (1.0 + ka.bias)));
    const ZvQuat in = QuatSum(QuatScaled(after, k1 * (1.0 + ka.continuity) * (1.0 - kb.bias)),
                              QuatScaled(across, k1 * (1.0 - kb.continuity) * (1.0 + kb.bias)));

    Segment& g = segments[s];
    g.start = q[A];
    g.end = q[B];
    g.a = QuatScaled(out, 0.3333333333333333);
    g.b = QuatScaled(in, 0.3333333333333333);
    g.a.w = 0.0;
    g.b.w = 0.0;
    g.m = QuatLog(QuatExp(QuatScaled(g.a, -1.0)) * QuatInverse(g.start) * g.end *
                  QuatExp(QuatScaled(g.b, -1.0)));
    QuatAddSpins(g.m, ka.GetSpins());
    g.t0 = t[A];
    g.t1 = t[B];
    g.invSpan = 1.0 / span;
    before = across;
    across = after;
  }
}

ZvQuatSpline::ZvQuatSpline(const ZvQuatSpline& o)
    : numSegments(o.numSegments),
      segments(nullptr),
      extrapolation(o.extrapolation),
      ordered(o.ordered) {
  if (numSegments == 0) return;
  segments = new Segment[numSegments];
  std::copy(o.segments, o.segments + numSegments, segments);
}

ZvQuatSpline& ZvQuatSpline::operator=(const ZvQuatSpline& o) {
  if (this == &o) return *this;
  Segment* copy = o.numSegments ? new Segment[o.numSegments] : nullptr;
  std::copy(o.segments, o.segments + o.numSegments, copy);
  delete[] segments;
  segments = copy;
  numSegments = o.numSegments;
  extrapolation = o.extrapolation;
  ordered = o.ordered;
  return *this;
}

ZvQuatSpline::~ZvQuatSpline() {
  delete[] segments;
}

// The first segment whose end lies above t. With ordered times that is what a bisection over the
// ends finds.
unsigned int ZvQuatSpline::SegmentAt(double t) const {
  const Segment* begin = segments;
  const Segment* last = segments + numSegments - 1;
  const Segment* s;
  if (ordered) {
    s = std::upper_bound(begin, last, t, [](double v, const Segment& g) { return v < g.t1; });
  } else {
    s = std::find_if(begin, last, [t](const Segment& g) { return g.t1 > t; });
  }
  return static_cast<unsigned int>(s - segments);
}

int ZvQuatSpline::GetEvalInterval(double t, double& u) const {
  if (numSegments == 0) return -1;
  const double first = segments[0].t0, last = segments[numSegments - 1].t1;
  if (!(t > first)) {
    u = 0.0;
    return 0;
  }
  if (!(t < last)) {
    u = 1.0;
    return static_cast<int>(numSegments - 1);
  }
  const unsigned int i = SegmentAt(t);
  u = (t - segments[i].t0) * segments[i].invSpan;
  return static_cast<int>(i);
}

ZvQuat ZvQuatSpline::Eval(double t) const {
  if (numSegments == 0) return ZvQuat();
  const double first = segments[0].t0, last = segments[numSegments - 1].t1;
  if (t > last) return EvalAfterLast(t);
  if (t < first) return EvalBeforeFirst(t);
  double u;
  const int i = GetEvalInterval(t, u);
  return segments[i].Eval(u);
}

ZvQuat ZvQuatSpline::EvalAfterLast(double t) const {
  const Segment& head = segments[0];
  const Segment& tail = segments[numSegments - 1];
  const double first = head.t0, last = tail.t1, period = last - first;
  switch (extrapolation) {
    case 4: {
      const long long k = Periods(std::ceil((t - first) / period) - 1.0);
      const double r = std::fmod(t - first, period);
      double at = std::fabs(r) <= 1e-9 ? last : first + r;
      at = std::min(std::max(at, first), last);
      // Each full period adds the rotation of the whole keyed span, applied after it.
      return Power(tail.end * QuatInverse(head.start), k) * Eval(at);
    }
    case 3: {
      double at = std::fmod(t - first, period) + first;
      at = std::min(std::max(at, first), last);
      return Eval(at);
    }
    case 2: {
      // Continue at the angular velocity of the last instant of the keys.
      ZvQuat p = tail.Eval(0.9999);
      p.Normalize();
      const double ta = tail.t0 + 0.9999 * (tail.t1 - tail.t0);
      return Slerp(p, tail.end, (t - ta) / (last - ta));
    }
    default:
      return tail.Eval(1.0);
  }
}

ZvQuat ZvQuatSpline::EvalBeforeFirst(double t) const {
  const Segment& head = segments[0];
  const Segment& tail = segments[numSegments - 1];
  const double first = head.t0, last = tail.t1, period = last - first;
  switch (extrapolation) {
    case 4: {
      const long long k = Periods(std::floor((t - first) / period));
      const double r = std::fmod(first - t, period);
      double at = std::fabs(r) <= 1e-9 ? first : last - r;
      at = std::min(std::max(at, first), last);
      return Power(tail.end * QuatInverse(head.start), k) * Eval(at);
    }
    case 3: {
      double at = last - std::fmod(first - t, period);
      at = std::min(std::max(at, first), last);
      return Eval(at);
    }
    case 2: {
      ZvQuat p = head.Eval(0.0001);
      p.Normalize();
      const double ta = head.t0 + 0.0001 * (head.t1 - head.t0);
      return Slerp(p, head.start, (ta - t) / (ta - first));
    }
    default:
      return head.Eval(0.0);
  }
}
