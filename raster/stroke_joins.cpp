// Joins and caps of the stroke outline.
#include "raster/stroke_outline.h"

#include <cmath>

namespace {
ZvPoint2<float> F(const ZvPoint2<double>& p) {
  return ZvPoint2<float>{static_cast<float>(p.x), static_cast<float>(p.y)};
}

// Where the two offset edges meet: the lines through c + a perpendicular to a and through
// c + b perpendicular to b.
ZvPoint2<double> MiterTip(const ZvPoint2<double>& a, const ZvPoint2<double>& b,
                          const ZvPoint2<double>& c, double radius) {
  const double k = radius * radius / (a.x * b.y - a.y * b.x);
  return ZvPoint2<double>{c.x + k * (b.y - a.y), c.y + k * (a.x - b.x)};
}

// The point of the offset edge through c + v (perpendicular to v) whose projection on the unit
// axis u is d.
ZvPoint2<double> OnOffsetEdge(const ZvPoint2<double>& v, const ZvPoint2<double>& c,
                              const ZvPoint2<double>& u, double d) {
  const ZvPoint2<double> along{-v.y, v.x};
  const double t = (d - ZvDot(v, u)) / ZvDot(along, u);
  return ZvPoint2<double>{c.x + v.x + t * along.x, c.y + v.y + t * along.y};
}
}  // namespace

ZvStrokeJoin pJoin = JoinMiter;
ZvStrokeCap pEndCap = EndCapFlat;

void JoinBevel(const ZvPoint2<double>& a, const ZvPoint2<double>& b, const ZvPoint2<double>& c,
               double, double, ZvPath2f& outline) {
  outline.Lineto(F(c + a));
  outline.Lineto(F(c + b));
}

void JoinMiter(const ZvPoint2<double>& a, const ZvPoint2<double>& b, const ZvPoint2<double>& c,
               double radius, double miterLimit, ZvPath2f& outline) {
  const ZvPoint2<double> m = MiterTip(a, b, c, radius);
  const double d2 = (m.x - c.x) * (m.x - c.x) + (m.y - c.y) * (m.y - c.y);
  const double limit = miterLimit * radius;
  if (limit * limit > d2) {
    outline.Lineto(F(m));
    return;
  }
  // The tip is cut square to the miter axis at 2 * limit - |m - c| from the vertex: the further
  // out the tip, the further in the cut. The established look of these joins depends on it.
  const double dist = std::sqrt(d2);
  const ZvPoint2<double> axis{(m.x - c.x) / dist, (m.y - c.y) / dist};
  const double cut = 2.0 * limit - dist;
  outline.Lineto(F(OnOffsetEdge(a, c, axis, cut)));
  outline.Lineto(F(OnOffsetEdge(b, c, axis, cut)));
}

void JoinRound(const ZvPoint2<double>& a, const ZvPoint2<double>& b, const ZvPoint2<double>& c,
               double radius, double, ZvPath2f& outline) {
  outline.Lineto(F(c + a));
  // One quadratic arc is close to a circle up to 120 degrees; beyond, a bevel rather than a
  // subdivision.
  if (ZvDot(a, b) >= -0.5 * radius * radius)
    outline.Curveto(F(MiterTip(a, b, c, radius)), F(c + b));
  else
    outline.Lineto(F(c + b));
}

void EndCapFlat(const ZvPoint2<double>&, const ZvPoint2<double>& to, double, ZvPath2f& outline) {
  outline.Lineto(F(to));
}

void EndCapSquare(const ZvPoint2<double>& from, const ZvPoint2<double>& to, double,
                  ZvPath2f& outline) {
  const ZvPoint2<double> h{(from.y - to.y) * 0.5, (to.x - from.x) * 0.5};
  outline.Lineto(F(from + h));
  outline.Lineto(F(to + h));
  outline.Lineto(F(to));
}

void EndCapRound(const ZvPoint2<double>& from, const ZvPoint2<double>& to, double,
                 ZvPath2f& outline) {
  const ZvPoint2<double> h{(from.y - to.y) * 0.5, (to.x - from.x) * 0.5};
  const ZvPoint2<float> p0 = F(from), p1 = F(from + h), p2 = F((from + to) * 0.5 + h),
                        p3 = F(to + h), p4 = F(to);
  const float kappa = 0.5522847498307935f;  // cubic quarter circle
  outline.Curveto(p0 + (p1 - p0) * kappa, p2 + (p1 - p2) * kappa, p2);
  outline.Curveto(p2 + (p3 - p2) * kappa, p4 + (p3 - p4) * kappa, p4);
}
