// The abstract one-dimensional function curve: a mapping from a double
// parameter (usually time) to a double value, held as a sorted list of keys.
// Concrete kinds derive from ZvBaseFCurve; clients work through its virtual
// operations and ask for a concrete kind with QueryFCurveKind.
//
// Conventions shared by every kind:
// - Operations that can fail return 1 on success and 0 on failure; those
//   that create a curve return null on failure.
// - Two parameters are the same key parameter when they differ by at most
//   1e-15 (both bounds tested, so a NaN never matches).
// - `tolerance` is the half-width of an interval centred on the parameter in
//   which the nearest key is searched; `excludeStart` / `excludeEnd` leave a
//   key lying exactly on that end of an interval out of it.
// - Every public operation takes the curve's recursive lock, so one curve may
//   be shared between threads. Operations on two curves lock `this` first.
#ifndef ZV_FCURVE_H
#define ZV_FCURVE_H

#include <zv/api.h>
#include <zv/arrays.h>
#include <zv/critical_section.h>
#include <zv/fcurve_userdata.h>
#include <zv/point.h>

#include <atomic>
#include <cstddef>

class ZvByteReader;
class ZvByteWriter;
class ZvTransfo4;

class ZV_API ZvBaseFCurve {
 public:
  // Enumerations are plain integers; their values are written into buffers.
  enum Kind { BooleanKind = 10, IntegerKind = 15, StdKind = 20, RawKind = 30, QuatKind = 40 };

  // Any value other than LeftSide acts as RightSide.
  enum KeySide { LeftSide = 1, RightSide = 2 };

  // Kind of the segment from a key to the next key. 0 is invalid.
  enum FSKind {
    ConstantSegment = 1,  // holds the key's right value up to the next key
    LinearSegment = 2,
    CubicSegment = 3  // Bezier
  };

  enum ExtrapolationMethod {
    ConstantExtrapolation = 1,
    LinearExtrapolation = 2,
    CycleExtrapolation = 3,
    CycleWithOffsetExtrapolation = 4
  };

  // One property of a key. SetConstraint accepts a combination of codes,
  // GetConstraint exactly one. Each code maps to bits of the key's 16-bit
  // KeyFlags word (noted on the right), which is what buffers hold.
  enum KeyConstraint {
    ParameterLock = 1,               // bit value 4
    ValueLock = 2,                   // bit value 2
    TangentContinuity = 4,           // bit value 1, set on every new key
    TangentDirectionLock = 8,        // bit value 8
    TangentLengthLock = 16,          // bit value 16
    WholeKeyLock = 32,               // mask 30: all four locks together
    FlatTangent = 64,                // bit value 32
    FlatAtExtremum = 128,            // bit value 64
    AutoTangent = 256,               // bit value 128
    CollapsedTangent = 512,          // bit value 256
    TangentLengthContinuity = 1024,  // bit value 512
    ChordTangent = 2048,             // bit value 1024
    MirroredTangents = 4096,         // bit value 2048
    ChordTangentAlias = 8192         // the same bit as ChordTangent, on purpose
  };

  // Side of a selection box that is dragged.
  enum RegionHandle { BottomHandle = 1, LeftHandle = 2, RightHandle = 4, TopHandle = 8 };

  // Filled on request: the caller sets `mask`, the curve fills only the
  // requested fields and clears the bits of requests it cannot meet.
  struct FCurveInfo {
    enum Mask {
      KindMask = 1,
      NumKeysMask = 2,
      ValueWhenNoKeysMask = 4,
      FirstSegmentKindMask = 8,
      MinClampMask = 16,
      MaxClampMask = 32,
      ExtrapolationMask = 64
    };
    unsigned int mask;
    unsigned int kind;
    double valueWhenNoKeys;
    unsigned int numKeys;
    unsigned int firstSegmentKind;
    double minClamp;
    double maxClamp;
    unsigned int extrapolation;
  };

