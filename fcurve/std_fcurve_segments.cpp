// ZvStdFCurve: segment kinds and tangent handles of keys.
#include <zv/std_fcurve.h>

#include "fcurve/fcurve_lock.h"
#include "fcurve/std_fcurve_impl.h"

ZvBaseFCurve::FSKind ZvStdFCurve::GetFirstSegmentKind() const {
  ZvFCurveLockGuard guard(*this);
  return static_cast<FSKind>(m_impl->firstSegmentKind);
}

unsigned int ZvStdFCurve::SetFirstSegmentKind(FSKind kind) {
  ZvFCurveLockGuard guard(*this);
  if (m_impl->readOnly || kind < ConstantSegment || kind > CubicSegment) return 0;
  m_impl->firstSegmentKind = kind;
  return 1;
}

unsigned int ZvStdFCurve::GetSegmentKind(double parameter, KeySide side, FSKind& kind,
                                         double tolerance) const {
  ZvFCurveLockGuard guard(*this);
  const ZvStdFCurveImpl& s = *m_impl;
  if (s.keys.size == 0) {
    kind = static_cast<FSKind>(s.firstSegmentKind);
    return 1;
  }
  unsigned int i;
  if (!s.GetClosestKeyIndexInCenteredInterval(parameter, tolerance, i)) return 0;
  if (side == LeftSide) {
    kind = static_cast<FSKind>(i == 0 ? s.firstSegmentKind : s.keys[i - 1].segmentKind);
  } else {
    kind = static_cast<FSKind>(s.keys[i].segmentKind);
  }
  return 1;
}

unsigned int ZvStdFCurve::SetSegmentKind(double parameter, KeySide side, FSKind kind,
                                         double tolerance) {
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  if (s.readOnly || kind < ConstantSegment || kind > CubicSegment) return 0;
  const unsigned int n = s.keys.size;
  if (n == 0) {
    s.firstSegmentKind = kind;
    return 1;
  }
  unsigned int i;
  if (!s.GetClosestKeyIndexInCenteredInterval(parameter, tolerance, i)) return 0;
  if (side == LeftSide) {
    if (i == 0) {
      s.firstSegmentKind = kind;
    } else {
      s.ModifyFSK(i - 1, kind);
    }
  } else if (i + 1 == n) {
    s.keys[i].segmentKind = static_cast<unsigned char>(kind);  // carried, evaluates nothing
  } else {
    s.ModifyFSK(i, kind);
  }
  return 1;
}

unsigned int ZvStdFCurve::GetActualKeyTgtHandles(double parameter, ZvPoint2<double>& left,
                                                 ZvPoint2<double>& right, double tolerance) const {
  ZvFCurveLockGuard guard(*this);
  unsigned int i;
  if (!m_impl->GetClosestKeyIndexInCenteredInterval(parameter, tolerance, i)) return 0;
  const CFCStdKey& k = m_impl->keys[i];
  left = {k.leftTangent.x - k.parameter, k.leftTangent.y - k.leftValue};
  right = {k.rightTangent.x - k.parameter, k.rightTangent.y - k.rightValue};
  return 1;
}

unsigned int ZvStdFCurve::GetEvaluatedKeyTgtHandles(double parameter, ZvPoint2<double>& left,
                                                    ZvPoint2<double>& right,
                                                    double tolerance) const {
  ZvFCurveLockGuard guard(*this);
  unsigned int i;
  if (!m_impl->GetClosestKeyIndexInCenteredInterval(parameter, tolerance, i)) return 0;
  const CFCStdKey& k = m_impl->keys[i];
  const ZvPoint2<double> l = m_impl->GetEvaluatedLeftTgt(i), r = m_impl->GetEvaluatedRightTgt(i);
  left = {l.x - k.parameter, l.y - k.leftValue};
  right = {r.x - k.parameter, r.y - k.rightValue};
  return 1;
}

namespace {

// A key exactly at the parameter whose tangents are locked refuses new handles.
bool TangentsLockedAt(const ZvStdFCurveImpl& s, double parameter) {
  unsigned int i;
  if (!s.GetClosestKeyIndexInCenteredInterval(parameter, 0.0, i)) return false;
  return (s.keys[i].flags & (CFCFlag_TangentLengthLock | CFCFlag_TangentDirectionLock)) != 0;
}

}  // namespace

unsigned int ZvStdFCurve::SetKeyTgtHandle(double parameter, KeySide side,
                                          const ZvPoint2<double>& handle, double tolerance) {
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  if (s.readOnly) return 0;
  if (s.keys.size == 0) return 1;
  if (TangentsLockedAt(s, parameter)) return 0;
  unsigned int i;
  if (!s.GetClosestKeyIndexInCenteredInterval(parameter, tolerance, i)) return 0;
  return s.SetActualKeyTgtHandle(i, side, handle);
}

// Both handles or neither. A key whose handles no longer line up loses its continuity flag.
unsigned int ZvStdFCurve::SetKeyTgtHandles(double parameter, const ZvPoint2<double>& left,
                                           const ZvPoint2<double>& right, double tolerance) {
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  if (s.readOnly) return 0;
  if (s.keys.size == 0) return 1;
  if (TangentsLockedAt(s, parameter)) return 0;
  unsigned int i;
  if (!s.GetClosestKeyIndexInCenteredInterval(parameter, tolerance, i)) return 0;
  const CFCStdKey saved = s.keys[i];
  if (!s.SetActualKeyTgtHandle(i, LeftSide, left) ||
      !s.SetActualKeyTgtHandle(i, RightSide, right)) {
    s.keys[i] = saved;
    return 0;
  }
  if (!s.ActualTangentsAreUnified(i)) {
    s.keys[i].flags = static_cast<unsigned short>(s.keys[i].flags & ~CFCFlag_TangentContinuity);
  }
  return 1;
}
