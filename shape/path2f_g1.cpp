// Tangent continuity at the nodes of ZvPath2f and the G1 locks kept in bit 7 of the codes.
#include <zv/path2f.h>

#include "shape/path_codes.h"
#include "shape/shape_lock.h"

using namespace zv_path;

int ZvPath2f::IsG1Continuous(unsigned int index) const {
  ZvShapeLock guard(*this);
  if (index >= points.size) return 0;
  unsigned int node = index, first = index - 1, second = index + 1;
  if (IsSubpathBoundary(index)) {
    // Only a closed subpath has a tangent on both sides of its start and end.
    const unsigned int s = SubpathStart(index), e = SubpathEnd(index);
    if (!IsClosedEnd(codes[e] & kCodeMask) || e - s < 3) return 0;
    node = s;
    first = s + 1;
    second = e - 1;
  }
  const ZvPoint2<float>& p = points[node];
  const ZvPoint2<float>& q1 = points[first];
  const ZvPoint2<float>& q2 = points[second];
  const double ax = static_cast<double>(p.x) - q1.x, ay = static_cast<double>(p.y) - q1.y;
  const double bx = static_cast<double>(p.x) - q2.x, by = static_cast<double>(p.y) - q2.y;
  const double A = ax * ax + ay * ay, B = bx * bx + by * by;
  // A handle of zero length is continuous by definition.
  if (A <= 1e-12 || B <= 1e-12) return 1;
  // u and v subtract in single precision, as stored, and widen afterwards.
  const float ux = p.x - q1.x, uy = p.y - q1.y;
  const float vx = q2.x - p.x, vy = q2.y - p.y;
  const double dot = static_cast<double>(ux) * vx + static_cast<double>(uy) * vy;
  if (!(dot > 0.0)) return 0;  // a cusp
  const double c = ax * static_cast<double>(vy) - ay * static_cast<double>(vx);
  // Squared sine of the angle between the handles at most one millionth.
  return c * c / (A * B) <= 1e-6 ? 1 : 0;
}

int ZvPath2f::LockG1(unsigned int index) {
  ZvShapeLock guard(*this);
  if (index >= points.size) return 0;
  if (codes[index] & kG1Lock) return 1;
  if (!IsNode(codes[index]) || !IsG1Continuous(index)) return 0;
  if (!IsSubpathBoundary(index)) {
    // Lines and quadratics have no free handle to keep in line: refused on either side.
    const unsigned int in = codes[index] & kCodeMask, out = codes[index + 1] & kCodeMask;
    if (in == 3 || in == 6 || out == 3 || out == 4 || out == 5) return 0;
    codes[index] |= kG1Lock;
    return 1;
  }
  // At a closed subpath's start and end both are marked. The first segment's degree is not
  // looked at here, only the closing one's.
  const unsigned int s = SubpathStart(index), e = SubpathEnd(index);
  const unsigned int endCode = codes[e] & kCodeMask;
  if (endCode == 4 || endCode == 7) return 0;
  codes[s] |= kG1Lock;
  codes[e] |= kG1Lock;
  return 1;
}

int ZvPath2f::UnlockG1(unsigned int index) {
  ZvShapeLock guard(*this);
  if (index >= points.size) return 1;
  const unsigned char clear = static_cast<unsigned char>(~kG1Lock);
  if (IsSubpathBoundary(index)) {
    codes[SubpathStart(index)] &= clear;
    codes[SubpathEnd(index)] &= clear;
  } else {
    codes[index] &= clear;
  }
  return 1;
}
