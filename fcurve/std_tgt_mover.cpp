// ZvStdTgtMover: the drag of one tangent handle, with the far handles of the key's segments
// giving way so that both segments stay functions of the parameter.
#include <zv/std_tgt_mover.h>

#include "fcurve/fcurve_lock.h"
#include "fcurve/std_fcurve_impl.h"
#include "fcurve/std_tgt_mover_impl.h"

#include <cmath>

namespace {

// The constraints a drag replaces by the handle it makes: FlatTangent, FlatAtExtremum and
// AutoTangent. The handles were frozen at construction, so the shape does not jump.
constexpr unsigned int kDragClearedCodes = 448;

// Reads one side of key i into its frame: the key's handle on that side and, if a key lies
// beyond, the segment to it.
ZvTgtMoverSide LoadSide(const ZvStdFCurveImpl& s, unsigned int i, bool right) {
  ZvTgtMoverSide side{};
  side.sign = right ? 1.0 : -1.0;
  const CFCStdKey& k = s.keys[i];
  side.key = side.ToFrame({k.parameter, right ? k.rightValue : k.leftValue});
  side.handle = side.ToFrame(right ? k.rightTangent : k.leftTangent);
  side.hasSegment = right ? i + 1 < s.keys.size : i > 0;
  if (side.hasSegment) {
    const CFCStdKey& n = s.keys[right ? i + 1 : i - 1];
    side.farKey = side.ToFrame({n.parameter, right ? n.leftValue : n.rightValue});
    side.far = side.savedFar = side.ToFrame(right ? n.leftTangent : n.rightTangent);
    const double dx = side.savedFar.x - side.farKey.x;
    side.inverseFarDx = dx != 0.0 ? 1.0 / dx : 0.0;
  }
  const ZvPoint2<double> d = side.handle - side.key;
  side.dx2 = d.x * d.x;
  side.dy2 = d.y * d.y;
  return side;
}

bool IsFinite(const ZvPoint2<double>& p) {
  return std::isfinite(p.x) && std::isfinite(p.y);
}

}  // namespace

ZvStdTgtMoverImpl::ZvStdTgtMoverImpl(ZvStdFCurve& curve, double keyParameter,
                                     ZvBaseFCurve::KeySide side, double tolerance)
    : m_curve(&curve),
      m_right{},
      m_left{},
      m_keyParameter(keyParameter),
      m_index(0),
      m_side(side == ZvBaseFCurve::LeftSide ? ZvBaseFCurve::LeftSide : ZvBaseFCurve::RightSide),
      m_valid(false),
      m_firstUpdate(true) {
  ZvFCurveLockGuard guard(curve);
  const ZvStdFCurveImpl& s = *curve.m_impl;
  if (s.keys.size < 2 || !s.GetClosestKeyIndexInCenteredInterval(keyParameter, tolerance, m_index))
    return;
  m_valid = true;
  m_keyParameter = s.keys[m_index].parameter;
  // From here on the key's stored handles are the ones drawn, whatever its automatic flags.
  curve.FreezeTangentsInInterval(m_keyParameter, m_keyParameter, 0, 0,
                                 static_cast<ZvBaseFCurve::KeyConstraint>(0));
  m_right = LoadSide(s, m_index, true);
  m_left = LoadSide(s, m_index, false);
}

int ZvStdTgtMoverImpl::Update(const ZvPoint2<double>& handle, int tangentContinuity,
                              int lengthContinuity, double ratio,
                              ZvExtent2<double>& modifiedExtent) {
  ZvFCurveLockGuard guard(*m_curve);
  ZvStdFCurveImpl& s = *m_curve->m_impl;
  if (s.readOnly) return 1;
  if (!m_valid) return 0;
  // The saved segments describe the key as it was; a curve edited under the drag is refused.
  if (m_index >= s.keys.size || s.keys[m_index].parameter != m_keyParameter) return 0;
  if (!IsFinite(handle) || !std::isfinite(ratio)) return 0;
  if (m_firstUpdate) {
    s.SetConstraint(m_index, kDragClearedCodes, 0);
    m_firstUpdate = false;
  }
  return m_side == ZvBaseFCurve::LeftSide
             ? UpdateLeft(handle, tangentContinuity, lengthContinuity, ratio, modifiedExtent)
             : UpdateRight(handle, tangentContinuity, lengthContinuity, ratio, modifiedExtent);
}

int ZvStdTgtMoverImpl::UpdateRight(const ZvPoint2<double>& handle, int tangentContinuity,
                                   int lengthContinuity, double ratio,
                                   ZvExtent2<double>& modifiedExtent) {
  return UpdateSide(m_right, m_left, handle, tangentContinuity, lengthContinuity, ratio,
                    modifiedExtent);
}

int ZvStdTgtMoverImpl::UpdateLeft(const ZvPoint2<double>& handle, int tangentContinuity,
                                  int lengthContinuity, double ratio,
                                  ZvExtent2<double>& modifiedExtent) {
  return UpdateSide(m_left, m_right, handle, tangentContinuity, lengthContinuity, ratio,
                    modifiedExtent);
}

