// Key creation and removal on the standard curve. A key added inside a cubic segment splits it
// so that the shape stays; a key added beyond the ends gets handles a third of the way, with
// the tangent continued where the key asks for continuity.
#include "fcurve/std_fcurve_impl.h"

#include "fcurve/std_fcurve_bezier.h"

#include <cmath>

namespace {

CFCStdKey MakeKey(double parameter, double value, unsigned int kind) {
  CFCStdKey k{};
  k.leftTangent = {parameter, value};
  k.rightTangent = k.leftTangent;
  k.parameter = parameter;
  k.leftValue = value;
  k.rightValue = value;
  k.segmentKind = static_cast<unsigned char>(kind);
  k.flags = CFCFlag_TangentContinuity;
  return k;
}

bool IsZeroLength(const ZvPoint2<double>& handle, double x, double y) {
  const double dx = handle.x - x, dy = handle.y - y;
  const double l2 = dx * dx + dy * dy;
  return l2 >= -1e-15 && 1e-15 >= l2;
}

// A locked value may only be set to what it already is.
bool MayTakeValue(const CFCStdKey& k, double current, double value) {
  return !(k.flags & CFCFlag_ValueLock) || std::fabs(value - current) <= 1e-15;
}

}  // namespace

int ZvStdFCurveImpl::CreateKey(double parameter, double value, unsigned int left,
                               unsigned int right, ZvBaseFCurve& curve) {
  const unsigned int n = keys.size;
  if (n == 0) {
    keys.Add(MakeKey(parameter, value, right ? right : firstSegmentKind));
    valueWhenNoKeys = value;
    if (left) firstSegmentKind = left;
    return 1;
  }
  int found;
  const unsigned int at = LocateParameter(parameter, found);
  if (found) {
    if (keys[at - 1].flags & CFCFlag_ValueLock) return 0;
    SetValOnExistingKey(at - 1, value);
    return 1;
  }
  if (at >= n) {
    const unsigned int kind = keys[n - 1].segmentKind;
    return RemoveTailAndCreateKeyAfterExistingKey(parameter, value, left ? left : kind,
                                                  right ? right : kind, n - 1, curve);
  }
  if (at == 0) {
    return RemoveHeadAndCreateKeyBeforeExistingKey(parameter, value, left ? left : firstSegmentKind,
                                                   right ? right : firstSegmentKind, 0, curve);
  }
  const unsigned int kind = keys[at - 1].segmentKind;
  RemoveBodyAndCreateKeyBetweenExistingKeys(parameter, value, left ? left : kind,
                                            right ? right : kind, at - 1, at, curve);
  return 1;
}

void ZvStdFCurveImpl::SetValOnExistingKey(unsigned int i, double value) {
  CFCStdKey& k = keys[i];
  k.leftTangent.y += value - EffectiveLeftValue(i);
  k.rightTangent.y += value - k.rightValue;
  if (MayTakeValue(k, k.leftValue, value)) k.leftValue = value;
  if (MayTakeValue(k, k.rightValue, value)) k.rightValue = value;
  if (i == 0) valueWhenNoKeys = value;
}

int ZvStdFCurveImpl::RemoveTailAndCreateKeyAfterExistingKey(double parameter, double value,
                                                            unsigned int left, unsigned int right,
                                                            unsigned int k, ZvBaseFCurve& curve) {
  const unsigned int n = keys.size;
  CFCStdKey& key = keys[k];
  const double x = key.parameter;
  const double third = (parameter - x) / 3.0;
  if (k + 1 == n) {
    if (k > 0 && (key.flags & CFCFlag_TangentContinuity)) {
      // Continue the left handle through the key.
      const double d = key.leftTangent.x - x;
      const double rise = key.leftTangent.y - key.leftValue;
      if (std::fabs(d) <= 1e-7) {
        key.rightTangent = {x, key.rightValue - (rise >= 0.0 ? third : -third)};
      } else {
        key.rightTangent = {x + third, key.rightValue + rise * third / d};
      }
    } else {
      key.rightTangent = {x + third, key.rightValue};
    }
  } else {
    RegularizeRightTgt(k, {parameter, value});
  }
  if (k == 0 && IsZeroLength(key.leftTangent, x, key.leftValue)) {
    key.leftTangent = {2.0 * x - key.rightTangent.x,
                       key.leftValue - (key.rightTangent.y - key.rightValue)};
  }
  key.segmentKind = static_cast<unsigned char>(left);
  if (k + 1 < n) RemoveWithUserData(k + 1, n - 1, curve);
  CFCStdKey added = MakeKey(parameter, value, right);
  const double handleX =
      defaultBezierTangentConstraint ? parameter + (x - parameter) / 3.0 : parameter - third;
  added.leftTangent = {handleX, value};
  added.rightTangent = {2.0 * parameter - handleX, value};
  keys.Add(added);
  return 1;
}

