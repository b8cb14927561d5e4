// The standard function curve: Bezier keys, each with a parameter, a left and a right value (they
// differ at a discontinuity), two tangent handles and the kind of the segment to the next key.
//
// Evaluation. Eval(t) is right-continuous and EvalLeft(t) gives the left limit; both first snap
// t to a key within 1e-12, extend the curve beyond its keys by the extrapolation method
// (constant, linear along the end tangents, cycle, cycle with a value offset per period) and
// clamp to the clamping values on request. A cubic segment from key i to key i + 1 has the
// control points (parameter(i), rightValue(i)), the evaluated right handle of i, the evaluated
// left handle of i + 1 and (parameter(i + 1), leftValue(i + 1)); its X must be monotone, which
// ZvStdFCurve_IsCubicSegmentValid tests, so that the segment is a function.
//
// Evaluated handles. What a key stores are its actual handles; the curve uses handles computed
// from them and the key's flags: FlatTangent makes them horizontal, FlatAtExtremum too on an
// extremum, AutoTangent follows the chord between the neighbours with handles a third of the way
// toward them (flat on an end key), CollapsedTangent puts them on the key, ChordTangent points
// them along the chord to the adjacent key.
//
// Sequential evaluation, parameter after parameter, costs constant time per call: the search for
// the segment starts from where the last one ended. Every public operation takes the curve's
// lock, queries included.
//
// Flattening. Flatten and FlattenFromTo append a tagged polyline to the arrays (tags
// ZvPointTag_First, _Continue, _Last per run; a jump in value is a vertical edge inside a run)
// and return 1. Flatten covers the keys; FlattenFromTo covers the parameters that a box in
// transformed space shows, with extrapolation, clipped to the box. EvalSequence samples that
// polyline at regular steps and replaces the contents of its arrays. Under the cycle methods a
// box showing more than a million periods is refused with 0, and so are the other drawings
// and samplings too large to hold (see ZvBaseFCurve).
//
// Persistence. The block (version 264) holds the curve-wide values, 60 bytes a key, the flags,
// extrapolation, read-only flag, the keys' extra bytes, the user data block, the tangent
// constraint and the time-curve flag: 68 + 64 n + U bytes for n keys and a user data block of U,
// of which the writer fills all but the last four, which it zeroes. GetBufferSize first drops
// every key whose parameter is not above the one kept before it (their per-key user data go
// along), so a curve writes only ascending keys. ReadFromBufferBody takes every older version as
// well; it consumes 60 + 64 n + U body bytes of a block of today.
//
// ScaleAndOffsetParameters scales, mirrors and shifts the whole curve, and offsets part of the
// keys as a drag of ZvFCurveKeyMover would (a key that would land on a key that stays does not
// move, nor do those behind it); it refuses with 0 a scale of part of the keys, which needs the
// key stretcher.
#ifndef ZV_STD_FCURVE_H
#define ZV_STD_FCURVE_H

#include <zv/api.h>
#include <zv/fcurve.h>
#include <zv/point.h>

#include <cstddef>

class ZvStdFCurveImpl;
class ZvFCurveLockGuard;

class ZV_API ZvStdFCurve : public ZvBaseFCurve {
 public:
  // Ways of building a curve through a list of points.
  enum DPMethod { DPCatmullRom = 1, DPCubicC2 = 2, DPLinearFitC0 = 3, DPCubicFitG1 = 4 };

  // A curve without keys.
  explicit ZvStdFCurve(double valueWhenNoKeys = 0.0, FSKind firstSegmentKind = CubicSegment);
  // One key with its handles on the key; none when a parameter or value is not finite.
  ZvStdFCurve(double parameter, double leftValue, double rightValue, FSKind firstSegmentKind,
              FSKind segmentKind);
  // One cubic segment through four control points; the handles are repaired into a function
  // segment if they fold back. The first point must lie left of the last.
  ZvStdFCurve(const ZvPoint2<double>& p0, const ZvPoint2<double>& p1, const ZvPoint2<double>& p2,
              const ZvPoint2<double>& p3);
  // One straight cubic segment from (startParameter, startValue) to (endParameter, endValue),
  // handles at the thirds of the chord. The start must lie left of the end, and every point
  // be finite (the chord too); otherwise the curve stays without keys.
  ZvStdFCurve(double startParameter, double startValue, double endParameter, double endValue);
  // A curve through points in ascending parameter order. DPCatmullRom: cubic segments through
  // every point, each tangent along the chord of the neighbours. DPCubicC2: the natural cubic
  // spline through every point. DPLinearFitC0: lines, a key where a point leaves the current
  // line by more than the tolerance. DPCubicFitG1: a cubic spline with continuous tangents that
  // passes within the tolerance of every point, on as few keys as it needs; with a negative
  // tolerance, or fewer than three points, or a fit that fails, it is one cubic from the first
  // point to the last with handles at the thirds of the chord. The last key takes
  // `lastSegmentKind`. Points out of order, or not finite, give a curve without keys.
  ZvStdFCurve(const ZvPoint2dArray& points, DPMethod method, double tolerance,
              FSKind firstSegmentKind, FSKind lastSegmentKind);
  ZvStdFCurve(const ZvStdFCurve& other);
  // The part of `source` from start to end: keys made at both ends without changing the shape,
  // the keys outside gone with their user data, automatic handles at the cuts frozen.
  ZvStdFCurve(const ZvStdFCurve& source, double start, double end);
  ~ZvStdFCurve() override;
  ZvStdFCurve& operator=(const ZvStdFCurve& other);

