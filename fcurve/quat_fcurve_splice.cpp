// Cutting, pasting and appending rotation views. The pieces are whole rotations: a piece carries
// all three angles of its keys, whatever view it goes through. Keys put at the ends of an
// interval take the rotation evaluated there; on a rotation spline such a key keeps the rotation
// at the key exactly and the shape of the neighbouring segments closely, not exactly, since the
// tangents follow the new neighbours.
#include <zv/quat_fcurve.h>

#include "fcurve/fcurve_lock.h"

#include <cmath>
#include <utility>
#include <vector>

namespace {

// The index of the key at t, made with the rotation there when there is none.
unsigned int KeyAt(ZvQuatCurve& c, double t) {
  const unsigned int i = c.FindKey(t, 1e-15);
  return i != ZvQuatCurve::NoKey ? i : c.SetKey(t, c.Eval(t), 0.0);
}

// A moving tail would carry parameter-locked keys along.
bool AnyParameterLockFrom(const ZvQuatCurve& c, double t) {
  for (const ZvQuatKey& k : c.GetKeys())
    if (k.time >= t && k.IsParamLocked()) return true;
  return false;
}

// The rotation from start to end as a curve of its own: keys at both ends, none outside.
ZvQuatCurve Piece(const ZvQuatCurve& source, double start, double end) {
  ZvQuatCurve piece(source);
  const unsigned int n = piece.GetNumKeys();
  if (n == 0) return piece;
  const unsigned int a = KeyAt(piece, start);
  const unsigned int b = KeyAt(piece, end);
  if (b + 1 < piece.GetNumKeys()) piece.RemoveKeyRange(b + 1, piece.GetNumKeys() - 1);
  if (a > 0) piece.RemoveKeyRange(0, a - 1);
  return piece;
}

}  // namespace

// Keys from `index` on move by delta; their per-key user data go with them.
void ZvQuatFCurve::MoveTail(unsigned int index, double delta) {
  ZvDoubleArray before, after;
  for (unsigned int i = index; i < m_curve->GetNumKeys(); ++i) {
    const double t = m_curve->GetKeyTime(i);
    m_curve->SetParameter(i, t + delta);
    if (HasUserData(t)) {
      before.Add(t);
      after.Add(t + delta);
    }
  }
  if (before.size) MoveKeyUserDataTail(before, after);
}

// Drops keys first..last with this view's user data of them.
void ZvQuatFCurve::DropKeys(unsigned int first, unsigned int last) {
  for (unsigned int i = first; i <= last; ++i)
    RemoveKeyUserData(m_curve->GetKeyTime(i));
  m_curve->RemoveKeyRange(first, last);
}

unsigned int ZvQuatFCurve::Cut(double start, double end, ZvBaseFCurve& cutOut) {
  ZvQuatFCurve* target = static_cast<ZvQuatFCurve*>(cutOut.QueryFCurveKind(QuatKind));
  if (target == nullptr || !std::isfinite(start) || !std::isfinite(end)) return 0;
  if (start > end) std::swap(start, end);
  ZvFCurveLockGuard hold(*this);
  if (m_curve->IsReadOnly() || target->IsReadOnly()) return 0;
  if (AreAnyValuesLockedInInterval(start, end, 0, 0) || AnyParameterLockFrom(*m_curve, start)) {
    return 0;
  }
  // The keys beyond the cut move left by its width; rounding must not land one on the cut.
  double previous = start;
  for (const ZvQuatKey& k : m_curve->GetKeys()) {
    if (!(k.time - end > 1e-15)) continue;
    const double moved = k.time + (start - end);
    if (!(moved > previous) || !std::isfinite(moved)) return 0;
    previous = moved;
  }
  const ZvQuatCurve piece = Piece(*m_curve, start, end);
  if (m_curve->GetNumKeys() > 0 && end > start) {
    // The key at end takes the place of the key at start: the curve goes on from start as it
    // went on from end.
    const unsigned int a = KeyAt(*m_curve, start);
    const unsigned int b = KeyAt(*m_curve, end);
    DropKeys(a, b - 1);
    MoveTail(a, start - end);
  }
  if (target->m_curve != m_curve) {
    ZvFCurveLockGuard holdTarget(*target);
    *target->m_curve = piece;
  }
  return 1;
}

unsigned int ZvQuatFCurve::Paste(const ZvBaseFCurve& source, double start, double end) {
  const ZvQuatFCurve* src = static_cast<const ZvQuatFCurve*>(source.QueryFCurveKind(QuatKind));
  if (src == nullptr || !std::isfinite(start) || !std::isfinite(end)) return 0;
  ZvQuatCurve piece;
  {
    ZvFCurveLockGuard holdSource(*src);
    piece = *src->m_curve;
  }
  ZvFCurveLockGuard hold(*this);
  const unsigned int count = piece.GetNumKeys();
  if (m_curve->IsReadOnly() || count == 0) return 0;
  if (start > end) std::swap(start, end);
  if (AnyParameterLockFrom(*m_curve, start)) return 0;
  const double first = piece.GetKeyTime(0);
  const double length = piece.GetKeyTime(count - 1) - first;
  if (m_curve->GetNumKeys() > 0) {
    // Keys of [start, end] give way to the piece; the tail makes room for its length.
    const unsigned int a = KeyAt(*m_curve, start);
    const unsigned int b = KeyAt(*m_curve, end);
    DropKeys(a, b);
    MoveTail(a, start + length - end);
  }
  for (ZvQuatKey k : piece.GetKeys()) {
    k.time += start - first;
    m_curve->SetKey(k, 1e-12);
  }
  return 1;
}

unsigned int ZvQuatFCurve::Append(const ZvBaseFCurve& source) {
  const ZvQuatFCurve* src = static_cast<const ZvQuatFCurve*>(source.QueryFCurveKind(QuatKind));
  if (src == nullptr) return 0;
  ZvQuatCurve piece;
  {
    ZvFCurveLockGuard holdSource(*src);
    piece = *src->m_curve;
  }
  ZvFCurveLockGuard hold(*this);
  if (m_curve->IsReadOnly()) return 0;
  const unsigned int n = m_curve->GetNumKeys(), count = piece.GetNumKeys();
  if (count == 0) return 1;
  // The piece's first key lands on, and replaces, the last key; without keys it comes as it is.
  const double offset = n ? m_curve->GetKeyTime(n - 1) - piece.GetKeyTime(0) : 0.0;
  for (ZvQuatKey k : piece.GetKeys()) {
    k.time += offset;
    m_curve->SetKey(k, 1e-12);
  }
  return 1;
}
