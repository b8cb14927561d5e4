// The rotation view's key editing: every change goes to the shared rotation curve in degrees of
// the view's component; this view's per-key user data follows the keys it removes or moves.
#include <zv/quat_fcurve.h>

#include "fcurve/fcurve_lock.h"
#include "fcurve/quat_key_interval.h"

#include <cmath>
#include <vector>

namespace {

constexpr double kLargestFloat = 3.4028234663852886e38;

// Whether moving the time of every key without a parameter lock keeps all times finite and
// strictly increasing; locked keys stay, so even a small move can pass a neighbour.
template <class Move>
bool MoveKeepsOrder(const ZvQuatCurve& c, Move move) {
  double previous = 0.0;
  bool first = true;
  for (const ZvQuatKey& k : c.GetKeys()) {
    const double t = k.IsParamLocked() ? k.time : move(k.time);
    if (!std::isfinite(t) || (!first && !(t > previous))) return false;
    previous = t;
    first = false;
  }
  return true;
}

}  // namespace

unsigned int ZvQuatFCurve::CreateKey(double parameter, double value) {
  ZvFCurveLockGuard hold(*this);
  if (m_curve->IsReadOnly() || !std::isfinite(parameter) || !std::isfinite(value)) return 0;
  m_curve->SetKey(parameter, m_component, value, 0.0);
  return 1;
}

unsigned int ZvQuatFCurve::CreateNonModifyingKey(double parameter, int noFold) {
  ZvFCurveLockGuard hold(*this);
  if (m_curve->IsReadOnly()) return 0;
  if (!noFold) parameter = FoldParameter(parameter);
  if (!std::isfinite(parameter)) return 0;
  m_curve->SetKey(parameter, m_component, m_curve->Eval(parameter, m_component), 0.0);
  return 1;
}

unsigned int ZvQuatFCurve::MergeAndCreateKey(double start, double end, double parameter,
                                             double value, int excludeStart, int excludeEnd,
                                             int keepAttributes) {
  ZvFCurveLockGuard hold(*this);
  if (m_curve->IsReadOnly() || !std::isfinite(parameter) || !std::isfinite(value) ||
      std::isnan(start) || std::isnan(end)) {
    return 0;
  }
  const std::vector<ZvQuatKey>& keys = m_curve->GetKeys();
  const unsigned short locks = ZvQuatKey::ParamLockFlag | ZvQuatKey::ValueLockFlag;
  unsigned int first, last;
  const int any = QuatKeyIndicesInInterval(keys, start, end, first, last, excludeStart, excludeEnd);
  if (any) {
    for (unsigned int i = first; i <= last; ++i)
      if (keys[i].flags & locks) return 0;
  }
  // A single key already on the parameter only takes the value.
  if (!any || (first == last && zvIsSameParameter(keys[first].time, parameter))) {
    m_curve->SetKey(parameter, m_component, value, 0.0);
    return 1;
  }
  unsigned short donorFlags = 0;
  CFCUserDataSet donorData;
  int donorHasData = 0;
  // A parameter beyond the largest float from every key finds no donor: nothing is kept.
  const unsigned int donor =
      keepAttributes ? m_curve->FindKey(parameter, kLargestFloat) : ZvQuatCurve::NoKey;
  if (donor != ZvQuatCurve::NoKey) {
    donorFlags = keys[donor].flags & locks;
    donorHasData = HasUserData(keys[donor].time);
    if (donorHasData) donorData = *GetUserDataSet(keys[donor].time);
  }
  for (unsigned int i = first; i <= last; ++i)
    RemoveKeyUserData(keys[i].time);
  m_curve->RemoveKeyRange(first, last);
  const unsigned int at = m_curve->SetKey(parameter, m_component, value, 0.0);
  if (donor != ZvQuatCurve::NoKey) {
    m_curve->SetConstraintData(at, (donorFlags & ZvQuatKey::ValueLockFlag ? 2u : 0u) |
                                       (donorFlags & ZvQuatKey::ParamLockFlag ? 4u : 0u));
    if (donorHasData) SetUserDataSet(donorData, parameter);
  }
  return 1;
}

