// The contract operations that the curve kinds of one value per key (integer, boolean, raw)
// perform alike: removal, cutting and joining of curves, moves along the parameter axis,
// resampling, smoothing, key info and snapshots. What differs between them - the value type,
// what lies between keys, the locks a store knows - reaches these through the store accessors
// and the members the evaluation templates use.
//
// Curve is the public class, which holds its implementation object in `m_impl` and names this
// template its friend; Kind is its GetKind(). Every function here is called with the curve's lock
// held, except those that take another curve, which lock in the contract's order themselves.
#ifndef ZV_FCURVE_CFC_SINGLE_VALUE_CURVE_H
#define ZV_FCURVE_CFC_SINGLE_VALUE_CURVE_H

#include <zv/fcurve.h>

#include "fcurve/cfc_base_impl.h"
#include "fcurve/cfc_extrapolation.h"
#include "fcurve/fcurve_lock.h"
#include "fcurve/key_user_data_transit.h"

#include <cmath>
#include <memory>
#include <new>

template <class Curve, class Impl>
struct CFCSingleValueCurve {
  using Value = typename Impl::Value;
  // An interval longer than this many periods is refused rather than built key by key.
  static constexpr double kMaxSnapShotCycles = 1e5;

  static Impl& Of(Curve& c) { return *c.m_impl; }
  static const Impl& Of(const Curve& c) { return *c.m_impl; }

  static bool AnyKeyHas(const Impl& s, unsigned short bits) {
    for (unsigned int i = 0; i < s.keys.size; ++i)
      if (s.GetKeyFlags(i) & bits) return true;
    return false;
  }
  static void ClearFlags(Impl& s, unsigned int i, unsigned short bits) {
    s.SetKeyFlags(i, static_cast<unsigned short>(s.GetKeyFlags(i) & ~bits));
  }
  static bool LockedIn(const Curve& c, double start, double end, int excludeStart, int excludeEnd) {
    return c.AreAnyParametersLockedInInterval(start, end, excludeStart, excludeEnd) ||
           c.AreAnyValuesLockedInInterval(start, end, excludeStart, excludeEnd);
  }

  // ---- Assignment ------------------------------------------------------------------------

  static unsigned int Set(Curve& c, const ZvBaseFCurve& curve) {
    const Curve* other = dynamic_cast<const Curve*>(curve.QueryFCurveKind(c.GetKind()));
    if (other == nullptr) return 0;
    ZvFCurveLockGuard guard(c);
    if (other == &c) return 1;
    c.ZvBaseFCurve::operator=(*other);
    ZvFCurveLockGuard otherGuard(*other);
    *c.m_impl = *other->m_impl;
    return 1;
  }

  static Curve* Clone(const Curve& c) {
    try {
      return new Curve(c);
    } catch (const std::bad_alloc&) {
      return nullptr;
    }
  }

  // ---- Removal ---------------------------------------------------------------------------

  static unsigned int RemoveKey(Curve& c, double parameter, double tolerance) {
    Impl& s = Of(c);
    if (s.readOnly) return 0;
    unsigned int i;
    if (!s.GetClosestKeyIndexInCenteredInterval(parameter, tolerance, i)) return 0;
    if (s.GetKeyFlags(i) & (CFCFlag_ValueLock | CFCFlag_ParameterLock)) return 0;
    return s.RemoveKey(s.keys[i].parameter, 0.0, c);
  }

  static unsigned int RemoveKeys(Curve& c, double start, double end, int excludeStart,
                                 int excludeEnd) {
    Impl& s = Of(c);
    if (s.readOnly || std::isnan(start) || std::isnan(end)) return 0;
    if (zvIsSameParameter(start, end) && excludeStart != excludeEnd) excludeStart = excludeEnd = 0;
    if (LockedIn(c, start, end, excludeStart, excludeEnd)) return 0;
    unsigned int first, last;
    if (!s.GetKeyIndicesInInterval(start, end, first, last, excludeStart, excludeEnd)) return 1;
    // The step in front of the keys that remain keeps the last removed value.
    const Value carried = s.GetValue(last);
    s.RemoveWithUserData(first, last, c);
    if (first == 0) s.KeepValueLeftOfFirstKey(s.keys.size ? carried : s.valueWhenNoKeys);
    return 1;
  }

