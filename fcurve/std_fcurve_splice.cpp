// Cutting, pasting and appending standard curves, and the constructor that copies a part of a
// curve. All of them take pieces of curves apart at keys made without changing the shape, and
// join pieces at keys that take their left side from one piece and their right side from the
// other.
#include <zv/std_fcurve.h>

#include "fcurve/fcurve_lock.h"
#include "fcurve/std_fcurve_impl.h"

#include <cmath>

namespace {

void ShiftKey(CFCStdKey& k, double dx) {
  k.parameter += dx;
  k.leftTangent.x += dx;
  k.rightTangent.x += dx;
}

// Key k takes the right side of `from`: value, handle and the kind of the segment after it.
void TakeRightSide(CFCStdKey& k, const CFCStdKey& from, double dx) {
  k.rightValue = from.rightValue;
  k.rightTangent = {from.rightTangent.x + dx, from.rightTangent.y};
  k.segmentKind = from.segmentKind;
}

void TakeLeftSide(CFCStdKey& k, const CFCStdKey& from, double dx) {
  k.leftValue = from.leftValue;
  k.leftTangent = {from.leftTangent.x + dx, from.leftTangent.y};
}

bool ValueLockedAndDiffers(const CFCStdKey& k, double was, double will) {
  return (k.flags & CFCFlag_ValueLock) && was != will;
}

void ClearBits(CFCStdKey& k, unsigned short bits) {
  k.flags = static_cast<unsigned short>(k.flags & ~bits);
}

// Handles at the thirds toward the neighbours when the curve asks for that.
void ReapplyHandleConstraint(ZvStdFCurveImpl& s, unsigned int from = 0) {
  if (!s.defaultBezierTangentConstraint) return;
  for (unsigned int i = from; i < s.keys.size; ++i) {
    const ZvPoint2<double> l = s.keys[i].leftTangent, r = s.keys[i].rightTangent;
    s.SetActualLeftTgt(i, l);
    s.SetActualRightTgt(i, r);
  }
}

}  // namespace

void ZvStdFCurveImpl::ResolveAutoTangentsAround(double start, double end) {
  const unsigned int n = keys.size;
  if (n == 0) return;
  int found;
  const unsigned int at = LocateParameter(start, found);
  const unsigned int first = at >= 2 ? at - 2 : 0;
  unsigned int last = LocateParameter(end, found);
  if (last >= n) last = n - 1;
  for (unsigned int i = first; i <= last; ++i)
    ResolveAutoTangent(i);
}

int ZvStdFCurveImpl::MoveTail(unsigned int first, double delta, ZvBaseFCurve& curve) {
  const unsigned int n = keys.size;
  if (first >= n || delta == 0.0) return 1;
  for (unsigned int i = first; i < n; ++i) {
    if (keys[i].flags & CFCFlag_ParameterLock) return 0;
  }
  if (first > 0 && !(keys[first].parameter + delta >= keys[first - 1].parameter)) return 0;
  // Near the largest double the move can overflow; the moved keys stay in order, so the ends
  // tell.
  if (!std::isfinite(keys[first].parameter + delta) ||
      !std::isfinite(keys[n - 1].parameter + delta))
    return 0;
  ZvDoubleArray from(4), to(4);
  // A key sharing its parameter with the key before it (a duplicate about to be opened up)
  // leaves the user data there with that key.
  const double shared = first > 0 ? keys[first - 1].parameter : NAN;
  for (unsigned int i = first; i < n; ++i) {
    const double p = keys[i].parameter;
    if (p != shared && curve.GetUserDataSet(p) != nullptr) {
      from.Add(p);
      to.Add(p + delta);
    }
    ShiftKey(keys[i], delta);
  }
  if (from.size) curve.MoveKeyUserDataTail(from, to);
  return 1;
}

