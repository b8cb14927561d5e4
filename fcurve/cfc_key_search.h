// The search layer of the key engine: the hinted locate, the nearest key in a centred interval,
// key intervals, folding under the cycle methods, and the KeyFlags constraint bits.
//
// The search writes the hint even in const queries, so it runs under the owning curve's lock
// like everything else in the engine.
#ifndef ZV_FCURVE_CFC_KEY_SEARCH_H
#define ZV_FCURVE_CFC_KEY_SEARCH_H

#include <zv/fcurve.h>

#include "fcurve/cfc_key_store.h"
#include "fcurve/key_params.h"

#include <cmath>

// Identity of stored parameters.
constexpr double kCFCParameterEpsilon = 1e-15;
// An evaluation parameter within this of a key is taken as the key.
constexpr double kCFCSnapTolerance = 1e-12;

template <class T, class Key, class Store>
class CFCKeySearch : public Store {
 public:
  using Store::keys;

  // ---- Search -------------------------------------------------------------------------------

  // The number of keys at or below t, i.e. the index of the first key above t; `found` tells
  // whether t lies on a key (then the result minus 1). Never on an empty store.
  //
  // The ends and the two-key neighbourhood of the hint compare with the parameter epsilon; the
  // bisection compares exactly, deliberately, so a t a hair above a key far from the hint
  // counts as after the key. Below 12 keys the neighbourhood is skipped.
  unsigned int LocateParameter(double t, int& found) const {
    const unsigned int n = keys.size;
    const Key* k = keys.data;
    // A NaN compares false with every key; without this it would reach the bisection, which
    // needs two keys. It counts as lying before all of them, on none.
    if (std::isnan(t)) {
      found = 0;
      return 0;
    }
    if (k[0].parameter >= t) {
      this->searchHint = 0;
      found = zvIsSameParameter(t, k[0].parameter);
      return found ? 1 : 0;
    }
    if (t >= k[n - 1].parameter) {
      this->searchHint = n - 1;
      found = t - k[n - 1].parameter <= kCFCParameterEpsilon;
      return n;
    }
    const unsigned int c = this->searchHint < n - 1 ? this->searchHint : n - 1;
    const unsigned int back = c < 2 ? c : 2;
    const unsigned int forward = n - 1 - c < 2 ? n - 1 - c : 2;
    this->searchHint = c;
    const double lowEnd = k[c - back].parameter, highEnd = k[c + forward].parameter;
    if (n - 1 >= 11 && t >= lowEnd && highEnd >= t) {
      unsigned int hit;
      if (forward > 0 && (InPair(t, c, hit) || InPair(t, c + forward - 1, hit))) {
        return Hit(t, hit, found);
      }
      if (back > 0 && (InPair(t, c - back, hit) || InPair(t, c - 1, hit))) {
        return Hit(t, hit, found);
      }
      if (zvIsSameParameter(t, highEnd)) {
        found = 1;
        this->searchHint = c + forward;
        return c + forward + 1;
      }
    }
    // Here k[low] < t < k[high]; the neighbourhood, when t lies outside it, narrows the range.
    // Which side t lies on is as good as random, so nothing below branches on it: a
    // mispredicted branch per halving would cost more than the whole search.
    unsigned int low = t > highEnd ? c + forward : 0;
    unsigned int length = (lowEnd > t ? c - back : n - 1) - low;
    // k[low] < t <= k[low + length] holds throughout. Each pass halves twice: the middle key and
    // the two keys the second halving may want are read together, so a pass waits for one load
    // where two halvings in turn would wait for two; the loads themselves, not the comparisons,
    // are the cost, in the first-level cache and beyond it alike. On a last pass over two or
    // three keys the quarter may be 0, which rereads k[low] and moves nothing.
    while (length > 1) {
      const unsigned int half = length / 2;
      const unsigned int rest = length - half;
      const unsigned int quarter = rest / 2;
      const double middle = k[low + half].parameter;
      const double lower = k[low + quarter].parameter;
      const double upper = k[low + half + quarter].parameter;
      const bool above = t > middle;
      low += above ? half : 0;
      low += t > (above ? upper : lower) ? quarter : 0;
      length = rest - quarter;
    }
    // A key equal to t is the one above low. Equality is exact, on purpose; a NaN is equal to
    // no key.
    if (k[low + 1].parameter == t) {
      this->searchHint = low + 1;
      found = 1;
      return low + 2;
    }
    this->searchHint = low;
    found = 0;
    return low + 1;
  }