int ZvStdFCurveImpl::RemoveHeadAndCreateKeyBeforeExistingKey(double parameter, double value,
                                                             unsigned int left, unsigned int right,
                                                             unsigned int k, ZvBaseFCurve& curve) {
  const unsigned int n = keys.size;
  CFCStdKey& key = keys[k];
  const double x = key.parameter;
  const double third = (x - parameter) / 3.0;
  if (k == 0) {
    if (n > 1 && (key.flags & CFCFlag_TangentContinuity)) {
      const double d = key.rightTangent.x - x;
      const double rise = key.rightTangent.y - key.rightValue;
      if (std::fabs(d) <= 1e-7) {
        key.leftTangent = {x, key.leftValue - (rise >= 0.0 ? third : -third)};
      } else {
        key.leftTangent = {x - third, key.leftValue - rise * third / d};
      }
    } else {
      key.leftTangent = {x - third, key.leftValue};
    }
  } else {
    RegularizeLeftTgt(k, {parameter, value});
  }
  if (k + 1 == n && IsZeroLength(key.rightTangent, x, key.rightValue)) {
    key.rightTangent = {2.0 * x - key.leftTangent.x,
                        key.rightValue - (key.leftTangent.y - key.leftValue)};
  }
  if (k > 0) RemoveWithUserData(0, k - 1, curve);
  CFCStdKey added = MakeKey(parameter, value, right);
  const double handleX =
      defaultBezierTangentConstraint ? parameter + (x - parameter) / 3.0 : parameter + third;
  added.rightTangent = {handleX, value};
  added.leftTangent = {2.0 * parameter - handleX, value};
  keys.InsertBefore(0, added);
  valueWhenNoKeys = value;
  firstSegmentKind = left;
  return 1;
}

