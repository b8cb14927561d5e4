// Rotation curves: ZvQuatCurve keys a rotation as Euler angles over time and interpolates it
// along a quaternion spline (see <zv/quat.h>); ZvQuatFCurve presents one Euler angle of a shared
// ZvQuatCurve as a function curve, so that three of them (x, y, z) edit one rotation together.
//
// Units. ZvQuatCurve stores and returns radians in its whole-rotation forms (ZvPoint3 angles);
// every form that takes a component (0 is x, 1 is y, anything else z) speaks degrees. A
// ZvQuatFCurve speaks degrees throughout. Times are the host's parameter unit.
//
// Sharing. A ZvQuatCurve is reference counted: it starts with a count of 0, each holder calls
// Ref, and UnRef deletes it when the count falls to 0 or below. ZvQuatFCurve holds one reference
// for its lifetime. The rotation curve has no lock of its own and even Eval writes to it (a cache
// of the last result and the spline built on first use); each view locks only itself, so views
// of one rotation curve that are used from several threads need the caller's own care (keep them
// on one thread, or hold all their locks).
//
// Failure. Operations that can fail return 0 (or ~0 for a key index) and change nothing;
// out-of-range indices fail; Eval of a curve without keys gives the no-keys value.
#ifndef ZV_QUAT_FCURVE_H
#define ZV_QUAT_FCURVE_H

#include <zv/api.h>
#include <zv/arrays.h>
#include <zv/fcurve.h>
#include <zv/point.h>
#include <zv/quat.h>

#include <cstddef>
#include <vector>

class ZV_API ZvQuatCurve {
 public:
  // Key search result when no key matches.
  static constexpr unsigned int NoKey = ~0u;

  ZvQuatCurve();
  // Keys and settings are copied, the reference count is not (the copy starts at 0).
  ZvQuatCurve(const ZvQuatCurve& other);
  ZvQuatCurve& operator=(const ZvQuatCurve& other);
  ~ZvQuatCurve();

  void Ref();
  // Deletes the curve when the count falls to 0 or below; the caller's pointer is then dead.
  void UnRef();
  int GetRefCount() const { return refCount; }

  // ---- Keys (radians unless a component is named) ----
  unsigned int GetNumKeys() const;
  // 0 for an index out of range.
  int GetKey(unsigned int index, ZvQuatKey& key) const;
  // The nearest key within the tolerance takes every field of `key` (its time too); otherwise
  // `key` is inserted in time order. Returns its index.
  unsigned int SetKey(const ZvQuatKey& key, double tolerance);
  // The same with tension, continuity, bias, spins and locks 0: a key found within the tolerance
  // loses its own.
  unsigned int SetKey(double time, const ZvPoint3<double>& radians, double tolerance);
  // Evaluates the rotation at `time`, replaces one angle by `degrees`, and sets that key: the
  // other two angles of a new key keep the curve's current shape.
  unsigned int SetKey(double time, unsigned int component, double degrees, double tolerance);
  // The key nearest `time` within the tolerance (the earlier of two equally near); NoKey if none.
  unsigned int FindKey(double time, double tolerance) const;
  int RemoveKey(double time, double tolerance);
  int RemoveKeyAt(unsigned int index);
  void RemoveAllKeys();
  // Removes keys first..last inclusive; 0 unless first <= last < GetNumKeys().
  int RemoveKeyRange(unsigned int first, unsigned int last);
  // 0.0 for an index out of range.
  double GetKeyTime(unsigned int index) const;
  // Radians; (0, 0, 0) for an index out of range.
  ZvPoint3<double> GetKeyValue(unsigned int index) const;
  // Degrees; 0.0 for an index out of range.
  double GetKeyValue(unsigned int index, unsigned int component) const;
  int SetKeyValue(unsigned int index, unsigned int component, double degrees);
  // Moves a key to another time without re-sorting; the caller keeps the order.
  int SetParameter(unsigned int index, double time);
  // The first key above time + tolerance / the last key below time - tolerance; NoKey when
  // there is none.
  unsigned int GetNextKey(double time, double tolerance) const;
  unsigned int GetPrevKey(double time, double tolerance) const;

