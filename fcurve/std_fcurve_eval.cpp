// Point evaluation of the standard curve: segments, the linear extensions beyond the keys and
// the four extrapolation methods. This is the hot path: it allocates nothing and finds its
// segment through the store's hinted search.
#include "fcurve/std_fcurve_impl.h"

#include <cmath>
#include <cstdint>
#include <cstring>

namespace {

// Flags under which a key's handles on the evaluation path differ from the stored ones.
constexpr unsigned short kComputedHandleFlags = CFCFlag_FlatTangent | CFCFlag_FlatAtExtremum |
                                                CFCFlag_AutoTangent | CFCFlag_CollapsedTangent |
                                                CFCFlag_ChordTangent;

std::uint64_t Bits(double v) {
  std::uint64_t b;
  std::memcpy(&b, &v, sizeof b);
  return b;
}

}  // namespace

double ZvStdFCurveImpl::EvalCubicSegment(double t, unsigned int i, bool keep) const {
  const CFCStdKey& k = keys[i];
  const CFCStdKey& next = keys[i + 1];
  if ((k.flags | next.flags) & kComputedHandleFlags) {
    ZvPoint2<double> p[4];
    GetSegmentControls(i, p);
    return ZvCubicFunctionSegment(p[0].x, p[1].x, p[2].x, p[3].x, p[0].y, p[1].y, p[2].y, p[3].y)
        .Eval(t);
  }
  // The fields a segment between keys with stored handles is built from, compared to the bit:
  // a NaN matches itself, 0 and -0 differ.
  const double in[8] = {k.parameter,  k.rightTangent.x, next.leftTangent.x, next.parameter,
                        k.rightValue, k.rightTangent.y, next.leftTangent.y, next.leftValue};
  PlainSegmentMemo& memo = m_plainSegment;
  std::uint64_t differ = memo.filled ? 0 : 1;
  for (int j = 0; j < 8; ++j)
    differ |= Bits(in[j]) ^ memo.inputs[j];
  if (!differ) return memo.segment.Eval(t);
  const ZvCubicFunctionSegment segment(in[0], in[1], in[2], in[3], in[4], in[5], in[6], in[7]);
  if (keep) {
    for (int j = 0; j < 8; ++j)
      memo.inputs[j] = Bits(in[j]);
    memo.segment = segment;
    memo.filled = true;
  }
  return segment.Eval(t);
}

double ZvStdFCurveImpl::EvalJustAfterIndex(double t, unsigned int i) const {
  return EvalSegment(t, i, true);
}

double ZvStdFCurveImpl::EvalSegment(double t, unsigned int i, bool keep) const {
  const CFCStdKey& k = keys[i];
  switch (k.segmentKind) {
    case ZvBaseFCurve::ConstantSegment:
      return k.rightValue;
    case ZvBaseFCurve::LinearSegment: {
      const CFCStdKey& next = keys[i + 1];
      return k.rightValue +
             (next.leftValue - k.rightValue) * (t - k.parameter) / (next.parameter - k.parameter);
    }
    case ZvBaseFCurve::CubicSegment:
      return EvalCubicSegment(t, i, keep);
    default:
      return 0.0;  // unknown kind: a hole in the data, not an error
  }
}

namespace {

constexpr double kDegenerateHandle = 1e-7;  // squared length of a handle too short to steer
constexpr double kHandleNudge = 1e-7;       // keeps a vertical handle's slope finite

double Chord(const CFCStdKey& a, const CFCStdKey& b, double t) {
  return a.rightValue +
         (t - a.parameter) * (b.leftValue - a.rightValue) / (b.parameter - a.parameter);
}

}  // namespace

