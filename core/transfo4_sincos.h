// Private: the snapped sine and cosine shared by every rotation of ZvTransfo4.
#ifndef ZV_CORE_TRANSFO4_SINCOS_H
#define ZV_CORE_TRANSFO4_SINCOS_H

#include <cmath>

// Degrees to radians, then each of sin and cos is pulled onto 0, 1 or -1 when strictly within
// 1e-7 of it (tested in that order). Turns by multiples of 90 degrees thus give exact matrices,
// and a quarter turn followed by its inverse is the identity to the last bit.
inline void zvSnappedSinCos(double degrees, double& s, double& c) {
  const double radians = degrees * 0.017453292519943295;
  double v[2] = {std::sin(radians), std::cos(radians)};
  for (double& x : v) {
    if (std::fabs(x) < 1e-7) x = 0.0;
    if (std::fabs(x - 1.0) < 1e-7) x = 1.0;
    if (std::fabs(x + 1.0) < 1e-7) x = -1.0;
  }
  s = v[0];
  c = v[1];
}

#endif
