// Point evaluation with extrapolation, told once for every keyed curve kind.
//
// The kinds differ only in what lies between two keys and in what is known about a key's two
// sides; those differences reach the evaluation through a handful of members of the
// implementation object:
//
//   KeyRightValue(i)     the value leaving key i;
//   KeyArrivingValue(i)  the value arriving at key i from the left;
//   ValueLeftOfFirstKey  the value in force left of the first key (from the store);
//   EvalSegment(t, i, keep)  the value strictly between key i and key i + 1; `keep` allows the
//                        kind to remember the segment for the next call;
//   GetValueBeforeFirstKeyWhenLinear(t), GetValueAfterLastKeyWhenLinear(t)  the linear
//                        extensions beyond the keys;
//   CycleOffset(left)    the value added per period under the offset cycle, seen from the
//                        right-continuous (false) or the left-limit evaluation (true).
//
// This is the hot path: nothing here allocates, and the segment is found through the store's
// hinted search.
#ifndef ZV_FCURVE_CFC_EXTRAPOLATION_H
#define ZV_FCURVE_CFC_EXTRAPOLATION_H

#include <zv/fcurve.h>

#include "fcurve/cfc_key_search.h"

// Plain evaluation, constant beyond the keys: right-continuous, or with `left` the left limit,
// which differs on a key only.
template <class Impl>
double CFCEvalPlain(const Impl& s, double t, bool left) {
  const unsigned int n = s.keys.size;
  if (n == 0) return s.valueWhenNoKeys;
  int found;
  const unsigned int at = s.LocateParameter(t, found);
  if (found) return left ? s.KeyArrivingValue(at - 1) : s.KeyRightValue(at - 1);
  if (at >= n) return s.KeyRightValue(n - 1);
  if (at == 0) return s.ValueLeftOfFirstKey();
  return s.EvalSegment(t, at - 1, true);
}

// What lies strictly inside the keyed range or on its ends once t has been folded, for the
// cycle methods: `at` and `found` come from the search of the folded t.
template <class Impl>
double CFCEvalFoldedInside(const Impl& s, double t, unsigned int at, double shift) {
  const unsigned int n = s.keys.size;
  if (at >= n) return s.KeyRightValue(n - 1);
  if (at == 0) return s.ValueLeftOfFirstKey();
  return shift + s.EvalSegment(t, at - 1, true);
}

// The value with extrapolation: right-continuous, or with `left` the left limit. They differ
// only on keys, where the left limit takes the value arriving at the key, and at the seam of two
// periods.
template <class Impl>
double CFCEvalUsingExtrapolationMethod(const Impl& s, double t, bool left) {
  const unsigned int n = s.keys.size;
  if (n == 0) return s.valueWhenNoKeys;
  auto onKey = [&s, left](unsigned int i) {
    return left ? s.KeyArrivingValue(i) : s.KeyRightValue(i);
  };
  // The key where one period ends and the next begins: the last one seen from the right, the
  // first one seen from the left.
  const unsigned int seam = left ? 1 : n;
  int found;
  switch (s.extrapolation) {
    case ZvBaseFCurve::LinearExtrapolation: {
      const unsigned int at = s.LocateParameter(t, found);
      if (found) return onKey(at - 1);
      if (at >= n) return s.GetValueAfterLastKeyWhenLinear(t);
      if (at == 0) return s.GetValueBeforeFirstKeyWhenLinear(t);
      return s.EvalSegment(t, at - 1, true);
    }
    case ZvBaseFCurve::CycleExtrapolation: {
      s.FoldParameter(t);
      const unsigned int at = s.LocateParameter(t, found);
      if (found) {
        // The right limit at the end of a period is the start of the next one; the left limit
        // at the start of a period is the end of the previous one.
        if (n >= 2 && at == seam) return left ? s.KeyArrivingValue(n - 1) : s.KeyRightValue(0);
        return onKey(at - 1);
      }
      return CFCEvalFoldedInside(s, t, at, 0.0);
    }
    case ZvBaseFCurve::CycleWithOffsetExtrapolation: {
      const double delta = s.CycleOffset(left);
      double cycles = 0.0;
      if (n >= 2) t = s.CycleOffsetFold(t, cycles, left);
      const unsigned int at = s.LocateParameter(t, found);
      if (found) {
        if (n >= 2 && at == seam) {
          return left ? cycles * delta + s.KeyRightValue(n - 1) - delta
                      : cycles * delta + (s.KeyRightValue(0) + delta);
        }
        return delta * cycles + onKey(at - 1);
      }
      return CFCEvalFoldedInside(s, t, at, delta * cycles);
    }
    default:
      return CFCEvalPlain(s, t, left);
  }
}

