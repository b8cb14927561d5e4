// Little-endian fields of the curve buffers, written and read byte by byte so
// that the layout does not depend on the processor. Doubles travel as their
// eight bytes, and a value that is not finite travels as 0.0.
#ifndef ZV_FCURVE_BUFFER_BYTES_H
#define ZV_FCURVE_BUFFER_BYTES_H

#include <cmath>
#include <cstring>

inline unsigned char* zvPutU8(unsigned char* p, unsigned int v) {
  *p = static_cast<unsigned char>(v);
  return p + 1;
}

inline unsigned char* zvPutU16(unsigned char* p, unsigned int v) {
  p[0] = static_cast<unsigned char>(v);
  p[1] = static_cast<unsigned char>(v >> 8);
  return p + 2;
}

inline unsigned char* zvPutU32(unsigned char* p, unsigned int v) {
  for (int i = 0; i < 4; ++i)
    p[i] = static_cast<unsigned char>(v >> (8 * i));
  return p + 4;
}

inline double zvFiniteOrZero(double v) {
  return std::isfinite(v) ? v : 0.0;
}

inline unsigned char* zvPutF64(unsigned char* p, double v) {
  const double filtered = zvFiniteOrZero(v);
  std::memcpy(p, &filtered, 8);
  return p + 8;
}

inline unsigned int zvGetU16(const unsigned char* p) {
  return static_cast<unsigned int>(p[0]) | (static_cast<unsigned int>(p[1]) << 8);
}

inline unsigned int zvGetU32(const unsigned char* p) {
  return static_cast<unsigned int>(p[0]) | (static_cast<unsigned int>(p[1]) << 8) |
         (static_cast<unsigned int>(p[2]) << 16) | (static_cast<unsigned int>(p[3]) << 24);
}

inline double zvGetF64(const unsigned char* p) {
  double v;
  std::memcpy(&v, p, 8);
  return zvFiniteOrZero(v);
}

#endif