int ZvStdFCurveImpl::SpliceAfter(unsigned int a, const ZvStdFCurveImpl& piece,
                                 const ZvBaseFCurve& pieceCurve, bool joinNext,
                                 ZvBaseFCurve& curve) {
  const unsigned int m = piece.keys.size;
  const CFCStdKey& head = piece.keys[0];
  const CFCStdKey& tail = piece.keys[m - 1];
  const double dx = keys[a].parameter - head.parameter;
  if (ValueLockedAndDiffers(keys[a], keys[a].rightValue, head.rightValue)) return 0;
  if (joinNext && m > 1 &&
      ValueLockedAndDiffers(keys[a + 1], keys[a + 1].leftValue, tail.leftValue)) {
    return 0;
  }
  if (joinNext && m == 1) {
    // A piece of one key closes the gap: key a keeps its left side and takes the right side of
    // the key that met it.
    TakeRightSide(keys[a], keys[a + 1], 0.0);
    this->DropKeys(a + 1, a + 1);
  } else {
    TakeRightSide(keys[a], head, dx);
    // The inner keys go in as one run: one by one, each would move the whole tail again.
    const unsigned int inner = joinNext ? m - 1 : m;
    if (inner > 1) keys.InsertBefore(a + 1, piece.keys.data + 1, inner - 1);
    for (unsigned int j = 1; j < inner; ++j)
      ShiftKey(keys[a + j], dx);
    if (joinNext) TakeLeftSide(keys[a + m - 1], tail, dx);
  }
  for (unsigned int j = 0; j < m; ++j) {
    const double p = piece.keys[j].parameter;
    if (pieceCurve.GetUserDataSet(p) != nullptr) curve.CopyKeyUserData(pieceCurve, p, p + dx);
  }
  // Both joins claim continuity only where the handles they met still agree; a block read back
  // would drop the claim otherwise.
  if (!ActualTangentsAreUnified(a)) ClearBits(keys[a], CFCFlag_TangentContinuity);
  const unsigned int far = a + m - 1;
  if (joinNext && m > 1 && !ActualTangentsAreUnified(far)) {
    ClearBits(keys[far], CFCFlag_TangentContinuity);
  }
  return 1;
}

// ---- The part constructor -------------------------------------------------------------------

ZvStdFCurve::ZvStdFCurve(const ZvStdFCurve& source, double start, double end)
    : ZvStdFCurve(source) {
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  const unsigned int n = s.keys.size;
  if (n == 0 || std::isnan(start) || std::isnan(end)) return;
  const double t0 = s.keys[0].parameter, tn = s.keys[n - 1].parameter;
  s.ResolveAutoTangentsAround(start, end);
  // The part is cut even out of a read-only curve; the flag comes back afterwards.
  const unsigned int readOnly = s.readOnly;
  s.readOnly = 0;
  const unsigned short locks = CFCFlag_ParameterLock | CFCFlag_ValueLock;
  if (start > t0) {
    for (unsigned int i = 0; i < s.keys.size && s.keys[i].parameter <= start + 1e-15; ++i)
      ClearBits(s.keys[i], locks);
    ZvStdFCurve::RemoveHead(start);
  }
  if (end < tn) {
    for (unsigned int i = s.keys.size; i-- > 0 && s.keys[i].parameter >= end - 1e-15;)
      ClearBits(s.keys[i], locks);
    ZvStdFCurve::RemoveTail(end);
  }
  s.readOnly = readOnly;
}

// ---- Cut, paste, append ---------------------------------------------------------------------

unsigned int ZvStdFCurve::Cut(double start, double end, ZvBaseFCurve& cutOut) {
  ZvStdFCurve* target = dynamic_cast<ZvStdFCurve*>(cutOut.QueryFCurveKind(StdKind));
  if (target == nullptr || !std::isfinite(start) || !std::isfinite(end)) return 0;
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  if (s.readOnly) return 0;
  if (start > end) {
    const double t = start;
    start = end;
    end = t;
  }
  if (AreAnyParametersLockedInInterval(start, end, 0, 0) ||
      AreAnyValuesLockedInInterval(start, end, 0, 0)) {
    return 0;
  }
  ZvStdFCurve piece(*this, start, end);
  if (s.keys.size == 0) return target->Set(piece);
  const ZvStdFCurve saved(*this);
  s.ResolveAutoTangentsAround(start, end);
  unsigned int a, b;
  s.CreateNonModifyingKey(start, a, *this);
  s.CreateNonModifyingKey(end, b, *this);
  if (b > a) {
    if (b > a + 1) s.RemoveWithUserData(a + 1, b - 1, *this);
    int ok = s.MoveTail(a + 1, start - end, *this);
    if (ok) {
      // Keys a and a + 1 now meet: a keeps what arrives from the left and takes what leaves.
      ok = !ValueLockedAndDiffers(s.keys[a], s.keys[a].rightValue, s.keys[a + 1].rightValue);
    }
    if (!ok) {
      Set(saved);
      return 0;
    }
    TakeRightSide(s.keys[a], s.keys[a + 1], 0.0);
    s.DropKeys(a + 1, a + 1);
    // Rounding of the moved tail can land a key on the cut; that would break the order.
    if (!s.KeysAreOrdered()) {
      Set(saved);
      return 0;
    }
    if (!s.ActualTangentsAreUnified(a)) ClearBits(s.keys[a], CFCFlag_TangentContinuity);
    ReapplyHandleConstraint(s);
  }
  if (target != this) target->Set(piece);
  return 1;
}

