// Drawing a motion path: a polyline with time ticks, and its projection to a plane path.
#include <zv/motion_path.h>
#include <zv/path2f.h>
#include <zv/polyline.h>

#include <cmath>
#include <limits>

#include "core/scoped_lock.h"
#include "motion/motion_path_impl.h"

namespace {

// The four parallel outputs of Render.
struct RenderOutput {
  ZvPoint3dArray& points;
  ZvUByteArray& kinds;
  ZvDoubleArray& times;
  ZvULongArray& segments;
  unsigned int count;

  void Emit(const ZvPoint3<double>& p, unsigned char kind, double time, unsigned int segment) {
    points.Add(p);
    kinds.Add(kind);
    times.Add(time);
    segments.Add(segment);
    ++count;
  }
  void Vertex(const ZvPoint3<double>& p, double time, unsigned int segment) {
    Emit(p, count ? ZvMotionPath3d::RenderVertex : ZvMotionPath3d::RenderFirstVertex, time,
         segment);
  }
  void Tick(const ZvPoint3<double>& p, double time, unsigned int segment) {
    Emit(p, count ? ZvMotionPath3d::RenderTick : ZvMotionPath3d::RenderFirstTick, time, segment);
  }
};

// Tick times origin + j step over the whole path. Counting whole steps rather than adding step
// after step keeps the ticks of the last segment on the same grid as those of the first.
struct TickGrid {
  double origin, step, j, latest;
  double Time() const { return origin + j * step; }
  // The next tick time after `current`; infinite when the grid cannot resolve the next step,
  // which ends the segment's ticks instead of repeating one tick forever.
  double Advance(double current) {
    j += 1.0;
    const double next = Time();
    return next > current ? next : std::numeric_limits<double>::infinity();
  }
  // Moves to the first tick at or after `time`, for a segment drawn without ticks. The quotient
  // is rounded, so its ceiling may be one step off either way.
  void SkipTo(double time) {
    const double k = std::ceil((time - origin) / step);
    if (!(k > j)) return;
    j = k;
    if (Time() < time) {
      j += 1.0;
    } else if (origin + (j - 1.0) * step >= time) {
      j -= 1.0;
    }
  }
};

void RenderSegment(const ZvMotionPath3dImpl& m, unsigned int node, double tolerance,
                   unsigned int maxTicks, ZvMotionArcCache& cache, TickGrid& grid,
                   RenderOutput& out) {
  const unsigned int i = 3 * node;
  const double t0 = m.initialTimes[node], t1 = m.initialTimes[node + 1];
  // A straight segment is its chord, timed linearly, as evaluation has it.
  ZvMotionSegmentArc line;
  const ZvMotionSegmentArc* arc = &line;
  const bool straight = m.IsLineNode(node);
  if (straight) {
    line.polyline.Add(m.controlPoints[i]);
    line.polyline.Add(m.controlPoints[i + 3]);
    line.length = ZvPoint3dArraySingleComponent_ComputeChordLength(line.polyline, line.chords);
  } else {
    arc = &cache.Segment(m.controlPoints, i, tolerance);
  }
  const ZvPoint3dArray& poly = arc->polyline;
  const ZvDoubleArray& chords = arc->chords;
  if (arc->length < 1e-7) {
    grid.SkipTo(t1);
    return;
  }
  // The segment's end vertex starts the next segment, or the list's last entry.
  const unsigned int end = poly.size - 1;
  if (m.tangents[node].right == ZvMotionPath3d::Hold || (t1 - t0) / grid.step > maxTicks) {
    out.Tick(poly[0], t0, node);
    for (unsigned int v = 1; v < end; ++v)
      out.Vertex(poly[v], t0, node);
    grid.SkipTo(t1);
    return;
  }
  ZvMotionTiming timing{t0, t1, arc->length, true, 0.0, 0.0, 0.0};
  if (!straight) timing = m.SegmentTiming(i, arc->length, tolerance, cache);
  unsigned int v = 0;
  for (double tick = grid.Time(); tick < t1; tick = grid.Advance(tick)) {
    const double s = timing.ArcLength(tick);
    for (; v < end && chords[v] < s && s - chords[v] > 1e-7; ++v)
      out.Vertex(poly[v], grid.latest, node);
    ZvPoint3<double> at;
    if (std::fabs(chords[v] - s) <= 1e-7) {
      at = poly[v];
      if (v < end) ++v;
    } else {
      ZvPoint3dArraySingleComponent_ComputePosition(poly, chords, s, at);
    }
    out.Tick(at, tick, node);
    grid.latest = tick;
  }
  for (; v < end; ++v)
    out.Vertex(poly[v], grid.latest, node);
}

}  // namespace

int ZvMotionPath3d::Render(double timeStep, double tolerance, unsigned int maxTicks,
                           ZvPoint3dArray& points, ZvUByteArray& kinds, ZvDoubleArray& times,
                           ZvULongArray& segments) const {
  ZvScopedLock guard(lock);
  const ZvMotionPath3dImpl& m = *impl;
  if (m.NumPoints() == 0 || !(timeStep > 0.0)) return 0;
  RenderOutput out{points, kinds, times, segments, 0};
  const double first = m.initialTimes[0];
  const unsigned int lastNode = m.NumNodes() - 1;
  // A separate store: rendering at its own tolerance must not evict the evaluation's segments.
  ZvMotionArcCache cache;
  TickGrid grid{first, timeStep, 0.0, first};
  for (unsigned int node = 0; node < lastNode; ++node)
    RenderSegment(m, node, tolerance, maxTicks, cache, grid, out);
  if (out.count == 0) out.Tick(m.controlPoints[0], first, 0);
  out.Emit(m.controlPoints[m.LastIndex()], RenderLastVertex, m.initialTimes[lastNode],
           lastNode ? lastNode - 1 : 0);
  return 1;
}

int ZvMotionPath3d::GetProjectedPath(Projection projection, ZvPath2f& path) const {
  ZvScopedLock guard(lock);
  const ZvMotionPath3dImpl& m = *impl;
  if (m.NumPoints() == 0 || static_cast<unsigned int>(projection) > ProjectXZ) return 0;
  const auto project = [projection](const ZvPoint3<double>& p) {
    const double x = projection == ProjectZY ? -p.z : p.x;
    const double y = projection == ProjectXZ ? -p.z : p.y;
    return ZvPoint2<float>{static_cast<float>(x), static_cast<float>(y)};
  };
  const ZvPoint3<double>* p = m.controlPoints.data;
  path.Clear();
  path.Moveto(project(p[0]));
  for (unsigned int i = 0; i + 3 < m.NumPoints(); i += 3) {
    if (m.IsLineNode(i / 3)) {
      path.Lineto(project(p[i + 3]));
    } else {
      path.Curveto(project(p[i + 1]), project(p[i + 2]), project(p[i + 3]));
    }
  }
  return 1;
}
