// ZvStdFCurve: appending segments after the last key, as a host draws a curve left to right.
#include <zv/std_fcurve.h>

#include "fcurve/fcurve_lock.h"
#include "fcurve/std_fcurve_impl.h"

#include <cmath>

namespace {

bool Finite(const ZvPoint2<double>& p) {
  return std::isfinite(p.x) && std::isfinite(p.y);
}

// A new last key on its handles, reached by a segment of `kind` from the old last key.
void AddLastKey(ZvStdFCurveImpl& s, const ZvPoint2<double>& point, double leftValue,
                unsigned int kind) {
  CFCStdKey k{};
  k.parameter = point.x;
  k.leftValue = leftValue;
  k.rightValue = point.y;
  k.leftTangent = {point.x, leftValue};
  k.rightTangent = point;
  k.segmentKind = static_cast<unsigned char>(kind);
  k.flags = CFCFlag_TangentContinuity;
  s.keys[s.keys.size - 1].segmentKind = static_cast<unsigned char>(kind);
  s.keys.Add(k);
}

bool CanAppend(const ZvStdFCurveImpl& s, const ZvPoint2<double>& point) {
  return !s.readOnly && s.keys.size > 0 && Finite(point) &&
         point.x > s.keys[s.keys.size - 1].parameter;
}

}  // namespace

unsigned int ZvStdFCurve::AppendConstantSegment(const ZvPoint2<double>& point) {
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  if (!CanAppend(s, point)) return 0;
  AddLastKey(s, point, s.keys[s.keys.size - 1].rightValue, ConstantSegment);
  return 1;
}

unsigned int ZvStdFCurve::AppendLinearSegment(const ZvPoint2<double>& point) {
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  if (!CanAppend(s, point)) return 0;
  AddLastKey(s, point, point.y, LinearSegment);
  return 1;
}

unsigned int ZvStdFCurve::AppendOrExtendLinearSegment(const ZvPoint2<double>& point,
                                                      double tolerance) {
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  if (!CanAppend(s, point)) return 0;
  const unsigned int n = s.keys.size;
  if (n >= 2 && s.keys[n - 2].segmentKind == LinearSegment) {
    const CFCStdKey& a = s.keys[n - 2];
    const CFCStdKey& b = s.keys[n - 1];
    const double line = a.rightValue + (point.x - a.parameter) * (b.leftValue - a.rightValue) /
                                           (b.parameter - a.parameter);
    if (std::fabs(line - point.y) <= tolerance) {
      // The last key slides along its own line; its locks keep what they lock.
      if (!(b.flags & CFCFlag_ParameterLock)) {
        const double old = b.parameter;
        s.MoveKeyParameter(n - 1, point.x);
        if (GetUserDataSet(old) != nullptr) {
          ZvDoubleArray from(1), to(1);
          from.Add(old);
          to.Add(point.x);
          MoveKeyUserDataTail(from, to);
        }
      }
      if (!(s.keys[n - 1].flags & CFCFlag_ValueLock)) s.SetValue(n - 1, line);
      return 1;
    }
  }
  AddLastKey(s, point, point.y, LinearSegment);
  return 1;
}

unsigned int ZvStdFCurve::AppendBezierCubicSegment(const ZvPoint2<double>& right,
                                                   const ZvPoint2<double>& left,
                                                   const ZvPoint2<double>& end) {
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  if (!CanAppend(s, end) || !Finite(right) || !Finite(left)) return 0;
  const unsigned int last = s.keys.size - 1;
  const ZvPoint2<double> start{s.keys[last].parameter, s.keys[last].rightValue};
  if (!ZvStdFCurve_IsCubicSegmentValid(start, right, left, end)) return 0;
  AddLastKey(s, end, end.y, CubicSegment);
  s.SetActualRightTgt(last, right);
  s.SetActualLeftTgt(last + 1, left);
  s.LockTangentContinuity(last);
  return 1;
}
