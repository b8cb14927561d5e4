// Clipped flattening of cubics and gamma segments into tagged polylines.
#include <zv/bezier_tool.h>

#include <cmath>

namespace {

bool SamePoint(const ZvPoint2<double>& a, const ZvPoint2<double>& b) {
  return std::fabs(a.x - b.x) <= 1e-9 && std::fabs(a.y - b.y) <= 1e-9;
}

void AddTagged(ZvPoint2dArray& points, ZvPointTagArray& tags, ZvBoolArray& flags,
               const ZvPoint2<double>& q, ZvPointTag tag) {
  points.Add(q);
  tags.Add(tag);
  flags.Add(1);
}

// Closes the last piece before a new one starts. The arrays run in parallel; a caller that let
// them drift apart gets no write outside them.
void CloseLastPiece(ZvPointTagArray& tags, ZvBoolArray& flags, int flag) {
  if (tags.size) tags[tags.size - 1] = ZvPointTag_Last;
  if (flags.size) flags[flags.size - 1] = flag;
}

// Starts (or continues) a piece at `start` on the unclipped path. An interrupted piece keeps
// flag 0 on its last vertex here, where the clipped path leaves 1; the difference is intended.
void StartUnclippedPiece(const ZvPoint2<double>& start, ZvPoint2dArray& points,
                         ZvPointTagArray& tags, ZvBoolArray& flags) {
  if (points.size == 0) {
    AddTagged(points, tags, flags, start, ZvPointTag_First);
  } else if (!SamePoint(points[points.size - 1], start)) {
    CloseLastPiece(tags, flags, 0);
    AddTagged(points, tags, flags, start, ZvPointTag_First);
  }
}

void TagAdded(unsigned int count, ZvPointTagArray& tags, ZvBoolArray& flags) {
  for (unsigned int i = 0; i < count; ++i) {
    tags.Add(ZvPointTag_Continue);
    flags.Add(1);
  }
}

bool ControlBoxInside(const ZvPoint2<double>* p, const ZvExtent2<double>& extent) {
  for (int i = 0; i < 4; ++i) {
    if (p[i].x < extent.xmin || p[i].x > extent.xmax || p[i].y < extent.ymin ||
        p[i].y > extent.ymax) {
      return false;
    }
  }
  return true;
}

// Whether the curve lies wholly on the far side of one of the extent's edges, by a margin that
// covers the rounding of the flattened points and the clip's own tolerance. The curve stays
// within its control points, so every chord of its flattening would be clipped away: a drawing
// mostly outside its box, or a fill under a large scale, then skips flattening what it would
// drop.
bool ControlBoxOutside(const ZvPoint2<double>* p, const ZvExtent2<double>& extent) {
  double lx = p[0].x, hx = lx, ly = p[0].y, hy = ly, reach = 0.0;
  for (int i = 0; i < 4; ++i) {
    lx = std::fmin(lx, p[i].x), hx = std::fmax(hx, p[i].x);
    ly = std::fmin(ly, p[i].y), hy = std::fmax(hy, p[i].y);
    reach = std::fmax(reach, std::fmax(std::fabs(p[i].x), std::fabs(p[i].y)));
  }
  const double margin = 1e-8 + 1e-6 * reach;
  return lx > extent.xmax + margin || hx < extent.xmin - margin || ly > extent.ymax + margin ||
         hy < extent.ymin - margin;
}

// The monotone, non-degenerate shape the power-law walk expects; anything else is drawn as
// its chord.
bool IsWellFormedGamma(const ZvPoint2<double>* p, double tolerance) {
  return p[1].y <= p[0].y && p[2].y <= p[0].y && p[3].y <= p[1].y && p[3].y <= p[2].y &&
         p[3].x - p[0].x >= tolerance && p[0].y - p[3].y >= tolerance &&
         p[3].x - p[1].x >= tolerance && p[2].x - p[1].x >= tolerance &&
         p[1].y - p[2].y >= tolerance;
}

}  // namespace

int ClipAndAddLineSegment(ZvPoint2<double>& a, ZvPoint2<double>& b, const ZvExtent2<double>& extent,
                          ZvPoint2dArray& points, ZvPointTagArray& tags, ZvBoolArray& flags) {
  const int kept = extent.ClipLineSegmentWhenRegular(a, b);
  if (!kept) return kept;
  if (points.size == 0) {
    AddTagged(points, tags, flags, a, ZvPointTag_First);
  } else if (!SamePoint(points[points.size - 1], a)) {
    CloseLastPiece(tags, flags, 1);
    AddTagged(points, tags, flags, a, ZvPointTag_First);
  }
  AddTagged(points, tags, flags, b, ZvPointTag_Continue);
  return kept;
}

void ZvBezierTool_ClipAndFlattenCubic2d(const ZvPoint2<double>* p, double tolerance,
                                        const ZvExtent2<double>& extent, ZvPoint2dArray* points,
                                        ZvPointTagArray* tags, ZvBoolArray* flags) {
  if (!p || !points || !tags || !flags || extent.kind == ZvExtent2<double>::Empty) return;
  const ZvPoint2<double> c[4] = {p[0], p[1], p[2], p[3]};
  if (extent.kind != ZvExtent2<double>::Infinite && !ControlBoxInside(c, extent)) {
    if (ControlBoxOutside(c, extent)) return;
    ZvPoint2dArray line(32);
    ZvBezierTool_FlattenCubic2d(c, tolerance, &line, 0);
    for (unsigned int i = 1; i < line.size; ++i) {
      ZvPoint2<double> a = line[i - 1], b = line[i];
      ClipAndAddLineSegment(a, b, extent, *points, *tags, *flags);
    }
    return;
  }
  StartUnclippedPiece(c[0], *points, *tags, *flags);
  TagAdded(ZvBezierTool_FlattenCubic2d(c, tolerance, points, 1), *tags, *flags);
}

void ZvBezierTool_ClipAndFlattenGamma(const ZvPoint2<double>* p, double tolerance,
                                      const ZvExtent2<double>& extent, ZvPoint2dArray* points,
                                      ZvPointTagArray* tags, ZvBoolArray* flags) {
  if (!p || !points || !tags || !flags || extent.kind == ZvExtent2<double>::Empty) return;
  const ZvPoint2<double> c[4] = {p[0], p[1], p[2], p[3]};
  if (extent.kind != ZvExtent2<double>::Infinite && !IsWellFormedGamma(c, tolerance)) {
    ZvPoint2<double> a = c[1], b = c[2];
    ClipAndAddLineSegment(a, b, extent, *points, *tags, *flags);
    return;
  }
  // The visible part of a gamma segment starts at its first on-curve point.
  StartUnclippedPiece(c[1], *points, *tags, *flags);
  TagAdded(ZvBezierTool_FlattenGamma(c, tolerance, points, 1), *tags, *flags);
}
