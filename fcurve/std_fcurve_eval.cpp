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