  // One key. Tangents are the evaluated handles relative to the key;
  // leftValue is the effective left value.
  struct KeyInfo {
    enum Mask {
      IndexMask = 1,
      ParameterMask = 2,
      LeftValueMask = 4,
      RightValueMask = 8,
      LeftTangentXMask = 16,
      LeftTangentYMask = 32,
      RightTangentXMask = 64,
      RightTangentYMask = 128,
      SegmentKindMask = 256
    };
    unsigned int mask;
    unsigned int index;
    double parameter;
    double leftValue;
    double rightValue;
    double leftTangentX;
    double leftTangentY;
    double rightTangentX;
    double rightTangentY;
    unsigned char segmentKind;  // the segment to the right of the key
  };

  // --- Virtual operations, in the order of the virtual table. ---
  //
  // Every kind keeps its key parameters finite and strictly increasing. An edit that cannot
  // (a parameter that is NaN or infinite, a merged key that would not lie strictly between the
  // keys that stay, a shift, scale or mirror that would overflow or round two keys onto one,
  // a cut whose moved tail would round onto the cut) answers 0 and leaves the curve as it was.
  // A NaN parameter names no key: the key queries answer 0 for it.

  virtual ZvBaseFCurve& operator=(const ZvBaseFCurve& other);
  virtual ~ZvBaseFCurve();

  virtual ZvBaseFCurve* QueryFCurveKind(Kind kind) const = 0;
  virtual Kind GetKind() const = 0;
  virtual ZvBaseFCurve* Clone() const = 0;
  // Under the cycle methods a snapshot repeats the keys of every period it shows: more than 1e5
  // periods, or more than 2^20 repeated keys (1048576), are refused with null.
  virtual ZvBaseFCurve* SnapShot(double start, double end, ExtrapolationMethod method) const = 0;

  virtual unsigned int CreateKey(double parameter, double value) = 0;
  virtual unsigned int MergeAndCreateKey(double start, double end, double parameter, double value,
                                         int excludeStart, int excludeEnd, int keepAttributes) = 0;
  virtual unsigned int CreateNonModifyingKey(double parameter, int noFold) = 0;
  virtual unsigned int MergeAndCreateNonModifyingKey(double start, double end, double parameter,
                                                     int excludeStart, int excludeEnd,
                                                     int keepAttributes, int noFold) = 0;
  virtual unsigned int RemoveKey(double parameter, double tolerance) = 0;
  virtual unsigned int RemoveKeys(double start, double end, int excludeStart, int excludeEnd) = 0;
  virtual unsigned int SetValueWhenNoKeys(double value) = 0;
  virtual unsigned int GetKeyValue(double parameter, KeySide side, double& value,
                                   double tolerance) const = 0;
  virtual unsigned int GetKeyValues(double parameter, double& left, double& right,
                                    double tolerance) const = 0;
  virtual unsigned int SetKeyValue(double parameter, KeySide side, double value,
                                   double tolerance) = 0;
  // cutOut receives what was cut; it must be of the same kind, not read-only. When the keys
  // after the cut, moved left by its width, would round onto the cut, the result is 0 and the
  // curve is as it was.
  virtual unsigned int Cut(double start, double end, ZvBaseFCurve& cutOut) = 0;
  virtual unsigned int RemoveTail(double parameter) = 0;
  virtual unsigned int RemoveHead(double parameter) = 0;
  virtual unsigned int Append(const ZvBaseFCurve& curve) = 0;
  virtual unsigned int Paste(const ZvBaseFCurve& curve, double start, double end) = 0;
  // Both refuse with 0, changing nothing, when a key would leave the finite doubles or land on
  // its neighbour (far from 0 a small shift or factor can do either).
  virtual unsigned int ShiftParameters(double delta) = 0;
  virtual unsigned int ScaleParameterAxis(double factor) = 0;
  virtual unsigned int ShiftValues(double delta) = 0;
  virtual unsigned int ReduceNumKeys(double start, double end, double tolerance) = 0;

