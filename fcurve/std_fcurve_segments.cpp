// ZvStdFCurve: segment kinds and tangent handles of keys.
#include <zv/std_fcurve.h>

#include "fcurve/fcurve_lock.h"
#include "fcurve/std_fcurve_impl.h"

#include <cmath>

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

namespace {

bool IsKind(unsigned int kind) {
  return kind >= ZvBaseFCurve::ConstantSegment && kind <= ZvBaseFCurve::CubicSegment;
}

// The kind of the segment from key i: the last key's byte is only carried, nothing follows it.
void SetKindAtIndex(ZvStdFCurveImpl& s, unsigned int i, unsigned int kind) {
  if (i + 1 == s.keys.size) {
    s.keys[i].segmentKind = static_cast<unsigned char>(kind);
  } else {
    s.ModifyFSK(i, kind);
  }
}

}  // namespace

ZvBaseFCurve::FSKind ZvStdFCurve::GetSegmentKindAtParameter(double parameter) const {
  ZvFCurveLockGuard guard(*this);
  const ZvStdFCurveImpl& s = *m_impl;
  if (s.keys.size == 0) return static_cast<FSKind>(s.firstSegmentKind);
  int found;
  const unsigned int at = s.LocateParameter(parameter, found);
  return static_cast<FSKind>(at == 0 ? s.firstSegmentKind : s.keys[at - 1].segmentKind);
}

unsigned int ZvStdFCurve::SetSegmentKindAtParameter(double parameter, FSKind kind) {
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  if (s.readOnly || !IsKind(kind) || std::isnan(parameter)) return 0;
  int found;
  const unsigned int at = s.keys.size ? s.LocateParameter(parameter, found) : 0;
  if (at == 0) {
    s.firstSegmentKind = kind;
  } else {
    SetKindAtIndex(s, at - 1, kind);
  }
  return 1;
}

unsigned int ZvStdFCurve::GetSegmentKinds(ZvUByteArray& kinds) const {
  ZvFCurveLockGuard guard(*this);
  for (unsigned int i = 0; i < m_impl->keys.size; ++i)
    kinds.Add(m_impl->keys[i].segmentKind);
  return m_impl->keys.size;
}

unsigned int ZvStdFCurve::GetSegmentKindAtIndex(unsigned int index, FSKind& kind) const {
  ZvFCurveLockGuard guard(*this);
  if (index >= m_impl->keys.size) return 0;
  kind = static_cast<FSKind>(m_impl->keys[index].segmentKind);
  return 1;
}

unsigned int ZvStdFCurve::SetSegmentKindAtIndex(unsigned int index, FSKind kind) {
  ZvFCurveLockGuard guard(*this);
  if (m_impl->readOnly || index >= m_impl->keys.size || !IsKind(kind)) return 0;
  SetKindAtIndex(*m_impl, index, kind);
  return 1;
}

unsigned int ZvStdFCurve::ConvertToUniformSegmentKind(FSKind kind) {
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  if (!IsKind(kind)) return 0;
  FSKind current;
  if (HasUniformSegmentKind(current) && current == kind) return 1;
  if (s.readOnly) return 0;
  s.firstSegmentKind = kind;
  for (unsigned int i = 0; i < s.keys.size; ++i)
    SetKindAtIndex(s, i, kind);
  return 1;
}

unsigned int ZvStdFCurve::HasUniformSegmentKind(FSKind& kind) const {
  ZvFCurveLockGuard guard(*this);
  const ZvStdFCurveImpl& s = *m_impl;
  if (s.keys.size == 0) return 0;
  for (unsigned int i = 1; i < s.keys.size; ++i) {
    if (s.keys[i].segmentKind != s.keys[0].segmentKind) return 0;
  }
  kind = static_cast<FSKind>(s.keys[0].segmentKind);
  return 1;
}