unsigned int ZvStdFCurve::Paste(const ZvBaseFCurve& source, double start, double end) {
  const ZvStdFCurve* src = dynamic_cast<const ZvStdFCurve*>(source.QueryFCurveKind(StdKind));
  if (src == nullptr || !std::isfinite(start) || !std::isfinite(end)) return 0;
  const ZvStdFCurve piece(*src);  // under the source's lock, before this curve's is taken
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  const ZvStdFCurveImpl& p = *piece.m_impl;
  if (s.readOnly || p.keys.size == 0) return 0;
  const double lo = start < end ? start : end, hi = start < end ? end : start;
  const double length = p.keys[p.keys.size - 1].parameter - p.keys[0].parameter;
  const ZvStdFCurve saved(*this);
  s.ResolveAutoTangentsAround(lo, hi);
  unsigned int first, last;
  if (s.keys.size && s.GetKeyIndicesInInterval(lo, hi, first, last, 1, 1)) {
    for (unsigned int i = first; i <= last; ++i)
      ClearBits(s.keys[i], CFCFlag_ParameterLock | CFCFlag_ValueLock);
  }
  unsigned int a, b;
  s.CreateNonModifyingKey(lo, a, *this);
  s.CreateNonModifyingKey(hi, b, *this);
  if (b > a + 1) s.RemoveWithUserData(a + 1, b - 1, *this);
  int ok = 1;
  if (b == a && length > 0.0) {
    // Open the curve at one key: a twin takes its right side across the gap.
    s.keys.InsertBefore(a + 1, s.keys[a]);
    ok = s.MoveTail(a + 1, length, *this);
  } else if (b > a) {
    // A piece as long as the interval leaves the tail where it is, rounding included.
    const double delta = lo + length - hi;
    if (std::fabs(delta) > 1e-12 * (1.0 + std::fabs(hi))) ok = s.MoveTail(a + 1, delta, *this);
  }
  if (ok)
    ok = b == a && length <= 0.0 ? s.SpliceAfter(a, p, piece, false, *this)
                                 : s.SpliceAfter(a, p, piece, true, *this);
  if (ok) {
    ReapplyHandleConstraint(s);
    // The keys stay ordered and finite: the ends tell whether a move overflowed.
    ok = s.IsValid() && std::isfinite(s.keys[0].parameter) &&
         std::isfinite(s.keys[s.keys.size - 1].parameter);
  }
  if (!ok) {
    Set(saved);
    return 0;
  }
  return 1;
}

unsigned int ZvStdFCurve::Append(const ZvBaseFCurve& source) {
  const ZvStdFCurve* src = dynamic_cast<const ZvStdFCurve*>(source.QueryFCurveKind(StdKind));
  if (src == nullptr) return 0;
  const ZvStdFCurve piece(*src);
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  const ZvStdFCurveImpl& p = *piece.m_impl;
  if (s.readOnly) return 0;
  if (p.keys.size == 0) return 1;
  if (s.keys.size == 0) {
    // Nothing to join to: the keys come as they are.
    s.keys = p.keys;
    s.firstSegmentKind = p.firstSegmentKind;
    for (unsigned int j = 0; j < p.keys.size; ++j) {
      const double t = p.keys[j].parameter;
      if (piece.GetUserDataSet(t) != nullptr) CopyKeyUserData(piece, t, t);
    }
    return 1;
  }
  // Far from the origin the piece's keys, moved to the last key, can round onto each other:
  // found before anything changes, so that appending stays proportional to the piece (a cycle
  // snapshot appends period after period).
  const unsigned int last = s.keys.size - 1;
  const double dx = s.keys[last].parameter - p.keys[0].parameter;
  const bool ordered = ZvStdFCurveImpl::WouldBeOrdered(p.keys.size, [&](unsigned int j) {
    return j == 0 ? s.keys[last].parameter : p.keys[j].parameter + dx;
  });
  if (!ordered || !s.SpliceAfter(last, p, piece, false, *this)) return 0;
  // Only the joined key and the keys after it have new neighbours.
  ReapplyHandleConstraint(s, last);
  return 1;
}
