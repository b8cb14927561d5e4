// The repair that every keyed curve makes before it counts its block: a curve read from a
// foreign block may hold keys out of order, and what a curve writes must read back as a valid
// curve.
#ifndef ZV_FCURVE_CFC_KEY_ORDER_H
#define ZV_FCURVE_CFC_KEY_ORDER_H

#include <zv/fcurve.h>

#include <vector>

// Whether the keys stand in strictly ascending order: what every edit keeps, and what a bounded
// reader asks of a block before it takes it.
template <class Keys>
bool CFCKeysStrictlyAscending(const Keys& keys) {
  for (unsigned int i = 1; i < keys.size; ++i)
    if (!(keys[i].parameter > keys[i - 1].parameter)) return false;
  return true;
}

// Keeps, in order, the keys whose parameter is above the last kept one, and removes the per-key
// user data of each dropped key unless a kept key has the same parameter. Works on any key store
// (its MoveKey and DropKeys carry whatever the store keeps beside the keys).
template <class Store>
void CFCDropKeysOutOfOrder(Store& s, ZvBaseFCurve& curve) {
  const unsigned int n = s.keys.size;
  std::vector<double> dropped;
  unsigned int kept = 0;
  for (unsigned int i = 0; i < n; ++i) {
    if (kept > 0 && !(s.keys[i].parameter > s.keys[kept - 1].parameter)) {
      dropped.push_back(s.keys[i].parameter);
      continue;
    }
    if (kept != i) s.MoveKey(kept, i);
    ++kept;
  }
  if (kept == n) return;
  s.DropKeys(kept, n - 1);
  for (const double parameter : dropped) {
    unsigned int at;
    if (!s.GetClosestKeyIndexInCenteredInterval(parameter, 0.0, at) ||
        s.keys[at].parameter != parameter) {
      curve.RemoveKeyUserData(parameter);
    }
  }
}

#endif
