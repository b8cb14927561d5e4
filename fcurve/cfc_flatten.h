// Flattening of a keyed curve for display, and sampling through the flattened polyline, told
// once for every keyed kind.
//
// The curve is assembled piece by piece in (parameter, value) space: a straight piece for each
// constant or linear segment and for the extrapolation beyond the keys, a cubic for each cubic
// segment (cut down with de Casteljau where the range ends inside it), and a vertical jump
// wherever the value changes at one parameter. Each piece is mapped through the transform and
// clipped to the box as it is added, so no point outside the box is ever stored. Under the
// cycle methods the keyed range is repeated once per period the range touches, shifted by the
// period and, with the offset method, by the value offset per period.
//
// Besides the members the evaluation uses (cfc_extrapolation.h), the implementation object
// offers SegmentKind(i), Clamp(v) and kHasCubicSegments, and GetSegmentControls(i, p) when it
// has cubic segments.
#ifndef ZV_FCURVE_CFC_FLATTEN_H
#define ZV_FCURVE_CFC_FLATTEN_H

#include <zv/bezier_tool.h>
#include <zv/fcurve.h>
#include <zv/std_fcurve.h>
#include <zv/transfo4.h>

#include "fcurve/cfc_key_search.h"

#include <cfloat>
#include <cmath>

namespace cfc_flatten {

// More periods than this in one range would only draw a solid band; the range is refused.
constexpr double kMaxCycles = 1e6;
// Most keys, counted once per period, that one cyclic range draws (2^20): this bounds the time
// of a drawing whose pieces are mostly clipped away.
constexpr double kMaxRepeatedKeys = 1048576.0;
// Most points one drawing adds and most samples one EvalSequence gives (2^20, about 25 MB of
// output and a fraction of a second to make); more are refused rather than allocated.
constexpr unsigned int kMaxOutput = 1048576;
// Most points a sampling flattens on its way (2^22, four for each of the most samples): they
// stream through a small buffer and are never stored, but each costs its share of time.
constexpr unsigned long kMaxStreamed = 1ul << 22;
// A value change at one parameter larger than this is drawn as a jump.
constexpr double kJumpEpsilon = 1e-15;

// The part of a transform that acts on a 2-D point.
struct PlaneMap {
  double a, b, c, d, e, f;
  explicit PlaneMap(const ZvTransfo4& t) {
    const double* m = t.GetMatrixPtr();
    a = m[0];
    b = m[1];
    c = m[4];
    d = m[5];
    e = m[12];
    f = m[13];
  }
  ZvPoint2<double> operator()(double x, double y) const {
    return {a * x + c * y + e, b * x + d * y + f};
  }
};

// A vertical jump from a to b, clipped to the box and joined to the polyline when it starts
// where the polyline ends.
inline void ClipAndAddDiscontinuity(ZvPoint2<double> a, ZvPoint2<double> b,
                                    const ZvExtent2<double>& box, ZvPoint2dArray& points,
                                    ZvPointTagArray& tags, ZvBoolArray& flags) {
  if (!box.ClipLineSegmentWhenRegular(a, b)) return;
  if (points.size == 0) {
    points.Add(a);
    tags.Add(ZvPointTag_First);
    flags.Add(0);
  } else {
    const ZvPoint2<double>& last = points[points.size - 1];
    if (std::fabs(last.x - a.x) <= 1e-9 && std::fabs(last.y - a.y) <= 1e-9) {
      flags[flags.size - 1] = 0;
    } else {
      tags[tags.size - 1] = ZvPointTag_Last;
      flags[flags.size - 1] = 0;
      points.Add(a);
      tags.Add(ZvPointTag_First);
      flags.Add(0);
    }
  }
  points.Add(b);
  tags.Add(ZvPointTag_Continue);
  flags.Add(1);
}

// The part of the cubic p between Bezier parameters u0 < u1, by two de Casteljau splits.
inline void SubCubic(const ZvPoint2<double>* p, double u0, double u1, ZvPoint2<double>* out) {
  ZvPoint2<double> q[4] = {p[0], p[1], p[2], p[3]};
  auto splitRight = [](ZvPoint2<double>* c, double u) {  // keeps the part after u
    const ZvPoint2<double> a = c[0] + (c[1] - c[0]) * u, b = c[1] + (c[2] - c[1]) * u,
                           d = c[2] + (c[3] - c[2]) * u;
    const ZvPoint2<double> ab = a + (b - a) * u, bd = b + (d - b) * u;
    c[0] = ab + (bd - ab) * u;
    c[1] = bd;
    c[2] = d;
  };
  auto splitLeft = [](ZvPoint2<double>* c, double u) {  // keeps the part before u
    const ZvPoint2<double> a = c[0] + (c[1] - c[0]) * u, b = c[1] + (c[2] - c[1]) * u,
                           d = c[2] + (c[3] - c[2]) * u;
    const ZvPoint2<double> ab = a + (b - a) * u, bd = b + (d - b) * u;
    c[1] = a;
    c[2] = ab;
    c[3] = ab + (bd - ab) * u;
  };
  if (u0 > 0.0) {
    splitRight(q, u0);
    u1 = (u1 - u0) / (1.0 - u0);
  }
  if (u1 < 1.0) splitLeft(q, u1);
  for (int i = 0; i < 4; ++i)
    out[i] = q[i];
}

// Takes the polyline in portions as it is made, so that a long one never has to be stored
// whole. Each portion starts with the last point of the one before (from the second on).
class PolylineSink {
 public:
  virtual void Take(const ZvPoint2dArray& points, unsigned int from) = 0;