  virtual unsigned int GetFCurveInfo(FCurveInfo* info) const = 0;
  virtual unsigned int GetKeyInfoFromIndex(unsigned int index, KeyInfo* info) const = 0;
  virtual unsigned int GetKeyInfoFromParameter(double parameter, KeyInfo* info) const = 0;
  virtual unsigned int GetKeyParameter(unsigned int index, double& parameter) const = 0;
  virtual unsigned int GetKeyIndex(double parameter, unsigned int& index) const = 0;
  virtual unsigned int GetNumKeys() const = 0;
  // Appends the parameters of the interval's keys; returns how many.
  virtual unsigned int GetKeyParameters(double start, double end, ZvDoubleArray& parameters,
                                        int excludeStart, int excludeEnd) const = 0;
  virtual unsigned int IsKeyParameter(double parameter, double tolerance) const = 0;
  virtual unsigned int GetAllKeyParameters(ZvDoubleArray& parameters) const = 0;
  virtual unsigned int GetNextKeyParameter(double parameter, double& next, int inclusive) const = 0;
  virtual unsigned int GetPrevKeyParameter(double parameter, double& prev, int inclusive) const = 0;
  // Of two equally near keys, the later one.
  virtual unsigned int GetNearestKeyParameter(double parameter, double& nearest) const = 0;
  // Replaces the parameter by the nearest key's within the tolerance.
  virtual unsigned int GetNearestKeyParameterInCenteredInterval(double& parameter,
                                                                double tolerance) const = 0;
  virtual unsigned int SetClampingValues(double minValue, double maxValue) = 0;
  virtual unsigned int GetClampingValues(double& minValue, double& maxValue) const = 0;
  virtual unsigned int GetSmallestKeyParameter(double& parameter) const = 0;
  virtual unsigned int IsSmallestKeyParameter(double parameter) const = 0;
  virtual double GetMinusInfinityVal() const = 0;
  virtual unsigned int GetLargestKeyParameter(double& parameter) const = 0;
  virtual unsigned int IsLargestKeyParameter(double parameter) const = 0;
  virtual double GetPlusInfinityVal() const = 0;
  virtual double GetValueUpperBound(int clamped) const = 0;
  virtual double GetValueLowerBound(int clamped) const = 0;

  // Right-continuous value with extrapolation.
  virtual double Eval(double parameter, int clamped) const = 0;
  // Samples at start, start + step, ... and end, read from the curve flattened at `tolerance`.
  // More than 2^20 samples (1048576) are refused with 0 rather than allocated, and so is a
  // sampling whose flattened curve would take more than 2^22 points (a tolerance far below the
  // curve's size over many keys or periods).
  virtual unsigned int EvalSequence(double start, double end, double step, double tolerance,
                                    ZvDoubleArray& parameters, ZvDoubleArray& values,
                                    int clamped) const = 0;
  // Refused with 0, the arrays as they were, when the drawing would add more than 2^20 points.
  virtual unsigned int Flatten(const ZvTransfo4& transfo, double tolerance, ZvPoint2dArray& points,
                               ZvPointTagArray& tags, int clamped) const = 0;
  // Refused with 0, the arrays as they were, when the drawing would add more than 2^20 points,
  // or when under the cycle methods the box shows more than a million periods or more than 2^20
  // keys counted once per period: such a drawing is a solid band.
  virtual unsigned int FlattenFromTo(const ZvExtent2<double>& box, const ZvTransfo4& transfo,
                                     double tolerance, ZvPoint2dArray& points,
                                     ZvPointTagArray& tags, ZvBoolArray& extrapolated,
                                     int clamped) const = 0;
  // Appends all keys (left values are effective left values); returns the count.
  virtual unsigned int GetKeys(ZvDoubleArray& parameters, ZvDoubleArray& leftValues,
                               ZvDoubleArray& rightValues, int clamped) const = 0;
  // The last argument has no effect. A resampling of more than 2^20 samples (1048576) is
  // refused with 0 before any key is made.
  virtual unsigned int ResampleSequence(double start, double end, double step, int keepExistingKeys,
                                        int ignoredFlag) = 0;
  // The caller's duty: `kernel` holds at least `kernelSize` doubles.
  virtual unsigned int SmoothSequence(double start, double end, const double* kernel,
                                      unsigned int kernelSize) = 0;
  virtual unsigned int MirrorValues() = 0;
  // Refused with 0 when mirrored keys would round onto each other or overflow.
  virtual unsigned int MirrorParameters() = 0;
  virtual unsigned int ScaleAndOffsetParameters(double start, double end, double pivot,
                                                double scale, double offset, int moveHead,
                                                int moveTail, RegionHandle handle) = 0;
  virtual unsigned int SetReadOnlyConstraint(int on) = 0;
  virtual unsigned int IsReadOnly() const = 0;
  // Both write the found key's parameter back.
  virtual unsigned int SetConstraint(double& parameter, KeyConstraint constraints, int on,
                                     double tolerance) = 0;
  virtual unsigned int GetConstraint(double& parameter, KeyConstraint constraint, int& on,
                                     double tolerance) const = 0;
  virtual unsigned int IsConstraintSupported(KeyConstraint constraint) const = 0;
  virtual unsigned int AreAnyValuesLockedInInterval(double start, double end, int excludeStart,
                                                    int excludeEnd) const = 0;
  virtual unsigned int AreAnyParametersLockedInInterval(double start, double end, int excludeStart,
                                                        int excludeEnd) const = 0;
  virtual unsigned int AreAnyKeysLockedInInterval(double start, double end, int excludeStart,
                                                  int excludeEnd) const = 0;
  virtual unsigned int SetExtrapolationMethod(ExtrapolationMethod method) = 0;
  virtual ExtrapolationMethod GetExtrapolationMethod() const = 0;
  // The parameter brought into the keyed range under the cycle methods.
  virtual double FoldParameter(double parameter) const = 0;

