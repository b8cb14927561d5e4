// The shared key engine of the keyed function curves: a sorted key array with a search hint,
// and the insertion, removal, merging, cutting, resampling and smoothing that work on it.
//
// CFCBaseImpl<T, Key, Store> sits on one of the stores of cfc_key_store.h, through the search
// layer of cfc_key_search.h, and reaches the store's differences only through the accessors
// every store offers. The owning curve is passed to the editing operations so that the per-key
// user data follows the keys.
//
// Nothing here locks: the engine runs under the owning curve's lock.
#ifndef ZV_FCURVE_CFC_BASE_IMPL_H
#define ZV_FCURVE_CFC_BASE_IMPL_H

#include "fcurve/cfc_key_search.h"

// Most samples one resampling makes (2^20): a million keys is already more than a curve
// editor draws, and each costs a key insertion.
constexpr double kCFCMaxResampledKeys = 1048576.0;
// Most key moves one resampling may cost (2^26): samples times the keys above the range, each
// of which an insertion shifts.
constexpr double kCFCMaxResampleMoves = 67108864.0;
// Most keys a snapshot under the cycle methods repeats (2^20): periods times keys per period.
// Each period is built whole, so more would only find the allocator's limit the slow way.
constexpr double kCFCMaxSnapShotKeys = 1048576.0;

template <class T, class Key, class Store>
class CFCBaseImpl : public CFCKeySearch<T, Key, Store> {
 public:
  using CFCKeySearch<T, Key, Store>::keys;
  using CFCKeySearch<T, Key, Store>::LocateParameter;
  using CFCKeySearch<T, Key, Store>::GetClosestKeyIndexInCenteredInterval;
  using CFCKeySearch<T, Key, Store>::NearestKeyIndex;
  using CFCKeySearch<T, Key, Store>::MergeBounds;

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

  // Removes the closest key in the tolerance (the integer curves snap the parameter themselves
  // and pass 0). The first key's value passes to the step in front of the new first key.
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
    if (!this->FitsBetweenMergeBounds(left, right, parameter)) return 0;
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

  // Drops the keys strictly inside first..last that add nothing, with their user data, and
  // returns how many went. What adds nothing is a store difference. The integer store drops a
  // key that repeats the previous key's value (the tolerance plays no part). The raw and
  // standard stores thin along lines: a line runs from a kept key through the next one, and the
  // key before each following key j goes while j lies on the line within the tolerance, on
  // both of its sides; otherwise that key stays and the line restarts from it to j. The
  // standard store keeps keys that touch a cubic segment and value- or parameter-locked keys.
  unsigned int ReduceNumKeys(unsigned int first, unsigned int last, double tolerance,
                             ZvBaseFCurve& curve) {
    if (last < first + 2 || last >= keys.size) return 0;
    const double firstParameter = keys[first].parameter, lastParameter = keys[last].parameter;
    // Kept keys are moved down in place; a key is read before anything is written over it.
    unsigned int write = first + 1;
    if constexpr (Store::kThinsAlongLines) {
      double anchorX = keys[first].parameter, anchorY = this->ThinOutValue(first);
      double slope =
          (this->ThinInValue(first + 1) - anchorY) / (keys[first + 1].parameter - anchorX);
      for (unsigned int j = first + 2; j <= last; ++j) {
        const double x = keys[j].parameter;
        const double y = anchorY + slope * (x - anchorX);
        const unsigned int candidate = j - 1;
        if (std::fabs(y - this->ThinInValue(j)) <= tolerance &&
            std::fabs(y - this->ThinOutValue(j)) <= tolerance && this->ThinMayDrop(candidate)) {
          curve.RemoveKeyUserData(keys[candidate].parameter);
          continue;
        }
        anchorX = keys[candidate].parameter;
        anchorY = this->ThinOutValue(candidate);
        slope = (this->ThinInValue(j) - anchorY) / (x - anchorX);
        if (write != candidate) this->MoveKey(write, candidate);
        ++write;
      }
    } else {
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
    // Every sample can become a key: more than the cap are refused before any is made.
    if (!(std::fabs(quotient) <= kCFCMaxResampledKeys)) return 0;
    const long count = static_cast<long>(quotient);
    // The samples are placed in ascending order whatever the sign of the step, so that each
    // insertion moves only the keys above the range, never the samples already made; the
    // number of such moves is bounded too.
    const bool down = step < 0.0 && count > 0;
    const double from = down ? end : start, to = down ? start : end;
    if (impl.keys.size) {
      int found;
      const double above = impl.keys.size - impl.LocateParameter(from < to ? from : to, found);
      if (!((std::fabs(quotient) + 1.0) * (above + 1.0) <= kCFCMaxResampleMoves)) return 0;
    }
    impl.CreateNonModifyingKey(from, previous, curve);
    for (long j = 1; j <= count; ++j) {
      const long i = down ? count + 1 - j : j;
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
    impl.CreateNonModifyingKey(to, last, curve);
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

  // ---- Redraw boxes -------------------------------------------------------------------------

  // The box of key i with its neighbours, the steps included: what must be redrawn when the key
  // changes.
  int ComputeKeyExtent(unsigned int i, ZvExtent2<double>& extent) const {
    const unsigned int n = keys.size;
    if (i >= n) return 0;
    extent = ZvExtent2<double>();
    const double before =
        i > 0 ? this->ValueAsDouble(i - 1) : static_cast<double>(this->ValueLeftOfFirstKey());
    extent.AddPoint(ZvPoint2<double>{keys[i].parameter, before});
    extent.AddPoint(ZvPoint2<double>{keys[i].parameter, this->ValueAsDouble(i)});
    if (i > 0) extent.AddPoint(ZvPoint2<double>{keys[i - 1].parameter, before});
    if (i + 1 < n) {
      extent.AddPoint(ZvPoint2<double>{keys[i + 1].parameter, this->ValueAsDouble(i)});
      extent.AddPoint(ZvPoint2<double>{keys[i + 1].parameter, this->ValueAsDouble(i + 1)});
    }
    return 1;
  }

  int ComputeNeighboringKeysExtent(double t, ZvExtent2<double>& extent) const {
    return NeighboringKeysExtent(*this, t, extent);
  }

  // On a key that key's box; between keys the union of both; beyond the ends the end key's.
  // Impl supplies ComputeKeyExtent, so that the standard curve adds its handles.
  template <class Impl>
  static int NeighboringKeysExtent(const Impl& impl, double t, ZvExtent2<double>& extent) {
    const unsigned int n = impl.keys.size;
    if (n == 0) return 0;
    int found;
    const unsigned int at = impl.LocateParameter(t, found);
    if (found) return impl.ComputeKeyExtent(at - 1, extent);
    if (at == 0) return impl.ComputeKeyExtent(0, extent);
    if (at >= n) return impl.ComputeKeyExtent(n - 1, extent);
    ZvExtent2<double> other;
    impl.ComputeKeyExtent(at - 1, extent);
    impl.ComputeKeyExtent(at, other);
    extent.Union(other);
    return 1;
  }

  // The key nearest to t: the key on it, else the nearer neighbour, the earlier on a tie.
};

#endif