 protected:
  ~PolylineSink() = default;
};

template <class Impl>
class Assembler {
 public:
  Assembler(const Impl& s, const ZvTransfo4& transfo, double tolerance,
            const ZvExtent2<double>& box, ZvPoint2dArray& points, ZvPointTagArray& tags,
            ZvBoolArray& flags, PolylineSink* sink = nullptr)
      : s(s),
        map(transfo),
        tolerance(tolerance),
        box(box),
        points(points),
        tags(tags),
        flags(flags),
        sink(sink),
        first(points.size) {}

  // Hands what is left to the sink.
  void Finish() {
    if (sink && points.size > taken) sink->Take(points, taken);
  }

  // The curve from parameter pa to pb (pa <= pb), with extrapolation.
  bool Run(double pa, double pb) {
    const unsigned int n = s.keys.size;
    if (n == 0) {
      Line(pa, s.valueWhenNoKeys, pb, s.valueWhenNoKeys);
      return true;
    }
    const double x0 = s.keys[0].parameter, xn = s.keys[n - 1].parameter;
    const bool cycles = n >= 2 && (s.extrapolation == ZvBaseFCurve::CycleExtrapolation ||
                                   s.extrapolation == ZvBaseFCurve::CycleWithOffsetExtrapolation);
    if (cycles) return RunCycles(pa, pb, x0, xn);
    if (n == 1 && pa == x0 && pb == x0) {
      // A lone key shows as its step from the left value to the right one.
      Line(x0, s.ValueLeftOfFirstKey(), x0, s.KeyRightValue(0));
      return true;
    }
    if (pa < x0) {
      const double e = pb < x0 ? pb : x0;
      Line(
          pa, s.EvalRightUsingExtrapolationMethod(pa), e,
          e < x0 ? s.EvalRightUsingExtrapolationMethod(e) : s.EvalLeftUsingExtrapolationMethod(x0));
    }
    const double lo = pa > x0 ? pa : x0, hi = pb < xn ? pb : xn;
    if (lo <= hi) KeyedRange(lo, hi, 0.0, 0.0);
    if (pb > xn) {
      const double b = pa > xn ? pa : xn;
      Line(b, s.EvalRightUsingExtrapolationMethod(b), pb, s.EvalRightUsingExtrapolationMethod(pb));
    }
    return !overflow;
  }

