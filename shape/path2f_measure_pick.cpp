// Picking on ZvPath2f: points near a position or inside a box, and the arc position of a node.
#include <zv/path2f.h>

#include <cmath>

#include "shape/path2f_measure.h"
#include "shape/shape_lock.h"

int ZvPath2f::GetClosePointIndex(const ZvPoint2<float>& p, double size, unsigned int* index) const {
  ZvShapeLock guard(*this);
  if (!index) return 0;
  const float h = static_cast<float>(size * 0.5);
  const float x0 = p.x - h, x1 = p.x + h, y0 = p.y - h, y1 = p.y + h;
  // The first point in the box, not the nearest: picks favour the lower index, which is how
  // a caller cycles through stacked points.
  for (unsigned int i = 0; i < points.size; ++i) {
    const ZvPoint2<float>& q = points[i];
    if (q.x >= x0 && q.x <= x1 && q.y >= y0 && q.y <= y1) {
      *index = i;
      return 1;
    }
  }
  return 0;
}

int ZvPath2f::GetClosePointIndex(const ZvPoint2<float>& p, unsigned int* index) const {
  ZvShapeLock guard(*this);
  if (!index || points.size == 0) return 0;
  // The octagonal metric: within 6% of the true distance and free of square roots.
  double best = 3.4028234663852886e38;
  unsigned int found = points.size;
  for (unsigned int i = 0; i < points.size; ++i) {
    const double dx = std::fabs(double(points[i].x) - p.x);
    const double dy = std::fabs(double(points[i].y) - p.y);
    const double d = dx > dy ? dx + 0.3334 * dy : 0.3334 * dx + dy;
    if (d < best) {
      best = d;
      found = i;
    }
  }
  if (found >= points.size) return 0;
  *index = found;
  return 1;
}

unsigned int ZvPath2f::GetPointsInExtentIndices(const ZvExtent2<float>& extent,
                                                ZvULongArray* indices) const {
  ZvShapeLock guard(*this);
  if (!indices || extent.kind == ZvExtent2<float>::Empty) return 0;
  const bool all = extent.kind == ZvExtent2<float>::Infinite;
  const unsigned int before = indices->size;
  for (unsigned int i = 0; i < points.size; ++i) {
    const ZvPoint2<float>& q = points[i];
    if (all ||
        (q.x >= extent.xmin && q.x <= extent.xmax && q.y >= extent.ymin && q.y <= extent.ymax))
      indices->Add(i);
  }
  return indices->size - before;
}

double ZvPath2f::GetNodeNormalizedArcLength(unsigned int node, double tolerance) const {
  ZvShapeLock guard(*this);
  if (node >= points.size) return 0.0;
  const unsigned int s = SubpathStart(node), e = SubpathEnd(node);
  if (s >= node) return 0.0;
  if (e <= node) return 1.0;
  // A control point stands for the node that ends its segment.
  const unsigned int end = EndOfSegment(node);
  ZvBezierTool tool;
  ZvPoint2fArray flat(64);
  unsigned int at = 0;
  ZvPath2fMeasure::FlattenSubpath<ZvFlattenInFloat>(*this, s, e, nullptr, tolerance, flat, tool,
                                                    end, &at);
  double total = 0.0, upTo = 0.0;
  for (unsigned int i = 1; i < flat.size; ++i) {
    const double dx = double(flat[i].x) - flat[i - 1].x, dy = double(flat[i].y) - flat[i - 1].y;
    const double l2 = dx * dx + dy * dy;
    if (l2 > 1e-9) total += std::sqrt(l2);
    if (i == at) upTo = total;
  }
  if (std::fabs(total) <= 1e-7) return 1.0;
  const double ratio = upTo / total;
  return ratio > 0.0 ? (ratio > 1.0 ? 1.0 : ratio) : 0.0;
}