  // Keeps the keys from the parameter on, a key made there on the curve.
  static unsigned int RemoveHead(Curve& c, double parameter) {
    Impl& s = Of(c);
    if (s.readOnly || !std::isfinite(parameter)) return 0;
    if (s.keys.size == 0 || zvIsSameParameter(parameter, s.keys[0].parameter)) return 1;
    if (LockedIn(c, s.keys[0].parameter, parameter, 0, 1)) return 0;
    DropOutside(c, s, parameter, true);
    return 1;
  }

  static unsigned int RemoveTail(Curve& c, double parameter) {
    Impl& s = Of(c);
    if (s.readOnly || !std::isfinite(parameter)) return 0;
    const unsigned int n = s.keys.size;
    if (n == 0 || zvIsSameParameter(parameter, s.keys[n - 1].parameter)) return 1;
    if (LockedIn(c, parameter, s.keys[n - 1].parameter, 1, 0)) return 0;
    DropOutside(c, s, parameter, false);
    return 1;
  }

  // Makes a key at the parameter and drops, with their user data, the keys before it (head) or
  // after it. Nothing is asked of locks or of the read-only flag.
  static void DropOutside(Curve& c, Impl& s, double parameter, bool head) {
    unsigned int index;
    s.CreateNonModifyingKey(parameter, index, c);
    if (head && index > 0) {
      const Value carried = s.GetValue(index - 1);
      s.RemoveWithUserData(0, index - 1, c);
      s.KeepValueLeftOfFirstKey(carried);
    } else if (!head && index + 1 < s.keys.size) {
      s.RemoveWithUserData(index + 1, s.keys.size - 1, c);
    }
  }

  // Turns a copy into the part of its curve from start to end: what the part constructor does.
  static void KeepSection(Curve& c, double start, double end) {
    Impl& s = Of(c);
    if (s.keys.size == 0 || std::isnan(start) || std::isnan(end)) return;
    if (start > end) {
      const double t = start;
      start = end;
      end = t;
    }
    if (start > s.keys[0].parameter) DropOutside(c, s, start, true);
    if (end < s.keys[s.keys.size - 1].parameter) DropOutside(c, s, end, false);
  }

  // ---- Cutting and joining ---------------------------------------------------------------

  static unsigned int Cut(Curve& c, double start, double end, ZvBaseFCurve& cutOut) {
    Curve* target = dynamic_cast<Curve*>(cutOut.QueryFCurveKind(c.GetKind()));
    if (target == nullptr || !std::isfinite(start) || !std::isfinite(end)) return 0;
    ZvFCurveLockGuard guard(c);
    Impl& s = Of(c);
    if (s.readOnly || (target != &c && target->IsReadOnly())) return 0;
    if (start > end) {
      const double t = start;
      start = end;
      end = t;
    }
    if (LockedIn(c, start, end, 0, 0)) return 0;
    const Curve piece(c, start, end);
    if (s.keys.size) {
      const Curve saved(c);
      // Rounding of the moved tail can land a key on the cut; that would break the order.
      if (!s.Cut(start, end, c) || !s.KeysAreOrdered()) {
        c.Set(saved);
        return 0;
      }
    }
    if (target != &c) target->Set(piece);
    return 1;
  }

  // Puts the keys of `piece`, moved by `shift`, behind the last key of s. A key that lands on the
  // last key gives it its value and flags; the piece's user data comes along.
  static void AppendShifted(Curve& c, Impl& s, const Curve& pieceCurve, double shift) {
    const Impl& p = Of(pieceCurve);
    if (s.keys.size == 0) s.KeepValueLeftOfFirstKey(p.ValueLeftOfFirstKey());
    for (unsigned int j = 0; j < p.keys.size; ++j) {
      const double from = p.keys[j].parameter, to = from + shift;
      const unsigned int n = s.keys.size;
      if (n && zvIsSameParameter(to, s.keys[n - 1].parameter)) {
        s.SetValue(n - 1, p.GetValue(j));
        s.SetKeyFlags(n - 1, p.GetKeyFlags(j));
      } else if (n == 0 || to > s.keys[n - 1].parameter) {
        s.InsertKey(n, to, p.GetValue(j));
        s.SetKeyFlags(n, p.GetKeyFlags(j));
      } else {
        continue;  // rounding put it behind the curve's end; the neighbour stands for it
      }
      if (pieceCurve.GetUserDataSet(from) != nullptr) {
        c.CopyKeyUserData(pieceCurve, from, s.keys[s.keys.size - 1].parameter);
      }
    }
  }