template <class Impl>
double CFCEvalRightUsingExtrapolationMethod(const Impl& s, double t) {
  return CFCEvalUsingExtrapolationMethod(s, t, false);
}

template <class Impl>
double CFCEvalLeftUsingExtrapolationMethod(const Impl& s, double t) {
  return CFCEvalUsingExtrapolationMethod(s, t, true);
}

// Away from every key, one search answers for the snap and for the evaluation, and the side of
// the limit does not matter. 1 with the value in v; 0 when t needs no snap but the method must
// fold it; -1, with the hint as it was, when t lies near a key and must be snapped first.
template <class Impl>
int CFCEvalClearOfKeys(const Impl& s, double t, double& v) {
  const unsigned int n = s.keys.size;
  const unsigned int hint = s.searchHint;
  const double clearance = 2.0 * kCFCSnapTolerance;
  // Clear of both keys that bracket it by twice the snap tolerance, t is not within the
  // parameter epsilon of any key, nor is t minus the snap tolerance: every search then finds
  // these two keys and leaves the hint on the lower one, whatever hint it starts from, so the
  // snap leaves t alone and the evaluation's own search repeats this one. Sequential
  // parameters mostly fall between the two keys at the hint, which needs no search at all.
  unsigned int at;
  if (hint < n - 1 && t - s.keys[hint].parameter > clearance &&
      s.keys[hint + 1].parameter - t > clearance) {
    at = hint + 1;
  } else {
    int found;
    at = s.LocateParameter(t, found);
    // Unless found, the located keys bracket t and every other key lies farther. Near a key
    // the snap must search from the hint it was given.
    if ((at > 0 && !(t - s.keys[at - 1].parameter > clearance)) ||
        (at < n && !(s.keys[at].parameter - t > clearance))) {
      s.searchHint = hint;
      return -1;
    }
  }
  const unsigned int method = s.extrapolation;
  if (method == ZvBaseFCurve::CycleWithOffsetExtrapolation) return 0;
  if (at > 0 && at < n) {
    // Strictly inside the keyed range the cycle's fold leaves t as it is. Only a parameter in
    // the segment of the search before or next to it keeps its segment: a sweep uses it for
    // its next steps, scattered parameters would only pay for keeping it.
    const unsigned int segment = at - 1;
    v = s.EvalSegment(t, segment, segment == hint || segment == hint + 1 || segment + 1 == hint);
    return 1;
  }
  if (method == ZvBaseFCurve::CycleExtrapolation) return 0;
  const bool linear = method == ZvBaseFCurve::LinearExtrapolation;
  if (at >= n) {
    v = linear ? s.GetValueAfterLastKeyWhenLinear(t) : s.KeyRightValue(n - 1);
  } else {
    v = linear ? s.GetValueBeforeFirstKeyWhenLinear(t) : s.ValueLeftOfFirstKey();
  }
  return 1;
}

// Snap t to a key within the snap tolerance, then the right-continuous value (or with `left`
// the left limit) with extrapolation: the whole of a curve's Eval but the lock and the clamp.
template <class Impl>
double CFCEvalSnapped(const Impl& s, double t, bool left) {
  if (s.keys.size == 0) return s.valueWhenNoKeys;
  double v;
  const int clear = CFCEvalClearOfKeys(s, t, v);
  if (clear > 0) return v;
  unsigned int i;
  if (clear < 0 && s.GetClosestKeyIndexInCenteredInterval(t, kCFCSnapTolerance, i)) {
    t = s.keys[i].parameter;
  }
  return left ? CFCEvalLeftUsingExtrapolationMethod(s, t)
              : CFCEvalRightUsingExtrapolationMethod(s, t);
}

#endif
