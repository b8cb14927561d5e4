// ZvStdFCurve: operations on all keys at once - moving and scaling along either axis,
// resampling and smoothing.
#include <zv/std_fcurve.h>

#include "fcurve/fcurve_lock.h"
#include "fcurve/key_user_data_transit.h"
#include "fcurve/std_fcurve_impl.h"

#include <cfloat>
#include <cmath>

namespace {

bool AnyKeyHas(const ZvStdFCurveImpl& s, unsigned short bits) {
  for (unsigned int i = 0; i < s.keys.size; ++i) {
    if (s.keys[i].flags & bits) return true;
  }
  return false;
}

// With the default Bezier tangent constraint, handles sit at the thirds toward the neighbours.
void ReapplyHandleConstraint(ZvStdFCurveImpl& s) {
  if (!s.defaultBezierTangentConstraint) return;
  for (unsigned int i = 0; i < s.keys.size; ++i) {
    const ZvPoint2<double> l = s.keys[i].leftTangent, r = s.keys[i].rightTangent;
    s.SetActualLeftTgt(i, l);
    s.SetActualRightTgt(i, r);
  }
}

// v -> v * scale + offset on every value of the curve and on the handles' Y.
void MapValues(ZvStdFCurveImpl& s, double scale, double offset) {
  for (unsigned int i = 0; i < s.keys.size; ++i) {
    CFCStdKey& k = s.keys[i];
    k.leftValue = k.leftValue * scale + offset;
    k.rightValue = k.rightValue * scale + offset;
    k.leftTangent.y = k.leftTangent.y * scale + offset;
    k.rightTangent.y = k.rightTangent.y * scale + offset;
  }
  s.valueWhenNoKeys = s.valueWhenNoKeys * scale + offset;
}

}  // namespace

unsigned int ZvStdFCurve::ShiftParameters(double delta) {
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  if (s.readOnly || !std::isfinite(delta) || AnyKeyHas(s, CFCFlag_ParameterLock)) return 0;
  // Near the largest double a shift can merge keys or overflow them.
  if (!s.WouldBeOrdered(s.keys.size,
                        [&s, delta](unsigned int j) { return s.keys[j].parameter + delta; })) {
    return 0;
  }
  s.ShiftKeyParameters(delta, *this);
  ReapplyHandleConstraint(s);
  return 1;
}

unsigned int ZvStdFCurve::ScaleParameterAxis(double factor) {
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  // A factor of zero or below would merge or reverse the keys.
  if (s.readOnly || !(factor > 0.0) || !std::isfinite(factor) ||
      AnyKeyHas(s, CFCFlag_ParameterLock)) {
    return 0;
  }
  if (!s.WouldBeOrdered(s.keys.size,
                        [&s, factor](unsigned int j) { return s.keys[j].parameter * factor; })) {
    return 0;
  }
  s.ScaleKeyParameters(factor, *this);
  ReapplyHandleConstraint(s);
  return 1;
}

unsigned int ZvStdFCurve::ShiftValues(double delta) {
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  if (s.readOnly || !std::isfinite(delta) || AnyKeyHas(s, CFCFlag_ValueLock)) return 0;
  MapValues(s, 1.0, delta);
  return 1;
}

unsigned int ZvStdFCurve::ScaleAndShiftValues(double scale, double offset) {
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  if (s.readOnly || !std::isfinite(scale) || !std::isfinite(offset) ||
      AnyKeyHas(s, CFCFlag_ValueLock)) {
    return 0;
  }
  MapValues(s, scale, offset);
  return 1;
}

unsigned int ZvStdFCurve::MirrorValues() {
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  if (s.readOnly || AnyKeyHas(s, CFCFlag_ValueLock)) return 0;
  MapValues(s, -1.0, 0.0);
  return 1;
}

// Under the cycle methods the interval is folded into the keyed range first: within one period
// the folded interval is resampled; across a period boundary the two folded pieces up to the
// ends of the keys; over more than a period the whole key range.
unsigned int ZvStdFCurve::ResampleSequence(double start, double end, double step,
                                           int keepExistingKeys, int) {
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  if (s.readOnly || !std::isfinite(start) || !std::isfinite(end)) return 0;
  return s.ForFoldedRanges(start, end, [&](double a, double b) {
    return ZvStdFCurveImpl::Engine::ResampleKeys(s, a, b, step, keepExistingKeys, *this);
  });
}

unsigned int ZvStdFCurve::SmoothSequence(double start, double end, const double* kernel,
                                         unsigned int kernelSize) {
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  unsigned int first, last;
  if (s.readOnly || !s.GetKeyIndicesInInterval(start, end, first, last, 0, 0)) return 0;
  return s.SmoothSequence(first, last, kernel, kernelSize, *this);
}

// The curve turns about the middle of its keys: t -> first + last - t. A key's left side becomes
// its right side; the value that arrives at a key (across a step, the step's value) is the one
// that now leaves it, so steps keep their values. Each key takes the kind of the segment that
// now follows it.
unsigned int ZvStdFCurve::MirrorParameters() {
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  if (s.readOnly || AnyKeyHas(s, CFCFlag_ParameterLock)) return 0;
  const unsigned int n = s.keys.size;
  if (n == 0) return 1;
  const double sum = s.keys[0].parameter + s.keys[n - 1].parameter;
  // Far-apart keys lose their distance in the sum: mirrored, near ones would merge.
  if (!s.WouldBeOrdered(
          n, [&s, n, sum](unsigned int j) { return sum - s.keys[n - 1 - j].parameter; })) {
    return 0;
  }
  // The user data sets travel with their keys, so they are taken out first.
  CFCKeyUserDataInTransit sets(*this, n, [&s](unsigned int i) { return s.keys[i].parameter; });
  ZvAltDynArray<CFCStdKey> mirrored(n);
  for (unsigned int j = 0; j < n; ++j) {
    const unsigned int i = n - 1 - j;
    const CFCStdKey& old = s.keys[i];
    CFCStdKey k = old;
    k.parameter = sum - old.parameter;
    k.leftValue = old.rightValue;
    k.rightValue = s.EffectiveLeftValue(i);
    const double lx = sum - old.rightTangent.x, rx = sum - old.leftTangent.x;
    k.leftTangent = {lx < k.parameter ? lx : k.parameter, old.rightTangent.y};
    k.rightTangent = {rx > k.parameter ? rx : k.parameter,
                      old.leftTangent.y + (k.rightValue - old.leftValue)};
    k.segmentKind =
        static_cast<unsigned char>(i > 0 ? s.keys[i - 1].segmentKind : s.firstSegmentKind);
    mirrored.Add(k);
  }
  s.firstSegmentKind = s.keys[n - 1].segmentKind;
  s.valueWhenNoKeys = s.keys[n - 1].rightValue;
  s.keys = mirrored;
  s.searchHint = 0;
  sets.GiveBackReversed([&s](unsigned int j) { return s.keys[j].parameter; });
  ReapplyHandleConstraint(s);
  return 1;
}