  virtual unsigned int GetBufferSize() const = 0;
  virtual unsigned int WriteToBuffer(void* buffer) const = 0;
  virtual unsigned int ReadFromBufferBody(const void* body) = 0;

  virtual unsigned int ScaleAndShiftValues(double scale, double offset) = 0;
  virtual unsigned int EvalInverse(double value, double& parameter, int clamped) const = 0;
  virtual unsigned int IsBijective() const = 0;
  virtual unsigned int SetDefaultBezierTangentConstraint(int on) = 0;
  virtual unsigned int IsDefautlBezierTangentConstraintOn() const = 0;
  // 1 if the flag changed; 0 if not, or if the curve is read-only.
  virtual unsigned int SetAsTimeFCurve(int on) = 0;
  virtual unsigned int IsTimeFCurve() const = 0;
  // Assigns from a curve of the same kind; 0 for another kind.
  virtual unsigned int Set(const ZvBaseFCurve& curve) = 0;

  // --- Locking. ---

  // The recursive lock of the curve, for holding it across several calls.
  void Lock() const;
  void Unlock() const;
  // How many times the lock is currently held.
  unsigned int GetLockCount() const;

  // --- Curve-level user data. ---

  // Creates the store on demand, replaces an existing item; always 1.
  unsigned int SetFCurveUserData(const _zvUID& uid, const unsigned char* data, unsigned int size);
  // Hands out a pointer into the store, valid while nobody changes the
  // curve; 0 if absent.
  unsigned int GetFCurveUserData(const _zvUID& uid, const unsigned char*& data,
                                 unsigned int& size) const;
  unsigned int RemoveFCurveUserData(const _zvUID& uid);
  // 1 if the store exists, whatever it holds.
  unsigned int HasUserData() const;

  // --- Per-key user data. ---
  // A `double& parameter` is first snapped to the nearest key within the
  // tolerance, and the snapped parameter is left in it.

