// The key records of the keyed function curves.
//
// Keys are plain records stored by value in a ZvAltDynArray: they are moved with memcpy and
// every fresh or freed slot is zero-filled, so no key ever carries stale bytes into a buffer.
#ifndef ZV_FCURVE_CFC_KEYS_H
#define ZV_FCURVE_CFC_KEYS_H

#include <zv/point.h>

// A key of one value: the integer and the raw curves.
template <class T>
struct CFCSingleValueKey {
  double parameter;
  T value;
};

// The KeyFlags word of a key whose store keeps its flags beside the keys.
struct CFCKeyConstraint {
  unsigned short flags;
};

// The Bezier key of the standard curve. The tangent handles are absolute positions in
// (parameter, value) space; leftValue and rightValue differ at a discontinuity.
struct CFCStdKey {
  ZvPoint2<double> leftTangent;
  ZvPoint2<double> rightTangent;
  double parameter;
  double leftValue;
  double rightValue;
  unsigned char segmentKind;  // kind of the segment from this key to the next
  unsigned short flags;       // KeyFlags
  unsigned char extra[2];     // carried through copies and buffers, read by nothing
};

// Bits of the KeyFlags word.
enum CFCKeyFlag : unsigned short {
  CFCFlag_TangentContinuity = 1,
  CFCFlag_ValueLock = 2,
  CFCFlag_ParameterLock = 4,
  CFCFlag_TangentDirectionLock = 8,
  CFCFlag_TangentLengthLock = 16,
  CFCFlag_FlatTangent = 32,
  CFCFlag_FlatAtExtremum = 64,
  CFCFlag_AutoTangent = 128,
  CFCFlag_CollapsedTangent = 256,
  CFCFlag_TangentLengthContinuity = 512,
  CFCFlag_ChordTangent = 1024,
  CFCFlag_MirroredTangents = 2048,
  // The four locks together: what the whole-key lock sets and reads.
  CFCFlag_WholeKeyLock = 30
};

#endif
