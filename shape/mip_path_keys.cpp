// The key store of the mip path: search, interval bounds, key edits and evaluation.
#include <zv/gc.h>
#include <zv/morpher.h>

#include <cmath>
#include <memory>
#include <utility>

#include "shape/mip_path_impl.h"

ZvMipPath2fProp1dImpl::ZvMipPath2fProp1dImpl(const ZvMipPath2fProp1dImpl& other)
    : keys(other.keys.capacity) {
  try {
    for (unsigned int i = 0; i < other.keys.size; ++i)
      AppendOwned(other.keys[i].parameter, new ZvPath2fProp1d(*other.keys[i].path));
  } catch (...) {
    // No destructor runs for a constructor that throws: free the copies made so far here.
    for (unsigned int i = 0; i < keys.size; ++i)
      delete keys[i].path;
    throw;
  }
}

ZvMipPath2fProp1dImpl::~ZvMipPath2fProp1dImpl() {
  for (unsigned int i = 0; i < keys.size; ++i)
    delete keys[i].path;
}

void ZvMipPath2fProp1dImpl::Swap(ZvMipPath2fProp1dImpl& other) {
  std::swap(keys.size, other.keys.size);
  std::swap(keys.capacity, other.keys.capacity);
  std::swap(keys.data, other.keys.data);
}

unsigned int ZvMipPath2fProp1dImpl::LocateParameter(double t, int& exact) const {
  exact = 0;
  const unsigned int n = keys.size;
  if (n == 0) return 0;
  const double first = keys[0].parameter;
  if (t <= first || std::fabs(t - first) <= kSameParameter) {
    exact = std::fabs(t - first) <= kSameParameter;
    return exact;
  }
  const double last = keys[n - 1].parameter;
  if (t >= last || std::fabs(t - last) <= kSameParameter) {
    exact = std::fabs(t - last) <= kSameParameter;
    return n;
  }
  // The first key above t lies in [low, high).
  unsigned int low = 0, high = n;
  while (low < high) {
    const unsigned int mid = (low + high) >> 1;
    const double p = keys[mid].parameter;
    if (std::fabs(p - t) <= kSameParameter) {
      exact = 1;
      return mid + 1;
    }
    if (p < t)
      low = mid + 1;
    else
      high = mid;
  }
  return low;
}

void ZvMipPath2fProp1dImpl::GetIntervalRange(double from, double to, int includeFrom, int includeTo,
                                             unsigned int& begin, unsigned int& end) const {
  int exact = 0;
  begin = LocateParameter(from, exact);
  // A key on the lower bound sits just below `begin`; it is inside when the bound counts.
  if (exact && includeFrom) --begin;
  end = LocateParameter(to, exact);
  if (exact && !includeTo) --end;
}

int ZvMipPath2fProp1dImpl::GetKeyIndicesInInterval(double from, double to, unsigned int& first,
                                                   unsigned int& last) const {
  unsigned int begin = 0, end = 0;
  GetIntervalRange(from, to, 1, 1, begin, end);
  if (begin >= end) return 0;
  first = begin;
  last = end - 1;
  return 1;
}

void ZvMipPath2fProp1dImpl::Splice(unsigned int at, unsigned int removeCount, const MPKey* insert) {
  // Everything that can fail happens before the first change.
  std::unique_ptr<ZvPath2fProp1d> copy;
  if (insert) copy.reset(new ZvPath2fProp1d(*insert->path));
  const unsigned int inserted = insert ? 1u : 0u;
  MPKey* block = keys.SpliceBlock(keys.size - removeCount + inserted);
  for (unsigned int i = at; i < at + removeCount; ++i)
    delete keys[i].path;
  keys.Splice(at, removeCount, inserted, block);
  if (insert) {
    keys[at].parameter = insert->parameter;
    keys[at].path = copy.release();
  }
}

int ZvMipPath2fProp1dImpl::RemoveBodyAndCreateKeyBetweenExistingKeys(const MPKey& key,
                                                                     unsigned int before,
                                                                     unsigned int after) {
  // ~0u + 1 wraps to the front.
  const unsigned int at = before + 1;
  Splice(at, after - at, &key);
  return 1;
}

void ZvMipPath2fProp1dImpl::InsertKey(unsigned int at, double parameter,
                                      const ZvPath2fProp1d& path) {
  MPKey key;
  key.parameter = parameter;
  key.path = const_cast<ZvPath2fProp1d*>(&path);  // only copied
  Splice(at, 0, &key);
}

void ZvMipPath2fProp1dImpl::ReplaceKeyPath(unsigned int index, const ZvPath2fProp1d& path) {
  ZvPath2fProp1d* copy = new ZvPath2fProp1d(path);
  delete keys[index].path;
  keys[index].path = copy;
}

void ZvMipPath2fProp1dImpl::RemoveKeys(unsigned int begin, unsigned int end) {
  Splice(begin, end - begin, nullptr);
}

void ZvMipPath2fProp1dImpl::AppendOwned(double parameter, ZvPath2fProp1d* path) {
  std::unique_ptr<ZvPath2fProp1d> owned(path);
  // Add would count the key before allocating for it; a failure would leave the count wrong.
  MPKey* block = keys.SpliceBlock(keys.size + 1);
  keys.Splice(keys.size, 0, 1, block);
  keys[keys.size - 1].parameter = parameter;
  keys[keys.size - 1].path = owned.release();
}

void ZvMipPath2fProp1dImpl::EvalInto(double t, unsigned int begin, unsigned int end, double spacing,
                                     double tolerance, ZvPath2fProp1d& out) const {
  int exact = 0;
  const unsigned int above = LocateParameter(t, exact);
  unsigned int key;
  if (exact)
    key = above - 1;
  else if (above <= begin)
    key = begin;
  else if (above >= end)
    key = end - 1;
  else {
    const MPKey& a = keys[above - 1];
    const MPKey& b = keys[above];
    ZvGC gc;
    gc.pointMergeDistance = spacing;
    gc.propertyTolerance = tolerance;
    gc.fitTolerance = 0.25;
    ZvMorpher(a.path, b.path, gc).LinearMorph((t - a.parameter) / (b.parameter - a.parameter), out);
    return;
  }
  // A key outside the visible ones gives way to the nearer visible end.
  if (key < begin) key = begin;
  if (key >= end) key = end - 1;
  out = *keys[key].path;
}
