// Whole-curve questions on the standard curve: bijectivity and inversion, integrals, value
// bounds of the control polygons, validity and constancy.
#include "fcurve/std_fcurve_impl.h"

#include "fcurve/std_fcurve_bezier.h"

#include <cmath>

namespace {

bool Within(double v, double eps) {
  return v >= -eps && eps >= v;
}

// The segment test on any four control values, as if they were X.
bool IsMonotoneCubic(double c0, double c1, double c2, double c3) {
  return ZvStdFCurve_IsCubicSegmentValid({c0, 0.0}, {c1, 0.0}, {c2, 0.0}, {c3, 0.0}) != 0;
}

}  // namespace

int ZvStdFCurveImpl::IsBijective() const {
  const unsigned int n = keys.size;
  if (n < 2) return 0;
  for (unsigned int i = 0; i < n; ++i) {
    if (!Within(EffectiveLeftValue(i) - keys[i].rightValue, 1e-15)) return 0;
  }
  if (keys[0].rightValue == keys[1].rightValue) return 0;
  const bool rising = keys[1].rightValue > keys[0].rightValue;
  for (unsigned int i = 0; i + 1 < n; ++i) {
    const CFCStdKey& k = keys[i];
    switch (k.segmentKind) {
      case ZvBaseFCurve::LinearSegment: {
        const double a = k.rightValue, b = keys[i + 1].leftValue;
        if (rising ? !(b > a) : !(a > b)) return 0;
        break;
      }
      case ZvBaseFCurve::CubicSegment: {
        ZvPoint2<double> p[4];
        GetSegmentControls(i, p);
        double y[4] = {p[0].y, p[1].y, p[2].y, p[3].y};
        if (!rising) {
          const double t0 = y[0], t1 = y[1];
          y[0] = y[3];
          y[1] = y[2];
          y[2] = t1;
          y[3] = t0;
        }
        if (y[0] >= y[3] || y[0] > y[1] || y[2] > y[3]) return 0;
        if (!IsMonotoneCubic(y[0], y[1], y[2], y[3])) return 0;
        break;
      }
      default:
        return 0;  // a constant segment is never one-to-one
    }
  }
  return 1;
}

int ZvStdFCurveImpl::EvalInverse(double value, double& parameter, int) const {
  if (!IsBijective()) return 0;
  const unsigned int n = keys.size;
  const bool rising = keys[1].rightValue > keys[0].rightValue;
  const double firstValue = keys[0].rightValue, lastValue = keys[n - 1].rightValue;
  if (rising ? value < firstValue : value > firstValue) {
    parameter = keys[0].parameter;
    return 1;
  }
  if (rising ? value > lastValue : value < lastValue) {
    parameter = keys[n - 1].parameter;
    return 1;
  }
  for (unsigned int i = 0; i < n; ++i) {
    if (std::fabs(value - keys[i].rightValue) <= 1e-7) {
      parameter = keys[i].parameter;
      return 1;
    }
    if (i + 1 >= n) break;
    const double a = keys[i].rightValue, b = keys[i + 1].leftValue;
    if (!(rising ? (a < value && value < b) : (b < value && value < a))) continue;
    if (keys[i].segmentKind == ZvBaseFCurve::LinearSegment) {
      parameter =
          keys[i].parameter + (value - a) * (keys[i + 1].parameter - keys[i].parameter) / (b - a);
      return 1;
    }
    ZvPoint2<double> p[4];
    GetSegmentControls(i, p);
    if (rising) {
      const double u = InvertParamCubic(value, p[0].y, p[1].y, p[2].y, p[3].y);
      parameter = zvBezierPoint(p, u).x;
    } else {
      const ZvPoint2<double> r[4] = {p[3], p[2], p[1], p[0]};
      const double u = InvertParamCubic(value, r[0].y, r[1].y, r[2].y, r[3].y);
      parameter = zvBezierPoint(r, u).x;
    }
    return 1;
  }
  return 0;
}

double ZvStdFCurveImpl::PartialSegmentIntegral(unsigned int i, double a, double b) const {
  const CFCStdKey& k = keys[i];
  switch (k.segmentKind) {
    case ZvBaseFCurve::ConstantSegment:
      return (b - a) * k.rightValue;
    case ZvBaseFCurve::LinearSegment: {
      const CFCStdKey& next = keys[i + 1];
      const double slope = (next.leftValue - k.rightValue) / (next.parameter - k.parameter);
      const double va = k.rightValue + (a - k.parameter) * slope;
      const double vb = k.rightValue + (b - k.parameter) * slope;
      return (b - a) * (va + vb) * 0.5;
    }
    case ZvBaseFCurve::CubicSegment: {
      ZvPoint2<double> p[4];
      GetSegmentControls(i, p);
      return IntegrateBezierSegment(p, a, b);
    }
    default:
      return 0.0;
  }
}

double ZvStdFCurveImpl::RightPieceIntegral(unsigned int i, double a) const {
  return PartialSegmentIntegral(i, a, keys[i + 1].parameter);
}