  // Whether the keys of p, moved by shift, stay finite: they stay ordered, so the ends tell.
  static bool StaysFinite(const Impl& p, double shift) {
    return p.keys.size == 0 || (std::isfinite(p.keys[0].parameter + shift) &&
                                std::isfinite(p.keys[p.keys.size - 1].parameter + shift));
  }

  // The piece's first key lands on the last key, which takes its value.
  static unsigned int Append(Curve& c, const ZvBaseFCurve& source) {
    const Curve* src = dynamic_cast<const Curve*>(source.QueryFCurveKind(c.GetKind()));
    if (src == nullptr) return 0;
    const Curve piece(*src);  // under the source's lock, before this curve's is taken
    ZvFCurveLockGuard guard(c);
    Impl& s = Of(c);
    const Impl& p = Of(piece);
    if (s.readOnly) return 0;
    if (p.keys.size == 0) return 1;
    const double shift =
        s.keys.size ? s.keys[s.keys.size - 1].parameter - p.keys[0].parameter : 0.0;
    if (!StaysFinite(p, shift)) return 0;
    AppendShifted(c, s, piece, shift);
    return 1;
  }

  // The interval gives way to the piece: the keys before `start` stay, the piece follows from
  // `start`, and the keys after `end` follow the piece, moved by the difference in length. At
  // `start` the piece's first key sets the value; at the far end the curve's key after the
  // interval does.
  static unsigned int Paste(Curve& c, const ZvBaseFCurve& source, double start, double end) {
    const Curve* src = dynamic_cast<const Curve*>(source.QueryFCurveKind(c.GetKind()));
    if (src == nullptr || !std::isfinite(start) || !std::isfinite(end)) return 0;
    Curve piece(*src);
    ZvFCurveLockGuard guard(c);
    Impl& s = Of(c);
    Impl& p = Of(piece);
    if (s.readOnly || p.keys.size == 0) return 0;
    const double lo = start < end ? start : end, hi = start < end ? end : start;
    const unsigned int n = s.keys.size;
    // Past the last key nothing of the curve is replaced, so nothing can be locked.
    if (n && !(lo > s.keys[n - 1].parameter) && LockedIn(c, lo, hi, 1, 1)) return 0;
    Curve head(c), tail(c);
    Impl& h = Of(head);
    Impl& t = Of(tail);
    h.readOnly = t.readOnly = p.readOnly = 0;
    unsigned int first, last;
    if (t.keys.size && t.GetKeyIndicesInInterval(lo, hi, first, last, 0, 0)) {
      for (unsigned int i = first; i <= last; ++i)
        ClearFlags(t, i, CFCFlag_ParameterLock | CFCFlag_ValueLock);
    }
    if (n) {
      DropOutside(head, h, lo, false);
      DropOutside(tail, t, hi, true);
      if (!(hi > s.keys[n - 1].parameter)) {
        const double length = p.keys[p.keys.size - 1].parameter - p.keys[0].parameter;
        const double delta = lo + length - hi;
        if (delta != 0.0) {
          if (AnyKeyHas(t, CFCFlag_ParameterLock)) return 0;
          t.ShiftKeyParameters(delta, tail);
        }
      } else {
        t.DropAllKeys();  // nothing of the curve lies beyond the interval
      }
    }
    // Near the largest double the piece or the moved tail can overflow.
    if (!StaysFinite(p, lo - p.keys[0].parameter) || !StaysFinite(t, 0.0)) return 0;
    const ZvBaseFCurve& headBase = head;
    c.ZvBaseFCurve::operator=(headBase);  // the user data of the head
    s = h;
    AppendShifted(c, s, piece, lo - p.keys[0].parameter);
    if (t.keys.size) AppendShifted(c, s, tail, 0.0);
    s.searchHint = 0;
    return 1;
  }

  // ---- Moves along the parameter axis ----------------------------------------------------

