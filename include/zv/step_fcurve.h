// The step function curves: ZvBooleanFCurve (values 0 and 1) and ZvIntegerFCurve (32-bit
// integers). A key's value holds from the key up to the next key; left of the first key holds
// the value before the first key, which a new key at the front takes from the key itself and
// which otherwise stays what it was. The two kinds differ only in which doubles they accept as
// values and how they make an integer of them.
//
// Values. Boolean: CreateKey accepts 0 and 1 within 1e-15 and refuses anything else with 0;
// MergeAndCreateKey, SetKeyValue and SetValueWhenNoKeys take a value within 1e-15 of 1 as 1 and
// anything else as 0. Integer: CreateKey and MergeAndCreateKey accept whole numbers within
// 1e-15 in [-2147483648, 2147483647] and refuse 2.5; SetKeyValue, SetValueWhenNoKeys and the
// constructor truncate. Eval returns the integer as a double (1.0 or 0.0 on the boolean curve).
//
// Evaluation. Eval(t) snaps t to a key within 1e-12 and is right-continuous: on a key it gives
// that key's value. Beyond the keys: constant (method 1), cycle (3: the keyed range repeats; on
// the last key the first key's value), cycle with offset (4: the same folding, the values repeat
// without accumulating). Linear extrapolation (2) cannot be set (SetExtrapolationMethod answers
// 0); a curve that has it gives 0.0 outside the keyed range, there being no slope to extend.
// The `clamped` argument of Eval and of the bounds is ignored; EvalSequence and GetKeys clamp to
// the stored clamps (0 and 1, or the int range) on request.
//
// Sides of a key. GetKeyValue with LeftSide gives the value just before the key (the previous
// key's value, or the value before the first key); SetKeyValue with LeftSide changes that value.
// A key's info reports the same two values; requests for tangents or segment kinds are not met
// (those fields are zeroed, the segment kind set to 1, and the answer is 0).
//
// What makes no sense for a step function answers 0: EvalInverse, IsBijective,
// SetClampingValues; GetClampingValues reports the extreme doubles rather than the stored
// clamps; GetFCurveInfo does not meet requests for the first segment kind or the clamps. Keys may
// hold ParameterLock, ValueLock and WholeKeyLock (both); other constraint codes answer 0. On the
// boolean curve ShiftValues and ScaleAndShiftValues do nothing and answer 1, SmoothSequence
// answers 0. On the integer curve ShiftValues and ScaleAndShiftValues round their arguments to
// integers; ScaleAndShiftValues gives each key the new value of the key before it, scaled and
// shifted (the first key takes that of the value before the first key).
//
// Every public operation takes the curve's recursive lock; operations on two curves lock this
// curve first. Operations that fail return 0 and leave the curve unchanged.
//
// Persistence. A block (version 258) holds the value without keys, the value before the first
// key, extrapolation, the read-only flag, the keys (parameter, value, flags) and the user data:
// 36 + 11 n + U bytes for the boolean curve, 42 + 14 n + U for the integer curve. GetBufferSize
// first drops every key whose parameter is not above the one kept before it. The clamps and the
// time-curve flag are not part of the block: a read curve has those of a new curve.
#ifndef ZV_STEP_FCURVE_H
#define ZV_STEP_FCURVE_H

#include <zv/api.h>
#include <zv/fcurve.h>

#include <cstddef>

class ZvStepFCurveImpl;
class ZvFCurveLockGuard;

class ZV_API ZvBooleanFCurve : public ZvBaseFCurve {
 public:
  // A curve without keys whose value is `valueWhenNoKeys` taken as a boolean.
  explicit ZvBooleanFCurve(double valueWhenNoKeys = 0.0);
  ZvBooleanFCurve(const ZvBooleanFCurve& other);
  // The part of `source` from start to end, with keys made at both ends.
  ZvBooleanFCurve(const ZvBooleanFCurve& source, double start, double end);
  ~ZvBooleanFCurve() override;
  ZvBooleanFCurve& operator=(const ZvBooleanFCurve& other);

  ZV_BASE_FCURVE_OVERRIDES

  // The value before the first key.
  int GetValueBeforeFirstKey() const;
  // Reads a whole block of `size` bytes, length field included, refusing one whose length exceeds
  // `size`, whose contents would be read past its body, or whose keys do not stand in strictly
  // ascending order (the body reader takes those and repairs them on writing): the bytes taken
  // (4 + the stored length), or 0 with the curve unchanged. Otherwise exactly ReadFromBufferBody.
  unsigned int ReadFromBuffer(const void* buffer, std::size_t size);

 private:
  ZvBooleanFCurve(const ZvBooleanFCurve& other, const ZvFCurveLockGuard& sourceLock);
  // The reader behind ReadFromBufferBody and ReadFromBuffer; the latter asks for ascending keys.
  unsigned int ReadBody(ZvByteReader& in, bool ascendingKeysOnly);

  ZvStepFCurveImpl* m_impl;

  template <class Curve, class Impl>
  friend struct CFCSingleValueCurve;
};

class ZV_API ZvIntegerFCurve : public ZvBaseFCurve {
 public:
  // A curve without keys whose value is `valueWhenNoKeys` truncated.
  explicit ZvIntegerFCurve(double valueWhenNoKeys = 0.0);
  ZvIntegerFCurve(const ZvIntegerFCurve& other);
  ZvIntegerFCurve(const ZvIntegerFCurve& source, double start, double end);
  ~ZvIntegerFCurve() override;
  ZvIntegerFCurve& operator=(const ZvIntegerFCurve& other);

  ZV_BASE_FCURVE_OVERRIDES

  int GetValueBeforeFirstKey() const;
  // Reads a whole block of `size` bytes, length field included, refusing one whose length exceeds
  // `size`, whose contents would be read past its body, or whose keys do not stand in strictly
  // ascending order (the body reader takes those and repairs them on writing): the bytes taken
  // (4 + the stored length), or 0 with the curve unchanged. Otherwise exactly ReadFromBufferBody.
  unsigned int ReadFromBuffer(const void* buffer, std::size_t size);

 private:
  ZvIntegerFCurve(const ZvIntegerFCurve& other, const ZvFCurveLockGuard& sourceLock);
  // The reader behind ReadFromBufferBody and ReadFromBuffer; the latter asks for ascending keys.
  unsigned int ReadBody(ZvByteReader& in, bool ascendingKeysOnly);

  ZvStepFCurveImpl* m_impl;

  template <class Curve, class Impl>
  friend struct CFCSingleValueCurve;
};

#endif