 private:
  // Each period k covers [x0 + kP, xn + kP) and repeats the keys shifted by kP and, with the
  // offset method, by k times the offset that the right-continuous evaluation uses.
  bool RunCycles(double pa, double pb, double x0, double xn) {
    const double period = xn - x0;
    const double kFirst = std::floor((pa - x0) / period), kLast = std::floor((pb - x0) / period);
    if (!(kLast - kFirst <= kMaxCycles)) return false;
    // Each period repeats every key: the repeated keys are bounded too, so that the output is.
    if (!((kLast - kFirst + 1.0) * s.keys.size <= kMaxRepeatedKeys)) return false;
    const double delta =
        s.extrapolation == ZvBaseFCurve::CycleWithOffsetExtrapolation ? s.CycleOffset(false) : 0.0;
    // Counted in integers: far from the keys k + 1 can round back to k.
    const long count = static_cast<long>(kLast - kFirst);
    for (long c = 0; c <= count; ++c) {
      const double k = kFirst + static_cast<double>(c);
      const double dx = k * period;
      double lo = pa - dx, hi = pb - dx;
      if (lo < x0) lo = x0;
      if (hi > xn) hi = xn;
      if (lo <= hi) KeyedRange(lo, hi, dx, k * delta);
      if (overflow) return false;
    }
    return true;
  }

  // The keyed curve from lo to hi (x0 <= lo <= hi <= xn), shifted by (dx, dy).
  void KeyedRange(double lo, double hi, double dx, double dy) {
    const unsigned int n = s.keys.size;
    int found;
    const unsigned int at = s.LocateParameter(lo, found);
    unsigned int i = at > 0 ? at - 1 : 0;
    if (found) {
      lo = s.keys[i].parameter;
      MoveTo(lo + dx, s.KeyRightValue(i) + dy);
    }
    for (; !overflow && i + 1 < n && s.keys[i].parameter < hi; ++i) {
      const double b = s.keys[i + 1].parameter < hi ? s.keys[i + 1].parameter : hi;
      const double a = s.keys[i].parameter > lo ? s.keys[i].parameter : lo;
      if (a < b) Segment(i, a, b, dx, dy);
      if (b == s.keys[i + 1].parameter) MoveTo(b + dx, s.KeyRightValue(i + 1) + dy);
    }
  }

  // Segment i from parameter a to b, both within it.
  void Segment(unsigned int i, double a, double b, double dx, double dy) {
    const double p0 = s.keys[i].parameter, p1 = s.keys[i + 1].parameter;
    const double v0 = s.KeyRightValue(i);
    switch (s.SegmentKind(i)) {
      case ZvBaseFCurve::LinearSegment: {
        const double v1 = s.KeyArrivingValue(i + 1);
        const double slope = (v1 - v0) / (p1 - p0);
        const double ya = a == p0 ? v0 : v0 + (a - p0) * slope;
        const double yb = b == p1 ? v1 : v0 + (b - p0) * slope;
        Line(a + dx, ya + dy, b + dx, yb + dy);
        return;
      }
      case ZvBaseFCurve::CubicSegment:
        if constexpr (Impl::kHasCubicSegments) {
          Cubic(i, a, b, dx, dy);
          return;
        }
        [[fallthrough]];
      default:  // constant, and any kind the evaluation also holds constant
        Line(a + dx, v0 + dy, b + dx, v0 + dy);
        return;
    }
  }

