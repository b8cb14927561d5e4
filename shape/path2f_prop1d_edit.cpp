// Edits of ZvPath2fProp1d: the path's own edits, with the records renumbered so that each curve
// stays on its subpath.
#include <zv/path2f_prop1d.h>

#include <memory>

#include "shape/path2f_prop1d_impl.h"
#include "shape/path_codes.h"
#include "shape/shape_lock.h"

// An edit inside one subpath changes only its point count: the subpaths behind it move by the
// difference, and the subpath's own start stays.
template <class Edit>
int ZvPath2fProp1d::EditKeepingRecords(unsigned int index, Edit edit) {
  ZvShapeLock guard(*this);
  unsigned int s = 0, e = 0;
  if (!GetSubpathIndices(index, s, e)) return 0;
  const unsigned int before = points.size;
  const int result = edit();
  if (result) m_impl->Shift(s, static_cast<long long>(points.size) - before);
  return result;
}

int ZvPath2fProp1d::ReplaceSegment(unsigned int index, const ZvPoint2<float>* p,
                                   unsigned int degree) {
  return EditKeepingRecords(index, [&] { return ZvPath2f::ReplaceSegment(index, p, degree); });
}

int ZvPath2fProp1d::ReplaceSubpathSection(unsigned int start, unsigned int end) {
  return EditKeepingRecords(start, [&] { return ZvPath2f::ReplaceSubpathSection(start, end); });
}

int ZvPath2fProp1d::ReplaceSubpathSection(unsigned int start, unsigned int end,
                                          const ZvPoint2<float>& c1, const ZvPoint2<float>& c2) {
  return EditKeepingRecords(start,
                            [&] { return ZvPath2f::ReplaceSubpathSection(start, end, c1, c2); });
}

int ZvPath2fProp1d::ReplaceSubpathSection(unsigned int start, unsigned int end,
                                          const ZvPath2f& source, unsigned int first,
                                          unsigned int last) {
  return EditKeepingRecords(
      start, [&] { return ZvPath2f::ReplaceSubpathSection(start, end, source, first, last); });
}

void ZvPath2fProp1d::Clear() {
  ZvShapeLock guard(*this);
  ZvPath2f::Clear();
  m_impl->Clear();
}

int ZvPath2fProp1d::CloseSubpath(unsigned int index) {
  return EditKeepingRecords(index, [&] { return ZvPath2f::CloseSubpath(index); });
}

int ZvPath2fProp1d::RemoveSubpath(unsigned int index) {
  ZvShapeLock guard(*this);
  unsigned int s = 0, e = 0;
  if (!GetSubpathIndices(index, s, e) || !ZvPath2f::RemoveSubpath(index)) return 0;
  RemovePropCurveInsideCriticalSection(s, e);
  return 1;
}

int ZvPath2fProp1d::RemoveSubpathSection(unsigned int start, unsigned int end) {
  ZvShapeLock guard(*this);
  unsigned int s = 0, e = 0;
  if (!GetSubpathIndices(start, s, e)) return 0;
  // A cut through the middle leaves a second subpath at start + 1; it keeps the property it had
  // as part of the first. Copied before the edit so that a failed allocation changes nothing.
  const ZvRawFCurve* curve = m_impl->Find(s);
  const bool splits = end < e && start != s;
  std::unique_ptr<ZvRawFCurve> second;
  if (curve && splits) {
    second = std::make_unique<ZvRawFCurve>(*curve);
    m_impl->records.reserve(m_impl->records.size() + 1);
  }
  const unsigned int before = points.size;
  if (!ZvPath2f::RemoveSubpathSection(start, end)) return 0;
  m_impl->Shift(s, static_cast<long long>(points.size) - before);
  if (second) m_impl->Set(start + 1, std::move(second));
  return 1;
}