  // The key nearest to t among those in [t - tolerance, t + tolerance]; of equal distances the
  // earlier. 0 when there is none.
  int GetClosestKeyIndexInCenteredInterval(double t, double tolerance, unsigned int& index) const {
    const unsigned int n = keys.size;
    // A NaN parameter or tolerance names no key.
    if (n == 0 || std::isnan(t) || std::isnan(tolerance)) return 0;
    const double lo = t - tolerance, hi = t + tolerance;
    int found;
    unsigned int start = LocateParameter(lo, found);
    if (found) --start;
    if (start >= n) return 0;
    if (!(hi >= keys[start].parameter)) return 0;
    unsigned int last = start;
    while (!zvIsSameParameter(keys[last].parameter, hi) && last + 1 < n &&
           keys[last + 1].parameter - hi <= kCFCParameterEpsilon) {
      ++last;
    }
    unsigned int best = start;
    double bestDistance = std::fabs(t - keys[start].parameter);
    for (unsigned int i = start + 1; i <= last; ++i) {
      const double d = std::fabs(t - keys[i].parameter);
      if (d < bestDistance) {
        bestDistance = d;
        best = i;
      }
    }
    index = best;
    return 1;
  }

  // The first and last index of the keys in the interval. 0, with `first` and `last` left
  // alone, when it holds none.
  int GetKeyIndicesInInterval(double start, double end, unsigned int& first, unsigned int& last,
                              int excludeStart, int excludeEnd) const {
    const unsigned int n = keys.size;
    if (n == 0) return 0;
    if (excludeStart && excludeEnd && zvIsSameParameter(start, end)) return 0;
    int found;
    long f = static_cast<long>(LocateParameter(start, found));
    if (found && !excludeStart) --f;
    long l = static_cast<long>(LocateParameter(end, found)) - 1;
    if (found && excludeEnd) --l;
    if (f > l || f >= static_cast<long>(n) || l < 0) return 0;
    first = static_cast<unsigned int>(f);
    last = static_cast<unsigned int>(l);
    return 1;
  }

  // Under the cycle methods, brings t into the keyed range and onto a key within the snap
  // tolerance. Nothing happens with fewer than two keys or another method.
  void FoldParameter(double& t) const {
    const unsigned int n = keys.size;
    if ((this->extrapolation != 3 && this->extrapolation != 4) || n < 2) return;
    const double first = keys[0].parameter, last = keys[n - 1].parameter;
    const double period = last - first;
    if (t > last) {
      t = first + std::fmod(t - first, period);
    } else if (t < first) {
      t = last - std::fmod(first - t, period);
    }
    if (t < first) t = first;
    if (t > last) t = last;
    unsigned int i;
    if (GetClosestKeyIndexInCenteredInterval(t, kCFCSnapTolerance, i)) t = keys[i].parameter;
  }