  // ---- The contract of ZvBaseFCurve ----
  // Beyond the base class's account: GetValueUpperBound and GetValueLowerBound are the bounds of
  // the control polygons, not the exact extremes; EvalInverse gives the parameter at which a
  // bijective curve takes the value (its last argument is ignored); IsBijective answers 1 for a
  // continuous, strictly monotone curve of at least two keys.
  ZV_BASE_FCURVE_OVERRIDES
  // Reads a whole block of `size` bytes, length field included, refusing one whose length exceeds
  // `size`, whose contents would be read past its body, or whose keys do not stand in strictly
  // ascending order (the body reader takes those and repairs them on writing): the bytes taken
  // (4 + the stored length), or 0 with the curve unchanged. Otherwise exactly ReadFromBufferBody.
  unsigned int ReadFromBuffer(const void* buffer, std::size_t size);

  // ---- Beyond the contract ----

  // Creates a key, or sets the value of the key at the parameter. The kinds are those of the
  // segments left and right of the new key; 0 inherits the kind in force there.
  unsigned int CreateKey(double parameter, double value, FSKind left, FSKind right);
  // Replaces the keys of the interval by one key, keeping the shape of the surviving
  // neighbours' segments; kinds as in CreateKey.
  unsigned int MergeAndCreateKey(double start, double end, double parameter, double value,
                                 FSKind left, FSKind right, int excludeStart, int excludeEnd,
                                 int keepAttributes);
  // Removes keys; the segment left in their place takes `kind`, or with 0 the kind of the
  // segment before them. Cubic neighbours are joined into one cubic of the same shape.
  unsigned int RemoveKey(double parameter, FSKind kind, double tolerance);
  unsigned int RemoveKeys(double start, double end, FSKind kind, int excludeStart, int excludeEnd);
  // The left limit at the parameter, with extrapolation.
  double EvalLeft(double parameter, int clamped) const;
  // The integral of the plain values from a to b (a <= b); the extrapolation does not enter.
  double EvalIntegral(double a, double b) const;
  // The control-polygon range of the segment on one side of a key.
  unsigned int GetValueRange(double parameter, KeySide side, double& low, double& high,
                             double tolerance, int clamped) const;
  unsigned int HasConstantValue() const;

  // The kind in force at the parameter: that of the key at or before it, or the first kind.
  FSKind GetSegmentKindAtParameter(double parameter) const;
  unsigned int SetSegmentKindAtParameter(double parameter, FSKind kind);
  // Appends the segment kind of every key, in key order; returns how many.
  unsigned int GetSegmentKinds(ZvUByteArray& kinds) const;
  unsigned int GetSegmentKindAtIndex(unsigned int index, FSKind& kind) const;
  unsigned int SetSegmentKindAtIndex(unsigned int index, FSKind kind);
  // Every segment takes the kind; segments turning cubic get valid handles.
  unsigned int ConvertToUniformSegmentKind(FSKind kind);
  // 1 with the kind when every key's segment has the same kind (0 without keys).
  unsigned int HasUniformSegmentKind(FSKind& kind) const;
  unsigned int GetSegmentKind(double parameter, KeySide side, FSKind& kind, double tolerance) const;
  unsigned int SetSegmentKind(double parameter, KeySide side, FSKind kind, double tolerance);
  FSKind GetFirstSegmentKind() const;
  unsigned int SetFirstSegmentKind(FSKind kind);

  // Handles relative to the key: X minus the parameter, Y minus the left value (left handle)
  // or the right value (right handle). Actual: as stored; evaluated: as used.
  unsigned int GetActualKeyTgtHandles(double parameter, ZvPoint2<double>& left,
                                      ZvPoint2<double>& right, double tolerance) const;
  unsigned int GetEvaluatedKeyTgtHandles(double parameter, ZvPoint2<double>& left,
                                         ZvPoint2<double>& right, double tolerance) const;
  // Sets a handle, relative to the key. Refused when it would fold the adjacent segment, or
  // when the key's tangent direction or length is locked. Only that handle moves: on a key with
  // tangent continuity the other handle stays where it was, so the key may stop being smooth
  // until the host moves the other handle too (or uses SetKeyTgtHandles).
  unsigned int SetKeyTgtHandle(double parameter, KeySide side, const ZvPoint2<double>& handle,
                               double tolerance);
  unsigned int SetKeyTgtHandles(double parameter, const ZvPoint2<double>& left,
                                const ZvPoint2<double>& right, double tolerance);