  static unsigned int ShiftParameters(Curve& c, double delta) {
    Impl& s = Of(c);
    if (s.readOnly || !std::isfinite(delta) || AnyKeyHas(s, CFCFlag_ParameterLock)) return 0;
    // Near the largest double a shift can merge keys or overflow them.
    if (!s.WouldBeOrdered(s.keys.size,
                          [&s, delta](unsigned int j) { return s.keys[j].parameter + delta; })) {
      return 0;
    }
    s.ShiftKeyParameters(delta, c);
    return 1;
  }

  static unsigned int ScaleParameterAxis(Curve& c, double factor) {
    Impl& s = Of(c);
    // A factor of zero or below would merge or reverse the keys.
    if (s.readOnly || !(factor > 0.0) || !std::isfinite(factor) ||
        AnyKeyHas(s, CFCFlag_ParameterLock)) {
      return 0;
    }
    if (!s.WouldBeOrdered(s.keys.size,
                          [&s, factor](unsigned int j) { return s.keys[j].parameter * factor; })) {
      return 0;
    }
    s.ScaleKeyParameters(factor, c);
    return 1;
  }

  // t -> first + last - t. What arrived at a key now leaves it, so the function is mirrored:
  // on a polyline the values stay with their keys, on a step each key takes the value of the
  // step that ended at it, and the value after the last key holds in front of the new first.
  static unsigned int MirrorParameters(Curve& c) {
    Impl& s = Of(c);
    if (s.readOnly || AnyKeyHas(s, CFCFlag_ParameterLock)) return 0;
    const unsigned int n = s.keys.size;
    if (n == 0) return 1;
    const double sum = s.keys[0].parameter + s.keys[n - 1].parameter;
    // Far-apart keys lose their distance in the sum: mirrored, near ones would merge.
    if (!s.WouldBeOrdered(
            n, [&s, n, sum](unsigned int j) { return sum - s.keys[n - 1 - j].parameter; })) {
      return 0;
    }
    // The user data sets travel with their keys, so they are taken out first.
    CFCKeyUserDataInTransit sets(c, n, [&s](unsigned int i) { return s.keys[i].parameter; });
    Impl mirrored(s);
    mirrored.DropAllKeys();
    for (unsigned int j = 0; j < n; ++j) {
      const unsigned int i = n - 1 - j;
      const Value arriving = i > 0 ? s.GetValue(i - 1) : s.ValueLeftOfFirstKey();
      mirrored.InsertKey(j, sum - s.keys[i].parameter,
                         Impl::kStepsBetweenKeys ? arriving : s.GetValue(i));
      mirrored.SetKeyFlags(j, s.GetKeyFlags(i));
    }
    mirrored.KeepValueLeftOfFirstKey(s.GetValue(n - 1));
    mirrored.searchHint = 0;
    s = mirrored;
    sets.GiveBackReversed([&s](unsigned int j) { return s.keys[j].parameter; });
    return 1;
  }

  // ---- Whole-curve edits of keys ---------------------------------------------------------

  // Keys made at both ends without changing the function, then the store's reduction between.
  static unsigned int ReduceNumKeys(Curve& c, double start, double end, double tolerance) {
    Impl& s = Of(c);
    return s.ReduceOverFoldedRanges(start, end, tolerance, [&](double a, double b) {
      unsigned int first, last;
      s.CreateNonModifyingKey(a, first, c);
      s.CreateNonModifyingKey(b, last, c);
      s.ReduceNumKeys(first, last, tolerance, c);
    });
  }

  static unsigned int ResampleSequence(Curve& c, double start, double end, double step,
                                       int keepExistingKeys) {
    Impl& s = Of(c);
    if (s.readOnly || !std::isfinite(start) || !std::isfinite(end)) return 0;
    return s.ForFoldedRanges(start, end, [&](double a, double b) {
      return Impl::Engine::ResampleKeys(s, a, b, step, keepExistingKeys, c);
    });
  }

  static unsigned int SmoothSequence(Curve& c, double start, double end, const double* kernel,
                                     unsigned int kernelSize) {
    Impl& s = Of(c);
    unsigned int first, last;
    if (s.readOnly || !s.GetKeyIndicesInInterval(start, end, first, last, 0, 0)) return 0;
    return s.SmoothSequence(first, last, kernel, kernelSize, c);
  }

