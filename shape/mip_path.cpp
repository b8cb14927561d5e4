// ZvMipPath2fProp1d: construction, copying and the key queries.
#include <zv/gc.h>

#include <memory>

#include "core/scoped_lock.h"
#include "shape/mip_path_impl.h"

ZvMipPath2fProp1d::ZvMipPath2fProp1d() : impl(new ZvMipPath2fProp1dImpl()) {}

ZvMipPath2fProp1d::ZvMipPath2fProp1d(const ZvMipPath2fProp1d& other) : impl(nullptr) {
  ZvScopedLock lock(other.cs);
  impl = new ZvMipPath2fProp1dImpl(*other.impl);
}

ZvMipPath2fProp1d::ZvMipPath2fProp1d(const ZvPath2fProp1d& path, double parameter) : impl(nullptr) {
  std::unique_ptr<ZvMipPath2fProp1dImpl> fresh(new ZvMipPath2fProp1dImpl());
  fresh->InsertKey(0, parameter, path);
  impl = fresh.release();
}

ZvMipPath2fProp1d::ZvMipPath2fProp1d(const ZvMipPath2fProp1d& source, double from, double to)
    : impl(nullptr) {
  std::unique_ptr<ZvMipPath2fProp1dImpl> fresh(new ZvMipPath2fProp1dImpl());
  ZvScopedLock lock(source.cs);
  const ZvMipPath2fProp1dImpl& s = *source.impl;
  const unsigned int n = s.keys.size;
  // A bound that falls strictly between two keys gets a key of its own, evaluated as an agent
  // with the default context would, so that the part looks the same as the whole over from..to.
  const ZvGC defaults;
  const auto addBoundKey = [&](double bound) {
    int exact = 0;
    const unsigned int above = s.LocateParameter(bound, exact);
    if (exact || above == 0 || above == n) return;
    std::unique_ptr<ZvPath2fProp1d> path(new ZvPath2fProp1d(1));
    s.EvalInto(bound, 0, n, defaults.pointMergeDistance, defaults.propertyTolerance, *path);
    fresh->AppendOwned(bound, path.release());
  };
  if (from <= to) {
    addBoundKey(from);
    unsigned int first = 0, last = 0;
    if (s.GetKeyIndicesInInterval(from, to, first, last)) {
      for (unsigned int i = first; i <= last; ++i)
        fresh->AppendOwned(s.keys[i].parameter, new ZvPath2fProp1d(*s.keys[i].path));
    }
    // Bounds within 1e-15 of each other make one key.
    if (to - from > ZvMipPath2fProp1dImpl::kSameParameter) addBoundKey(to);
  }
  impl = fresh.release();
}

ZvMipPath2fProp1d::~ZvMipPath2fProp1d() {
  delete impl;
}

ZvMipPath2fProp1d& ZvMipPath2fProp1d::operator=(const ZvMipPath2fProp1d& other) {
  if (this == &other) return *this;
  ZvScopedLock lock(cs);
  ZvScopedLock sourceLock(other.cs);
  // Copied aside first, so that a failed copy leaves this sequence whole.
  ZvMipPath2fProp1dImpl copy(*other.impl);
  impl->Swap(copy);
  return *this;
}

unsigned int ZvMipPath2fProp1d::GetNumKeys() const {
  ZvScopedLock lock(cs);
  return impl->keys.size;
}

unsigned int ZvMipPath2fProp1d::GetAllKeyParameters(ZvDoubleArray& parameters) const {
  ZvScopedLock lock(cs);
  const unsigned int n = impl->keys.size;
  for (unsigned int i = 0; i < n; ++i)
    parameters.Add(impl->keys[i].parameter);
  return n;
}

int ZvMipPath2fProp1d::GetSmallestKeyParameter(double& parameter) const {
  ZvScopedLock lock(cs);
  if (impl->keys.size == 0) return 0;
  parameter = impl->keys[0].parameter;
  return 1;
}

int ZvMipPath2fProp1d::GetLargestKeyParameter(double& parameter) const {
  ZvScopedLock lock(cs);
  if (impl->keys.size == 0) return 0;
  parameter = impl->keys[impl->keys.size - 1].parameter;
  return 1;
}