unsigned int ZvQuatFCurve::MergeAndCreateNonModifyingKey(double start, double end, double parameter,
                                                         int excludeStart, int excludeEnd,
                                                         int keepAttributes, int noFold) {
  ZvFCurveLockGuard hold(*this);
  if (m_curve->IsReadOnly()) return 0;
  if (!noFold) parameter = FoldParameter(parameter);
  return MergeAndCreateKey(start, end, parameter, m_curve->Eval(parameter, m_component),
                           excludeStart, excludeEnd, keepAttributes);
}

unsigned int ZvQuatFCurve::RemoveKey(double parameter, double tolerance) {
  ZvFCurveLockGuard hold(*this);
  if (m_curve->IsReadOnly()) return 0;
  const unsigned int i = m_curve->FindKey(parameter, tolerance);
  if (i == ZvQuatCurve::NoKey) return 0;
  RemoveKeyUserData(m_curve->GetKeyTime(i));
  return m_curve->RemoveKeyAt(i) ? 1 : 0;
}

unsigned int ZvQuatFCurve::RemoveKeys(double start, double end, int excludeStart, int excludeEnd) {
  ZvFCurveLockGuard hold(*this);
  if (m_curve->IsReadOnly()) return 0;
  unsigned int first, last;
  const std::vector<ZvQuatKey>& keys = m_curve->GetKeys();
  if (!QuatKeyIndicesInInterval(keys, start, end, first, last, excludeStart, excludeEnd)) return 1;
  for (unsigned int i = first; i <= last; ++i)
    RemoveKeyUserData(keys[i].time);
  return m_curve->RemoveKeyRange(first, last) ? 1 : 0;
}

unsigned int ZvQuatFCurve::SetValueWhenNoKeys(double value) {
  ZvFCurveLockGuard hold(*this);
  if (m_curve->IsReadOnly()) return 0;
  m_curve->SetValueWhenNoKeys(m_component, value);
  return 1;
}

unsigned int ZvQuatFCurve::SetKeyValue(double parameter, KeySide, double value, double tolerance) {
  ZvFCurveLockGuard hold(*this);
  if (m_curve->GetNumKeys() == 0 || m_curve->IsReadOnly()) return 0;
  if (AreAnyValuesLockedInInterval(parameter - tolerance, parameter + tolerance, 0, 0)) return 0;
  const unsigned int i = m_curve->FindKey(parameter, tolerance);
  if (i == ZvQuatCurve::NoKey) return 0;
  return m_curve->SetKeyValue(i, m_component, value) ? 1 : 0;
}

// Puts a key at the parameter that keeps the rotation there, and removes the keys before it
// (head) or after it (tail). Locked keys in the removed part refuse the whole operation.
unsigned int ZvQuatFCurve::RemoveHead(double parameter) {
  ZvFCurveLockGuard hold(*this);
  // The cut leaves a key at the parameter, which must be a time.
  if (m_curve->IsReadOnly() || !std::isfinite(parameter)) return 0;
  const unsigned int n = m_curve->GetNumKeys();
  if (n == 0) return 1;
  const double first = m_curve->GetKeyTime(0);
  if (zvIsSameParameter(first, parameter)) return 1;
  if (AreAnyValuesLockedInInterval(first, parameter, 0, 1) ||
      AreAnyParametersLockedInInterval(first, parameter, 0, 1)) {
    return 0;
  }
  const unsigned int at = m_curve->SetKey(parameter, m_curve->Eval(parameter), 0.0);
  if (at > 0) {
    for (unsigned int i = 0; i < at; ++i)
      RemoveKeyUserData(m_curve->GetKeyTime(i));
    m_curve->RemoveKeyRange(0, at - 1);
  }
  return 1;
}