  // Brings t into the keyed range for the cycle methods and counts the periods (two keys or
  // more). The right version sends a whole number of periods to the last key, the left version
  // to the first.
  double CycleOffsetFold(double t, double& cycles, bool left) const {
    const unsigned int n = keys.size;
    const double first = keys[0].parameter, last = keys[n - 1].parameter;
    const double period = last - first;
    const double r = (t - first) / period;
    double folded;
    if (left) {
      cycles = std::floor(r);
      if (first - t <= 1e-9) {
        const double w = period * (r - std::floor(r));
        folded = std::fabs(w) <= 1e-9 ? first : first + w;
      } else {
        const double w = period * (std::ceil(r) - r);
        folded = std::fabs(w) <= 1e-9 ? first : last - w;
      }
    } else {
      cycles = std::ceil(r) - 1.0;
      if (t > first) {
        const double w = period * (r - std::floor(r));
        folded = std::fabs(w) <= 1e-9 ? last : first + w;
      } else {
        const double w = period * (std::ceil(r) - r);
        folded = std::fabs(w) <= 1e-9 ? last : last - w;
      }
    }
    // A period too small for the distance (a subnormal span, a parameter near the largest
    // double) leaves no number of periods to count: such a parameter folds onto the first key.
    if (!(folded >= first)) folded = first;
    if (folded > last) folded = last;
    return folded;
  }

  // Runs `edit(a, b)` over the parts of the keyed range that [start, end] covers: under the
  // cycle methods (two keys or more) the interval is folded into the keyed range first - within
  // one period the folded interval; across a period boundary the two folded pieces up to the
  // ends of the keys; over more than a period the whole key range. Otherwise [start, end]
  // itself. A reversed interval covers [end, start] and gets its pieces reversed. Stops at the
  // first part that answers 0 and answers 0 then.
  template <class Edit>
  int ForFoldedRanges(double start, double end, Edit edit) const {
    const unsigned int n = keys.size;
    if ((this->extrapolation != 3 && this->extrapolation != 4) || n < 2) return edit(start, end);
    const bool reversed = end < start;
    const double lo = reversed ? end : start, hi = reversed ? start : end;
    auto piece = [&](double a, double b) { return reversed ? edit(b, a) : edit(a, b); };
    const double first = keys[0].parameter, last = keys[n - 1].parameter;
    double loCycle, hiCycle;
    const double foldedLo = CycleOffsetFold(lo, loCycle, true);
    // A single parameter on a period boundary folds, as an end, onto the end of the period
    // before: it is one point, not a range across the boundary.
    if (lo == hi) return edit(foldedLo, foldedLo);
    const double foldedHi = CycleOffsetFold(hi, hiCycle, false);
    if (loCycle == hiCycle) return piece(foldedLo, foldedHi);
    if (hi - lo <= last - first) return piece(first, foldedHi) && piece(foldedLo, last);
    return piece(first, last);
  }

  // Key reduction over [start, end] in either order, through ForFoldedRanges: refused on a
  // read-only curve or with a bound or tolerance that is not a number; nothing to do below two
  // keys.
  template <class Reduce>
  int ReduceOverFoldedRanges(double start, double end, double tolerance, Reduce reduce) {
    if (this->readOnly || !std::isfinite(start) || !std::isfinite(end) || std::isnan(tolerance)) {
      return 0;
    }
    if (keys.size < 2) return 1;
    if (start > end) {
      const double t = start;
      start = end;
      end = t;
    }
    ForFoldedRanges(start, end, [&reduce](double a, double b) {
      reduce(a, b);
      return 1;
    });
    return 1;
  }

  // Folds t and moves both bounds by the same displacement, then orders the bounds and clamps
  // t into them.
  void FoldBoundsAndParameter(double& start, double& end, double& t) const {
    const double before = t;
    FoldParameter(t);
    const double shift = t - before;
    start += shift;
    end += shift;
    if (start > end) {
      const double s = start;
      start = end;
      end = s;
    }
    if (t < start) t = start;
    if (t > end) t = end;
  }

  // ---- Constraints --------------------------------------------------------------------------