  // Appending after the last key (the point must lie right of it). A constant segment holds the
  // last right value up to the point, where the new key takes the point's value; a linear one
  // runs to the point. The cubic one takes the last key's right handle, the new key's left
  // handle and the new key, absolute, and refuses handles that would fold the segment.
  unsigned int AppendConstantSegment(const ZvPoint2<double>& point);
  unsigned int AppendLinearSegment(const ZvPoint2<double>& point);
  // Moves the last key to the point instead when the point continues the last linear segment
  // within the tolerance (locked parameters or values stay, and that is still a success).
  unsigned int AppendOrExtendLinearSegment(const ZvPoint2<double>& point, double tolerance);
  unsigned int AppendBezierCubicSegment(const ZvPoint2<double>& right, const ZvPoint2<double>& left,
                                        const ZvPoint2<double>& end);

  // Tangent continuity: the two handles of a key stay collinear. Locking needs the handles to be
  // collinear already on a key between two cubic segments. The found key's parameter is
  // written back.
  unsigned int LockTangentContinuity(double& parameter, double tolerance);
  unsigned int UnlockTangentContinuity(double& parameter, double tolerance);
  unsigned int IsTangentContinuityLocked(double& parameter, double tolerance) const;
  // Locks continuity. Where the handles do not agree yet and a cubic segment touches the key,
  // the handle on the other side than `side` is turned to meet the one on `side`, as a drag of
  // that handle to where it already is would do (ZvStdTgtMover), with length continuity kept
  // if the key has it. 0 when the key's tangent direction or length is locked, when the
  // continuity is already locked and met, or when no valid handle position exists.
  unsigned int UnifyAndLockTangentContinuity(double& parameter, KeySide side, double tolerance);
  // Length continuity: both handles keep the same visual length, Y counted times `aspect`.
  unsigned int LockTangentLengthContinuity(double& parameter, double tolerance, double aspect);
  unsigned int UnlockTangentLengthContinuity(double& parameter, double tolerance);
  unsigned int IsTangentLengthContinuityLocked(double& parameter, double tolerance) const;
  // As UnifyAndLockTangentContinuity, for lengths measured with Y times `aspect`; the key's
  // tangent continuity, if locked, is kept.
  unsigned int UnifyAndLockTangentLengthContinuity(double& parameter, KeySide side,
                                                   double tolerance, double aspect);
  unsigned int AreAnyTgtLengthsLockedInInterval(double start, double end, int excludeStart,
                                                int excludeEnd) const;
  unsigned int AreAnyTgtDirectionsLockedInInterval(double start, double end, int excludeStart,
                                                   int excludeEnd) const;
  // The evaluated handles of the interval's keys become their actual handles (at an excluded
  // end only the inward one), and the passed automatic-handle constraints (FlatTangent,
  // FlatAtExtremum, AutoTangent, CollapsedTangent, ChordTangent) are cleared on them.
  unsigned int FreezeTangentsInInterval(double first, double last, int excludeFirst,
                                        int excludeLast, KeyConstraint constraints);
  unsigned int FreezeAllTangents(KeyConstraint constraints);
  // The keys with AutoTangent at the parameter and next to it take their evaluated handles as
  // actual handles, keeping the flag, so that they keep their shape once the flag goes. 0 on a
  // read-only curve or without a key at the parameter.
  unsigned int AdjustAdjacentAutomaticKeysTangents(double parameter);
  unsigned int GetConstraintAtIndex(unsigned int index, KeyConstraint constraint, int& on) const;
  unsigned int SetConstraintAtIndex(unsigned int index, KeyConstraint constraints, int on);

  // Is the curve's data consistent: ascending keys, known segment kinds, function segments,
  // ordered clamps, no NaN.
  unsigned int IsValid() const;

 private:
  // Copies under the source's lock, held from before the user data is copied until the keys are.
  ZvStdFCurve(const ZvStdFCurve& other, const ZvFCurveLockGuard& sourceLock);
  friend class ZvStdTgtMoverImpl;  // a drag writes handles that are valid only as a pair
  // The reader behind ReadFromBufferBody and ReadFromBuffer; the latter asks for ascending keys.
  unsigned int ReadBody(ZvByteReader& in, bool ascendingKeysOnly);

  ZvStdFCurveImpl* m_impl;

  friend struct CFCCurveStore;  // the interactive editing tools work on the keys directly
};

// The u in [0, 1] at which a monotone cubic X with controls x0..x3 takes the value x.
ZV_API double InvertParamCubic(double x, double x0, double x1, double x2, double x3);
// Shortens the handles of the cubic p[0..3] along their directions until its X is monotone.
ZV_API void BezierCubicRegularize(ZvPoint2<double>* p);
// The integral of the function segment p[0..3] from parameter a to parameter b.
ZV_API double IntegrateBezierSegment(const ZvPoint2<double>* p, double a, double b);
// 1 when X of the cubic is monotone, so that the segment is a function of the parameter.
ZV_API int ZvStdFCurve_IsCubicSegmentValid(const ZvPoint2<double>& p0, const ZvPoint2<double>& p1,
                                           const ZvPoint2<double>& p2, const ZvPoint2<double>& p3);

#endif