unsigned int ZvQuatFCurve::RemoveTail(double parameter) {
  ZvFCurveLockGuard hold(*this);
  // The cut leaves a key at the parameter, which must be a time.
  if (m_curve->IsReadOnly() || !std::isfinite(parameter)) return 0;
  const unsigned int n = m_curve->GetNumKeys();
  if (n == 0) return 1;
  const double last = m_curve->GetKeyTime(n - 1);
  if (zvIsSameParameter(last, parameter)) return 1;
  if (AreAnyValuesLockedInInterval(parameter, last, 1, 0) ||
      AreAnyParametersLockedInInterval(parameter, last, 1, 0)) {
    return 0;
  }
  const unsigned int at = m_curve->SetKey(parameter, m_curve->Eval(parameter), 0.0);
  const unsigned int count = m_curve->GetNumKeys();
  if (at + 1 < count) {
    for (unsigned int i = at + 1; i < count; ++i)
      RemoveKeyUserData(m_curve->GetKeyTime(i));
    m_curve->RemoveKeyRange(at + 1, count - 1);
  }
  return 1;
}

unsigned int ZvQuatFCurve::ShiftParameters(double delta) {
  ZvFCurveLockGuard hold(*this);
  if (m_curve->IsReadOnly() || !MoveKeepsOrder(*m_curve, [delta](double t) { return t + delta; })) {
    return 0;
  }
  m_curve->Shift(delta);
  TranslateAllKeyUserData(delta);
  return 1;
}

unsigned int ZvQuatFCurve::ScaleParameterAxis(double factor) {
  ZvFCurveLockGuard hold(*this);
  if (m_curve->IsReadOnly() ||
      !MoveKeepsOrder(*m_curve, [factor](double t) { return t * factor; }) ||
      !m_curve->Scale(factor)) {
    return 0;
  }
  ScaleAllKeyUserData(factor);
  return 1;
}

unsigned int ZvQuatFCurve::ShiftValues(double delta) {
  return ScaleAndShiftValues(1.0, delta);
}

unsigned int ZvQuatFCurve::MirrorValues() {
  return ScaleAndShiftValues(-1.0, 0.0);
}

// The component of every key and the no-keys value become value * scale + offset; a value-locked
// key refuses the whole change.
unsigned int ZvQuatFCurve::ScaleAndShiftValues(double scale, double offset) {
  ZvFCurveLockGuard hold(*this);
  if (m_curve->IsReadOnly()) return 0;
  const unsigned int n = m_curve->GetNumKeys();
  for (unsigned int i = 0; i < n; ++i)
    if (m_curve->IsValueLocked(i)) return 0;
  for (unsigned int i = 0; i < n; ++i) {
    m_curve->SetKeyValue(i, m_component, m_curve->GetKeyValue(i, m_component) * scale + offset);
  }
  m_curve->SetValueWhenNoKeys(m_component,
                              m_curve->GetValueWhenNoKeys(m_component) * scale + offset);
  return 1;
}

