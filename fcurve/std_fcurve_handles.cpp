// Setting the stored handles of the standard curve's keys, and the tests and repairs that keep
// every cubic segment a function.
#include "fcurve/std_fcurve_impl.h"

#include "core/vec.h"

#include <cmath>

namespace {

// Steepest slope a handle may take when only its slope counts.
constexpr double kMaxHandleSlope = 100000.0;

double ClampSlope(double s) {
  if (s > kMaxHandleSlope) return kMaxHandleSlope;
  if (s < -kMaxHandleSlope) return -kMaxHandleSlope;
  return s;
}

bool Within(double v, double eps) {
  return v >= -eps && eps >= v;
}

}  // namespace

// With the default Bezier tangent constraint only the slope of the handle counts: the handle is
// put a third of the way to the previous key.
void ZvStdFCurveImpl::SetActualLeftTgt(unsigned int i, const ZvPoint2<double>& handle) {
  CFCStdKey& k = keys[i];
  if (!defaultBezierTangentConstraint || i == 0) {
    k.leftTangent = handle;
    return;
  }
  const double x = k.parameter, v = EffectiveLeftValue(i);
  const double dx = x - handle.x;
  const double slope = ClampSlope(Within(dx, 1e-9) ? (v - handle.y) / 0.001 : (v - handle.y) / dx);
  const double third = (keys[i - 1].parameter - x) / 3.0;
  k.leftTangent = {x + third, v + third * slope};
}

// The mirror for the right handle; its near-vertical test is 0.001 wide, not 1e-9, as stored
// curves have always had it.
void ZvStdFCurveImpl::SetActualRightTgt(unsigned int i, const ZvPoint2<double>& handle) {
  CFCStdKey& k = keys[i];
  if (!defaultBezierTangentConstraint || i + 1 >= keys.size) {
    k.rightTangent = handle;
    return;
  }
  const double x = k.parameter, v = k.rightValue;
  const double dx = handle.x - x;
  const double slope = ClampSlope(Within(dx, 0.001) ? (handle.y - v) / 0.001 : (handle.y - v) / dx);
  const double third = (keys[i + 1].parameter - x) / 3.0;
  k.rightTangent = {x + third, v + third * slope};
}

namespace {

// Scales a handle toward its key by 0.9, 0.81, ... until the segment is a function. Valid
// handles always get there; the round limit only stops a handle that lies on the wrong side of
// its key, which then collapses onto the key.
template <class Valid>
ZvPoint2<double> ShortenUntilValid(const ZvPoint2<double>& anchor, const ZvPoint2<double>& handle,
                                   Valid valid) {
  double s = 1.0;
  for (int round = 0; round < 2000; ++round) {
    const ZvPoint2<double> h = anchor + (handle - anchor) * s;
    if (valid(h)) return h;
    s *= 0.9;
  }
  return anchor;
}

}  // namespace

// Key i gets a left handle valid for a segment arriving from the point `from`, whose own handle
// reaches a third of the way at its height.
void ZvStdFCurveImpl::RegularizeLeftTgt(unsigned int i, const ZvPoint2<double>& from) {
  CFCStdKey& k = keys[i];
  const ZvPoint2<double> key{k.parameter, k.leftValue};
  const ZvPoint2<double> c1{from.x + (k.parameter - from.x) / 3.0, from.y};
  k.leftTangent = ShortenUntilValid(key, k.leftTangent, [&](const ZvPoint2<double>& h) {
    return ZvStdFCurve_IsCubicSegmentValid(from, c1, h, key) != 0;
  });
}

void ZvStdFCurveImpl::RegularizeRightTgt(unsigned int i, const ZvPoint2<double>& to) {
  CFCStdKey& k = keys[i];
  const ZvPoint2<double> key{k.parameter, k.rightValue};
  const ZvPoint2<double> c2{to.x - (to.x - k.parameter) / 3.0, to.y};
  k.rightTangent = ShortenUntilValid(key, k.rightTangent, [&](const ZvPoint2<double>& h) {
    return ZvStdFCurve_IsCubicSegmentValid(key, h, c2, to) != 0;
  });
}

// The outer handles of the end keys are free; every other handle must keep its segment a
// function.
int ZvStdFCurveImpl::SetActualKeyTgtHandle(unsigned int i, int side,
                                           const ZvPoint2<double>& relative) {
  if (!std::isfinite(relative.x) || !std::isfinite(relative.y)) return 0;
  CFCStdKey& k = keys[i];
  if (side == ZvBaseFCurve::LeftSide) {
    const ZvPoint2<double> h{k.parameter + relative.x, k.leftValue + relative.y};
    if (i > 0) {
      const CFCStdKey& prev = keys[i - 1];
      if (!ZvStdFCurve_IsCubicSegmentValid({prev.parameter, prev.rightValue}, prev.rightTangent, h,
                                           {k.parameter, k.leftValue})) {
        return 0;
      }
    }
    SetActualLeftTgt(i, h);
    return 1;
  }
  const ZvPoint2<double> h{k.parameter + relative.x, k.rightValue + relative.y};
  if (i + 1 < keys.size) {
    const CFCStdKey& next = keys[i + 1];
    if (!ZvStdFCurve_IsCubicSegmentValid({k.parameter, k.rightValue}, h, next.leftTangent,
                                         {next.parameter, next.leftValue})) {
      return 0;
    }
  }
  SetActualRightTgt(i, h);
  return 1;
}

