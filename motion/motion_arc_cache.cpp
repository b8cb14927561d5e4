// Flattened segments of a motion path, kept between evaluations.
#include "motion/motion_arc_cache.h"

#include <zv/bezier_tool.h>
#include <zv/polyline.h>

#include <cstdint>
#include <cstring>

namespace {
// Tolerances are compared by their bits, so that 0.0 and -0.0 or two NaNs never share entries
// that a fresh flatten might lay out differently.
bool SameBits(double a, double b) {
  std::uint64_t x, y;
  std::memcpy(&x, &a, sizeof x);
  std::memcpy(&y, &b, sizeof y);
  return x == y;
}
}  // namespace

ZvMotionSegmentArc& ZvMotionArcCache::Segment(const ZvPoint3dArray& points, unsigned int i,
                                              double tolerance) {
  const std::size_t segments = points.size / 3;
  if (entries_.size() != segments || !SameBits(tolerance, tolerance_)) {
    entries_.clear();
    entries_.resize(segments);
    tolerance_ = tolerance;
  }
  std::unique_ptr<ZvMotionSegmentArc>& entry = entries_[i / 3];
  if (!entry) {
    auto arc = std::make_unique<ZvMotionSegmentArc>();
    ZvBezierTool_FlattenCubic3d(points.data + i, tolerance, &arc->polyline, 0);
    arc->length = ZvPoint3dArraySingleComponent_ComputeChordLength(arc->polyline, arc->chords);
    entry = std::move(arc);
  }
  return *entry;
}
