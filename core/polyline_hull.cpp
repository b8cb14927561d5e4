// Convex hull of a point set and growing of a convex polygon.
#include <zv/polyline.h>

#include <cmath>
#include <memory>

#include "core/convex_hull.h"

int ZvGetConvexHull2D(int count, ZvPoint2<float>* points, ZvPoint2fArray* out) {
  if (count <= 0 || !points || !out) return 0;
  std::unique_ptr<CQNVector2<double>[]> inputs(new CQNVector2<double>[count]);
  std::unique_ptr<CQNVector2<double>[]> hull(new CQNVector2<double>[count]);
  for (int i = 0; i < count; ++i)
    inputs[i] = CQNVector2<double>(points[i].x, points[i].y);
  int hullCount = 0;
  const int result =
      CQNGeometry::BuildConvexHull<double>(count, inputs.get(), hullCount, hull.get());
  // The corners are float inputs widened, so narrowing them back is exact.
  if (result)
    for (int i = 0; i < hullCount; ++i)
      out->Add(hull[i][0], hull[i][1]);
  return result;
}

namespace {

// Squared distance under which two points of a polygon are one.
const double kMergeDistance2 = 1e-5;

bool Merge(double x0, double y0, double x1, double y1) {
  const double dx = x1 - x0, dy = y1 - y0;
  return dx * dx + dy * dy < kMergeDistance2;
}

bool Merge(const ZvPoint2<float>& p, const ZvPoint2<float>& q) {
  return Merge(p.x, p.y, q.x, q.y);
}

// Outward normal of edge p -> q of a counter-clockwise polygon, scaled to distance. The guarded
// length is taken in single precision, like the coordinates.
ZvPoint2<double> OffsetNormal(const ZvPoint2<float>& p, const ZvPoint2<float>& q, double distance) {
  const float dx = q.x - p.x, dy = q.y - p.y;
  const float l2 = dx * dx + dy * dy;
  if (l2 <= 1e-9f) return {0.0, 0.0};
  const double scale = distance / std::sqrt(l2);
  return {dy * scale, -dx * scale};
}

// Appends points to out, dropping one that merges with the last point this call appended.
class Outline {
 public:
  explicit Outline(ZvPoint2fArray& out) : out_(out), start_(out.size) {}

  void Add(const ZvPoint2<float>& p, const ZvPoint2<double>& offset) {
    const double x = p.x + offset.x, y = p.y + offset.y;
    if (out_.size > start_) {
      const ZvPoint2<float>& last = out_[out_.size - 1];
      if (Merge(last.x, last.y, x, y)) return;
    }
    out_.Add(x, y);
  }

 private:
  ZvPoint2fArray& out_;
  unsigned int start_;
};

// The arc around a corner turns counter-clockwise from one edge normal to the next. It stops once
// a step would reach or pass the end normal, or merge with it; a corner of a convex polygon turns
// by less than half a turn, which also bounds the walk when the step is a multiple of a turn.
void AddArc(Outline& outline, const ZvPoint2<float>& corner, ZvPoint2<double> from,
            const ZvPoint2<double>& to, double degreesPerStep) {
  const double radians = degreesPerStep * (3.141592653589793 / 180.0);
  const double c = std::cos(radians), s = std::sin(radians);
  for (unsigned int k = 1; k * degreesPerStep < 180.0; ++k) {
    from = {from.x * c - from.y * s, from.x * s + from.y * c};
    if (ZvCross(from, to) <= 0.0 || Merge(from.x, from.y, to.x, to.y)) return;
    outline.Add(corner, from);
  }
}

}  // namespace

int ZvExpandConvexPolygon2D(ZvPoint2fArray& polygon, double distance, double degreesPerStep,
                            ZvPoint2fArray* out) {
  if (polygon.size == 0 || !out || !std::isfinite(distance)) return 0;
  if (!(degreesPerStep > 0.0) || !std::isfinite(degreesPerStep)) return 0;
  if (distance < 0.0) distance = 0.0;
  const ZvPoint2<float>* p = polygon.data;

  // The corners: no run of merging points, and no closing repeat of the first point.
  unsigned int used = polygon.size;
  while (used > 1 && Merge(p[used - 1], p[0]))
    --used;
  ZvULongArray corners(used);
  corners.Add(0u);
  for (unsigned int i = 1; i < used; ++i)
    if (!Merge(p[i], p[corners[corners.size - 1]])) corners.Add(i);
  while (corners.size > 1 && Merge(p[corners[corners.size - 1]], p[0]))
    corners.Chop(corners.size - 1);

  Outline outline(*out);
  const unsigned int n = corners.size;
  if (n == 1) {
    for (unsigned int k = 0; k * degreesPerStep < 360.0; ++k) {
      const double radians = k * degreesPerStep * (3.141592653589793 / 180.0);
      out->Add(p[0].x + distance * std::cos(radians), p[0].y + distance * std::sin(radians));
    }
    return 1;
  }
  for (unsigned int j = 0; j < n; ++j) {
    const ZvPoint2<float>& before = p[corners[(j + n - 1) % n]];
    const ZvPoint2<float>& corner = p[corners[j]];
    const ZvPoint2<float>& after = p[corners[(j + 1) % n]];
    const ZvPoint2<double> incoming = OffsetNormal(before, corner, distance);
    const ZvPoint2<double> outgoing = OffsetNormal(corner, after, distance);
    outline.Add(corner, incoming);
    AddArc(outline, corner, incoming, outgoing, degreesPerStep);
    outline.Add(corner, outgoing);
  }
  return 1;
}