// Beyond the last key the curve follows its last tangent: the right handle if it has a
// length, else the left handle, else the chord from the previous key. The line is anchored at
// the key's left value.
double ZvStdFCurveImpl::GetValueAfterLastKeyWhenLinear(double t) const {
  const unsigned int n = keys.size;
  const CFCStdKey& last = keys[n - 1];
  if (n == 1) return last.rightValue;
  const CFCStdKey& prev = keys[n - 2];
  switch (prev.segmentKind) {
    case ZvBaseFCurve::ConstantSegment:
      return last.rightValue;
    case ZvBaseFCurve::LinearSegment:
      return Chord(prev, last, t);
    case ZvBaseFCurve::CubicSegment: {
      if ((last.flags & CFCFlag_FlatTangent) ||
          ((last.flags & CFCFlag_FlatAtExtremum) && IsKeyAnExtremum(n - 1))) {
        return last.rightValue;
      }
      double dx = last.rightTangent.x - last.parameter;
      const double dy = last.rightTangent.y - last.rightValue;
      if (dx * dx + dy * dy >= kDegenerateHandle) {
        if (std::fabs(dx) < kHandleNudge) dx += kHandleNudge;
        return last.leftValue + (t - last.parameter) * (last.rightTangent.y - last.leftValue) / dx;
      }
      double lx = last.leftTangent.x;
      const double ldx = lx - last.parameter, ldy = last.leftTangent.y - last.leftValue;
      if (ldx * ldx + ldy * ldy < kDegenerateHandle) return Chord(prev, last, t);
      if (last.parameter - lx < kHandleNudge) lx -= kHandleNudge;
      return last.leftValue +
             (t - last.parameter) * (last.leftValue - last.leftTangent.y) / (last.parameter - lx);
    }
    default:
      return 0.0;
  }
}

// The mirror on the first key, anchored at its right value; FlatAtExtremum counts without an
// extremum test, an end key always being one.
double ZvStdFCurveImpl::GetValueBeforeFirstKeyWhenLinear(double t) const {
  const unsigned int n = keys.size;
  const CFCStdKey& first = keys[0];
  if (n == 1) return first.leftValue;
  const CFCStdKey& second = keys[1];
  switch (first.segmentKind) {
    case ZvBaseFCurve::ConstantSegment:
      return first.leftValue;
    case ZvBaseFCurve::LinearSegment:
      return Chord(first, second, t);
    case ZvBaseFCurve::CubicSegment: {
      if (first.flags & (CFCFlag_FlatTangent | CFCFlag_FlatAtExtremum)) return first.leftValue;
      double lx = first.leftTangent.x;
      const double ldx = lx - first.parameter, ldy = first.leftTangent.y - first.leftValue;
      if (ldx * ldx + ldy * ldy >= kDegenerateHandle) {
        if (first.parameter - lx < kHandleNudge) lx -= kHandleNudge;
        return first.rightValue + (t - first.parameter) * (first.rightValue - first.leftTangent.y) /
                                      (first.parameter - lx);
      }
      double rx = first.rightTangent.x;
      const double rdx = rx - first.parameter, rdy = first.rightTangent.y - first.rightValue;
      if (rdx * rdx + rdy * rdy < kDegenerateHandle) return Chord(first, second, t);
      if (rx - first.parameter < kHandleNudge) rx += kHandleNudge;
      return first.rightValue + (t - first.parameter) * (first.rightTangent.y - first.rightValue) /
                                    (rx - first.parameter);
    }
    default:
      return 0.0;
  }
}

double ZvStdFCurveImpl::EvalRight(double t) const {
  const unsigned int n = keys.size;
  if (n == 0) return valueWhenNoKeys;
  int found;
  const unsigned int at = LocateParameter(t, found);
  if (found) return keys[at - 1].rightValue;
  if (at >= n) return keys[n - 1].rightValue;
  if (at == 0) return keys[0].leftValue;
  return EvalJustAfterIndex(t, at - 1);
}

double ZvStdFCurveImpl::EvalLeft(double t) const {
  const unsigned int n = keys.size;
  if (n == 0) return valueWhenNoKeys;
  int found;
  const unsigned int at = LocateParameter(t, found);
  if (found) return EffectiveLeftValue(at - 1);
  if (at >= n) return keys[n - 1].rightValue;
  if (at == 0) return keys[0].leftValue;
  return EvalJustAfterIndex(t, at - 1);
}