int ZvStdTgtMoverImpl::UpdateSide(ZvTgtMoverSide& dragged, ZvTgtMoverSide& other,
                                  const ZvPoint2<double>& p, int tangentContinuity,
                                  int lengthContinuity, double ratio,
                                  ZvExtent2<double>& modifiedExtent) {
  ZvStdFCurveImpl& s = *m_curve->m_impl;
  const unsigned short flags = s.keys[m_index].flags;
  ZvPoint2<double> p1, far;
  ZvTgtSegmentFix fix;
  if (!ConstrainHandle(dragged, flags, dragged.ToFrame(p), ratio, p1)) return 0;
  if (!ZvTgtMover_FixSegment(dragged, p1, far, fix)) return 0;
  const bool follow = tangentContinuity || lengthContinuity;
  ZvPoint2<double> q, otherFar;
  if (follow) {
    q = ZvTgtMover_OtherHandle(dragged, other, p1, (flags & CFCFlag_MirroredTangents) != 0,
                               tangentContinuity, lengthContinuity, ratio);
    if (q.x < other.key.x) q.x = other.key.x;
    if (!ZvTgtMover_FixSegment(other, q, otherFar, fix)) return 0;
    // The other handle went back along its own line, so its direction still answers the
    // dragged one; only a shared length must follow it back.
    if (fix == ZvTgtSegmentFix::PulledBack && lengthContinuity) {
      const double length = ZvTgtMover_ScreenLength(q - other.key, ratio);
      p1 = dragged.key + ZvTgtMover_WithScreenLength(p1 - dragged.key, length, ratio);
    }
  }
  // The interval arithmetic above works to 1e-9; a segment it got wrong by rounding is refused
  // rather than stored.
  if (dragged.hasSegment && !ZvStdFCurve_IsCubicSegmentValid(dragged.key, p1, far, dragged.farKey))
    return 0;
  if (follow && other.hasSegment &&
      !ZvStdFCurve_IsCubicSegmentValid(other.key, q, otherFar, other.farKey)) {
    return 0;
  }
  dragged.far = far;
  WriteSide(dragged, p1, modifiedExtent);
  if (follow) {
    other.far = otherFar;
    WriteSide(other, q, modifiedExtent);
  }
  ZvExtent2<double> pieces;
  s.ComputeKeyExtent(m_index, pieces);
  modifiedExtent.Union(pieces);
  UpdateContinuityFlags(tangentContinuity, lengthContinuity, ratio);
  return 1;
}

void ZvStdTgtMoverImpl::WriteSide(const ZvTgtMoverSide& side, const ZvPoint2<double>& handle,
                                  ZvExtent2<double>& modifiedExtent) {
  ZvStdFCurveImpl& s = *m_curve->m_impl;
  const bool right = side.sign > 0;
  CFCStdKey& k = s.keys[m_index];
  const ZvPoint2<double> newHandle = side.FromFrame(handle);
  modifiedExtent.AddPoint(right ? k.rightTangent : k.leftTangent);
  modifiedExtent.AddPoint(newHandle);
  if (right) {
    s.SetActualRightTgt(m_index, newHandle);
  } else {
    s.SetActualLeftTgt(m_index, newHandle);
  }
  if (!side.hasSegment) return;
  const unsigned int j = right ? m_index + 1 : m_index - 1;
  const ZvPoint2<double> newFar = side.FromFrame(side.far);
  modifiedExtent.AddPoint(right ? s.keys[j].leftTangent : s.keys[j].rightTangent);
  modifiedExtent.AddPoint(newFar);
  if (right) {
    s.SetActualLeftTgt(j, newFar);
  } else {
    s.SetActualRightTgt(j, newFar);
  }
}

void ZvStdTgtMoverImpl::UpdateContinuityFlags(int tangentContinuity, int lengthContinuity,
                                              double ratio) {
  ZvStdFCurveImpl& s = *m_curve->m_impl;
  CFCStdKey& k = s.keys[m_index];
  const bool smooth = (k.flags & CFCFlag_TangentContinuity) != 0;
  if (tangentContinuity && !smooth) {
    s.LockTangentContinuity(m_index);
  } else if (!tangentContinuity && smooth) {
    k.flags = static_cast<unsigned short>(k.flags & ~CFCFlag_TangentContinuity);
  }
  // The first key's left handle shapes only what lies before the curve; it is kept in line.
  if (m_index == 0 && (k.flags & CFCFlag_TangentContinuity)) {
    s.UnifyActualLeftTangentWithActualRightTangent(0);
  }
  const bool sameLength = (k.flags & CFCFlag_TangentLengthContinuity) != 0;
  if (lengthContinuity && !sameLength) {
    double at = m_keyParameter;
    m_curve->LockTangentLengthContinuity(at, 0.0, ratio);
  } else if (!lengthContinuity && sameLength) {
    k.flags = static_cast<unsigned short>(k.flags & ~CFCFlag_TangentLengthContinuity);
  }
}

ZvStdTgtMover::ZvStdTgtMover(ZvStdFCurve& curve, double keyParameter, ZvBaseFCurve::KeySide side,
                             double tolerance)
    : m_impl(new ZvStdTgtMoverImpl(curve, keyParameter, side, tolerance)) {}

ZvStdTgtMover::~ZvStdTgtMover() {
  delete m_impl;
}

int ZvStdTgtMover::Update(const ZvPoint2<double>& handle, int tangentContinuity,
                          int lengthContinuity, double ratio, ZvExtent2<double>& modifiedExtent) {
  return m_impl->Update(handle, tangentContinuity, lengthContinuity, ratio, modifiedExtent);
}
