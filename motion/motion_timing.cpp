// How time runs along a motion path: the node time search and the arc-length cubic of a
// segment.
#include <cmath>

#include "motion/motion_path_impl.h"

unsigned int ZvMotionPath3dImpl::LocateTimeValue(double time, int& isExact) const {
  const double* t = initialTimes.data;
  const unsigned int k = initialTimes.size;
  if (time <= t[0]) {
    isExact = std::fabs(time - t[0]) <= 1e-15;
    return isExact ? 1 : 0;
  }
  if (time >= t[k - 1]) {
    isExact = std::fabs(time - t[k - 1]) <= 1e-15;
    return k;
  }
  // A time well inside the hinted segment is where the bisection would end too: no node time
  // lies within 1e-15 of it, so no exact hit is missed.
  if (timeHint + 1 < k && time - t[timeHint] > 1e-15 && t[timeHint + 1] - time > 1e-15) {
    isExact = 0;
    return timeHint + 1;
  }
  unsigned int low = 0, high = k - 1;
  while (high - low > 1) {
    const unsigned int mid = (low + high) / 2;
    if (std::fabs(time - t[mid]) <= 1e-15) {
      isExact = 1;
      return mid + 1;
    }
    if (time < t[mid]) {
      high = mid;
    } else {
      low = mid;
    }
  }
  isExact = 0;
  timeHint = low;
  return low + 1;
}

double ZvMotionTiming::ArcLength(double time) const {
  double s;
  if (constantSpeed) {
    s = (time - t0) * length / (t1 - t0);
  } else {
    s = ((c3 * time + c2) * time + c1) * time - ((c3 * t0 + c2) * t0 + c1) * t0;
  }
  return s < 0.0 ? 0.0 : (s > length ? length : s);
}

ZvMotionTiming ZvMotionPath3dImpl::SegmentTiming(unsigned int i, double length, double tolerance,
                                                 ZvMotionArcCache& cache) const {
  const unsigned int node = i / 3;
  ZvMotionTiming timing{};
  timing.t0 = initialTimes[node];
  timing.t1 = initialTimes[node + 1];
  timing.length = length;
  const ZvMotionPath3d::TangentInfo r = tangents[node].right;
  const ZvMotionPath3d::TangentInfo l = tangents[node + 1].left;
  timing.constantSpeed = r == ZvMotionPath3d::Constant && l == ZvMotionPath3d::Constant;
  if (timing.constantSpeed) return timing;

  const double t0 = timing.t0, t1 = timing.t1;
  // A smooth end takes the mean speed over this segment and its neighbour, so the speed is
  // continuous across a node whose two sides are both smooth.
  double vs = 0.0;
  if (r != ZvMotionPath3d::Ease && node > 0) {
    const double before = cache.Segment(controlPoints, i - 3, tolerance).length;
    vs = (before + length) / (t1 - initialTimes[node - 1]);
  }
  double ve = 0.0;
  if (l == ZvMotionPath3d::Constant) {
    ve = length / (t1 - t0);
  } else if (l != ZvMotionPath3d::Ease && node + 2 < initialTimes.size) {
    const double after = cache.Segment(controlPoints, i + 3, tolerance).length;
    ve = (after + length) / (initialTimes[node + 2] - t0);
  }

  // Hermite cubic with s(t0) = 0, s(t1) = length, s'(t0) = vs, s'(t1) = ve, expanded in
  // absolute time; the order of the operations is kept so that results stay reproducible.
  const double inv = 1.0 / (t1 - t0);
  const double m = length * inv;
  timing.c3 = (vs + ve - 2.0 * m) * inv * inv;
  timing.c2 =
      inv / 2.0 *
      ((3.0 * m - 2.0 * vs - ve) * 2.0 * inv * t1 - (-3.0 * m + vs + 2.0 * ve) * 2.0 * inv * t0);
  timing.c1 = vs - (3.0 * timing.c3 * t0 + 2.0 * timing.c2) * t0;
  return timing;
}