  void Cubic(unsigned int i, double a, double b, double dx, double dy) {
    ZvPoint2<double> p[4], q[4];
    s.GetSegmentControls(i, p);
    const double u0 = a > p[0].x ? InvertParamCubic(a, p[0].x, p[1].x, p[2].x, p[3].x) : 0.0;
    const double u1 = b < p[3].x ? InvertParamCubic(b, p[0].x, p[1].x, p[2].x, p[3].x) : 1.0;
    if (u0 > 0.0 || u1 < 1.0) {
      SubCubic(p, u0, u1, q);
    } else {
      for (int j = 0; j < 4; ++j)
        q[j] = p[j];
    }
    MoveTo(a + dx, q[0].y + dy);
    ZvPoint2<double> m[4];
    for (int j = 0; j < 4; ++j)
      m[j] = map(q[j].x + dx, q[j].y + dy);
    ZvBezierTool_ClipAndFlattenCubic2d(m, tolerance, box, &points, &tags, &flags);
    pen = {b + dx, q[3].y + dy};
    Drain();
  }

  // Starts the next piece at (x, y): a jump when the last piece ended at the same parameter with
  // another value.
  void MoveTo(double x, double y) {
    if (hasPen && std::fabs(pen.x - x) <= 1e-9 * (1.0 + std::fabs(x)) &&
        std::fabs(pen.y - y) > kJumpEpsilon) {
      ClipAndAddDiscontinuity(map(pen.x, pen.y), map(pen.x, y), box, points, tags, flags);
    }
    pen = {x, y};
    hasPen = true;
  }

  void Line(double xa, double ya, double xb, double yb) {
    MoveTo(xa, ya);
    ZvPoint2<double> a = map(xa, ya), b = map(xb, yb);
    ClipAndAddLineSegment(a, b, box, points, tags, flags);
    pen = {xb, yb};
    Drain();
  }

  // With a sink, a full buffer goes to it, keeping its last point, to which the next piece
  // joins.
  void Drain() {
    if (sink == nullptr) {
      if (points.size - first > kMaxOutput) overflow = true;
      return;
    }
    if (points.size < kPortion) return;
    streamed += points.size - taken;
    if (streamed > kMaxStreamed) {
      overflow = true;
      return;
    }
    sink->Take(points, taken);
    const unsigned int last = points.size - 1;
    points[0] = points[last];
    tags[0] = tags[last];
    flags[0] = flags[last];
    points.Chop(1);
    tags.Chop(1);
    flags.Chop(1);
    taken = 1;
  }

  static constexpr unsigned int kPortion = 256;

