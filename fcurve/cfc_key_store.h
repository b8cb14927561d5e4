// The three key stores under the shared key engine (CFCBaseImpl).
//
// A store holds the sorted key array, the curve-wide values and the search hint. The engine is
// told once over all three; what differs between them is gathered here as a handful of small
// accessors with the same names in every store:
//
//   store A  int keys, KeyFlags in a parallel array, a value in force left of the first key;
//   store B  double keys, a flags pointer that stays null (raw curves keep no locks), the first
//            key's value holds left of it;
//   store C  Bezier keys carrying their own KeyFlags, segment kinds, and a firstSegmentKind.
#ifndef ZV_FCURVE_CFC_KEY_STORE_H
#define ZV_FCURVE_CFC_KEY_STORE_H

#include <zv/arrays.h>

#include "fcurve/cfc_keys.h"
#include "fcurve/key_params.h"

#include <cfloat>

// The integer stores know the two value locks and the whole-key lock, which there means both.
inline unsigned short CFCLockConstraintBits(unsigned int code) {
  switch (code) {
    case ZvBaseFCurve::ParameterLock:
      return CFCFlag_ParameterLock;
    case ZvBaseFCurve::ValueLock:
      return CFCFlag_ValueLock;
    case ZvBaseFCurve::WholeKeyLock:
      return CFCFlag_ParameterLock | CFCFlag_ValueLock;
    default:
      return 0;
  }
}

// Store A: boolean and integer curves.
template <class T, class Key>
class CFCKeyStoreA {
 public:
  ZvAltDynArray<Key> keys;
  ZvAltDynArray<CFCKeyConstraint> flags;  // always as many entries as keys
  T valueBeforeFirstKey;
  T valueWhenNoKeys;
  T minClamp;
  T maxClamp;
  mutable unsigned int searchHint;
  unsigned char extrapolation;
  unsigned int defaultBezierTangentConstraint;
  unsigned int readOnly;
  unsigned int timeCurve;

  CFCKeyStoreA()
      : keys(2),
        flags(2),
        valueBeforeFirstKey(0),
        valueWhenNoKeys(0),
        minClamp(0),
        maxClamp(0),
        searchHint(0),
        extrapolation(1),
        defaultBezierTangentConstraint(0),
        readOnly(0),
        timeCurve(1) {}

  unsigned short GetKeyFlags(unsigned int i) const { return flags[i].flags; }
  void SetKeyFlags(unsigned int i, unsigned short f) { flags[i].flags = f; }
  static unsigned short ConstraintBits(unsigned int code) { return CFCLockConstraintBits(code); }

  T GetValue(unsigned int i) const { return keys[i].value; }
  void SetValue(unsigned int i, T v) { keys[i].value = v; }
  double ValueAsDouble(unsigned int i) const { return static_cast<double>(keys[i].value); }

  void InsertKey(unsigned int at, double parameter, T value) {
    keys.InsertBefore(at, Key{parameter, value});
    flags.InsertBefore(at, CFCKeyConstraint{0});
  }
  void DropKeys(unsigned int first, unsigned int last) {
    keys.RemoveClosedRange(first, last);
    flags.RemoveClosedRange(first, last);
  }
  void DropAllKeys() {
    keys.Resize(0);
    flags.Resize(0);
  }
  void MoveKey(unsigned int to, unsigned int from) {
    keys[to] = keys[from];
    flags[to] = flags[from];
  }
  void MoveKeyParameter(unsigned int i, double p) { keys[i].parameter = p; }
  void ScaleKeyParameter(unsigned int i, double f) { keys[i].parameter *= f; }
  // Key reduction drops repeated values.
  static constexpr bool kThinsAlongLines = false;

  // The value in force just after the key at `before`, up to the next key: a step.
  T ValueAfterKey(unsigned int before, double) const { return keys[before].value; }

