// Cutting, pasting and appending rotation views. The pieces are whole rotations: a piece carries
// all three angles of its keys, whatever view it goes through. Keys put at the ends of an
// interval take the rotation evaluated there; on a rotation spline such a key keeps the rotation
// at the key exactly and the shape of the neighbouring segments closely, not exactly, since the
// tangents follow the new neighbours.
#include <zv/quat_fcurve.h>

#include "fcurve/fcurve_lock.h"

#include <cmath>
#include <cstddef>
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

// What a splice does to the per-key user data, noted while the keys are edited aside and done
// only once the edited keys are known to stay in order.
struct KeyUserDataMoves {
  ZvDoubleArray dropped, from, to;

  void Apply(ZvBaseFCurve& curve) const {
    for (unsigned int i = 0; i < dropped.size; ++i)
      curve.RemoveKeyUserData(dropped[i]);
    ZvDoubleArray before, after;
    for (unsigned int i = 0; i < from.size; ++i) {
      if (curve.HasUserData(from[i])) {
        before.Add(from[i]);
        after.Add(to[i]);
      }
    }
    if (before.size) curve.MoveKeyUserDataTail(before, after);
  }
};

// Takes keys first..last out of `keys`.
void DropKeys(std::vector<ZvQuatKey>& keys, unsigned int first, unsigned int last,
              KeyUserDataMoves& moves) {
  for (unsigned int i = first; i <= last; ++i)
    moves.dropped.Add(keys[i].time);
  keys.erase(keys.begin() + first, keys.begin() + last + 1);
}

// Keys from `index` on move by delta.
void MoveTail(std::vector<ZvQuatKey>& keys, unsigned int index, double delta,
              KeyUserDataMoves& moves) {
  for (unsigned int i = index; i < keys.size(); ++i) {
    moves.from.Add(keys[i].time);
    keys[i].time += delta;
    moves.to.Add(keys[i].time);
  }
}

// The keys of `into` with those of `piece`, moved by `shift`, put among them in one pass over
// both: a piece key within 1e-12 of the key placed last or of the next key of `into` replaces
// the nearer, as setting the keys one by one with that tolerance would.
std::vector<ZvQuatKey> Merged(const std::vector<ZvQuatKey>& into,
                              const std::vector<ZvQuatKey>& piece, double shift) {
  std::vector<ZvQuatKey> out;
  out.reserve(into.size() + piece.size());
  size_t i = 0;
  for (ZvQuatKey k : piece) {
    k.time += shift;
    while (i < into.size() && into[i].time < k.time - 1e-12)
      out.push_back(into[i++]);
    const double placed = out.empty() ? INFINITY : std::fabs(out.back().time - k.time);
    const double next = i < into.size() ? std::fabs(into[i].time - k.time) : INFINITY;
    if (placed <= 1e-12 && !(next < placed)) {
      out.back() = k;
    } else {
      if (next <= 1e-12) ++i;
      out.push_back(k);
    }
  }
  out.insert(out.end(), into.begin() + static_cast<std::ptrdiff_t>(i), into.end());
  return out;
}

// Times finite and strictly increasing: what every edit must leave.
bool Ordered(const std::vector<ZvQuatKey>& keys) {
  for (size_t i = 0; i < keys.size(); ++i) {
    if (!std::isfinite(keys[i].time) || (i > 0 && !(keys[i].time > keys[i - 1].time))) {
      return false;
    }
  }
  return true;
}

}  // namespace

unsigned int ZvQuatFCurve::Cut(double start, double end, ZvBaseFCurve& cutOut) {
  ZvQuatFCurve* target = static_cast<ZvQuatFCurve*>(cutOut.QueryFCurveKind(QuatKind));
  if (target == nullptr || !std::isfinite(start) || !std::isfinite(end)) return 0;
  if (start > end) std::swap(start, end);
  ZvFCurveLockGuard hold(*this);
  if (m_curve->IsReadOnly() || target->IsReadOnly()) return 0;
  if (AreAnyValuesLockedInInterval(start, end, 0, 0) || AnyParameterLockFrom(*m_curve, start)) {
    return 0;
  }
  const ZvQuatCurve piece = Piece(*m_curve, start, end);
  ZvQuatCurve cut(*m_curve);
  KeyUserDataMoves moves;
  if (cut.GetNumKeys() > 0 && end > start) {
    // The key at end takes the place of the key at start: the curve goes on from start as it
    // went on from end. Ends closer than the key tolerance find one key: nothing lies between.
    const unsigned int a = KeyAt(cut, start);
    const unsigned int b = KeyAt(cut, end);
    if (b > a) {
      DropKeys(cut.keys, a, b - 1, moves);
      MoveTail(cut.keys, a, start - end, moves);
    }
  }
  // Rounding of the moved tail can land a key on the one before the cut, or, on a cut as wide
  // as the largest doubles, behind it.
  if (!Ordered(cut.keys)) return 0;
  moves.Apply(*this);
  *m_curve = cut;
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
  ZvQuatCurve pasted(*m_curve);
  KeyUserDataMoves moves;
  if (pasted.GetNumKeys() > 0) {
    // Keys of [start, end] give way to the piece; the tail makes room for its length.
    const unsigned int a = KeyAt(pasted, start);
    const unsigned int b = KeyAt(pasted, end);
    DropKeys(pasted.keys, a, b, moves);
    MoveTail(pasted.keys, a, start + length - end, moves);
  }
  std::vector<ZvQuatKey> keys = Merged(pasted.keys, piece.keys, start - first);
  if (!Ordered(keys)) return 0;
  moves.Apply(*this);
  pasted.keys.swap(keys);
  *m_curve = pasted;
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
  ZvQuatCurve appended(*m_curve);
  std::vector<ZvQuatKey> keys = Merged(appended.keys, piece.keys, offset);
  if (!Ordered(keys)) return 0;
  appended.keys.swap(keys);
  *m_curve = appended;
  return 1;
}
