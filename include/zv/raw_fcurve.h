// The raw function curve: keys of one value each, always joined by straight lines. It is the
// light form of the standard curve for sampled data (a property path keeps one per subpath).
//
// Evaluation. Eval(t) snaps t to a key within 1e-12 and interpolates linearly between the keys
// around it. Beyond the keys it follows the extrapolation method: constant (the end value),
// linear (the slope of the first two or of the last two keys; one key gives its value on both
// sides), cycle, or cycle with an offset of (last value - first value) per period. With
// `clamped` the result is clamped to the clamping values, which are the largest finite doubles
// on a new curve. Evaluation at increasing parameters costs constant time per call, through
// the search hint of the key store, and allocates nothing.
//
// Raw curves keep no locks: the constraint slots accept ParameterLock, ValueLock and
// WholeKeyLock on an existing key and answer 1, but store nothing (GetConstraint reports 0), and
// the lock queries always answer 0. A key has one value, so both sides of GetKeyValue, and the
// left and right values of a key's info, are that value; SetKeyValue sets it whatever the side.
// The curve has no tangents and no segment kinds: GetFCurveInfo answers a request for the first
// segment kind with 0 (firstSegmentKind written 0, the other fields filled), and a key-info
// request for tangents or segment kind likewise (tangents 0, segment kind 1).
//
// Every public operation takes the curve's recursive lock; operations on two curves lock this
// curve first. Operations that can fail return 0 and leave the curve unchanged.
//
// Persistence. The block (version 264) holds the value without keys, the clamps, the keys
// (parameter, value), extrapolation, the read-only flag, the user data and the time-curve flag:
// 55 + 16 n + U bytes. GetBufferSize first drops every key whose parameter is not above the one
// kept before it. ReadFromBufferBody takes the older versions from 256 on as well.
#ifndef ZV_RAW_FCURVE_H
#define ZV_RAW_FCURVE_H

#include <zv/api.h>
#include <zv/fcurve.h>
#include <zv/point.h>

#include <cstddef>

class ZvRawFCurveImpl;
class ZvFCurveLockGuard;

class ZV_API ZvRawFCurve : public ZvBaseFCurve {
 public:
  // A curve without keys.
  explicit ZvRawFCurve(double valueWhenNoKeys = 0.0);
  // One key; none when the parameter or the value is not finite.
  ZvRawFCurve(double parameter, double value);
  // Two keys; in either order, and one key when the parameters are the same. None when any
  // argument is not finite.
  ZvRawFCurve(double parameter0, double value0, double parameter1, double value1);
  // A polyline through the points (ascending parameters): a key where a point leaves the line
  // of the current piece by more than `tolerance`. Points out of order or not finite give a
  // curve without keys.
  ZvRawFCurve(const ZvPoint2dArray& points, double tolerance);
  ZvRawFCurve(const ZvRawFCurve& other);
  // The part of `source` from start to end, with keys made at both ends on the polyline.
  ZvRawFCurve(const ZvRawFCurve& source, double start, double end);
  ~ZvRawFCurve() override;
  ZvRawFCurve& operator=(const ZvRawFCurve& other);

  ZV_BASE_FCURVE_OVERRIDES

  // ---- Beyond the contract ----

  // Adds the point as a key after the last key; 0 when it does not lie right of it.
  unsigned int AppendLinearSegment(const ZvPoint2<double>& point);
  // With two keys or more, when the point lies within `tolerance` (in value) of the line through
  // the last two keys, the last key moves to the point's parameter on that line; otherwise, and
  // with fewer keys, the point is added as a key.
  unsigned int AppendOrExtendLinearSegment(const ZvPoint2<double>& point, double tolerance);
  // Thins the keys of the whole curve: a key goes when its neighbours' line passes within
  // `tolerance` of every dropped key. Returns 1 (0 on a read-only curve).
  unsigned int ReduceNumKeys(double tolerance);
  // The box of key `index` and the segments touching it: what must be redrawn when it changes.
  unsigned int ComputeKeyExtent(unsigned int index, ZvExtent2<double>& extent) const;

  // Reads a whole block of `size` bytes, length field included, refusing one whose length exceeds
  // `size`, whose contents would be read past its body, or whose keys do not stand in strictly
  // ascending order (the body reader takes those and repairs them on writing): the bytes taken
  // (4 + the stored length), or 0 with the curve unchanged. Otherwise exactly ReadFromBufferBody.
  unsigned int ReadFromBuffer(const void* buffer, std::size_t size);

 private:
  ZvRawFCurve(const ZvRawFCurve& other, const ZvFCurveLockGuard& sourceLock);
  // The reader behind ReadFromBufferBody and ReadFromBuffer; the latter asks for ascending keys.
  unsigned int ReadBody(ZvByteReader& in, bool ascendingKeysOnly);

  ZvRawFCurveImpl* m_impl;

  template <class Curve, class Impl>
  friend struct CFCSingleValueCurve;
};

#endif
