// Closing and reopening subpaths of ZvPath2f.
#include <zv/path2f.h>

#include <cstring>

#include "shape/path_codes.h"
#include "shape/shape_lock.h"

using namespace zv_path;

int ZvPath2f::Closeto() {
  ZvShapeLock guard(*this);
  if (points.size == 0) return 0;
  const unsigned int last = points.size - 1;
  if (!Coincide(points[last], points[SubpathStart(last)])) return 0;
  // A code with no closed form (already closed, a lone start) stays as it is.
  if (IsOpenEnd(codes[last] & kCodeMask)) codes[last] = ClosedFromOpen(codes[last]);
  currentSubpathOpen = 0;
  return 1;
}

int ZvPath2f::CloseSubpath(unsigned int index) {
  ZvShapeLock guard(*this);
  if (index >= points.size) return 0;
  const unsigned int s = SubpathStart(index), e = SubpathEnd(index);
  const bool atPathEnd = e + 1 == points.size;
  if (Coincide(points[e], points[s])) {
    if (!IsOpenEnd(codes[e] & kCodeMask)) return 0;
    codes[e] = ClosedFromOpen(codes[e]);
    if (atPathEnd) currentSubpathOpen = 0;
    return 1;
  }
  // The ends are apart: a closing line back to the start, behind the subpath's last point.
  const ZvPoint2<float> start = points[s];
  const unsigned int n = points.size;
  GrowBoth(1);
  const unsigned int at = e + 1, tail = n - at;
  if (tail) {
    std::memmove(points.data + at + 1, points.data + at, tail * sizeof(ZvPoint2<float>));
    std::memmove(codes.data + at + 1, codes.data + at, tail);
  }
  points[at] = start;
  codes[at] = static_cast<unsigned char>(Base(1) + 1);
  if (atPathEnd) currentSubpathOpen = 0;
  return 1;
}

int ZvPath2f::OpenSubpath(unsigned int index) {
  ZvShapeLock guard(*this);
  if (index >= points.size) return 0;
  const unsigned int e = SubpathEnd(index);
  if (!IsClosedEnd(codes[e] & kCodeMask)) return 0;
  codes[e] = OpenFromClosed(codes[e]);
  if (codes[e] & kG1Lock) UnlockG1(e);
  if (e + 1 == points.size) currentSubpathOpen = 1;
  return 1;
}
