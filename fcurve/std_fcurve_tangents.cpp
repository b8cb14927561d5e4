// Evaluated handles: what the curve really uses, computed from the stored handles and the flags
// of a key and of its neighbours.
#include "fcurve/std_fcurve_impl.h"

#include <cmath>

ZvStdFCurveImpl::ZvStdFCurveImpl(double valueWhenNoKeys, unsigned int firstKind) {
  this->valueWhenNoKeys = valueWhenNoKeys;
  firstSegmentKind = firstKind;
}

double ZvStdFCurveImpl::EffectiveLeftValue(unsigned int i) const {
  if (i > 0 && keys[i - 1].segmentKind == ZvBaseFCurve::ConstantSegment) {
    return keys[i - 1].rightValue;
  }
  return keys[i].leftValue;
}

int ZvStdFCurveImpl::IsKeyAnExtremum(unsigned int i) const {
  const unsigned int n = keys.size;
  if (i == 0 || i + 1 >= n) return 1;
  const double l = keys[i].leftValue, r = keys[i].rightValue;
  const double p = keys[i - 1].rightValue, nx = keys[i + 1].leftValue;
  const double jump = r - l;
  if (jump >= -1e-15 && 1e-15 >= jump) return (nx >= r && p >= r) || (r >= nx && r >= p);
  return (nx >= r && p >= r) || (r >= p && r >= nx) || (p >= l && nx >= l) || (l >= nx && l >= p);
}

namespace {

bool IsFlattened(unsigned short f, const ZvStdFCurveImpl& impl, unsigned int i) {
  return (f & CFCFlag_FlatTangent) || ((f & CFCFlag_FlatAtExtremum) && impl.IsKeyAnExtremum(i));
}

}  // namespace

// X of the evaluated right handle. Automatic handles reach a third of the way to the next key,
// but only when that key is automatic too.
double ZvStdFCurveImpl::EvaluatedRightX(unsigned int i) const {
  const CFCStdKey& k = keys[i];
  const unsigned short f = k.flags;
  if (f & CFCFlag_CollapsedTangent) return k.parameter;
  if (IsFlattened(f, *this, i)) return k.rightTangent.x;
  if ((f & CFCFlag_AutoTangent) && i + 1 < keys.size && (keys[i + 1].flags & CFCFlag_AutoTangent)) {
    return k.parameter + (keys[i + 1].parameter - k.parameter) / 3.0;
  }
  return k.rightTangent.x;
}

ZvPoint2<double> ZvStdFCurveImpl::DerivedRightTgt(unsigned int i) const {
  const CFCStdKey& k = keys[i];
  const unsigned short f = k.flags;
  if (f & CFCFlag_CollapsedTangent) return {k.parameter, k.rightValue};
  if (IsFlattened(f, *this, i)) return {k.rightTangent.x, k.rightValue};
  // FlatAtExtremum away from an extremum.
  if (!(f & (CFCFlag_AutoTangent | CFCFlag_ChordTangent))) return k.rightTangent;
  return {EvaluatedRightX(i), GetEvaluatedRightTgtY(i)};
}

double ZvStdFCurveImpl::GetEvaluatedRightTgtY(unsigned int i) const {
  const unsigned int n = keys.size;
  const CFCStdKey& k = keys[i];
  const unsigned short f = k.flags;
  if ((f & (CFCFlag_FlatTangent | CFCFlag_CollapsedTangent)) ||
      ((f & CFCFlag_FlatAtExtremum) && IsKeyAnExtremum(i))) {
    return k.rightValue;
  }
  const bool hasNext = i + 1 < n;
  const bool autoPair =
      (f & CFCFlag_AutoTangent) && hasNext && (keys[i + 1].flags & CFCFlag_AutoTangent);
  const double x =
      autoPair ? k.parameter + (keys[i + 1].parameter - k.parameter) / 3.0 : k.rightTangent.x;
  if (f & CFCFlag_ChordTangent) {
    if (!hasNext) return k.rightValue;
    const CFCStdKey& next = keys[i + 1];
    return k.rightValue +
           (x - k.parameter) * (next.leftValue - k.rightValue) / (next.parameter - k.parameter);
  }
  if (!(f & CFCFlag_AutoTangent)) return k.rightTangent.y;
  if (i > 0 && hasNext) {
    const CFCStdKey& prev = keys[i - 1];
    const CFCStdKey& next = keys[i + 1];
    return k.rightValue + (x - k.parameter) * (next.leftValue - prev.rightValue) /
                              (next.parameter - prev.parameter);
  }
  return k.rightValue;  // an automatic end key is flat
}

ZvPoint2<double> ZvStdFCurveImpl::DerivedLeftTgt(unsigned int i) const {
  const CFCStdKey& k = keys[i];
  const unsigned short f = k.flags;
  if (f & CFCFlag_CollapsedTangent) return {k.parameter, k.leftValue};
  if (IsFlattened(f, *this, i)) return {k.leftTangent.x, k.leftValue};
  // FlatAtExtremum away from an extremum.
  if (!(f & (CFCFlag_AutoTangent | CFCFlag_ChordTangent))) return k.leftTangent;
  // Unlike the right handle, the neighbour's flags are not consulted here.
  double x = k.leftTangent.x;
  if (i > 0 && ((f & CFCFlag_AutoTangent) || !(f & CFCFlag_ChordTangent))) {
    x = k.parameter + (keys[i - 1].parameter - k.parameter) / 3.0;
  }
  return {x, GetEvaluatedLeftTgtY(i)};
}

double ZvStdFCurveImpl::GetEvaluatedLeftTgtY(unsigned int i) const {
  const unsigned int n = keys.size;
  const CFCStdKey& k = keys[i];
  const unsigned short f = k.flags;
  if ((f & (CFCFlag_FlatTangent | CFCFlag_CollapsedTangent)) ||
      ((f & CFCFlag_FlatAtExtremum) && IsKeyAnExtremum(i))) {
    return k.leftValue;
  }
  if (f & CFCFlag_ChordTangent) {
    if (i == 0) return k.leftValue;
    const CFCStdKey& prev = keys[i - 1];
    const double x = (f & CFCFlag_AutoTangent) ? k.parameter + (prev.parameter - k.parameter) / 3.0
                                               : k.leftTangent.x;
    return k.leftValue +
           (k.leftValue - prev.rightValue) / (k.parameter - prev.parameter) * (x - k.parameter);
  }
  if (!(f & CFCFlag_AutoTangent)) return k.leftTangent.y;
  if (i > 0 && i + 1 < n) {
    const CFCStdKey& prev = keys[i - 1];
    const CFCStdKey& next = keys[i + 1];
    return k.leftValue + (next.leftValue - prev.rightValue) / (next.parameter - prev.parameter) *
                             (prev.parameter - k.parameter) / 3.0;
  }
  return k.leftValue;
}

void ZvStdFCurveImpl::GetSegmentControls(unsigned int i, ZvPoint2<double>* p) const {
  const CFCStdKey& k = keys[i];
  const CFCStdKey& next = keys[i + 1];
  const double x0 = k.parameter, x3 = next.parameter;
  double x2 = next.leftTangent.x;
  if (next.flags & CFCFlag_CollapsedTangent) {
    x2 = x3;
  } else if (next.flags & CFCFlag_AutoTangent) {
    x2 = x3 + (x0 - x3) / 3.0;
  }
  p[0] = {x0, k.rightValue};
  p[1] = {EvaluatedRightX(i), GetEvaluatedRightTgtY(i)};
  p[2] = {x2, GetEvaluatedLeftTgtY(i + 1)};
  p[3] = {x3, next.leftValue};
}
