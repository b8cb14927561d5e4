// Removing subpaths, or sections of one, from ZvPath2f.
#include <zv/path2f.h>

#include "shape/path_codes.h"
#include "shape/path_splice.h"
#include "shape/shape_lock.h"

using namespace zv_path;

int ZvPath2f::RemoveSubpathSection(unsigned int start, unsigned int end) {
  ZvShapeLock guard(*this);
  if (start >= end || end >= points.size) return 0;
  if (!IsNode(codes[start]) || !IsNode(codes[end])) return 0;
  if (StartsIn(codes.data, start + 1, end)) return 0;
  const unsigned int s = SubpathStart(start), e = SubpathEnd(start);
  // Cut at the subpath's end, the subpath now ends at `start`. Cut inside, the part behind
  // `end` becomes a subpath of its own, and a part before `start` of a single point vanishes.
  const bool atEnd = e == end;
  const unsigned int from = atEnd || start != s ? start + 1 : start;
  const unsigned int to = atEnd ? end : end - 1;
  ZvPathSplice splice(points, codes, from, to - from + 1, 0);
  if (codes[start] & kG1Lock) UnlockG1(start);
  if (codes[end] & kG1Lock) UnlockG1(end);
  // A closed subpath cut anywhere is open: its ends no longer meet through the section.
  OpenSubpath(e);
  if (!atEnd) codes[end] = static_cast<unsigned char>(kStart | (codes[end] & kKeepBits));
  splice.Apply();
  return 1;
}

int ZvPath2f::RemoveSubpath(unsigned int index) {
  ZvShapeLock guard(*this);
  if (index >= points.size) return 0;
  const unsigned int s = SubpathStart(index), e = SubpathEnd(index);
  const bool last = e + 1 == points.size;
  ZvPathSplice splice(points, codes, s, e - s + 1, 0);
  splice.Apply();
  // Removing the only subpath leaves the flag as it was: there is no last subpath to follow.
  if (last && points.size > 0)
    currentSubpathOpen = IsClosedEnd(codes[points.size - 1] & kCodeMask) ? 0 : 1;
  return 1;
}