  // ---- Key values and key info -----------------------------------------------------------

  static unsigned int GetKeyValues(const Curve& c, double parameter, double* left, double* right,
                                   double tolerance) {
    const Impl& s = Of(c);
    unsigned int i;
    if (!s.GetClosestKeyIndexInCenteredInterval(parameter, tolerance, i)) return 0;
    if (left) *left = s.KeyArrivingValue(i);
    if (right) *right = s.KeyRightValue(i);
    return 1;
  }

  // Keys of one value have no tangents and no segment kinds: a request for them is cleared
  // from the mask, the fields are zeroed (the kind set to 1) and the answer is 0.
  static unsigned int GetKeyInfoFromIndex(const Curve& c, unsigned int index,
                                          ZvBaseFCurve::KeyInfo* info) {
    using KeyInfo = ZvBaseFCurve::KeyInfo;
    if (info == nullptr) return 0;
    const Impl& s = Of(c);
    if (index >= s.keys.size) {
      info->mask = 0;
      return 0;
    }
    const unsigned int mask = info->mask;
    if (mask & KeyInfo::IndexMask) info->index = index;
    if (mask & KeyInfo::ParameterMask) info->parameter = s.keys[index].parameter;
    if (mask & KeyInfo::LeftValueMask) info->leftValue = s.KeyArrivingValue(index);
    if (mask & KeyInfo::RightValueMask) info->rightValue = s.KeyRightValue(index);
    const unsigned int unmet = KeyInfo::LeftTangentXMask | KeyInfo::LeftTangentYMask |
                               KeyInfo::RightTangentXMask | KeyInfo::RightTangentYMask |
                               KeyInfo::SegmentKindMask;
    if ((mask & unmet) == 0) return 1;
    info->mask = mask & ~unmet;
    info->leftTangentX = info->leftTangentY = info->rightTangentX = info->rightTangentY = 0.0;
    info->segmentKind = ZvBaseFCurve::ConstantSegment;
    return 0;
  }

  static unsigned int GetKeyInfoFromParameter(const Curve& c, double parameter,
                                              ZvBaseFCurve::KeyInfo* info) {
    if (info == nullptr) return 0;
    unsigned int i;
    if (!Of(c).GetClosestKeyIndexInCenteredInterval(parameter, 0.0, i)) {
      info->mask = 0;
      return 0;
    }
    return GetKeyInfoFromIndex(c, i, info);
  }

  // ---- Snapshots -------------------------------------------------------------------------

  // A new curve equal to this one over [start, end], the extrapolated parts made into keys: a
  // key at both ends and at every key, or repetition of a key under the cycle methods, in
  // between, each with the value in force there; the value left of the first key is the one
  // arriving at `start`.
  static ZvBaseFCurve* SnapShot(const Curve& c, double start, double end,
                                ZvBaseFCurve::ExtrapolationMethod method) {
    if (!std::isfinite(start) || !std::isfinite(end)) return nullptr;
    ZvFCurveLockGuard guard(c);
    const Impl& s = Of(c);
    const double lo = start < end ? start : end, hi = start < end ? end : start;
    const unsigned int n = s.keys.size;
    const bool cycles = n >= 2 && (s.extrapolation == ZvBaseFCurve::CycleExtrapolation ||
                                   s.extrapolation == ZvBaseFCurve::CycleWithOffsetExtrapolation);
    double kFirst = 0.0, kLast = 0.0, period = 0.0;
    if (cycles) {
      period = s.keys[n - 1].parameter - s.keys[0].parameter;
      kFirst = std::floor((lo - s.keys[0].parameter) / period);
      kLast = std::floor((hi - s.keys[0].parameter) / period);
      if (!(kLast - kFirst <= kMaxSnapShotCycles)) return nullptr;
      if (!((kLast - kFirst + 1.0) * n <= kCFCMaxSnapShotKeys)) return nullptr;
    }
    try {
      std::unique_ptr<Curve> out(new Curve(c));
      Impl& o = Of(*out);
      out->RemoveAllKeyUserData();
      o.DropAllKeys();
      o.readOnly = 0;
      o.searchHint = 0;
      auto add = [&](double t) {
        const unsigned int m = o.keys.size;
        if (m && !(t > o.keys[m - 1].parameter)) return;
        o.InsertKey(m, t, s.ToStored(CFCEvalRightUsingExtrapolationMethod(s, t)));
      };
      add(lo);
      o.KeepValueLeftOfFirstKey(s.ToStored(CFCEvalLeftUsingExtrapolationMethod(s, lo)));
      // Counted from 0: far from the origin kFirst + 1 can round back to kFirst.
      for (double counted = 0.0; counted <= kLast - kFirst; counted += 1.0) {
        const double k = kFirst + counted;
        for (unsigned int i = 0; i < n; ++i) {
          const double t = s.keys[i].parameter + k * period;
          if (t > lo && t < hi) add(t);
        }
      }
      if (hi > lo) add(hi);
      o.valueWhenNoKeys = o.GetValue(0);
      out->SetExtrapolationMethod(method);
      return out.release();
    } catch (const std::bad_alloc&) {
      return nullptr;
    }
  }
};