unsigned int ZvQuatFCurve::ScaleAndOffsetParameters(double start, double end, double pivot,
                                                    double scale, double offset, int moveHead,
                                                    int moveTail, RegionHandle) {
  ZvFCurveLockGuard hold(*this);
  if (m_curve->IsReadOnly()) return 0;
  const unsigned int n = m_curve->GetNumKeys();
  for (unsigned int i = 0; i < n; ++i)
    if (m_curve->IsParamLocked(i)) return 0;
  if (scale >= -1e-9 && scale <= 1e-9) return 0;
  if (n == 0) return 1;
  if (zvIsSameParameter(scale, 1.0) && zvIsSameParameter(offset, 0.0)) return 1;
  // The keys beyond the interval that a moving head or tail carries along.
  const double firstKey = m_curve->GetKeyTime(0), lastKey = m_curve->GetKeyTime(n - 1);
  if (moveHead) {
    if (offset > 0.0)
      end = lastKey;
    else
      start = firstKey;
  }
  if (moveTail) {
    if (offset > 0.0)
      start = firstKey;
    else
      end = lastKey;
  }
  unsigned int first, last;
  if (!QuatKeyIndicesInInterval(m_curve->GetKeys(), start, end, first, last, 0, 0)) return 1;
  // A NaN pivot, scale or offset, or an overflow, would store a time that is not finite.
  for (unsigned int i = first; i <= last; ++i) {
    if (!std::isfinite((m_curve->GetKeyTime(i) - pivot) * scale + pivot + offset)) return 0;
  }
  // Keys with constraint data stay where they are.
  std::vector<ZvQuatKey> moved;
  for (unsigned int i = last + 1; i-- > first;) {
    if (m_curve->GetConstraintData(i) != 0) continue;
    ZvQuatKey k;
    m_curve->GetKey(i, k);
    moved.push_back(k);
    RemoveKeyUserData(k.time);
    m_curve->RemoveKeyAt(i);
  }
  for (ZvQuatKey& k : moved) {
    k.time = (k.time - pivot) * scale + pivot + offset;
    m_curve->SetKey(k, 1e-6);
  }
  return 1;
}

unsigned int ZvQuatFCurve::SetConstraint(double& parameter, KeyConstraint constraints, int on,
                                         double tolerance) {
  const unsigned int code = static_cast<unsigned int>(constraints);
  if (code == 0 || (code & ~static_cast<unsigned int>(ParameterLock | ValueLock | WholeKeyLock))) {
    return 0;
  }
  ZvFCurveLockGuard hold(*this);
  if (m_curve->IsReadOnly()) return 0;
  const unsigned int i = m_curve->FindKey(parameter, tolerance);
  if (i == ZvQuatCurve::NoKey) return 0;
  if (code & (ParameterLock | WholeKeyLock)) m_curve->SetParamLock(i, on);
  if (code & (ValueLock | WholeKeyLock)) m_curve->SetValueLock(i, on);
  parameter = m_curve->GetKeyTime(i);
  return 1;
}

unsigned int ZvQuatFCurve::AppendLinearSegment(const ZvPoint2<double>& point) {
  ZvFCurveLockGuard hold(*this);
  const unsigned int n = m_curve->GetNumKeys();
  if (m_curve->IsReadOnly() || n == 0 || !(point.x > m_curve->GetKeyTime(n - 1))) return 0;
  m_curve->SetKey(point.x, m_component, point.y, 0.0);
  return 1;
}

unsigned int ZvQuatFCurve::AppendOrExtendLinearSegment(const ZvPoint2<double>& point,
                                                       double tolerance) {
  ZvFCurveLockGuard hold(*this);
  const unsigned int n = m_curve->GetNumKeys();
  if (m_curve->IsReadOnly() || n == 0 || !(point.x > m_curve->GetKeyTime(n - 1))) return 0;
  if (n >= 2) {
    const double t0 = m_curve->GetKeyTime(n - 2), t1 = m_curve->GetKeyTime(n - 1);
    const double v0 = m_curve->GetKeyValue(n - 2, m_component);
    const double v1 = m_curve->GetKeyValue(n - 1, m_component);
    const double onLine = v0 + (v1 - v0) * (point.x - t0) / (t1 - t0);
    if (std::fabs(onLine - point.y) <= tolerance) {
      if (HasUserData(t1)) {
        ZvDoubleArray from(1), to(1);
        from.Add(t1);
        to.Add(point.x);
        MoveKeyUserDataTail(from, to);
      }
      m_curve->SetParameter(n - 1, point.x);
      m_curve->SetKeyValue(n - 1, m_component, onLine);
      return 1;
    }
  }
  m_curve->SetKey(point.x, m_component, point.y, 0.0);
  return 1;
}