  // 0 if the curve has no keys or no key lies within the tolerance.
  unsigned int SetKeyUserData(double& parameter, const _zvUID& uid, const unsigned char* data,
                              unsigned int size, double tolerance);
  unsigned int GetKeyUserData(double& parameter, const _zvUID& uid, const unsigned char*& data,
                              unsigned int& size, double tolerance) const;
  // Removing the last item of a key removes that key's set.
  unsigned int RemoveKeyUserData(double& parameter, const _zvUID& uid, double tolerance);
  // Removes the whole set at exactly this parameter.
  unsigned int RemoveKeyUserData(double parameter);
  // 1 if a set lies at exactly this parameter; 0 on a curve without keys.
  unsigned int HasUserData(double parameter) const;
  // Copies the items of the source's set at sourceParameter to this curve
  // at parameter; 1 even when nothing was copied. Locks this curve first.
  unsigned int CopyKeyUserData(const ZvBaseFCurve& source, double sourceParameter,
                               double parameter);
  // The set at exactly this parameter, or null; valid while nobody changes
  // the curve.
  const CFCUserDataSet* GetUserDataSet(double parameter) const;
  // Replaces the set at exactly this parameter by a copy (an empty set
  // removes it); 0 for a NaN parameter.
  unsigned int SetUserDataSet(const CFCUserDataSet& set, double parameter);
  // Frees all per-key sets; the curve-level items stay.
  unsigned int RemoveAllKeyUserData();
  // Every per-key set moves to its parameter plus delta, or times factor;
  // sets whose parameters meet are merged. 0 for a delta or factor that is
  // not finite.
  unsigned int TranslateAllKeyUserData(double delta);
  unsigned int ScaleAllKeyUserData(double factor);
  // Moves the sets of the keys from oldParameters[0] onward. The two arrays
  // have the same length (else 0) and ascend: the set at oldParameters[i]
  // goes to newParameters[i]; a set the lists do not name stays. The first
  // moved set, when it lands within 1e-15 of the last set that stays, is
  // merged into it (its items win). A NaN in the lists is refused with 0,
  // nothing moved. An empty list answers 1 at once and
  // leaves the curve locked once more: callers never pass one, and one that
  // does must Unlock after it.
  unsigned int MoveKeyUserDataTail(const ZvDoubleArray& oldParameters,
                                   const ZvDoubleArray& newParameters);
  // Swaps the user data stores of the two curves. Locks this curve first.
  unsigned int ExchangeUserData(ZvBaseFCurve& other);

  // The persistent user data block shared by every kind.
  unsigned int WriteUserDataToBuffer(void* buffer) const;
  unsigned int GetUserDataBufferSize() const;
  // Given the block past its length field; returns the body bytes consumed,
  // 0 for a refused version, 5 when the block holds nothing. A curve that
  // has a store already only steps over the block; otherwise it takes the
  // block's store, created even when empty.
  unsigned int ReadUserDataFromBufferBody(const void* body);

 protected:
  ZvBaseFCurve();
  // Locks the source and deep-copies its user data.
  ZvBaseFCurve(const ZvBaseFCurve& other);

  // The user data block inside a curve's block, for the readers and writers of every kind.
  void WriteUserData(ZvByteWriter& out) const;
  // Reads the u32 length and, when it is not 0, the block's body within that length; moves past
  // the length the block states. 0 when the block does not fit or is refused, else 4 + length.
  unsigned int ReadUserDataBlock(ZvByteReader& in);

 private:
  CFCUserDataStore& GetOrCreateUserDataStore();
  // The reader behind ReadUserDataFromBufferBody.
  unsigned int ReadUserDataBody(ZvByteReader& in);

  mutable ZvCriticalSection m_lock;
  CFCUserDataStore* m_userData;
  mutable std::atomic<unsigned int> m_lockCount;
};

