// Where a dragged handle may go under the key's constraints, and where the key's other handle
// follows it. All positions are in the frame of their side (see std_tgt_mover_impl.h).
#include "fcurve/std_fcurve_impl.h"
#include "fcurve/std_tgt_mover_impl.h"

#include "core/vec.h"

#include <cmath>

namespace {

bool IsNull(const ZvPoint2<double>& v) {
  return std::fabs(v.x) <= 1e-09 && std::fabs(v.y) <= 1e-09;
}

// The direction of h; a handle of no length points away from its key along X.
ZvPoint2<double> Unit(const ZvPoint2<double>& h) {
  const double l = zvGuardedLength(h);
  return l > 0.0 ? h / l : ZvPoint2<double>{1.0, 0.0};
}

// The unsigned angle between u and v in degrees, -1 when either is null.
double AngleBetween(const ZvPoint2<double>& u, const ZvPoint2<double>& v) {
  double sweep;
  if (!ZvPoint2_AngleInDegrees(u, v, sweep)) return -1.0;
  return sweep > 180.0 ? 360.0 - sweep : sweep;
}

// Length of a direction-locked handle dragged through its key: short enough to look collapsed,
// long enough to keep its direction.
constexpr double kLockedMinimumLength = 0.01;

}  // namespace

double ZvTgtMover_ScreenLength(const ZvPoint2<double>& v, double ratio) {
  return std::sqrt(v.x * v.x + (ratio * v.y) * (ratio * v.y));
}

// A null v stays null, so a handle dragged onto its key collapses there instead of taking an
// arbitrary direction.
ZvPoint2<double> ZvTgtMover_WithScreenLength(const ZvPoint2<double>& v, double length,
                                             double ratio) {
  const double l = ZvTgtMover_ScreenLength(v, ratio);
  if (IsNull(v) || !(l > 0.0)) return {0.0, 0.0};
  return v * (length / l);
}

double ZvTgtMoverSide::VisualLength(double ratio) const {
  return std::sqrt(dx2 + ratio * ratio * dy2);
}

ZvPoint2<double> ZvStdTgtMoverImpl::CurrentHandle(const ZvTgtMoverSide& s) const {
  const CFCStdKey& k = m_curve->m_impl->keys[m_index];
  return s.ToFrame(s.sign > 0 ? k.rightTangent : k.leftTangent);
}

bool ZvStdTgtMoverImpl::ConstrainHandle(const ZvTgtMoverSide& s, unsigned short flags,
                                        const ZvPoint2<double>& p, double ratio,
                                        ZvPoint2<double>& out) const {
  const unsigned short bothLocks = CFCFlag_TangentDirectionLock | CFCFlag_TangentLengthLock;
  if ((flags & bothLocks) == bothLocks) return false;
  const ZvPoint2<double> key = s.key;
  ZvPoint2<double> p1 = p;
  if (flags & CFCFlag_TangentLengthLock) {
    // The handle turns about its key on a circle, or on an ellipse when Y is seen scaled.
    p1 = key + ZvTgtMover_WithScreenLength(p - key, s.VisualLength(ratio), ratio);
  } else if (flags & CFCFlag_TangentDirectionLock) {
    const ZvPoint2<double> h = CurrentHandle(s) - key;
    const double hh = h.x * h.x + h.y * h.y;
    if (hh <= 1e-07) {
      p1 = key + Unit(h) * kLockedMinimumLength;
    } else {
      const ZvPoint2<double> m = p - key;
      const double t = (h.x * m.x + h.y * m.y) / hh;
      p1 = key + h * t;
      // A projection behind the key would flip the handle, which its clamp onto the key would
      // then turn vertical. Near the key the projection changes sides with the smallest move
      // of the pointer, so there the pointer must be clearly on the other side, by angle.
      const ZvPoint2<double> d = p1 - key;
      bool behind = t < 0.0;
      if (d.x * d.x + d.y * d.y <= 0.5) {
        const double toHandle = AngleBetween(m, h), toOpposite = AngleBetween(m, -h);
        behind = toHandle >= 0.0 && toHandle - toOpposite > 10.0;
      }
      if (behind) p1 = key + Unit(h) * kLockedMinimumLength;
    }
  }
  if (flags & CFCFlag_CollapsedTangent) return false;
  const bool flat = (flags & CFCFlag_FlatTangent) ||
                    ((flags & CFCFlag_FlatAtExtremum) && m_curve->m_impl->IsKeyAnExtremum(m_index));
  if (flat) {
    // The curve draws a flat handle level whatever its stored Y; the stored one keeps the
    // handle's slope so that the shape comes back if the flag goes.
    if (flags & bothLocks) return false;
    const ZvPoint2<double> c = CurrentHandle(s), h = c - key;
    const double l = zvGuardedLength(h);
    if (std::fabs(h.x) <= 1e-09) {
      p1.y = key.y + std::copysign(l, h.y);
    } else if (h.x >= h.y || p1.x < c.x) {
      p1.y = key.y + (p1.x - key.x) * h.y / h.x;
    } else {
      p1.y = key.y + 0.75 * std::copysign(l, h.y);
    }
  }
  // A handle never crosses its key.
  if (p1.x < key.x) p1.x = key.x;
  out = p1;
  return true;
}

ZvPoint2<double> ZvTgtMover_OtherHandle(const ZvTgtMoverSide& from, const ZvTgtMoverSide& to,
                                        const ZvPoint2<double>& h, bool mirrored,
                                        int tangentContinuity, int lengthContinuity, double ratio) {
  const ZvPoint2<double> rel = h - from.key;
  if (IsNull(rel)) return (lengthContinuity || !tangentContinuity) ? to.handle : to.key;
  if (tangentContinuity) {
    // In the frames, the opposite direction keeps X and negates Y; a mirrored pair keeps both.
    const ZvPoint2<double> v{rel.x, mirrored ? rel.y : -rel.y};
    if (lengthContinuity) return to.key + v;
    return to.key + ZvTgtMover_WithScreenLength(v, to.VisualLength(ratio), ratio);
  }
  ZvPoint2<double> direction = to.handle - to.key;
  if (IsNull(direction)) direction = {1.0, 0.0};
  return to.key +
         ZvTgtMover_WithScreenLength(direction, ZvTgtMover_ScreenLength(rel, ratio), ratio);
}