// Are the evaluated handles of key i collinear through the key (or, with MirroredTangents,
// mirror images about the vertical through it)? A handle of no length unifies with anything.
int ZvStdFCurveImpl::ActualTangentsAreUnified(unsigned int i) const {
  const CFCStdKey& k = keys[i];
  const ZvPoint2<double> lh = GetEvaluatedLeftTgt(i), rh = GetEvaluatedRightTgt(i);
  ZvPoint2<double> l{lh.x - k.parameter, lh.y - k.leftValue};
  ZvPoint2<double> r{rh.x - k.parameter, rh.y - k.rightValue};
  if ((Within(l.x, 1e-7) && Within(l.y, 1e-7)) || (Within(r.x, 1e-7) && Within(r.y, 1e-7))) {
    return 1;
  }
  if (k.flags & CFCFlag_MirroredTangents) {
    if (Within(l.x, 1e-15) && Within(r.x, 1e-15)) {
      return (l.y >= 0 && r.y >= 0) || (l.y <= 0 && r.y <= 0);
    }
    const double ll = zvGuardedLength(l), rl = zvGuardedLength(r);
    if (ll > 0.0 && !(Within(l.x, 1e-9) && Within(l.y, 1e-9))) l = l / ll;
    if (rl > 0.0 && !(Within(r.x, 1e-9) && Within(r.y, 1e-9))) r = r / rl;
    return Within(l.x + r.x, 1e-15) && Within(l.y - r.y, 1e-15);
  }
  if (Within(l.x, 1e-7) && Within(r.x, 1e-7)) return (l.y >= 0) != (r.y >= 0);
  return std::fabs(l.x * r.y - l.y * r.x) <= 1e-7;
}

// A key without the flag has nothing to clear, and the test is pure: only keys that claim
// continuity are tested. A read runs this over every key of the block; flattened, the test and
// the handle evaluation it calls are inlined into the loop instead of called per key.
__attribute__((flatten)) void ZvStdFCurveImpl::ClaimContinuityOnlyWhereUnified() {
  const unsigned int n = keys.size;
  for (unsigned int i = 1; i + 1 < n; ++i) {
    CFCStdKey& k = keys[i];
    if ((k.flags & CFCFlag_TangentContinuity) && !ActualTangentsAreUnified(i))
      k.flags = static_cast<unsigned short>(k.flags & ~CFCFlag_TangentContinuity);
  }
}

int ZvStdFCurveImpl::LockTangentContinuity(unsigned int i) {
  CFCStdKey& k = keys[i];
  if (k.flags & CFCFlag_TangentContinuity) return 1;
  const bool betweenCubics = i > 0 && i + 1 < keys.size &&
                             keys[i - 1].segmentKind == ZvBaseFCurve::CubicSegment &&
                             k.segmentKind == ZvBaseFCurve::CubicSegment;
  if (betweenCubics && !ActualTangentsAreUnified(i)) return 0;
  k.flags = static_cast<unsigned short>(k.flags | CFCFlag_TangentContinuity);
  return 1;
}

int ZvStdFCurveImpl::UnifyActualRightTangentWithActualLeftTangent(unsigned int i) {
  if (i >= keys.size) return 0;
  const CFCStdKey& k = keys[i];
  const ZvPoint2<double> l{k.leftTangent.x - k.parameter, k.leftTangent.y - k.leftValue};
  const double ll = zvGuardedLength(l);
  if (ll == 0.0) return 0;
  const double rl =
      zvGuardedLength2(k.rightTangent.x - k.parameter, k.rightTangent.y - k.rightValue);
  return SetActualKeyTgtHandle(i, ZvBaseFCurve::RightSide, l * (-rl / ll));
}

int ZvStdFCurveImpl::UnifyActualLeftTangentWithActualRightTangent(unsigned int i) {
  if (i >= keys.size) return 0;
  const CFCStdKey& k = keys[i];
  const ZvPoint2<double> r{k.rightTangent.x - k.parameter, k.rightTangent.y - k.rightValue};
  const double rl = zvGuardedLength(r);
  if (rl == 0.0) return 0;
  const double ll = zvGuardedLength2(k.leftTangent.x - k.parameter, k.leftTangent.y - k.leftValue);
  return SetActualKeyTgtHandle(i, ZvBaseFCurve::LeftSide, r * (-ll / rl));
}

// Changes the kind of the segment from key i. A segment turning cubic whose handles would fold
// it gets handles at the thirds of its chord, and continuity is restored at both ends.
void ZvStdFCurveImpl::ModifyFSK(unsigned int i, unsigned int kind) {
  CFCStdKey& k = keys[i];
  if (k.segmentKind == kind) return;
  if (kind == ZvBaseFCurve::CubicSegment && i + 1 < keys.size) {
    CFCStdKey& next = keys[i + 1];
    const ZvPoint2<double> p0{k.parameter, k.rightValue}, p3{next.parameter, next.leftValue};
    if (!ZvStdFCurve_IsCubicSegmentValid(p0, k.rightTangent, next.leftTangent, p3)) {
      k.rightTangent = p0 + (p3 - p0) * (1.0 / 3.0);
      next.leftTangent = p0 + (p3 - p0) * (2.0 / 3.0);
    }
    k.segmentKind = static_cast<unsigned char>(kind);
    if ((k.flags & CFCFlag_TangentContinuity) && !ActualTangentsAreUnified(i)) {
      UnifyActualRightTangentWithActualLeftTangent(i);
    }
    if ((next.flags & CFCFlag_TangentContinuity) && !ActualTangentsAreUnified(i + 1)) {
      UnifyActualLeftTangentWithActualRightTangent(i + 1);
    }
    return;
  }
  k.segmentKind = static_cast<unsigned char>(kind);
}