  // ---- Evaluation ----
  // Radians. Between keys the spline; beyond them the extrapolation method. The angles are the
  // Euler solution nearest the blend of the two neighbouring keys' angles, so that a curve keyed
  // with angles beyond +-180 degrees evaluates near them. The last result is cached: a time
  // within 1e-9 of the previous one returns it again.
  ZvPoint3<double> Eval(double time) const;
  // One angle in degrees.
  double Eval(double time, unsigned int component) const;

  // ---- Whole curve ----
  // Multiplies / shifts the time of every key without a parameter lock; no re-sorting, so a
  // locked key can leave the times out of order (IsValid then fails). Scale fails below 1e-12.
  int Scale(double factor);
  int Shift(double delta);
  // Times strictly increasing.
  int IsValid() const;
  // The box, in (time, degrees), of the keys from index - 2 to index + 2, each value reduced by
  // 360 into [0, 360) - the branch a display draws it in; a missing neighbour counts as time 0
  // with the no-keys value. Empty for an index out of range.
  ZvExtent2<double> GetKeyExtent(unsigned int index, unsigned int component) const;

  // ---- Locks and settings ----
  int IsParamLocked(unsigned int index) const;
  int SetParamLock(unsigned int index, int on);
  int IsValueLocked(unsigned int index) const;
  int SetValueLock(unsigned int index, int on);
  int IsReadOnly() const;
  void SetReadOnlyConstraint(int on);
  // Value 2 for the value lock, 4 for the parameter lock; 0 out of range.
  unsigned int GetConstraintData(unsigned int index) const;
  int SetConstraintData(unsigned int index, unsigned int data);
  ZvPoint3<double> GetValueWhenNoKeys() const;              // radians
  double GetValueWhenNoKeys(unsigned int component) const;  // degrees
  void SetValueWhenNoKeys(const ZvPoint3<double>& radians);
  void SetValueWhenNoKeys(unsigned int component, double degrees);
  // 1 constant, 2 linear, 3 repeat, 4 repeat with offset; anything else is refused with 0.
  unsigned int GetExtrapolationMethod() const;
  int SetExtrapolationMethod(unsigned int method);

  // The keys in time order, for readers that walk them (flattening, persistence).
  const std::vector<ZvQuatKey>& GetKeys() const { return keys; }

 private:
  void Invalidate();
  const ZvQuatSpline& Spline() const;

  ZvPoint3<double> valueWhenNoKeys;
  mutable ZvPoint3<double> lastValue;
  mutable double lastTime;
  std::vector<ZvQuatKey> keys;
  mutable ZvQuatSpline* spline;
  int refCount;
  unsigned int extrapolation;
  int readOnly;

  friend struct CFCCurveStore;  // the interactive editing tools work on the keys directly
  friend class ZvQuatFCurve;    // its splices build the new keys aside in one pass
};

// One Euler angle (component 0 x, 1 y, 2 z) of a shared ZvQuatCurve as a function curve, in
// degrees. Keys are the rotation curve's keys: a key made through one view is a key of all
// three, with the other two angles taken from the evaluated rotation. The function curve has no
// clamping (it reports the extreme doubles), no tangents, no segment kinds and no inverse.
// Only the parameter lock, the value lock and the whole-key lock (both) are supported.
// CreateKey sets a whole key: on an existing key its tension, continuity, bias, spins and locks
// return to 0 (set them on the rotation curve's ZvQuatKey).
//
// The persistent block ("1010") holds the component, the rotation curve's keys (time, angles in
// radians, tension, continuity, bias, spins and locks), its value without keys, read-only flag
// and extrapolation, and this view's user data: 52 + 48 n + U bytes. Reading replaces the
// rotation curve's contents, as every view of it sees, and takes the component; the older block
// ("0010") keeps the component. SmoothSequence, ReduceNumKeys and MirrorParameters answer 0 and
// change nothing.
//
// Cut, Paste and Append move whole rotations (all three angles of the keys). Cut puts keys with
// the evaluated rotation at both ends, gives `cutOut` (a rotation view, whose rotation is
// replaced) the keys between them, and closes the gap: the curve goes on from start as it went
// on from end. Paste replaces [start, end] by the source's keys and moves the later keys by the
// length difference. Append puts the source's first key on the last key. All three refuse a
// parameter-locked key that would move, and Cut a value-locked key in the interval.
class ZV_API ZvQuatFCurve : public ZvBaseFCurve {
 public:
  // A view of a new rotation curve of its own.
  explicit ZvQuatFCurve(unsigned int component = 0);
  // A view of `curve` (not null), which gains a reference.
  ZvQuatFCurve(ZvQuatCurve* curve, unsigned int component);
  // Takes the source's component and a copy of its rotation curve; user data are not copied.
  ZvQuatFCurve(const ZvQuatFCurve& other);
  ~ZvQuatFCurve() override;
  ZvQuatFCurve& operator=(const ZvQuatFCurve& other);

