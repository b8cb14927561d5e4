// Key intervals over the rotation curve's keys, under the same parameter identity as every
// other curve kind: a key within 1e-15 of an end lies on it, and is in the interval unless that
// end is excluded.
#ifndef ZV_FCURVE_QUAT_KEY_INTERVAL_H
#define ZV_FCURVE_QUAT_KEY_INTERVAL_H

#include <zv/quat.h>

#include "fcurve/key_params.h"

#include <algorithm>
#include <vector>

// First and last index of the keys in [start, end]; 0, with both left alone, when there is none.
inline int QuatKeyIndicesInInterval(const std::vector<ZvQuatKey>& keys, double start, double end,
                                    unsigned int& first, unsigned int& last, int excludeStart,
                                    int excludeEnd) {
  if (keys.empty()) return 0;
  if (excludeStart && excludeEnd && zvIsSameParameter(start, end)) return 0;
  const auto lo = std::find_if(keys.begin(), keys.end(), [&](const ZvQuatKey& k) {
    return excludeStart ? k.time - start > 1e-15 : k.time - start >= -1e-15;
  });
  const auto hi = std::find_if(keys.rbegin(), keys.rend(), [&](const ZvQuatKey& k) {
    return excludeEnd ? end - k.time > 1e-15 : end - k.time >= -1e-15;
  });
  if (lo == keys.end() || hi == keys.rend()) return 0;
  const long f = lo - keys.begin();
  const long l = keys.rend() - hi - 1;
  if (f > l) return 0;
  first = static_cast<unsigned int>(f);
  last = static_cast<unsigned int>(l);
  return 1;
}

// 1 when a key of the interval carries all of `flags`.
inline int QuatKeysHaveFlagsInInterval(const std::vector<ZvQuatKey>& keys, double start, double end,
                                       int excludeStart, int excludeEnd, unsigned short flags) {
  unsigned int first, last;
  if (!QuatKeyIndicesInInterval(keys, start, end, first, last, excludeStart, excludeEnd)) return 0;
  for (unsigned int i = first; i <= last; ++i)
    if ((keys[i].flags & flags) == flags) return 1;
  return 0;
}

#endif