// Splits the cubic between the kept keys a and b at the parameter. 0 for a new key, -1 when the
// parameter fell on key a and 1 when on key b (the value then goes on that key).
int ZvStdFCurveImpl::RemoveBodyAndCreateKeyBetweenExistingKeys(double parameter, double value,
                                                               unsigned int left,
                                                               unsigned int right, unsigned int a,
                                                               unsigned int b,
                                                               ZvBaseFCurve& curve) {
  const bool merged = b > a + 1;
  ZvPoint2<double> keptRight{}, keptLeft{};
  if (merged) {
    keptRight = keys[a].rightTangent - ZvPoint2<double>{keys[a].parameter, keys[a].rightValue};
    keptLeft = keys[b].leftTangent - ZvPoint2<double>{keys[b].parameter, keys[b].leftValue};
    keys[a].segmentKind = ZvBaseFCurve::CubicSegment;
    SetupBezierCubicWhenRemoving(a, b);
    RemoveWithUserData(a + 1, b - 1, curve);
    b = a + 1;
  }
  const CFCStdKey& ka = keys[a];
  const CFCStdKey& kb = keys[b];
  const ZvPoint2<double> p[4] = {
      {ka.parameter, ka.rightValue}, ka.rightTangent, kb.leftTangent, {kb.parameter, kb.leftValue}};
  const double u = InvertParamCubic(parameter, p[0].x, p[1].x, p[2].x, p[3].x);
  if (u >= -1e-15 && 1e-15 >= u) {
    SetValOnExistingKey(a, value);
    return -1;
  }
  if (u - 1.0 >= -1e-15 && 1e-15 >= u - 1.0) {
    SetValOnExistingKey(b, value);
    return 1;
  }
  const double w = (parameter - p[0].x) / (p[3].x - p[0].x);
  const double v = 1.0 - u;
  const ZvPoint2<double> q01 = p[0] * v + p[1] * u, q12 = p[1] * v + p[2] * u,
                         q23 = p[2] * v + p[3] * u;
  const ZvPoint2<double> r0 = q01 * v + q12 * u, r1 = q12 * v + q23 * u;
  ZvPoint2<double> s = r0 * v + r1 * u;
  s.x = parameter;
  ZvPoint2<double> lp[4] = {p[0], p[0] + (p[1] - p[0]) * w, r0, s};
  ZvPoint2<double> rp[4] = {s, r1, p[3] + (p[2] - p[3]) * (1.0 - w), p[3]};
  BezierCubicRegularize(lp);
  BezierCubicRegularize(rp);
  CFCStdKey added = MakeKey(parameter, value, right);
  keys[a].segmentKind = static_cast<unsigned char>(left);
  keys.InsertBefore(b, added);
  const unsigned int m = b;
  const ZvPoint2<double> shift{0.0, value - s.y};
  SetActualRightTgt(a, lp[1]);
  SetActualLeftTgt(m, lp[2] + shift);
  SetActualRightTgt(m, rp[1] + shift);
  SetActualLeftTgt(m + 1, rp[2]);
  if (merged) {
    // Fit the handles the outer keys had before the merge to the two new segments.
    ZvPoint2<double> newLeft = keys[m].leftTangent - ZvPoint2<double>{parameter, value};
    if (ComputeBestMatchTangents(a, keptRight, newLeft, 0)) {
      keys[a].rightTangent = ZvPoint2<double>{keys[a].parameter, keys[a].rightValue} + keptRight;
    }
    ZvPoint2<double> newRight = keys[m].rightTangent - ZvPoint2<double>{parameter, value};
    if (ComputeBestMatchTangents(m, newRight, keptLeft, 0)) {
      keys[m + 1].leftTangent =
          ZvPoint2<double>{keys[m + 1].parameter, keys[m + 1].leftValue} + keptLeft;
    }
  }
  return 0;
}

int ZvStdFCurveImpl::RemoveAllKeysAndCreateNewKey(double parameter, double value, unsigned int left,
                                                  unsigned int right, ZvBaseFCurve& curve) {
  curve.RemoveAllKeyUserData();
  DropAllKeys();
  keys.Add(MakeKey(parameter, value, right));
  firstSegmentKind = left;
  valueWhenNoKeys = value;
  return 1;
}

void ZvStdFCurveImpl::ResolveAutoTangent(unsigned int i) {
  CFCStdKey& k = keys[i];
  if (!(k.flags & CFCFlag_AutoTangent)) return;
  const ZvPoint2<double> l = GetEvaluatedLeftTgt(i), r = GetEvaluatedRightTgt(i);
  SetActualLeftTgt(i, l);
  SetActualRightTgt(i, r);
  k.flags = static_cast<unsigned short>(k.flags & ~CFCFlag_AutoTangent);
}

int ZvStdFCurveImpl::CreateNonModifyingKey(double parameter, unsigned int& index,
                                           ZvBaseFCurve& curve) {
  const unsigned int n = keys.size;
  if (n == 0) {
    CreateKey(parameter, valueWhenNoKeys, firstSegmentKind, firstSegmentKind, curve);
    index = 0;
    return 1;
  }
  int found;
  const unsigned int at = LocateParameter(parameter, found);
  if (found) {
    index = at - 1;
    return 1;
  }
  if (at >= n) {
    ResolveAutoTangent(n - 1);
    const unsigned int kind = keys[n - 1].segmentKind;
    CreateKey(parameter, keys[n - 1].rightValue, kind, kind, curve);
    index = n;
    return 1;
  }
  if (at == 0) {
    ResolveAutoTangent(0);
    CreateKey(parameter, keys[0].leftValue, firstSegmentKind, firstSegmentKind, curve);
    index = 0;
    return 1;
  }
  ResolveAutoTangent(at - 1);
  ResolveAutoTangent(at);
  const double value = EvalJustAfterIndex(parameter, at - 1);
  const unsigned int kind = keys[at - 1].segmentKind;
  const int onKey =
      RemoveBodyAndCreateKeyBetweenExistingKeys(parameter, value, kind, kind, at - 1, at, curve);
  index = onKey < 0 ? at - 1 : at;
  return 1;
}