double ZvStdFCurveImpl::LeftPieceIntegral(unsigned int i, double b) const {
  return PartialSegmentIntegral(i, keys[i].parameter, b);
}

// The segments from key `first` up to key `last`.
double ZvStdFCurveImpl::WholeSegmentsIntegral(unsigned int first, unsigned int last) const {
  double sum = 0.0;
  for (unsigned int i = first; i < last; ++i) {
    const CFCStdKey& k = keys[i];
    const CFCStdKey& next = keys[i + 1];
    const double width = next.parameter - k.parameter;
    switch (k.segmentKind) {
      case ZvBaseFCurve::ConstantSegment:
        sum += width * k.rightValue;
        break;
      case ZvBaseFCurve::LinearSegment:
        sum += width * (k.rightValue + next.leftValue) * 0.5;
        break;
      case ZvBaseFCurve::CubicSegment: {
        ZvPoint2<double> p[4];
        GetSegmentControls(i, p);
        sum += zvWholeBezierSegmentIntegral(p);
        break;
      }
      default:
        break;
    }
  }
  return sum;
}

double ZvStdFCurveImpl::EvalIntegral(double a, double b) const {
  const unsigned int n = keys.size;
  if (n == 0) return (b - a) * valueWhenNoKeys;
  const double first = keys[0].parameter, last = keys[n - 1].parameter;
  double sum = 0.0;
  if (a < first) {
    const double end = b < first ? b : first;
    sum += (end - a) * keys[0].leftValue;
    a = end;
  }
  if (b > last) {
    const double begin = a > last ? a : last;
    sum += (b - begin) * keys[n - 1].rightValue;
    b = begin;
  }
  if (!(a < b)) return sum;
  int found;
  const unsigned int i = LocateParameter(a, found) - 1;
  const unsigned int j = LocateParameter(b, found) - 1;
  if (i == j) return sum + PartialSegmentIntegral(i, a, b);
  sum += RightPieceIntegral(i, a) + WholeSegmentsIntegral(i + 1, j);
  if (j + 1 < n) sum += LeftPieceIntegral(j, b);
  return sum;
}

// Control-polygon range of the segment from key i.
int ZvStdFCurveImpl::ComputeEvaluatedValueRange(unsigned int i, double& low, double& high) const {
  const unsigned int n = keys.size;
  if (i >= n) return 0;
  const CFCStdKey& k = keys[i];
  low = high = k.rightValue;
  if (i + 1 >= n) return 1;
  double y[3] = {keys[i + 1].leftValue, k.rightValue, k.rightValue};
  unsigned int count = 0;
  switch (k.segmentKind) {
    case ZvBaseFCurve::ConstantSegment:
      break;
    case ZvBaseFCurve::LinearSegment:
      count = 1;
      break;
    case ZvBaseFCurve::CubicSegment:
      y[1] = GetEvaluatedRightTgtY(i);
      y[2] = GetEvaluatedLeftTgtY(i + 1);
      count = 3;
      break;
    default:
      break;
  }
  for (unsigned int c = 0; c < count; ++c) {
    if (y[c] < low) low = y[c];
    if (y[c] > high) high = y[c];
  }
  return 1;
}

namespace {

// The values bounding the curve, by its control polygons. An automatic key that starts a cubic
// segment takes a shortcut: only the handle on the side of the higher (for the upper bound)
// neighbour is considered.
template <class Better>
double PolygonBound(const ZvStdFCurveImpl& impl, Better better, bool upper) {
  const unsigned int n = impl.keys.size;
  if (n == 0) return impl.valueWhenNoKeys;
  double bound = impl.keys[0].leftValue;
  auto take = [&](double v) {
    if (better(v, bound)) bound = v;
  };
  take(impl.keys[n - 1].rightValue);
  for (unsigned int i = 0; i + 1 < n; ++i) {
    const CFCStdKey& k = impl.keys[i];
    switch (k.segmentKind) {
      case ZvBaseFCurve::ConstantSegment:
        take(k.rightValue);
        break;
      case ZvBaseFCurve::LinearSegment:
        take(k.rightValue);
        take(impl.keys[i + 1].leftValue);
        break;
      case ZvBaseFCurve::CubicSegment:
        if (i > 0 && (k.flags & CFCFlag_AutoTangent)) {
          const double before = impl.keys[i - 1].rightValue, after = impl.keys[i + 1].leftValue;
          const bool leftSide = upper ? before > after : before < after;
          take(leftSide ? impl.GetEvaluatedLeftTgtY(i) : impl.GetEvaluatedRightTgtY(i));
        } else {
          take(k.rightValue);
          take(impl.GetEvaluatedRightTgtY(i));
          take(impl.GetEvaluatedLeftTgtY(i + 1));
          take(impl.keys[i + 1].leftValue);
        }
        break;
      default:
        break;
    }
  }
  return bound;
}

}  // namespace

