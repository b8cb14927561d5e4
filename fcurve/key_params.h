// Parameter identity and the mapping of key constraint codes to KeyFlags bits,
// shared by every curve kind.
#ifndef ZV_FCURVE_KEY_PARAMS_H
#define ZV_FCURVE_KEY_PARAMS_H

#include <zv/fcurve.h>

// Two stored parameters are the same key when they differ by at most 1e-15.
// Both comparisons are written out so that a NaN never matches.
inline bool zvIsSameParameter(double a, double b) {
  const double d = a - b;
  return d >= -1e-15 && 1e-15 >= d;
}

// KeyFlags bits of one constraint code; 0 for an unknown code.
inline unsigned short zvKeyFlagsOfConstraint(unsigned int code) {
  switch (code) {
    case ZvBaseFCurve::ParameterLock:
      return 4;
    case ZvBaseFCurve::ValueLock:
      return 2;
    case ZvBaseFCurve::TangentContinuity:
      return 1;
    case ZvBaseFCurve::TangentDirectionLock:
      return 8;
    case ZvBaseFCurve::TangentLengthLock:
      return 16;
    case ZvBaseFCurve::WholeKeyLock:
      return 30;
    case ZvBaseFCurve::FlatTangent:
      return 32;
    case ZvBaseFCurve::FlatAtExtremum:
      return 64;
    case ZvBaseFCurve::AutoTangent:
      return 128;
    case ZvBaseFCurve::CollapsedTangent:
      return 256;
    case ZvBaseFCurve::TangentLengthContinuity:
      return 512;
    case ZvBaseFCurve::ChordTangent:
      return 1024;
    case ZvBaseFCurve::MirroredTangents:
      return 2048;
    case ZvBaseFCurve::ChordTangentAlias:
      return 1024;
    default:
      return 0;
  }
}

// KeyFlags bits of a combination of codes, as SetConstraint accepts it.
inline unsigned short zvKeyFlagsOfConstraints(unsigned int codes) {
  unsigned short mask = 0;
  for (unsigned int code = 1; code != 0 && code <= ZvBaseFCurve::ChordTangentAlias; code <<= 1)
    if (codes & code) mask = static_cast<unsigned short>(mask | zvKeyFlagsOfConstraint(code));
  return mask;
}

// Reads one code from a KeyFlags word: 1 if all its bits are set (the whole
// key lock needs all four locks), 0 otherwise and for an unknown code.
inline int zvKeyFlagsHaveConstraint(unsigned short flags, unsigned int code) {
  const unsigned short mask = zvKeyFlagsOfConstraint(code);
  return mask != 0 && (flags & mask) == mask;
}

#endif
