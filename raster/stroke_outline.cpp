// Offsetting a tagged polyline into closed stroke contours.
#include "raster/stroke_outline.h"

#include <zv/polyline.h>

#include <cmath>
#include <new>

namespace {
using P = ZvPoint2<double>;

ZvPoint2<float> F(const P& p) {
  return ZvPoint2<float>{static_cast<float>(p.x), static_cast<float>(p.y)};
}

bool Coincide(const P& a, const P& b) {
  return std::fabs(a.x - b.x) <= 1e-9 && std::fabs(a.y - b.y) <= 1e-9;
}

class Outliner {
 public:
  Outliner(const ZvGC& gc, const ZvPoint2dArray& points, const double* weights, P* offsets,
           ZvPath2f& outline)
      : p(points.data), w(weights), off(offsets), out(outline) {
    const double tol = gc.flattenTolerance > 0.25 ? gc.flattenTolerance : 0.25;
    tol2 = tol * tol;
    halfWidth = 0.5 * gc.lineWidth;
    miterLimit = gc.miterLimit < 1.0 ? 1.0 : gc.miterLimit;
    miterExtra = gc.joinStyle == 1;
  }

  // The contours of points first..last (last tagged 2).
  void Subpath(unsigned int first, unsigned int last) {
    for (unsigned int k = first; k < last; ++k)
      Offsets(k);
    out.Moveto(F(p[first] + off[2 * first]));
    for (unsigned int k = first + 1; k < last; ++k)
      Vertex(p[k], p[k - 1], p[k + 1], off[2 * k - 1], off[2 * k], w[k]);
    const P endOffset = off[2 * last - 1];
    if (Coincide(p[last], p[first])) {
      Seam(p[first], p[last - 1], p[first + 1], endOffset, off[2 * first], w[first]);
      out.Closeto();
      out.Moveto(F(p[first] - endOffset));
    } else {
      out.Lineto(F(p[last] + endOffset));
      pEndCap(p[last] + endOffset, p[last] - endOffset, w[last] * halfWidth, out);
    }
    // Backward: the offsets negated, arriving and leaving swapped.
    for (unsigned int k = last - 1; k > first; --k)
      Vertex(p[k], p[k + 1], p[k - 1], -off[2 * k], -off[2 * k - 1], w[k]);
    if (Coincide(p[last], p[first])) {
      Seam(p[first], p[first + 1], p[last - 1], -off[2 * first], -endOffset, w[first]);
    } else {
      out.Lineto(F(p[first] - off[2 * first]));
      pEndCap(p[first] - off[2 * first], p[first] + off[2 * first], w[first] * halfWidth, out);
    }
    out.Closeto();
  }

 private:
  // The start and end offsets of the segment from point k: the unit normal scaled to the half
  // width, times each end's weight. A segment of no length has no normal and no offset.
  void Offsets(unsigned int k) {
    const double dx = p[k + 1].x - p[k].x;
    const double dy = p[k].y - p[k + 1].y;
    const double s = dx * dx + dy * dy;
    const double h = s <= 1e-09 ? 0.0 : halfWidth / std::sqrt(s);
    const P normal{dy * h, dx * h};
    off[2 * k] = normal * w[k];
    off[2 * k + 1] = normal * w[k + 1];
  }

  // The vertex c between o and q, arriving with offset a, leaving with b. Answers whether a join
  // or the inner detour was drawn.
  bool Vertex(const P& c, const P& o, const P& q, const P& a, const P& b, double weight) {
    const P d = a - b;
    if (ZvDot(d, d) <= tol2) {
      out.Lineto(F(c + b));
      return false;
    }
    const double turn = (q.y - o.y) * (c.x - o.x) - (c.y - o.y) * (q.x - o.x);
    if (turn < 0) {
      pJoin(a, b, c, weight * halfWidth, miterLimit, out);
    } else {
      out.Lineto(F(c + a));
      out.Lineto(F(c));
      out.Lineto(F(c + b));
    }
    return true;
  }

  // A closed subpath's start as a vertex; a miter join may end off the contour's first point,
  // so one more line brings it back for the close.
  void Seam(const P& c, const P& o, const P& q, const P& a, const P& b, double weight) {
    if (Vertex(c, o, q, a, b, weight) && miterExtra) out.Lineto(F(c + b));
  }

  const P* p;
  const double* w;
  P* off;
  ZvPath2f& out;
  double tol2;
  double halfWidth;
  double miterLimit;
  bool miterExtra;
};
}  // namespace

void ZvStrokeWeights(const ZvPoint2dArray& points, const ZvPointTagArray& tags, int taper,
                     double* weights) {
  const unsigned int n = points.size < tags.size ? points.size : tags.size;
  for (unsigned int i = 0; i < n; ++i)
    weights[i] = 1.0;
  if (!taper) return;
  ZvDoubleArray chords;
  unsigned int first = 0;
  for (unsigned int i = 0; i < n; ++i) {
    if (tags[i] != ZvPointTag_Last) continue;
    chords.Chop(0);
    ZvPoint2dArray_ComputeChordLength(points, first, i, chords);
    const double total = chords[chords.size - 1];
    for (unsigned int k = first; k <= i; ++k) {
      const double t = total != 0.0 ? chords[k - first] / total : 0.0;
      weights[k] = 4.0 * t * (1.0 - t);
    }
    first = i + 1;
  }
}

void ComputeStrokeOutline(const ZvGC& gc, const ZvPoint2dArray& points, ZvPointTagArray tags,
                          unsigned int numSubPaths, const double* weights, ZvPath2f& outline) {
  const unsigned int n = points.size < tags.size ? points.size : tags.size;
  if (numSubPaths == 0 || n == 0) return;
  switch (gc.joinStyle) {
    case 0:
      pJoin = JoinBevel;
      break;
    case 1:
      pJoin = JoinMiter;
      break;
    case 2:
      pJoin = JoinRound;
      break;
    default:
      break;
  }
  switch (gc.capStyle) {
    case 0:
      pEndCap = EndCapRound;
      break;
    case 1:
      pEndCap = EndCapSquare;
      break;
    case 2:
      pEndCap = EndCapFlat;
      break;
    default:
      break;
  }
  P* offsets = new (std::nothrow) P[2 * static_cast<std::size_t>(n)]();
  if (!offsets) return;
  Outliner outliner(gc, points, weights, offsets, outline);
  unsigned int i = 0;
  try {
    for (unsigned int s = 0; s < numSubPaths && i < n; ++s) {
      unsigned int last = i;
      while (last + 1 < n && tags[last] != ZvPointTag_Last)
        ++last;
      if (last == i || (last == i + 1 && Coincide(points[i], points[last]))) {
        outline.Moveto(F(points[i]));  // a point: no area
      } else {
        outliner.Subpath(i, last);
      }
      i = last + 1;
    }
  } catch (...) {
    delete[] offsets;
    throw;
  }
  delete[] offsets;
}