// Declares, inside a concrete curve class, every slot of the contract: each concrete kind
// overrides them all, and its header notes only where a slot says more than the account above.
#define ZV_BASE_FCURVE_OVERRIDES                                                                   \
  ZvBaseFCurve& operator=(const ZvBaseFCurve& other) override;                                     \
  ZvBaseFCurve* QueryFCurveKind(Kind kind) const override;                                         \
  Kind GetKind() const override;                                                                   \
  ZvBaseFCurve* Clone() const override;                                                            \
  ZvBaseFCurve* SnapShot(double start, double end, ExtrapolationMethod method) const override;     \
  unsigned int CreateKey(double parameter, double value) override;                                 \
  unsigned int MergeAndCreateKey(double start, double end, double parameter, double value,         \
                                 int excludeStart, int excludeEnd, int keepAttributes) override;   \
  unsigned int CreateNonModifyingKey(double parameter, int noFold) override;                       \
  unsigned int MergeAndCreateNonModifyingKey(double start, double end, double parameter,           \
                                             int excludeStart, int excludeEnd, int keepAttributes, \
                                             int noFold) override;                                 \
  unsigned int RemoveKey(double parameter, double tolerance) override;                             \
  unsigned int RemoveKeys(double start, double end, int excludeStart, int excludeEnd) override;    \
  unsigned int SetValueWhenNoKeys(double value) override;                                          \
  unsigned int GetKeyValue(double parameter, KeySide side, double& value, double tolerance)        \
      const override;                                                                              \
  unsigned int GetKeyValues(double parameter, double& left, double& right, double tolerance)       \
      const override;                                                                              \
  unsigned int SetKeyValue(double parameter, KeySide side, double value, double tolerance)         \
      override;                                                                                    \
  unsigned int Cut(double start, double end, ZvBaseFCurve& cutOut) override;                       \
  unsigned int RemoveTail(double parameter) override;                                              \
  unsigned int RemoveHead(double parameter) override;                                              \
  unsigned int Append(const ZvBaseFCurve& curve) override;                                         \
  unsigned int Paste(const ZvBaseFCurve& curve, double start, double end) override;                \
  unsigned int ShiftParameters(double delta) override;                                             \
  unsigned int ScaleParameterAxis(double factor) override;                                         \
  unsigned int ShiftValues(double delta) override;                                                 \
  unsigned int ReduceNumKeys(double start, double end, double tolerance) override;                 \
  unsigned int GetFCurveInfo(FCurveInfo* info) const override;                                     \
  unsigned int GetKeyInfoFromIndex(unsigned int index, KeyInfo* info) const override;              \
  unsigned int GetKeyInfoFromParameter(double parameter, KeyInfo* info) const override;            \
  unsigned int GetKeyParameter(unsigned int index, double& parameter) const override;              \
  unsigned int GetKeyIndex(double parameter, unsigned int& index) const override;                  \
  unsigned int GetNumKeys() const override;                                                        \
  unsigned int GetKeyParameters(double start, double end, ZvDoubleArray& parameters,               \
                                int excludeStart, int excludeEnd) const override;                  \
  unsigned int IsKeyParameter(double parameter, double tolerance) const override;                  \
  unsigned int GetAllKeyParameters(ZvDoubleArray& parameters) const override;                      \
  unsigned int GetNextKeyParameter(double parameter, double& next, int inclusive) const override;  \
  unsigned int GetPrevKeyParameter(double parameter, double& prev, int inclusive) const override;  \
  unsigned int GetNearestKeyParameter(double parameter, double& nearest) const override;           \
  unsigned int GetNearestKeyParameterInCenteredInterval(double& parameter, double tolerance)       \
      const override;                                                                              \
  unsigned int SetClampingValues(double minValue, double maxValue) override;                       \
  unsigned int GetClampingValues(double& minValue, double& maxValue) const override;               \
  unsigned int GetSmallestKeyParameter(double& parameter) const override;                          \
  unsigned int IsSmallestKeyParameter(double parameter) const override;                            \
  double GetMinusInfinityVal() const override;                                                     \
  unsigned int GetLargestKeyParameter(double& parameter) const override;                           \
  unsigned int IsLargestKeyParameter(double parameter) const override;                             \
  double GetPlusInfinityVal() const override;                                                      \
  double GetValueUpperBound(int clamped) const override;                                           \
  double GetValueLowerBound(int clamped) const override;                                           \
  double Eval(double parameter, int clamped) const override;                                       \
  unsigned int EvalSequence(double start, double end, double step, double tolerance,               \
                            ZvDoubleArray& parameters, ZvDoubleArray& values, int clamped)         \
      const override;                                                                              \
  unsigned int Flatten(const ZvTransfo4& transfo, double tolerance, ZvPoint2dArray& points,        \
                       ZvPointTagArray& tags, int clamped) const override;                         \
  unsigned int FlattenFromTo(const ZvExtent2<double>& box, const ZvTransfo4& transfo,              \
                             double tolerance, ZvPoint2dArray& points, ZvPointTagArray& tags,      \
                             ZvBoolArray& extrapolated, int clamped) const override;               \
  unsigned int GetKeys(ZvDoubleArray& parameters, ZvDoubleArray& leftValues,                       \
                       ZvDoubleArray& rightValues, int clamped) const override;                    \
  unsigned int ResampleSequence(double start, double end, double step, int keepExistingKeys,       \
                                int ignoredFlag) override;                                         \
  unsigned int SmoothSequence(double start, double end, const double* kernel,                      \
                              unsigned int kernelSize) override;                                   \
  unsigned int MirrorValues() override;                                                            \
  unsigned int MirrorParameters() override;                                                        \
  unsigned int ScaleAndOffsetParameters(double start, double end, double pivot, double scale,      \
                                        double offset, int moveHead, int moveTail,                 \
                                        RegionHandle handle) override;                             \
  unsigned int SetReadOnlyConstraint(int on) override;                                             \
  unsigned int IsReadOnly() const override;                                                        \
  unsigned int SetConstraint(double& parameter, KeyConstraint constraints, int on,                 \
                             double tolerance) override;                                           \
  unsigned int GetConstraint(double& parameter, KeyConstraint constraint, int& on,                 \
                             double tolerance) const override;                                     \
  unsigned int IsConstraintSupported(KeyConstraint constraint) const override;                     \
  unsigned int AreAnyValuesLockedInInterval(double start, double end, int excludeStart,            \
                                            int excludeEnd) const override;                        \
  unsigned int AreAnyParametersLockedInInterval(double start, double end, int excludeStart,        \
                                                int excludeEnd) const override;                    \
  unsigned int AreAnyKeysLockedInInterval(double start, double end, int excludeStart,              \
                                          int excludeEnd) const override;                          \
  unsigned int SetExtrapolationMethod(ExtrapolationMethod method) override;                        \
  ExtrapolationMethod GetExtrapolationMethod() const override;                                     \
  double FoldParameter(double parameter) const override;                                           \
  unsigned int GetBufferSize() const override;                                                     \
  unsigned int WriteToBuffer(void* buffer) const override;                                         \
  unsigned int ReadFromBufferBody(const void* body) override;                                      \
  unsigned int ScaleAndShiftValues(double scale, double offset) override;                          \
  unsigned int EvalInverse(double value, double& parameter, int clamped) const override;           \
  unsigned int IsBijective() const override;                                                       \
  unsigned int SetDefaultBezierTangentConstraint(int on) override;                                 \
  unsigned int IsDefautlBezierTangentConstraintOn() const override;                                \
  unsigned int SetAsTimeFCurve(int on) override;                                                   \
  unsigned int IsTimeFCurve() const override;                                                      \
  unsigned int Set(const ZvBaseFCurve& curve) override;

