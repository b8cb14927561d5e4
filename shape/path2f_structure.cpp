// Structure queries of ZvPath2f: everything is read from the code bytes by linear scans.
//
// Blocks read from outside may carry any codes, so every walk here stays inside the arrays
// whatever the codes say.
#include <zv/path2f.h>

#include "shape/path_codes.h"
#include "shape/shape_lock.h"

using namespace zv_path;

namespace {
inline unsigned int CodeAt(const ZvUByteArray& codes, unsigned int i) {
  return codes[i] & kCodeMask;
}
}  // namespace

unsigned int ZvPath2f::SubpathStart(unsigned int index) const {
  while (index > 0 && CodeAt(codes, index) != kStart)
    --index;
  return index;
}

unsigned int ZvPath2f::SubpathEnd(unsigned int index) const {
  while (index + 1 < codes.size && CodeAt(codes, index + 1) != kStart)
    ++index;
  return index;
}

// A subpath's start, its last point, or a point whose successor starts a subpath. Index 0 is
// always a start, whatever a foreign block put there.
int ZvPath2f::IsSubpathBoundary(unsigned int index) const {
  return index == 0 || CodeAt(codes, index) == kStart || index + 1 >= codes.size ||
         CodeAt(codes, index + 1) == kStart;
}

unsigned int ZvPath2f::StartOfSegment(unsigned int index) const {
  if (CodeAt(codes, index) == kStart) return index;
  const CodeInfo c = Decode(codes[index]);
  if (c.degree == 0 || c.position > index) return 0;
  return index - c.position;
}

unsigned int ZvPath2f::EndOfSegment(unsigned int index) const {
  if (CodeAt(codes, index) == kStart) {
    // A start point ends where the first segment behind it ends; a lone start ends on itself.
    if (index + 1 >= codes.size || CodeAt(codes, index + 1) == kStart) return index;
    ++index;
  }
  const CodeInfo c = Decode(codes[index]);
  if (c.degree == 0) return 0;
  const unsigned int end = index + (c.degree - c.position);
  return end < codes.size ? end : codes.size - 1;
}

unsigned int ZvPath2f::Degree(unsigned int index) const {
  if (CodeAt(codes, index) == kStart) {
    if (index + 1 >= codes.size || CodeAt(codes, index + 1) == kStart) return 0;
    ++index;
  }
  return Decode(codes[index]).degree;
}

int ZvPath2f::GetSubpathIndices(unsigned int index, unsigned int& first, unsigned int& last) const {
  ZvShapeLock guard(*this);
  if (index >= points.size) return 0;
  first = SubpathStart(index);
  last = SubpathEnd(index);
  return 1;
}

int ZvPath2f::GetSegmentIndices(unsigned int index, unsigned int& first, unsigned int& last) const {
  ZvShapeLock guard(*this);
  if (index >= points.size) return 0;
  first = StartOfSegment(index);
  last = EndOfSegment(index);
  return 1;
}

int ZvPath2f::IsStartOfSubpath(unsigned int index) const {
  ZvShapeLock guard(*this);
  return index < codes.size && CodeAt(codes, index) == kStart;
}

int ZvPath2f::IsEndOfSubpath(unsigned int index, int& closed) const {
  ZvShapeLock guard(*this);
  if (index >= codes.size) return 0;
  if (index + 1 < codes.size && CodeAt(codes, index + 1) != kStart) return 0;
  closed = IsClosedEnd(CodeAt(codes, index));
  return 1;
}

int ZvPath2f::IsSubpathClosed(unsigned int index) const {
  ZvShapeLock guard(*this);
  if (index >= codes.size) return 0;
  return IsClosedEnd(CodeAt(codes, SubpathEnd(index)));
}

unsigned int ZvPath2f::NumSegments() const {
  ZvShapeLock guard(*this);
  unsigned int count = 0;
  for (unsigned int i = 0; i < codes.size; ++count) {
    const unsigned int end = EndOfSegment(i);
    i = end >= i ? end + 1 : i + 1;  // an illegal code answers 0: step over it
  }
  return count;
}

unsigned int ZvPath2f::NumSubpaths() const {
  ZvShapeLock guard(*this);
  const unsigned int n = codes.size;
  if (n == 0) return 0;
  unsigned int count = 1;  // i == n closes the last subpath
  for (unsigned int i = 1; i < n; ++i)
    if (CodeAt(codes, i) == kStart) ++count;
  return count;
}

unsigned int ZvPath2f::NumNodes() const {
  ZvShapeLock guard(*this);
  unsigned int count = 0;
  for (unsigned int i = 0; i < codes.size; ++i)
    if (IsNode(codes[i])) ++count;
  return count;
}

unsigned int ZvPath2f::NumNodesExceptLastNodeOfClosedSubpaths() const {
  ZvShapeLock guard(*this);
  unsigned int count = 0;
  for (unsigned int i = 0; i < codes.size; ++i)
    if (IsNode(codes[i]) && !IsClosedEnd(CodeAt(codes, i))) ++count;
  return count;
}

unsigned int ZvPath2f::GetDegree(unsigned int index) const {
  ZvShapeLock guard(*this);
  if (index >= codes.size) return 0;
  return Degree(index);
}

unsigned int ZvPath2f::LargestDegree() const {
  ZvShapeLock guard(*this);
  unsigned int largest = 0;
  for (unsigned int i = 0; i < codes.size;) {
    const unsigned int d = Degree(i);
    if (d > largest) largest = d;
    const unsigned int end = EndOfSegment(i);
    i = end >= i ? end + 1 : i + 1;
  }
  return largest;
}

int ZvPath2f::IsPolyline() const {
  ZvShapeLock guard(*this);
  if (codes.size == 0) return 0;
  for (unsigned int i = 0; i < codes.size; ++i) {
    const unsigned int code = CodeAt(codes, i);
    if (code >= 5 && code <= 46) return 0;
  }
  return 1;
}

int ZvPath2f::IsSiblingOf(const ZvPath2f& other) const {
  ZvShapeLock guard(*this);
  ZvShapeLock guardOther(other);
  if (codes.size != other.codes.size) return 0;
  for (unsigned int i = 0; i < codes.size; ++i)
    if (CodeAt(codes, i) != CodeAt(other.codes, i)) return 0;
  return 1;
}

ZvPoint2<float> ZvPath2f::GetCurrentPoint() const {
  ZvShapeLock guard(*this);
  if (points.size == 0) return ZvPoint2<float>{0.0f, 0.0f};
  return points[points.size - 1];
}

int ZvPath2fIter::GetNextSubPathIndices(unsigned int& first, unsigned int& last) {
  if (next >= path->NumPoints()) return 0;
  if (!path->GetSubpathIndices(next, first, last)) return 0;
  next = last + 1;
  return 1;
}