  // The value in force left of the first key.
  T ValueLeftOfFirstKey() const { return valueBeforeFirstKey; }
  // A locked first key keeps the step in front of it: the value left of it may only change to
  // the key's own value.
  void KeepValueLeftOfFirstKey(T v) {
    if (keys.size && (GetKeyFlags(0) & CFCFlag_ValueLock) && keys[0].value != v) return;
    valueBeforeFirstKey = v;
  }
};

// Store B: raw curves.
template <class T, class Key>
class CFCKeyStoreB {
 public:
  ZvAltDynArray<Key> keys;
  CFCKeyConstraint* flags;  // null on every curve: raw keys carry no locks
  T valueWhenNoKeys;
  T minClamp;
  T maxClamp;
  mutable unsigned int searchHint;
  unsigned char extrapolation;
  unsigned int defaultBezierTangentConstraint;
  unsigned int readOnly;
  unsigned int timeCurve;

  CFCKeyStoreB()
      : keys(2),
        flags(nullptr),
        valueWhenNoKeys(0),
        minClamp(-DBL_MAX),
        maxClamp(DBL_MAX),
        searchHint(0),
        extrapolation(1),
        defaultBezierTangentConstraint(0),
        readOnly(0),
        timeCurve(1) {}
  CFCKeyStoreB(const CFCKeyStoreB& o)
      : keys(o.keys),
        flags(nullptr),
        valueWhenNoKeys(o.valueWhenNoKeys),
        minClamp(o.minClamp),
        maxClamp(o.maxClamp),
        searchHint(o.searchHint),
        extrapolation(o.extrapolation),
        defaultBezierTangentConstraint(o.defaultBezierTangentConstraint),
        readOnly(o.readOnly),
        timeCurve(o.timeCurve) {}
  CFCKeyStoreB& operator=(const CFCKeyStoreB& o) {
    keys = o.keys;
    valueWhenNoKeys = o.valueWhenNoKeys;
    minClamp = o.minClamp;
    maxClamp = o.maxClamp;
    searchHint = o.searchHint;
    extrapolation = o.extrapolation;
    defaultBezierTangentConstraint = o.defaultBezierTangentConstraint;
    readOnly = o.readOnly;
    timeCurve = o.timeCurve;
    return *this;
  }

  unsigned short GetKeyFlags(unsigned int) const { return 0; }
  void SetKeyFlags(unsigned int, unsigned short) {}
  static unsigned short ConstraintBits(unsigned int) { return 0; }

  T GetValue(unsigned int i) const { return keys[i].value; }
  void SetValue(unsigned int i, T v) { keys[i].value = v; }
  double ValueAsDouble(unsigned int i) const { return static_cast<double>(keys[i].value); }

  void InsertKey(unsigned int at, double parameter, T value) {
    keys.InsertBefore(at, Key{parameter, value});
  }
  void DropKeys(unsigned int first, unsigned int last) { keys.RemoveClosedRange(first, last); }
  void DropAllKeys() { keys.Resize(0); }
  void MoveKey(unsigned int to, unsigned int from) { keys[to] = keys[from]; }
  void MoveKeyParameter(unsigned int i, double p) { keys[i].parameter = p; }
  void ScaleKeyParameter(unsigned int i, double f) { keys[i].parameter *= f; }
  // Key reduction thins along lines, through the single values, locks unknown.
  static constexpr bool kThinsAlongLines = true;
  double ThinInValue(unsigned int i) const { return keys[i].value; }
  double ThinOutValue(unsigned int i) const { return keys[i].value; }
  bool ThinMayDrop(unsigned int) const { return true; }

  // The polyline between the key at `before` and the next one.
  T ValueAfterKey(unsigned int before, double t) const {
    const Key& a = keys[before];
    if (before + 1 >= keys.size) return a.value;
    const Key& b = keys[before + 1];
    return (t - a.parameter) * (b.value - a.value) / (b.parameter - a.parameter) + a.value;
  }

  // A polyline holds its first value to the left.
  T ValueLeftOfFirstKey() const { return keys.size ? keys[0].value : valueWhenNoKeys; }
  void KeepValueLeftOfFirstKey(T) {}
};

