// The records of a property path: one owned raw curve per subpath that has one, ordered by the
// start index of the subpath.
//
// A path rarely has more than a handful of subpaths with a property, so the records are a short
// vector searched linearly; a search stops at the first record above the key.
#ifndef ZV_SHAPE_PATH2F_PROP1D_IMPL_H
#define ZV_SHAPE_PATH2F_PROP1D_IMPL_H

#include <zv/raw_fcurve.h>

#include <memory>
#include <vector>

struct ZvPropCurveRecord {
  unsigned int subpathStart;
  std::unique_ptr<ZvRawFCurve> curve;
};

class ZvPath2fProp1dImpl {
 public:
  ZvPath2fProp1dImpl() = default;
  // Deep copy; the allocation failure passes through.
  ZvPath2fProp1dImpl(const ZvPath2fProp1dImpl& other);
  ZvPath2fProp1dImpl& operator=(const ZvPath2fProp1dImpl&) = delete;

  // The curve of the subpath starting at `start`, or null.
  ZvRawFCurve* Find(unsigned int start) const;
  // Replaces the curve at `start`, or inserts a record in order, with a copy of `curve`.
  void Set(unsigned int start, const ZvRawFCurve& curve);
  // Takes an already allocated curve.
  void Set(unsigned int start, std::unique_ptr<ZvRawFCurve> curve);
  // Drops the record at `start`; whether there was one.
  bool Remove(unsigned int start);
  // Every record whose start lies above `after` moves by `delta` (signed, in points).
  void Shift(unsigned int after, long long delta);
  void Clear() { records.clear(); }
  void Swap(ZvPath2fProp1dImpl& other) { records.swap(other.records); }

  std::vector<ZvPropCurveRecord> records;
};

#endif