// Defines the slots that the kinds of one value per key answer alike, by the functions above.
#define ZV_CFC_SINGLE_VALUE_SLOTS(Class, Impl)                                                     \
  using Class##Ops = CFCSingleValueCurve<Class, Impl>;                                             \
  Class::Class(const Class& other) : Class(other, ZvFCurveLockGuard(other)) {}                     \
  Class::Class(const Class& other, const ZvFCurveLockGuard&)                                       \
      : ZvBaseFCurve(other), m_impl(new Impl(*other.m_impl)) {}                                    \
  Class::Class(const Class& source, double start, double end) : Class(source) {                    \
    ZvFCurveLockGuard guard(*this);                                                                \
    Class##Ops::KeepSection(*this, start, end);                                                    \
  }                                                                                                \
  Class::~Class() {                                                                                \
    delete m_impl;                                                                                 \
  }                                                                                                \
  unsigned int Class::CreateNonModifyingKey(double parameter, int noFold) {                        \
    ZvFCurveLockGuard guard(*this);                                                                \
    if (m_impl->readOnly || !std::isfinite(parameter)) return 0;                                   \
    if (!noFold) m_impl->FoldParameter(parameter);                                                 \
    /* Folding by a period past the largest double gives no parameter. */                          \
    if (!std::isfinite(parameter)) return 0;                                                       \
    unsigned int index;                                                                            \
    return m_impl->CreateNonModifyingKey(parameter, index, *this);                                 \
  }                                                                                                \
  /* The value is read on the curve before its keys change. */                                     \
  unsigned int Class::MergeAndCreateNonModifyingKey(double start, double end, double parameter,    \
                                                    int excludeStart, int excludeEnd,              \
                                                    int keepAttributes, int noFold) {              \
    ZvFCurveLockGuard guard(*this);                                                                \
    if (!std::isfinite(parameter)) return 0;                                                       \
    if (!noFold) m_impl->FoldParameter(parameter);                                                 \
    const double value = Eval(parameter, 0);                                                       \
    return MergeAndCreateKey(start, end, parameter, value, excludeStart, excludeEnd,               \
                             keepAttributes);                                                      \
  }                                                                                                \
  Class& Class::operator=(const Class& other) {                                                    \
    Class##Ops::Set(*this, other);                                                                 \
    return *this;                                                                                  \
  }                                                                                                \
  ZvBaseFCurve& Class::operator=(const ZvBaseFCurve& other) {                                      \
    Class##Ops::Set(*this, other);                                                                 \
    return *this;                                                                                  \
  }                                                                                                \
  unsigned int Class::Set(const ZvBaseFCurve& curve) {                                             \
    return Class##Ops::Set(*this, curve);                                                          \
  }                                                                                                \
  ZvBaseFCurve* Class::QueryFCurveKind(Kind kind) const {                                          \
    return kind == GetKind() ? const_cast<Class*>(this) : nullptr;                                 \
  }                                                                                                \
  ZvBaseFCurve* Class::Clone() const {                                                             \
    return Class##Ops::Clone(*this);                                                               \
  }                                                                                                \
  ZvBaseFCurve* Class::SnapShot(double start, double end, ExtrapolationMethod method) const {      \
    return Class##Ops::SnapShot(*this, start, end, method);                                        \
  }                                                                                                \
  unsigned int Class::RemoveKey(double parameter, double tolerance) {                              \
    ZvFCurveLockGuard guard(*this);                                                                \
    return Class##Ops::RemoveKey(*this, parameter, tolerance);                                     \
  }                                                                                                \
  unsigned int Class::RemoveKeys(double start, double end, int excludeStart, int excludeEnd) {     \
    ZvFCurveLockGuard guard(*this);                                                                \
    return Class##Ops::RemoveKeys(*this, start, end, excludeStart, excludeEnd);                    \
  }                                                                                                \
  unsigned int Class::Cut(double start, double end, ZvBaseFCurve& cutOut) {                        \
    return Class##Ops::Cut(*this, start, end, cutOut);                                             \
  }                                                                                                \
  unsigned int Class::RemoveHead(double parameter) {                                               \
    ZvFCurveLockGuard guard(*this);                                                                \
    return Class##Ops::RemoveHead(*this, parameter);                                               \
  }                                                                                                \
  unsigned int Class::RemoveTail(double parameter) {                                               \
    ZvFCurveLockGuard guard(*this);                                                                \
    return Class##Ops::RemoveTail(*this, parameter);                                               \
  }                                                                                                \
  unsigned int Class::Append(const ZvBaseFCurve& curve) {                                          \
    return Class##Ops::Append(*this, curve);                                                       \
  }                                                                                                \
  unsigned int Class::Paste(const ZvBaseFCurve& curve, double start, double end) {                 \
    return Class##Ops::Paste(*this, curve, start, end);                                            \
  }                                                                                                \
  unsigned int Class::ShiftParameters(double delta) {                                              \
    ZvFCurveLockGuard guard(*this);                                                                \
    return Class##Ops::ShiftParameters(*this, delta);                                              \
  }                                                                                                \
  unsigned int Class::ScaleParameterAxis(double factor) {                                          \
    ZvFCurveLockGuard guard(*this);                                                                \
    return Class##Ops::ScaleParameterAxis(*this, factor);                                          \
  }                                                                                                \
  unsigned int Class::MirrorParameters() {                                                         \
    ZvFCurveLockGuard guard(*this);                                                                \
    return Class##Ops::MirrorParameters(*this);                                                    \
  }                                                                                                \
  unsigned int Class::ReduceNumKeys(double start, double end, double tolerance) {                  \
    ZvFCurveLockGuard guard(*this);                                                                \
    return Class##Ops::ReduceNumKeys(*this, start, end, tolerance);                                \
  }                                                                                                \
  unsigned int Class::ResampleSequence(double start, double end, double step,                      \
                                       int keepExistingKeys, int) {                                \
    ZvFCurveLockGuard guard(*this);                                                                \
    return Class##Ops::ResampleSequence(*this, start, end, step, keepExistingKeys);                \
  }                                                                                                \
  unsigned int Class::GetKeyValue(double parameter, KeySide side, double& value, double tolerance) \
      const {                                                                                      \
    ZvFCurveLockGuard guard(*this);                                                                \
    return side == LeftSide                                                                        \
               ? Class##Ops::GetKeyValues(*this, parameter, &value, nullptr, tolerance)            \
               : Class##Ops::GetKeyValues(*this, parameter, nullptr, &value, tolerance);           \
  }                                                                                                \
  unsigned int Class::GetKeyValues(double parameter, double& left, double& right,                  \
                                   double tolerance) const {                                       \
    ZvFCurveLockGuard guard(*this);                                                                \
    return Class##Ops::GetKeyValues(*this, parameter, &left, &right, tolerance);                   \
  }                                                                                                \
  unsigned int Class::GetKeyInfoFromIndex(unsigned int index, KeyInfo* info) const {               \
    ZvFCurveLockGuard guard(*this);                                                                \
    return Class##Ops::GetKeyInfoFromIndex(*this, index, info);                                    \
  }                                                                                                \
  unsigned int Class::GetKeyInfoFromParameter(double parameter, KeyInfo* info) const {             \
    ZvFCurveLockGuard guard(*this);                                                                \
    return Class##Ops::GetKeyInfoFromParameter(*this, parameter, info);                            \
  }

#endif