// Store C: the standard curve of Bezier keys.
template <class T, class Key>
class CFCKeyStoreC {
 public:
  ZvAltDynArray<Key> keys;
  unsigned int firstSegmentKind;  // kind before the first key, and of a first key on creation
  T valueWhenNoKeys;
  T minClamp;
  T maxClamp;
  mutable unsigned int searchHint;
  unsigned char extrapolation;
  unsigned int defaultBezierTangentConstraint;
  unsigned int readOnly;
  unsigned int timeCurve;

  CFCKeyStoreC()
      : keys(2),
        firstSegmentKind(3),
        valueWhenNoKeys(0),
        minClamp(-DBL_MAX),
        maxClamp(DBL_MAX),
        searchHint(0),
        extrapolation(1),
        defaultBezierTangentConstraint(0),
        readOnly(0),
        timeCurve(1) {}

  unsigned short GetKeyFlags(unsigned int i) const { return keys[i].flags; }
  void SetKeyFlags(unsigned int i, unsigned short f) { keys[i].flags = f; }
  static unsigned short ConstraintBits(unsigned int code) { return zvKeyFlagsOfConstraint(code); }

  T GetValue(unsigned int i) const { return keys[i].rightValue; }
  // Both sides take the value; the handles follow it.
  void SetValue(unsigned int i, T v) {
    Key& k = keys[i];
    k.leftTangent.y += v - k.leftValue;
    k.rightTangent.y += v - k.rightValue;
    k.leftValue = v;
    k.rightValue = v;
  }
  double ValueAsDouble(unsigned int i) const { return keys[i].rightValue; }

  // A key on its handles, as the engine makes it; flags 0 like every engine-made key.
  void InsertKey(unsigned int at, double parameter, T value) {
    Key k{};
    k.leftTangent = ZvPoint2<double>{parameter, value};
    k.rightTangent = k.leftTangent;
    k.parameter = parameter;
    k.leftValue = value;
    k.rightValue = value;
    k.segmentKind = static_cast<unsigned char>(at ? keys[at - 1].segmentKind : firstSegmentKind);
    keys.InsertBefore(at, k);
  }
  void DropKeys(unsigned int first, unsigned int last) { keys.RemoveClosedRange(first, last); }
  void DropAllKeys() { keys.Resize(0); }
  void MoveKey(unsigned int to, unsigned int from) { keys[to] = keys[from]; }
  // The handles travel with the key.
  void MoveKeyParameter(unsigned int i, double p) {
    Key& k = keys[i];
    const double d = p - k.parameter;
    k.leftTangent.x += d;
    k.rightTangent.x += d;
    k.parameter = p;
  }
  void ScaleKeyParameter(unsigned int i, double f) {
    Key& k = keys[i];
    k.leftTangent.x *= f;
    k.rightTangent.x *= f;
    k.parameter *= f;
  }

  T ValueLeftOfFirstKey() const { return keys.size ? keys[0].leftValue : valueWhenNoKeys; }
  void KeepValueLeftOfFirstKey(T) {}

  // Key reduction thins runs of constant and linear segments along lines. A key arrives with
  // its effective left value (the step's value across a constant segment) and leaves with its
  // right value; a key touching a cubic segment, or holding a value or parameter lock, stays.
  static constexpr bool kThinsAlongLines = true;
  double ThinInValue(unsigned int i) const {
    return i > 0 && keys[i - 1].segmentKind == ZvBaseFCurve::ConstantSegment
               ? keys[i - 1].rightValue
               : keys[i].leftValue;
  }
  double ThinOutValue(unsigned int i) const { return keys[i].rightValue; }
  bool ThinMayDrop(unsigned int i) const {
    return (keys[i].flags & (CFCFlag_ValueLock | CFCFlag_ParameterLock)) == 0 &&
           keys[i].segmentKind != ZvBaseFCurve::CubicSegment && i > 0 &&
           keys[i - 1].segmentKind != ZvBaseFCurve::CubicSegment;
  }
};

#endif