  const Impl& s;
  const PlaneMap map;
  const double tolerance;
  const ZvExtent2<double> box;
  ZvPoint2dArray& points;
  ZvPointTagArray& tags;
  ZvBoolArray& flags;
  PolylineSink* const sink;
  const unsigned int first;
  unsigned int taken = 0;
  unsigned long streamed = 0;  // points handed to the sink
  bool overflow = false;  // more points than kMaxOutput or kMaxStreamed: the drawing is abandoned
  ZvPoint2<double> pen{0.0, 0.0};
  bool hasPen = false;
};

// The parameter range that a box in transformed space shows: the box's corners mapped back.
inline bool ParameterRangeOfBox(const ZvExtent2<double>& box, const ZvTransfo4& transfo, double& pa,
                                double& pb) {
  const PlaneMap m(transfo);
  const double det = m.a * m.d - m.b * m.c;
  if (!std::isfinite(det) || det == 0.0) return false;
  if (m.c == 0.0) {  // X on screen depends on the parameter only: the usual curve view
    pa = (box.xmin - m.e) / m.a;
    pb = (box.xmax - m.e) / m.a;
  } else {
    pa = DBL_MAX;
    pb = -DBL_MAX;
    const double xs[2] = {box.xmin, box.xmax}, ys[2] = {box.ymin, box.ymax};
    for (double x : xs) {
      for (double y : ys) {
        const double t = (m.d * (x - m.e) - m.c * (y - m.f)) / det;
        if (t < pa) pa = t;
        if (t > pb) pb = t;
      }
    }
  }
  if (pa > pb) {
    const double t = pa;
    pa = pb;
    pb = t;
  }
  return std::isfinite(pa) && std::isfinite(pb);
}

// Keeps the part of the runs from index `from` on where pass(y, limit) holds, adding a point at
// each crossing of the limit; a crossing point takes flag 1 (it ends or starts a piece) and the
// kept points keep theirs. When nothing survives, the arrays stay as they were.
template <class Pass>
void YClipInPlace(ZvPoint2dArray& points, ZvPointTagArray& tags, ZvBoolArray* flags,
                  unsigned int from, Pass pass, double limit) {
  ZvPoint2dArray out(points.size - from + 4);
  ZvPointTagArray outTags(points.size - from + 4);
  ZvBoolArray outFlags(points.size - from + 4);
  bool open = false;
  auto emit = [&](const ZvPoint2<double>& p, ZvPointTag tag, int flag) {
    out.Add(p);
    outTags.Add(tag);
    outFlags.Add(flag);
  };
  auto crossing = [limit](const ZvPoint2<double>& a, const ZvPoint2<double>& b) {
    return ZvPoint2<double>{a.x + (limit - a.y) * (b.x - a.x) / (b.y - a.y), limit};
  };
  auto close = [&]() {
    if (open) outTags[outTags.size - 1] = ZvPointTag_Last;
    open = false;
  };
  for (unsigned int j = from; j < points.size; ++j) {
    const bool in = pass(points[j].y, limit);
    if (j == from || tags[j - 1] == ZvPointTag_Last) {
      close();
    } else {
      const bool wasIn = pass(points[j - 1].y, limit);
      if (wasIn && !in) {
        emit(crossing(points[j - 1], points[j]), ZvPointTag_Continue, 1);
        close();
      } else if (!wasIn && in) {
        emit(crossing(points[j - 1], points[j]), ZvPointTag_First, 1);
        open = true;
      }
    }
    if (in) {
      emit(points[j], open ? ZvPointTag_Continue : ZvPointTag_First, flags ? (*flags)[j] : 1);
      open = true;
    }
  }
  close();
  if (out.size == 0) return;
  points.Chop(from);
  tags.Chop(from);
  if (flags) flags->Chop(from);
  for (unsigned int j = 0; j < out.size; ++j) {
    points.Add(out[j]);
    tags.Add(outTags[j]);
    if (flags) flags->Add(outFlags[j]);
  }
}

// Clips the runs from index `from` on to the clamping values, mapped through the transform.
inline void ClampInPlace(ZvPoint2dArray& points, ZvPointTagArray& tags, ZvBoolArray* flags,
                         unsigned int from, const ZvTransfo4& transfo, double minValue,
                         double maxValue) {
  const PlaneMap m(transfo);
  const bool hasMin = std::fabs(minValue) < DBL_MAX, hasMax = std::fabs(maxValue) < DBL_MAX;
  double low = hasMin ? m(0.0, minValue).y : 0.0, high = hasMax ? m(0.0, maxValue).y : 0.0;
  if (hasMin && hasMax && low > high) {  // a transform that flips Y swaps the limits
    const double t = low;
    low = high;
    high = t;
  }
  auto isAboveMin = [](double a, double b) { return a >= b; };
  auto isBelowMax = [](double a, double b) { return b >= a; };
  if (hasMin) YClipInPlace(points, tags, flags, from, isAboveMin, low);
  if (hasMax) YClipInPlace(points, tags, flags, from, isBelowMax, high);
}

}  // namespace cfc_flatten

