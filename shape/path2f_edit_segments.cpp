// Replacing a segment, or the section between two nodes of a subpath, of ZvPath2f.
//
// Each replacement is one splice of the arrays (remove a run, open a gap at the same place)
// around which the new handles are stored. Where the old section had a handle at the place of a
// new one, the new one goes through ReplacePoint, so that a locked node next to it turns its
// partner handle; the other new points are stored as they are.
#include <zv/path2f.h>

#include "shape/path_codes.h"
#include "shape/path_splice.h"
#include "shape/shape_lock.h"

using namespace zv_path;

int ZvPath2f::ReplaceSegment(unsigned int index, const ZvPoint2<float>* pts, unsigned int n) {
  ZvShapeLock guard(*this);
  if (index >= points.size) return 0;
  const unsigned int a = StartOfSegment(index), b = EndOfSegment(index);
  if (b <= a) return 0;  // a lone start point (or an illegal code): no segment
  if (!Coincide(pts[0], points[a]) || !Coincide(pts[n], points[b])) return 0;
  // A locked node cannot take a line or a quadratic: it needs a free handle on this side.
  if ((n == 1 || n == 2) && ((codes[a] | codes[b]) & kG1Lock)) return 0;
  if (n == 0) return 1;  // a zero-length segment replaced by its own end: nothing to do
  const unsigned int span = b - a;
  // A degree the codes cannot hold still cuts the segment down, as the caller asked for a
  // replacement: to a cubic on the old outer handles, or a quadratic to a line.
  const bool outOfRange = n > kMaxDegree;
  const unsigned int d = outOfRange ? (span >= 3 ? 3 : 1) : n;
  const unsigned char endByte = codes[b];
  const unsigned int base = Base(d);
  if (d <= 2 || span < 3) {
    // Nothing of the old inner points is kept: the new ones are stored as they are.
    ZvPathSplice splice(points, codes, a + 1, span - 1, d - 1);
    splice.Apply();
    for (unsigned int k = 1; k < d; ++k) {
      points[a + k] = pts[k];
      codes[a + k] = static_cast<unsigned char>(base + k - 1);
    }
  } else {
    // The old first and last handles stay, the points between give way to the new inner ones.
    ZvPathSplice splice(points, codes, a + 2, span - 3, d - 3);
    if (!outOfRange) ReplacePoint(a + 1, pts[1], 1);
    codes[a + 1] = static_cast<unsigned char>(base);
    splice.Apply();
    for (unsigned int k = 2; k + 1 < d; ++k) {
      points[a + k] = pts[k];
      codes[a + k] = static_cast<unsigned char>(base + k - 1);
    }
    if (!outOfRange) ReplacePoint(a + d - 1, pts[d - 1], 1);
    codes[a + d - 1] = static_cast<unsigned char>(base + d - 2);
  }
  codes[a + d] = EndNodeByte(base + d - 1, endByte);
  return 1;
}

int ZvPath2f::ReplaceSubpathSection(unsigned int start, unsigned int end) {
  ZvShapeLock guard(*this);
  if (start >= end || end >= points.size) return 0;
  if (!IsNode(codes[start]) || !IsNode(codes[end])) return 0;
  if ((codes[start] | codes[end]) & kG1Lock) return 0;  // a line leaves a lock no handle
  if (StartsIn(codes.data, start + 1, end)) return 0;
  if (end - start < 2) return 1;  // already a line
  const unsigned char endByte = codes[end];
  ZvPathSplice splice(points, codes, start + 1, end - start - 1, 0);
  splice.Apply();
  codes[start + 1] = EndNodeByte(Base(1), endByte);
  return 1;
}