  // The shared rotation curve (still owned through the reference counts) and the component.
  ZvQuatCurve* GetQuatCurve() const { return m_curve; }
  unsigned int GetComponent() const { return m_component; }
  // Degrees: each low and high start at the extreme doubles; the keys inside [start, end] and
  // the values at both ends count. 0 without keys.
  unsigned int GetValueBoundsBetween(double start, double end, double& low, double& high) const;

  // Pen input: a key at the point (x the time, y degrees), which must lie right of the last key.
  // 0 without keys or read-only.
  unsigned int AppendLinearSegment(const ZvPoint2<double>& point);
  // The same, except that when the line through the last two keys' values passes within
  // `tolerance` of the point, the last key moves onto that line at the point's time instead.
  unsigned int AppendOrExtendLinearSegment(const ZvPoint2<double>& point, double tolerance);

  // ---- The contract of ZvBaseFCurve ----
  // Beyond the base class's account: EvalSequence samples Eval at start, start + step, ... while
  // below end, then at end, replaces the arrays' contents and returns the number of samples (0
  // for a step that is not positive); EvalInverse writes the largest float to `parameter` and
  // returns 0, as a rotation angle has no inverse; Set, from another rotation view, takes its
  // component and a copy of its rotation curve.
  ZV_BASE_FCURVE_OVERRIDES
  // Reads a whole block of `size` bytes, length field included, refusing one whose length exceeds
  // `size`, whose contents would be read past its body, or whose keys do not stand in strictly
  // ascending order (the body reader takes those and repairs them on writing): the bytes taken
  // (4 + the stored length), or 0 with the curve unchanged. Otherwise exactly ReadFromBufferBody.
  unsigned int ReadFromBuffer(const void* buffer, std::size_t size);

 private:
  // The reader behind ReadFromBufferBody and ReadFromBuffer; the latter asks for ascending keys.
  unsigned int ReadBody(ZvByteReader& in, bool ascendingKeysOnly);

  ZvQuatCurve* m_curve;
  unsigned int m_component;
};

// ---- Sampling of a rotation curve ----

// A sampled image of the rotation between start and end: the curve is subdivided between each
// pair of keys (from the key before start to the key after end) until each angle, mapped as
// (time, degrees) through `transfo`, is flat within `tolerance` over a piece, or six halvings
// deep; then the samples are made continuous. Appends to the arrays: times, angles in radians,
// a key mark per sample, and a tag ZvPointTag_First per sample when `tags` is given.
ZV_API void ZvQuatCurveFlatten(const ZvQuatCurve& curve, double start, double end,
                               const ZvTransfo4& transfo, double tolerance, ZvDoubleArray& times,
                               ZvPoint3dArray& points, ZvBoolArray& isKey, ZvPointTagArray* tags);
// One subdivision step between (t0, v0) and (t1, v1) (radians), appending the end sample.
ZV_API void ZvQuatFCurveSubdivide(const ZvQuatCurve& curve, double t0, const ZvPoint3<double>& v0,
                                  bool key0, double t1, const ZvPoint3<double>& v1, bool key1,
                                  const ZvTransfo4& transfo, double tolerance, ZvDoubleArray& times,
                                  ZvPoint3dArray& points, ZvBoolArray& isKey, ZvPointTagArray* tags,
                                  int depth);
// Removes the 2 pi jumps of the Euler form: samples outside the keys and between them are each
// re-expressed as the Euler triple of their rotation nearest the neighbouring sample, walking
// outward from the first and last keys. Key samples stay as they are.
ZV_API void ZvQuatFCurveMakeContinuous(const ZvDoubleArray& times, ZvPoint3dArray& points,
                                       const ZvBoolArray& isKey);
// The time from key m to key m + 1 with m = i modulo (keys - 1), made non-negative. The curve
// must have two keys or more.
ZV_API double ZvQuatKeyDelta(const ZvQuatCurve& curve, int i);

#endif