template <class Impl>
unsigned int CFCFlatten(const Impl& s, const ZvTransfo4& transfo, double tolerance,
                        ZvPoint2dArray& points, ZvPointTagArray& tags, int clamped) {
  if (std::isnan(tolerance) || points.size != tags.size) return 0;
  const unsigned int from = points.size;
  ZvBoolArray flags(points.size + 64);
  for (unsigned int j = 0; j < points.size; ++j)
    flags.Add(0);
  // No clipping: a box over every double.
  const ZvExtent2<double> box(-DBL_MAX, -DBL_MAX, DBL_MAX, DBL_MAX);
  cfc_flatten::Assembler<Impl> assembler(s, transfo, tolerance, box, points, tags, flags);
  // Without keys a unit piece at the constant value stands for the whole line.
  const unsigned int n = s.keys.size;
  const double pa = n ? s.keys[0].parameter : 0.0, pb = n ? s.keys[n - 1].parameter : 1.0;
  if (!assembler.Run(pa, pb)) {  // more points than a drawing may hold
    points.Chop(from);
    tags.Chop(from);
    return 0;
  }
  if (points.size > from) tags[tags.size - 1] = ZvPointTag_Last;
  if (clamped)
    cfc_flatten::ClampInPlace(points, tags, nullptr, from, transfo, s.minClamp, s.maxClamp);
  return 1;
}

template <class Impl>
unsigned int CFCFlattenFromTo(const Impl& s, const ZvExtent2<double>& box,
                              const ZvTransfo4& transfo, double tolerance, ZvPoint2dArray& points,
                              ZvPointTagArray& tags, ZvBoolArray& extrapolated, int clamped) {
  if (std::isnan(tolerance) || points.size != tags.size || points.size != extrapolated.size) {
    return 0;
  }
  if (box.kind == ZvExtent2<double>::Empty) return 1;
  double pa, pb;
  ZvExtent2<double> clip = box;
  if (box.kind == ZvExtent2<double>::Infinite) {
    // All of the line cannot be drawn: the keyed range stands for it, unclipped.
    const unsigned int n = s.keys.size;
    pa = n ? s.keys[0].parameter : 0.0;
    pb = n ? s.keys[n - 1].parameter : 1.0;
    clip = ZvExtent2<double>(-DBL_MAX, -DBL_MAX, DBL_MAX, DBL_MAX);
  } else if (!cfc_flatten::ParameterRangeOfBox(box, transfo, pa, pb)) {
    return 0;
  }
  const unsigned int from = points.size;
  cfc_flatten::Assembler<Impl> assembler(s, transfo, tolerance, clip, points, tags, extrapolated);
  if (!assembler.Run(pa, pb)) {
    points.Chop(from);
    tags.Chop(from);
    extrapolated.Chop(from);
    return 0;
  }
  if (points.size > from) tags[tags.size - 1] = ZvPointTag_Last;
  if (clamped) {
    cfc_flatten::ClampInPlace(points, tags, &extrapolated, from, transfo, s.minClamp, s.maxClamp);
  }
  return 1;
}

namespace cfc_flatten {

// Samples at start, start + step, ... below end, read from the polyline as it streams by: a
// sample lies on the edge from the last point at or before it (a point within 1e-15 counts as
// hit exactly) to the next point. At a jump that is the upper point, so the samples are
// right-continuous like Eval.
class Sampler : public PolylineSink {
 public:
  Sampler(double start, double end, double step, ZvDoubleArray& parameters, ZvDoubleArray& values)
      : t(start), start(start), end(end), step(step), parameters(parameters), values(values) {}

  void Take(const ZvPoint2dArray& points, unsigned int from) override {
    for (unsigned int j = from; j < points.size; ++j) {
      const ZvPoint2<double>& q = points[j];
      if (hasPrevious) {
        while (end > t && t + kCFCParameterEpsilon < q.x) {
          if (std::fabs(previous.x - t) <= kCFCParameterEpsilon || previous.x == q.x) {
            Add(t, previous.y);
          } else {
            Add(t, previous.y + (t - previous.x) * (q.y - previous.y) / (q.x - previous.x));
          }
          Advance();
        }
      }
      previous = q;
      hasPrevious = true;
    }
  }