int ZvPath2f::ReplaceSubpathSection(unsigned int start, unsigned int end, const ZvPoint2<float>& c1,
                                    const ZvPoint2<float>& c2) {
  ZvShapeLock guard(*this);
  if (start >= end || end >= points.size) return 0;
  if (!IsNode(codes[start]) || !IsNode(codes[end])) return 0;
  if (StartsIn(codes.data, start + 1, end)) return 0;
  // Locks are not refused: a cubic has a handle on each side, and where an old handle takes c1
  // or c2 through ReplacePoint a locked end turns its partner to match.
  const unsigned int d = end - start;
  const unsigned char endByte = codes[end];
  const unsigned char first = static_cast<unsigned char>(Base(3)), second = first + 1;
  if (d >= 3) {
    ZvPathSplice splice(points, codes, start + 2, d - 3, 0);
    splice.Apply();
    ReplacePoint(start + 1, c1, 1);
    codes[start + 1] = first;
    ReplacePoint(start + 2, c2, 1);
    codes[start + 2] = second;
  } else if (d == 2) {
    ZvPathSplice splice(points, codes, start + 2, 0, 1);
    ReplacePoint(start + 1, c1, 1);
    codes[start + 1] = static_cast<unsigned char>(first | (codes[start + 1] & kKeepBits));
    splice.Apply();
    points[start + 2] = c2;
    codes[start + 2] = second;
  } else {
    ZvPathSplice splice(points, codes, start + 1, 0, 2);
    splice.Apply();
    points[start + 1] = c1;
    codes[start + 1] = first;
    points[start + 2] = c2;
    codes[start + 2] = second;
  }
  codes[start + 3] = EndNodeByte(Base(3) + 2, endByte);
  return 1;
}

int ZvPath2f::ReplaceSubpathSection(unsigned int start, unsigned int end, const ZvPath2f& source,
                                    unsigned int first, unsigned int last) {
  ZvShapeLock guard(*this);
  if (&source == this) {
    // The stretch would move under the splice: take it from a copy.
    const ZvPath2f copy(source);  // NOLINT(performance-unnecessary-copy-initialization)
    return ZvPath2f::ReplaceSubpathSection(start, end, copy, first, last);
  }
  ZvShapeLock guardSource(source);
  const ZvPoint2fArray& sp = source.points;
  const ZvUByteArray& sc = source.codes;
  if (start >= end || end >= points.size || first >= last || last >= sp.size) return 0;
  if (!IsNode(codes[start]) || !IsNode(codes[end]) || !IsNode(sc[first]) || !IsNode(sc[last]))
    return 0;
  if (!Coincide(points[start], sp[first]) || !Coincide(points[end], sp[last])) return 0;
  // A locked node needs a handle of its own on the new side: a segment of degree 3 or more.
  const unsigned int out = sc[first + 1] & kCodeMask, in = sc[last] & kCodeMask;
  if ((codes[start] & kG1Lock) && (out == 3 || out == 4 || out == 5)) return 0;
  if ((codes[end] & kG1Lock) && (in == 3 || in == 4 || in == 6 || in == 7)) return 0;
  if (StartsIn(codes.data, start + 1, end) || StartsIn(sc.data, first + 1, last)) return 0;
  const unsigned int s = last - first, d = end - start;
  const unsigned char endByte = codes[end];
  if (s < 3 || d < 3) {
    ZvPathSplice splice(points, codes, start + 1, d - 1, s - 1);
    splice.Apply();
    for (unsigned int k = 1; k < s; ++k) {
      points[start + k] = sp[first + k];
      codes[start + k] = sc[first + k];
    }
  } else {
    ZvPathSplice splice(points, codes, start + 2, d - 3, s - 3);
    ReplacePoint(start + 1, sp[first + 1], 1);
    codes[start + 1] = sc[first + 1];
    splice.Apply();
    for (unsigned int k = 2; k + 1 < s; ++k) {
      points[start + k] = sp[first + k];
      codes[start + k] = sc[first + k];
    }
    ReplacePoint(start + s - 1, sp[last - 1], 1);
    codes[start + s - 1] = sc[last - 1];
  }
  // The source's end may close its subpath where this one stays open, or the reverse.
  const unsigned int c = in;
  codes[start + s] = EndNodeByte(IsClosedEnd(c) ? c - 1 : c, endByte);
  return 1;
}
