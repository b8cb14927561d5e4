// Flattened segments of a motion path, kept between evaluations.
//
// Timing a segment needs its own arc length and polyline and the lengths of its two
// neighbours, and flattening is by far the dearest part of an evaluation. The cache holds the
// flattened polyline of each segment for one tolerance; asking with another tolerance starts
// afresh, and the path empties it on every edit. The polylines are the ones a fresh flatten
// gives, so cached and fresh evaluations agree bit for bit.
#ifndef ZV_MOTION_ARC_CACHE_H
#define ZV_MOTION_ARC_CACHE_H

#include <zv/arrays.h>

#include <memory>
#include <vector>

// How arc length runs with time along one segment.
struct ZvMotionTiming {
  double t0, t1, length;
  bool constantSpeed;
  double c3, c2, c1;  // the cubic in absolute time when the speed is not constant
  // Distance from the segment start at `time`, within [0, length].
  double ArcLength(double time) const;
};

struct ZvMotionSegmentArc {
  ZvMotionSegmentArc() : polyline(32), chords(32), length(0.0), timed(false), timing() {}
  ZvPoint3dArray polyline;
  ZvDoubleArray chords;  // running length at each polyline vertex
  double length;
  // The timing depends on times and tangent information too, which edits change; it is kept
  // here because every edit empties the cache anyway.
  bool timed;
  ZvMotionTiming timing;
};

class ZvMotionArcCache {
 public:
  ZvMotionArcCache() = default;
  // A copy starts empty: the entries describe the points of the path that owns them.
  ZvMotionArcCache(const ZvMotionArcCache&) {}
  ZvMotionArcCache& operator=(const ZvMotionArcCache&) {
    Clear();
    return *this;
  }

  // The segment of `points` that starts at control index i (a node, not the last), flattened to
  // `tolerance`. The reference stays valid until Clear or a call with another tolerance.
  ZvMotionSegmentArc& Segment(const ZvPoint3dArray& points, unsigned int i, double tolerance);
  void Clear() { entries_.clear(); }

 private:
  double tolerance_ = 0.0;
  std::vector<std::unique_ptr<ZvMotionSegmentArc>> entries_;
};

#endif