// Keeps the shape of the cubic that replaces the segments from key a to key b: both outer
// handles keep their directions and stretch with the span.
void ZvStdFCurveImpl::SetupBezierCubicWhenRemoving(unsigned int a, unsigned int b) {
  CFCStdKey& ka = keys[a];
  CFCStdKey& kb = keys[b];
  const double span = kb.parameter - ka.parameter;
  ZvPoint2<double> p[4] = {
      {ka.parameter, ka.rightValue}, ka.rightTangent, kb.leftTangent, {kb.parameter, kb.leftValue}};
  const ZvPoint2<double> r = (p[1] - p[0]) * (span / (keys[a + 1].parameter - ka.parameter));
  const ZvPoint2<double> l = (p[2] - p[3]) * (span / (kb.parameter - keys[b - 1].parameter));
  p[1] = std::sqrt(ZvDot(r, r)) <= 1e-7 ? p[0] : p[0] + r;
  p[2] = std::sqrt(ZvDot(l, l)) <= 1e-7 ? p[3] : p[3] + l;
  BezierCubicRegularize(p);
  ka.rightTangent = p[1];
  kb.leftTangent = p[2];
}

int ZvStdFCurveImpl::RemoveKey(double parameter, unsigned int kind, double tolerance,
                               ZvBaseFCurve& curve) {
  unsigned int i;
  if (!GetClosestKeyIndexInCenteredInterval(parameter, tolerance, i)) return 0;
  const unsigned int n = keys.size;
  if (kind == 0) kind = i > 0 ? keys[i - 1].segmentKind : firstSegmentKind;
  if (n == 1) {
    curve.RemoveAllKeyUserData();
    DropAllKeys();
    firstSegmentKind = kind;
    return 1;
  }
  if (i == 0) return RemoveHeadBeforeExistingKey(kind, 1, curve);
  keys[i - 1].segmentKind = static_cast<unsigned char>(kind);
  if (i + 1 < n) SetupBezierCubicWhenRemoving(i - 1, i + 1);
  RemoveWithUserData(i, i, curve);
  return 1;
}

// Removes the first k keys. A discontinuity on the new first key closes onto its right value,
// since nothing arrives from the left any more.
int ZvStdFCurveImpl::RemoveHeadBeforeExistingKey(unsigned int kind, unsigned int k,
                                                 ZvBaseFCurve& curve) {
  if (k > 0) RemoveWithUserData(0, k - 1, curve);
  if (keys.size) {
    CFCStdKey& first = keys[0];
    const double jump = first.rightValue - first.leftValue;
    if (std::fabs(jump) > 1e-15 && !(first.flags & CFCFlag_ValueLock)) {
      first.leftTangent.y += jump;
      first.leftValue = first.rightValue;
    }
    valueWhenNoKeys = first.leftValue;
  }
  firstSegmentKind = kind;
  return 1;
}

int ZvStdFCurveImpl::RemoveTailAfterExistingKey(unsigned int kind, unsigned int k,
                                                ZvBaseFCurve& curve) {
  if (k + 1 < keys.size) RemoveWithUserData(k + 1, keys.size - 1, curve);
  keys[k].segmentKind = static_cast<unsigned char>(kind);
  return 1;
}

int ZvStdFCurveImpl::RemoveBodyBetweenExistingKeys(unsigned int kind, unsigned int a,
                                                   unsigned int b, ZvBaseFCurve& curve) {
  if (b <= a + 1) return 1;
  keys[a].segmentKind = static_cast<unsigned char>(kind);
  SetupBezierCubicWhenRemoving(a, b);
  RemoveWithUserData(a + 1, b - 1, curve);
  return 1;
}