  // `code` may combine several codes; each sets or clears the bits its store knows for it.
  int SetConstraint(unsigned int index, unsigned int code, int on) {
    unsigned short bits = 0;
    for (unsigned int c = 1; c != 0 && c <= code; c <<= 1) {
      if (code & c) bits |= Store::ConstraintBits(c);
    }
    const unsigned short f = this->GetKeyFlags(index);
    this->SetKeyFlags(index, static_cast<unsigned short>(on ? (f | bits) : (f & ~bits)));
    return 1;
  }

  // Exactly one code. A code of several bits (the whole-key lock) reads true only when all are
  // set; an unknown code reads 0.
  int GetConstraint(unsigned int index, unsigned int code) const {
    const unsigned short bits = Store::ConstraintBits(code);
    if (bits == 0) return 0;
    return (this->GetKeyFlags(index) & bits) == bits ? 1 : 0;
  }

  // 1 when a key of the interval has all of `bits` in its KeyFlags.
  int AnyKeyHasFlagsInInterval(double start, double end, int excludeStart, int excludeEnd,
                               unsigned short bits) const {
    unsigned int first, last;
    if (!GetKeyIndicesInInterval(start, end, first, last, excludeStart, excludeEnd)) return 0;
    for (unsigned int i = first; i <= last; ++i) {
      if ((this->GetKeyFlags(i) & bits) == bits) return 1;
    }
    return 0;
  }

  unsigned int NearestKeyIndex(double t) const {
    int found;
    const unsigned int at = LocateParameter(t, found);
    if (found) return at - 1;
    if (at == 0) return 0;
    if (at >= keys.size) return keys.size - 1;
    const double before = t - keys[at - 1].parameter, after = keys[at].parameter - t;
    return after < before ? at : at - 1;
  }

  // 1 when every key parameter is finite and above the one before: what every edit must leave
  // behind, and what an edit that cannot manage it refuses on.
  bool KeysAreOrdered() const {
    const unsigned int n = keys.size;
    for (unsigned int i = 0; i < n; ++i) {
      const double p = keys[i].parameter;
      if (!std::isfinite(p) || (i > 0 && !(p > keys[i - 1].parameter))) return false;
    }
    return true;
  }

  // Whether the parameters that `at(j)` gives for j = 0..n-1 would be finite and strictly
  // increasing: whole-curve moves test the keys they would make before touching any.
  template <class At>
  static bool WouldBeOrdered(unsigned int n, At at) {
    double previous = 0.0;
    for (unsigned int j = 0; j < n; ++j) {
      const double p = at(j);
      if (!std::isfinite(p) || (j > 0 && !(p > previous))) return false;
      previous = p;
    }
    return true;
  }

  // Whether a key at `parameter` fits strictly between the merge bounds left and right (as
  // MergeBounds gives them), so that the merged keys stay in order.
  bool FitsBetweenMergeBounds(long left, long right, double parameter) const {
    if (!std::isfinite(parameter)) return false;
    if (left >= 0 && !(parameter > keys[left].parameter)) return false;
    return right >= static_cast<long>(keys.size) || parameter < keys[right].parameter;
  }

  // The last key that stays left of a merged interval and the first that stays right of it;
  // -1 and the key count stand for "none".
  void MergeBounds(double start, double end, int excludeStart, int excludeEnd, long& left,
                   long& right) const {
    int found;
    left = static_cast<long>(LocateParameter(start, found)) - 1;
    if (found && !excludeStart) --left;
    right = static_cast<long>(LocateParameter(end, found));
    if (found && excludeEnd) --right;
  }

 private:
  // Does t lie in [key[lo], key[lo + 1])? `hit` receives lo.
  bool InPair(double t, unsigned int lo, unsigned int& hit) const {
    if (t >= keys[lo].parameter && keys[lo + 1].parameter > t) {
      hit = lo;
      return true;
    }
    return false;
  }
  unsigned int Hit(double t, unsigned int lo, int& found) const {
    found = t - keys[lo].parameter <= kCFCParameterEpsilon;
    this->searchHint = lo;
    return lo + 1;
  }
};

#endif