double ZvStdFCurveImpl::CycleOffsetFold(double t, double& cycles, bool left) const {
  const unsigned int n = keys.size;
  const double first = keys[0].parameter, last = keys[n - 1].parameter;
  const double period = last - first;
  const double r = (t - first) / period;
  double folded;
  if (left) {
    cycles = std::floor(r);
    if (first - t <= 1e-9) {
      const double w = period * (r - std::floor(r));
      folded = std::fabs(w) <= 1e-9 ? first : first + w;
    } else {
      const double w = period * (std::ceil(r) - r);
      folded = std::fabs(w) <= 1e-9 ? first : last - w;
    }
  } else {
    cycles = std::ceil(r) - 1.0;
    if (t > first) {
      const double w = period * (r - std::floor(r));
      folded = std::fabs(w) <= 1e-9 ? last : first + w;
    } else {
      const double w = period * (std::ceil(r) - r);
      folded = std::fabs(w) <= 1e-9 ? last : last - w;
    }
  }
  if (folded < first) folded = first;
  if (folded > last) folded = last;
  return folded;
}

double ZvStdFCurveImpl::EvalRightUsingExtrapolationMethod(double t) const {
  const unsigned int n = keys.size;
  if (n == 0) return valueWhenNoKeys;
  int found;
  switch (extrapolation) {
    case ZvBaseFCurve::LinearExtrapolation: {
      const unsigned int at = LocateParameter(t, found);
      if (found) return keys[at - 1].rightValue;
      if (at >= n) return GetValueAfterLastKeyWhenLinear(t);
      if (at == 0) return GetValueBeforeFirstKeyWhenLinear(t);
      return EvalJustAfterIndex(t, at - 1);
    }
    case ZvBaseFCurve::CycleExtrapolation: {
      FoldParameter(t);
      const unsigned int at = LocateParameter(t, found);
      if (found) {
        // The right limit at the end of a period is the start of the next one.
        if (n >= 2 && at == n) return keys[0].rightValue;
        return keys[at - 1].rightValue;
      }
      if (at >= n) return keys[n - 1].rightValue;
      if (at == 0) return keys[0].leftValue;
      return EvalJustAfterIndex(t, at - 1);
    }
    case ZvBaseFCurve::CycleWithOffsetExtrapolation: {
      const double delta = keys[n - 1].rightValue - keys[0].rightValue;
      double cycles = 0.0;
      if (n >= 2) t = CycleOffsetFold(t, cycles, false);
      const unsigned int at = LocateParameter(t, found);
      if (found) {
        if (n >= 2 && at == n) return cycles * delta + (keys[0].rightValue + delta);
        return delta * cycles + keys[at - 1].rightValue;
      }
      if (at >= n) return keys[n - 1].rightValue;
      if (at == 0) return keys[0].leftValue;
      return delta * cycles + EvalJustAfterIndex(t, at - 1);
    }
    default:
      return EvalRight(t);
  }
}

