// The record list of a property path.
#include "shape/path2f_prop1d_impl.h"

#include <utility>

ZvPath2fProp1dImpl::ZvPath2fProp1dImpl(const ZvPath2fProp1dImpl& other) {
  records.reserve(other.records.size());
  for (const ZvPropCurveRecord& r : other.records)
    records.push_back({r.subpathStart, std::make_unique<ZvRawFCurve>(*r.curve)});
}

ZvRawFCurve* ZvPath2fProp1dImpl::Find(unsigned int start) const {
  for (const ZvPropCurveRecord& r : records) {
    if (r.subpathStart > start) break;
    if (r.subpathStart == start) return r.curve.get();
  }
  return nullptr;
}

void ZvPath2fProp1dImpl::Set(unsigned int start, const ZvRawFCurve& curve) {
  Set(start, std::make_unique<ZvRawFCurve>(curve));
}

void ZvPath2fProp1dImpl::Set(unsigned int start, std::unique_ptr<ZvRawFCurve> curve) {
  auto at = records.begin();
  while (at != records.end() && at->subpathStart < start)
    ++at;
  if (at != records.end() && at->subpathStart == start) {
    at->curve = std::move(curve);
    return;
  }
  records.insert(at, ZvPropCurveRecord{start, std::move(curve)});
}

bool ZvPath2fProp1dImpl::Remove(unsigned int start) {
  for (auto at = records.begin(); at != records.end() && at->subpathStart <= start; ++at) {
    if (at->subpathStart == start) {
      records.erase(at);
      return true;
    }
  }
  return false;
}

void ZvPath2fProp1dImpl::Shift(unsigned int after, long long delta) {
  for (ZvPropCurveRecord& r : records)
    if (r.subpathStart > after) r.subpathStart = static_cast<unsigned int>(r.subpathStart + delta);
}