double ZvStdFCurveImpl::GetValueUpperBound() const {
  return PolygonBound(
      *this, [](double v, double b) { return v > b; }, true);
}

double ZvStdFCurveImpl::GetValueLowerBound() const {
  return PolygonBound(
      *this, [](double v, double b) { return v < b; }, false);
}

// Shortens a pair of handles (relative to keys i and i + 1) by 0.99 per round until the segment
// is a function. A handle without X extent is left alone, as shortening it cannot help.
int ZvStdFCurveImpl::ComputeBestMatchTangents(unsigned int i, ZvPoint2<double>& right,
                                              ZvPoint2<double>& left, unsigned int) const {
  if (i + 1 >= keys.size) return 0;
  const CFCStdKey& a = keys[i];
  const CFCStdKey& b = keys[i + 1];
  const ZvPoint2<double> p0{a.parameter, a.rightValue}, p3{b.parameter, b.leftValue};
  if (ZvStdFCurve_IsCubicSegmentValid(p0, p0 + right, p3 + left, p3)) return 1;
  const bool onlyLeft = Within(right.x, 1e-15);
  const bool onlyRight = !onlyLeft && Within(left.x, 1e-15);
  double s = 1.0;
  for (int round = 0; round < 1024; ++round) {
    s *= 0.99;
    const ZvPoint2<double> r = onlyLeft ? right : right * s;
    const ZvPoint2<double> l = onlyRight ? left : left * s;
    if (ZvStdFCurve_IsCubicSegmentValid(p0, p0 + r, p3 + l, p3)) {
      right = r;
      left = l;
      return 1;
    }
  }
  return 0;
}

int ZvStdFCurveImpl::IsValid() const {
  if (firstSegmentKind == 0) return 0;
  if (std::isnan(valueWhenNoKeys) || std::isnan(minClamp) || std::isnan(maxClamp)) return 0;
  if (minClamp > maxClamp) return 0;
  const unsigned int n = keys.size;
  if (n == 0) return 1;
  if (!KeysAreOrdered()) return 0;
  for (unsigned int i = 0; i + 1 < n; ++i) {
    const CFCStdKey& k = keys[i];
    const CFCStdKey& next = keys[i + 1];
    if (!(next.parameter > k.parameter) || k.segmentKind == 0) return 0;
    if (!ZvStdFCurve_IsCubicSegmentValid({k.parameter, k.rightValue}, k.rightTangent,
                                         next.leftTangent, {next.parameter, next.leftValue})) {
      return 0;
    }
  }
  return keys[n - 1].segmentKind != 0;
}

int ZvStdFCurveImpl::HasConstantValue() const {
  const unsigned int n = keys.size;
  if (n == 0) return 1;
  const double v = keys[0].leftValue;
  auto same = [v](double x) { return Within(x - v, 1e-15); };
  for (unsigned int i = 0; i + 1 < n; ++i) {
    const CFCStdKey& k = keys[i];
    if (!same(k.rightValue)) return 0;
    if (k.segmentKind == ZvBaseFCurve::ConstantSegment) continue;
    if (!same(keys[i + 1].leftValue)) return 0;
    if (k.segmentKind == ZvBaseFCurve::CubicSegment &&
        (!same(k.rightTangent.y) || !same(keys[i + 1].leftTangent.y))) {
      return 0;
    }
  }
  return same(keys[n - 1].rightValue);
}

// The box of a key, its evaluated handles and the control polygons of the segments touching
// it: what must be redrawn when the key changes.
int ZvStdFCurveImpl::ComputeKeyExtent(unsigned int i, ZvExtent2<double>& extent) const {
  const unsigned int n = keys.size;
  if (i >= n) return 0;
  extent = ZvExtent2<double>();
  const CFCStdKey& k = keys[i];
  extent.AddPoint(ZvPoint2<double>{k.parameter, k.leftValue});
  extent.AddPoint(ZvPoint2<double>{k.parameter, k.rightValue});
  extent.AddPoint(GetEvaluatedLeftTgt(i));
  extent.AddPoint(GetEvaluatedRightTgt(i));
  if (i > 0) {
    const CFCStdKey& prev = keys[i - 1];
    extent.AddPoint(ZvPoint2<double>{prev.parameter, prev.rightValue});
    if (prev.segmentKind == ZvBaseFCurve::CubicSegment)
      extent.AddPoint(GetEvaluatedRightTgt(i - 1));
  }
  if (i + 1 < n) {
    const CFCStdKey& next = keys[i + 1];
    extent.AddPoint(ZvPoint2<double>{next.parameter, next.leftValue});
    if (k.segmentKind == ZvBaseFCurve::CubicSegment) extent.AddPoint(GetEvaluatedLeftTgt(i + 1));
  }
  return 1;
}

int ZvStdFCurveImpl::ComputeNeighboringKeysExtent(double t, ZvExtent2<double>& extent) const {
  return NeighboringKeysExtent(*this, t, extent);
}
