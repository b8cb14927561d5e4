// The shared key engine of the keyed function curves: a sorted key array with a search hint,
// and the insertion, removal, merging, cutting, resampling and smoothing that work on it.
//
// CFCBaseImpl<T, Key, Store> sits on one of the stores of cfc_key_store.h and reaches the
// store's differences only through the accessors every store offers. The owning curve is
// passed to the editing operations so that the per-key user data follows the keys.
//
// Nothing here locks: the engine runs under the owning curve's lock. Even the const searches
// write the hint, so they too need that lock.
#ifndef ZV_FCURVE_CFC_BASE_IMPL_H
#define ZV_FCURVE_CFC_BASE_IMPL_H

#include <zv/fcurve.h>

#include "fcurve/cfc_key_store.h"
#include "fcurve/key_params.h"

#include <cmath>

// Identity of stored parameters.
constexpr double kCFCParameterEpsilon = 1e-15;
// An evaluation parameter within this of a key is taken as the key.
constexpr double kCFCSnapTolerance = 1e-12;

template <class T, class Key, class Store>
class CFCBaseImpl : public Store {
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
    unsigned int low = 0, high = n - 1;
    if (lowEnd > t) {
      high = c - back;
    } else if (t > highEnd) {
      low = c + forward;
    }
    while (high - low > 1) {
      const unsigned int mid = (low + high) / 2;
      if (t > k[mid].parameter) {
        low = mid;
      } else {
        high = mid;
        if (t >= k[mid].parameter) {  // exact equality, on purpose
          this->searchHint = mid;
          found = 1;
          return mid + 1;
        }
      }
    }
    this->searchHint = low;
    found = 0;
    return low + 1;
  }

  // The key nearest to t among those in [t - tolerance, t + tolerance]; of equal distances the
  // earlier. 0 when there is none.
  int GetClosestKeyIndexInCenteredInterval(double t, double tolerance, unsigned int& index) const {
    const unsigned int n = keys.size;
    if (n == 0) return 0;
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

  // ---- Editing of single-value stores -------------------------------------------------------

  int CreateKey(double parameter, T value, ZvBaseFCurve& curve) {
    const unsigned int n = keys.size;
    if (n == 0) {
      this->InsertKey(0, parameter, value);
      this->valueWhenNoKeys = value;
      this->KeepValueLeftOfFirstKey(value);
      return 1;
    }
    int found;
    const unsigned int at = LocateParameter(parameter, found);
    if (found) {
      if (this->GetKeyFlags(at - 1) & CFCFlag_ValueLock) return 0;
      this->SetValue(at - 1, value);
      if (at == 1) this->KeepValueLeftOfFirstKey(value);
      return 1;
    }
    if (at == 0) return RemoveHeadAndCreateKeyBeforeExistingKey(parameter, value, 0, curve);
    this->InsertKey(at, parameter, value);
    return 1;
  }

  // Puts a key at the parameter without changing the function; `index` receives its index.
  int CreateNonModifyingKey(double parameter, unsigned int& index, ZvBaseFCurve&) {
    const unsigned int n = keys.size;
    if (n == 0) {
      this->InsertKey(0, parameter, this->valueWhenNoKeys);
      index = 0;
      return 1;
    }
    int found;
    const unsigned int at = LocateParameter(parameter, found);
    if (found) {
      index = at - 1;
      return 1;
    }
    if (at == 0) {
      const T before = this->ValueLeftOfFirstKey();
      this->InsertKey(0, parameter, before);
      this->KeepValueLeftOfFirstKey(before);
    } else {
      this->InsertKey(at, parameter, this->ValueAfterKey(at - 1, parameter));
    }
    index = at;
    return 1;
  }

  int RemoveKey(double parameter, double tolerance, ZvBaseFCurve& curve) {
    unsigned int i;
    if (!GetClosestKeyIndexInCenteredInterval(parameter, tolerance, i)) return 0;
    if (keys.size == 1) {
      curve.RemoveAllKeyUserData();
      this->KeepValueLeftOfFirstKey(this->valueWhenNoKeys);
      this->DropAllKeys();
      return 1;
    }
    curve.RemoveKeyUserData(keys[i].parameter);
    const T removed = this->GetValue(i);
    this->DropKeys(i, i);
    // The function left of the new first key must not jump.
    if (i == 0) this->KeepValueLeftOfFirstKey(removed);
    return 1;
  }

  // Removes the first `count` keys and puts a key in front of what remains.
  int RemoveHeadAndCreateKeyBeforeExistingKey(double parameter, T value, unsigned int count,
                                              ZvBaseFCurve& curve) {
    if (count > 0) {
      for (unsigned int i = 0; i < count; ++i)
        curve.RemoveKeyUserData(keys[i].parameter);
      const T lastRemoved = this->GetValue(count - 1);
      this->DropKeys(0, count - 1);
      this->KeepValueLeftOfFirstKey(lastRemoved);
    }
    this->InsertKey(0, parameter, value);
    this->KeepValueLeftOfFirstKey(value);
    return 1;
  }

  int RemoveAllKeysAndCreateNewKey(double parameter, T value, ZvBaseFCurve& curve) {
    curve.RemoveAllKeyUserData();
    this->KeepValueLeftOfFirstKey(this->valueWhenNoKeys);
    this->DropAllKeys();
    this->InsertKey(0, parameter, value);
    this->KeepValueLeftOfFirstKey(value);
    this->valueWhenNoKeys = value;
    return 1;
  }

  // Replaces the keys of an interval by one key at `parameter`. With `keepAttributes` the new
  // key inherits the flags and the user data of the removed key nearest to it.
  int MergeAndCreateKey(double start, double end, double parameter, T value, ZvBaseFCurve& curve,
                        int excludeStart, int excludeEnd, int keepAttributes) {
    const long n = static_cast<long>(keys.size);
    if (n == 0) return CreateKey(parameter, value, curve);
    long left, right;
    MergeBounds(start, end, excludeStart, excludeEnd, left, right);
    if (right - left == 2 && zvIsSameParameter(keys[left + 1].parameter, parameter)) {
      return CreateKey(parameter, value, curve);
    }
    if (n == 1 && !zvIsSameParameter(keys[0].parameter, parameter)) {
      return CreateKey(parameter, value, curve);
    }
    const bool inherit = keepAttributes && right - left > 1;
    unsigned short donorFlags = 0;
    CFCUserDataSet donorData;
    int donorHasData = 0;
    if (inherit) {
      const unsigned int donor = NearestKeyIndex(parameter);
      donorFlags = this->GetKeyFlags(donor);
      donorHasData = curve.HasUserData(keys[donor].parameter);
      if (donorHasData) donorData = *curve.GetUserDataSet(keys[donor].parameter);
    }
    unsigned int at;
    if (left < 0 && right >= n) {
      RemoveAllKeysAndCreateNewKey(parameter, value, curve);
      at = 0;
    } else if (left < 0) {
      RemoveHeadAndCreateKeyBeforeExistingKey(parameter, value, static_cast<unsigned int>(right),
                                              curve);
      at = 0;
    } else {
      at = static_cast<unsigned int>(left + 1);
      if (right - left > 1) RemoveWithUserData(at, static_cast<unsigned int>(right - 1), curve);
      this->InsertKey(at, parameter, value);
    }
    if (inherit) {
      this->SetKeyFlags(at, donorFlags);
      if (donorHasData) curve.SetUserDataSet(donorData, parameter);
    }
    return 1;
  }

  // Removes [start, end] and closes the gap: the keys after `end` move left by its width.
  int Cut(double start, double end, ZvBaseFCurve& curve) {
    unsigned int a, b;
    CreateNonModifyingKey(start, a, curve);
    CreateNonModifyingKey(end, b, curve);
    if (b > a + 1) RemoveWithUserData(a + 1, b - 1, curve);
    if (!TranslateParamsAfterExistingKey(a, start, start - end, curve)) return 0;
    if (a + 1 >= keys.size) return 1;
    if ((this->GetKeyFlags(a) & CFCFlag_ValueLock) && this->GetValue(a) != this->GetValue(a + 1)) {
      return 0;
    }
    this->SetValue(a, this->GetValue(a + 1));
    this->DropKeys(a + 1, a + 1);
    return 1;
  }

  // Moves the key after `index` to `parameter` and every later key by `delta`. A parameter-
  // locked key moves only when it is already within the epsilon of its target. Stops with 0
  // when the order would break, leaving the keys moved so far where they are.
  int TranslateParamsAfterExistingKey(unsigned int index, double parameter, double delta,
                                      ZvBaseFCurve& curve) {
    const unsigned int n = keys.size;
    if (index + 1 >= n) return 1;
    ZvDoubleArray oldParameters, newParameters;
    double previous = 0.0;
    for (unsigned int i = index + 1; i < n; ++i) {
      const double old = keys[i].parameter;
      // The owner is asked for data at the key's index, not at its parameter. That is how
      // stored curves have always behaved; their user data depend on it.
      const int hasData = curve.HasUserData(static_cast<double>(i));
      double target = i == index + 1 ? parameter : old + delta;
      if ((this->GetKeyFlags(i) & CFCFlag_ParameterLock) && !zvIsSameParameter(old, target)) {
        target = old;
      }
      if (i > index + 1 && !(target > previous)) return 0;
      this->MoveKeyParameter(i, target);
      previous = target;
      if (hasData) {
        oldParameters.Add(old);
        newParameters.Add(target);
      }
    }
    if (oldParameters.size == 0) return 1;
    return curve.MoveKeyUserDataTail(oldParameters, newParameters);
  }

  // Keys whose value repeats the previous key's are dropped, unless value- or parameter-locked.
  // Returns the number of keys dropped.
  unsigned int ReduceNumKeys(unsigned int first, unsigned int last, double, ZvBaseFCurve& curve) {
    if (last < first + 2 || last >= keys.size) return 0;
    const double firstParameter = keys[first].parameter, lastParameter = keys[last].parameter;
    unsigned int write = first + 1;
    for (unsigned int i = first + 1; i < last; ++i) {
      const bool drop = zvIsSameParameter(this->ValueAsDouble(i), this->ValueAsDouble(i - 1)) &&
                        (this->GetKeyFlags(i) & (CFCFlag_ValueLock | CFCFlag_ParameterLock)) == 0;
      if (drop) {
        curve.RemoveKeyUserData(keys[i].parameter);
      } else {
        if (write != i) this->MoveKey(write, i);
        ++write;
      }
    }
    if (write == last) return 0;
    const unsigned int n = keys.size;
    for (unsigned int i = last; i < n; ++i)
      this->MoveKey(write + (i - last), i);
    this->DropKeys(write + (n - last), n - 1);
    int found;
    const unsigned int newFirst = LocateParameter(firstParameter, found) - 1;
    const unsigned int newLast = LocateParameter(lastParameter, found) - 1;
    return (last - first) - (newLast - newFirst);
  }

  // Convolves the values of keys first..last with the kernel and writes them back through the
  // curve, so that locked keys refuse one by one. The kernel is used as given, not normalised.
  int SmoothSequence(unsigned int first, unsigned int last, const double* kernel,
                     unsigned int kernelSize, ZvBaseFCurve& curve) {
    if (last < first || last >= keys.size || kernel == nullptr || kernelSize == 0) return 0;
    const long m = static_cast<long>(last - first) + 1;
    const long taps = static_cast<long>(kernelSize);
    const long h = (taps - 1) / 2;
    ZvDoubleArray source(static_cast<unsigned int>(m)), result(static_cast<unsigned int>(m));
    for (long i = 0; i < m; ++i)
      source.Add(this->ValueAsDouble(first + i));
    for (long i = 0; i < m; ++i) {
      double r = 0.0;
      if (m < taps) {
        // Too few samples for the kernel: plain products, nothing mirrored. Taps that would
        // fall off the kernel contribute nothing.
        for (long j = 0; j < m; ++j) {
          const long tap = h - i + j;
          if (tap >= 0 && tap < taps) r += source[j] * kernel[tap];
        }
      } else {
        // Near the ends the range is mirrored about the sample being computed.
        for (long k = -h; k < taps - h; ++k) {
          long at = i + k;
          if (at < 0 || at >= m) at = i - k;
          if (at >= 0 && at < m) r += kernel[h + k] * source[at];
        }
      }
      result.Add(r);
    }
    for (long i = 0; i < m; ++i) {
      curve.SetKeyValue(keys[first + i].parameter, ZvBaseFCurve::RightSide, result[i], 0.0);
    }
    return 1;
  }

  // Keys at start, start + step, ... and end, each sample put on the curve without changing it
  // (an existing key within 1e-7 serves as the sample). Without keepExistingKeys the keys
  // between samples go. Impl supplies CreateNonModifyingKey and RemoveKeysBetween, so that the
  // standard curve keeps its shape through both.
  template <class Impl>
  static int ResampleKeys(Impl& impl, double start, double end, double step, int keepExistingKeys,
                          ZvBaseFCurve& curve) {
    unsigned int previous;
    if (zvIsSameParameter(start, end)) return impl.CreateNonModifyingKey(start, previous, curve);
    const double quotient = std::floor((end - start) / step);
    if (!(quotient > -2147483648.0 && quotient < 2147483648.0)) return 0;
    const long count = static_cast<long>(quotient);
    impl.CreateNonModifyingKey(start, previous, curve);
    for (long i = 1; i <= count; ++i) {
      const double p = static_cast<double>(i) * step + start;
      unsigned int sample = impl.NearestKeyIndex(p);
      if (!(std::fabs(impl.keys[sample].parameter - p) <= 1e-7)) {
        impl.CreateNonModifyingKey(p, sample, curve);
      }
      if (!keepExistingKeys && sample > previous + 1) {
        impl.RemoveKeysBetween(previous, sample, curve);
        sample = previous + 1;
      }
      previous = sample;
    }
    unsigned int last;
    impl.CreateNonModifyingKey(end, last, curve);
    if (!keepExistingKeys && last > previous + 1) impl.RemoveKeysBetween(previous, last, curve);
    return 1;
  }

  // Removes the keys strictly between a and b, user data included.
  void RemoveKeysBetween(unsigned int a, unsigned int b, ZvBaseFCurve& curve) {
    RemoveWithUserData(a + 1, b - 1, curve);
  }

  // Removes keys first..last, user data included.
  void RemoveWithUserData(unsigned int first, unsigned int last, ZvBaseFCurve& curve) {
    for (unsigned int i = first; i <= last; ++i)
      curve.RemoveKeyUserData(keys[i].parameter);
    this->DropKeys(first, last);
  }

  int RemoveClosedRange(unsigned int first, unsigned int last) {
    if (first > last || last >= keys.size) return 0;
    this->DropKeys(first, last);
    return 1;
  }
  void RemoveKey(unsigned int index) { this->DropKeys(index, index); }

  // ---- Whole-curve moves of single-value stores ---------------------------------------------

  // Moves every key that is not parameter-locked; the key user data follows.
  void ShiftKeyParameters(double delta, ZvBaseFCurve& curve) {
    for (unsigned int i = 0; i < keys.size; ++i) {
      if (!(this->GetKeyFlags(i) & CFCFlag_ParameterLock)) {
        this->MoveKeyParameter(i, keys[i].parameter + delta);
      }
    }
    curve.TranslateAllKeyUserData(delta);
  }
  void ScaleKeyParameters(double factor, ZvBaseFCurve& curve) {
    for (unsigned int i = 0; i < keys.size; ++i) {
      if (!(this->GetKeyFlags(i) & CFCFlag_ParameterLock)) {
        this->ScaleKeyParameter(i, factor);
      }
    }
    curve.ScaleAllKeyUserData(factor);
  }

  // The key nearest to t: the key on it, else the nearer neighbour, the earlier on a tie.
  unsigned int NearestKeyIndex(double t) const {
    int found;
    const unsigned int at = LocateParameter(t, found);
    if (found) return at - 1;
    if (at == 0) return 0;
    if (at >= keys.size) return keys.size - 1;
    const double before = t - keys[at - 1].parameter, after = keys[at].parameter - t;
    return after < before ? at : at - 1;
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