// ---- Persistent blocks ----
//
// A curve's block is a u32 body length, little-endian, followed by the body, which opens with a
// u32 version stamp and, from stamp 256 on, the u32 kind (the standard curve's oldest blocks,
// stamp 1, carry no kind). All numbers are little-endian, so a block is the same from 32-bit and
// 64-bit builds; a double that is not finite is written and read as 0.0. GetBufferSize counts the
// whole block, WriteToBuffer fills a caller's block of that size and returns the size, and
// ReadFromBufferBody, given the body, returns the body bytes it consumed, or 0 with the curve
// unchanged when a stamp, kind, identifier or tag is not what the kind expects. The body readers
// trust the caller that the block is complete; the bounded readers check it.

// The size of the length field in front of a body: 4.
ZV_API unsigned int ZvBaseFCurve_GetBufferBodyLengthSize();
// The kind a body holds: StdKind for a first word below 256, else the second word when it is a
// known kind, else 0.
ZV_API unsigned int ZvBaseFCurve_GetKindFromBufferBody(const void* body);
// A new curve of the body's kind read from the trusted body: 1 with the curve in *out, which the
// caller owns and deletes; 0 with *out null for an unknown kind, a refused body or any failure,
// allocation included (nothing is thrown). A null argument answers 0 with *out untouched.
ZV_API unsigned int ZvBaseFCurve_CreateFromBufferBody(const void* body, ZvBaseFCurve** out);
// The bounded factory: reads the whole block of `size` bytes at `buffer`, length field included.
// Null with `consumed` 0 when the stored length exceeds `size`, when the contents would be read
// past the body's end, and wherever ZvBaseFCurve_CreateFromBufferBody fails; otherwise the new
// curve (the caller owns it) with `consumed` = 4 + the stored length.
ZV_API ZvBaseFCurve* ZvBaseFCurve_CreateFromBuffer(const void* buffer, std::size_t size,
                                                   unsigned int& consumed);

#endif