  // The samples beyond the last point, and the last sample at the end.
  void Close() {
    for (; end > t; Advance())
      Add(t, previous.y);
    Add(end, previous.y);
  }

  bool Empty() const { return !hasPrevious; }

 private:
  void Add(double p, double v) {
    parameters.Add(p);
    values.Add(v);
  }

  // Sample i lies at start + i * step: a running sum would stall where step is below the
  // spacing of doubles near t.
  void Advance() { t = start + static_cast<double>(++index) * step; }

  double t;
  const double start, end, step;
  unsigned long index = 0;
  ZvDoubleArray& parameters;
  ZvDoubleArray& values;
  ZvPoint2<double> previous{0.0, 0.0};
  bool hasPrevious = false;
};

}  // namespace cfc_flatten

// Samples read from the flattened polyline, which streams through a small buffer.
template <class Impl>
unsigned int CFCEvalSequence(const Impl& s, double start, double end, double step, double tolerance,
                             ZvDoubleArray& parameters, ZvDoubleArray& values, int clamped) {
  if (!std::isfinite(start) || !std::isfinite(end) || !(step > 0.0) || !std::isfinite(step) ||
      std::isnan(tolerance)) {
    return 0;
  }
  parameters.Chop(0);
  values.Chop(0);
  if (std::fabs(start - end) <= kCFCParameterEpsilon) {
    parameters.Add(start);
    values.Add(s.EvalRightUsingExtrapolationMethod(start));
  } else {
    const double lo = start < end ? start : end, hi = start < end ? end : start;
    if (!((hi - lo) / step <= cfc_flatten::kMaxOutput)) return 0;
    const ZvExtent2<double> box(lo, -DBL_MAX, hi, DBL_MAX);
    ZvPoint2dArray points(128);
    ZvPointTagArray tags(128);
    ZvBoolArray flags(128);
    cfc_flatten::Sampler sampler(start, end, step, parameters, values);
    cfc_flatten::Assembler<Impl> assembler(s, ZvTransfo4(), tolerance, box, points, tags, flags,
                                           &sampler);
    if (!assembler.Run(lo, hi)) return 0;
    assembler.Finish();
    if (sampler.Empty()) return 0;
    sampler.Close();
  }
  if (clamped) {
    for (unsigned int i = 0; i < values.size; ++i)
      values[i] = s.Clamp(values[i]);
  }
  return parameters.size;
}

// Defines the drawing and sampling slots of a keyed curve class, which holds its implementation
// object in `m_impl`; each takes the curve's lock.
#define ZV_CFC_DRAWING_SLOTS(Class)                                                                \
  unsigned int Class::Flatten(const ZvTransfo4& transfo, double tolerance, ZvPoint2dArray& points, \
                              ZvPointTagArray& tags, int clamped) const {                          \
    ZvFCurveLockGuard guard(*this);                                                                \
    return CFCFlatten(*m_impl, transfo, tolerance, points, tags, clamped);                         \
  }                                                                                                \
  unsigned int Class::FlattenFromTo(const ZvExtent2<double>& box, const ZvTransfo4& transfo,       \
                                    double tolerance, ZvPoint2dArray& points,                      \
                                    ZvPointTagArray& tags, ZvBoolArray& extrapolated, int clamped) \
      const {                                                                                      \
    ZvFCurveLockGuard guard(*this);                                                                \
    return CFCFlattenFromTo(*m_impl, box, transfo, tolerance, points, tags, extrapolated,          \
                            clamped);                                                              \
  }                                                                                                \
  unsigned int Class::EvalSequence(double start, double end, double step, double tolerance,        \
                                   ZvDoubleArray& parameters, ZvDoubleArray& values, int clamped)  \
      const {                                                                                      \
    ZvFCurveLockGuard guard(*this);                                                                \
    return CFCEvalSequence(*m_impl, start, end, step, tolerance, parameters, values, clamped);     \
  }

#endif