double ZvStdFCurveImpl::EvalLeftUsingExtrapolationMethod(double t) const {
  const unsigned int n = keys.size;
  if (n == 0) return valueWhenNoKeys;
  int found;
  switch (extrapolation) {
    case ZvBaseFCurve::LinearExtrapolation: {
      const unsigned int at = LocateParameter(t, found);
      if (found) return EffectiveLeftValue(at - 1);
      if (at >= n) return GetValueAfterLastKeyWhenLinear(t);
      if (at == 0) return GetValueBeforeFirstKeyWhenLinear(t);
      return EvalJustAfterIndex(t, at - 1);
    }
    case ZvBaseFCurve::CycleExtrapolation: {
      FoldParameter(t);
      const unsigned int at = LocateParameter(t, found);
      if (found) {
        // The left limit at the start of a period is the end of the previous one.
        if (n >= 2 && at == 1) return EffectiveLeftValue(n - 1);
        return EffectiveLeftValue(at - 1);
      }
      if (at >= n) return keys[n - 1].rightValue;
      if (at == 0) return keys[0].leftValue;
      return EvalJustAfterIndex(t, at - 1);
    }
    case ZvBaseFCurve::CycleWithOffsetExtrapolation: {
      // The offset runs from the first left value here, not from the first right value.
      const double delta = keys[n - 1].rightValue - keys[0].leftValue;
      double cycles = 0.0;
      if (n >= 2) t = CycleOffsetFold(t, cycles, true);
      const unsigned int at = LocateParameter(t, found);
      if (found) {
        if (n >= 2 && at == 1) return cycles * delta + keys[n - 1].rightValue - delta;
        if (n == 1) return cycles * delta + keys[0].leftValue;
        return delta * cycles + EffectiveLeftValue(at - 1);
      }
      if (at >= n) return keys[n - 1].rightValue;
      if (at == 0) return keys[0].leftValue;
      return delta * cycles + EvalJustAfterIndex(t, at - 1);
    }
    default:
      return EvalLeft(t);
  }
}

inline int ZvStdFCurveImpl::EvalClearOfKeys(double t, double& v) const {
  const unsigned int n = keys.size;
  const unsigned int hint = searchHint;
  const double clearance = 2.0 * kCFCSnapTolerance;
  // Clear of both keys that bracket it by twice the snap tolerance, t is not within the
  // parameter epsilon of any key, nor is t minus the snap tolerance: every search then finds
  // these two keys and leaves the hint on the lower one, whatever hint it starts from, so the
  // snap leaves t alone and the evaluation's own search repeats this one. Sequential
  // parameters mostly fall between the two keys at the hint, which needs no search at all.
  unsigned int at;
  if (hint < n - 1 && t - keys[hint].parameter > clearance &&
      keys[hint + 1].parameter - t > clearance) {
    at = hint + 1;
  } else {
    int found;
    at = LocateParameter(t, found);
    // Unless found, the located keys bracket t and every other key lies farther. Near a key
    // the snap must search from the hint it was given.
    if ((at > 0 && !(t - keys[at - 1].parameter > clearance)) ||
        (at < n && !(keys[at].parameter - t > clearance))) {
      searchHint = hint;
      return -1;
    }
  }
  const unsigned int method = extrapolation;
  if (method == ZvBaseFCurve::CycleWithOffsetExtrapolation) return 0;
  if (at > 0 && at < n) {
    // Strictly inside the keyed range the cycle's fold leaves t as it is. Only a parameter in
    // the segment of the search before or next to it keeps its segment: a sweep uses it for
    // its next steps, scattered parameters would only pay for keeping it.
    const unsigned int segment = at - 1;
    v = EvalSegment(t, segment, segment == hint || segment == hint + 1 || segment + 1 == hint);
    return 1;
  }
  if (method == ZvBaseFCurve::CycleExtrapolation) return 0;
  const bool linear = method == ZvBaseFCurve::LinearExtrapolation;
  if (at >= n) {
    v = linear ? GetValueAfterLastKeyWhenLinear(t) : keys[n - 1].rightValue;
  } else {
    v = linear ? GetValueBeforeFirstKeyWhenLinear(t) : keys[0].leftValue;
  }
  return 1;
}

double ZvStdFCurveImpl::EvalSnapped(double t, bool left) const {
  if (keys.size == 0) return valueWhenNoKeys;
  double v;
  const int clear = EvalClearOfKeys(t, v);
  if (clear > 0) return v;
  unsigned int i;
  if (clear < 0 && GetClosestKeyIndexInCenteredInterval(t, kCFCSnapTolerance, i)) {
    t = keys[i].parameter;
  }
  return left ? EvalLeftUsingExtrapolationMethod(t) : EvalRightUsingExtrapolationMethod(t);
}
