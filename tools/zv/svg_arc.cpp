// Endpoint to centre parameterisation of an elliptical arc, then one cubic per quarter turn.
#include "svg_arc.h"

#include <algorithm>
#include <cmath>

namespace {
using Pd = ZvPoint2<double>;
constexpr double kPi = 3.14159265358979323846;

// Signed angle from u to v.
double Angle(double ux, double uy, double vx, double vy) {
  return std::atan2(ux * vy - uy * vx, ux * vx + uy * vy);
}
}  // namespace

int ZvSvgArcToCubics(const Pd& from, double rx, double ry, double degrees, bool large, bool sweep,
                     const Pd& to, std::vector<Pd>& controls) {
  rx = std::fabs(rx);
  ry = std::fabs(ry);
  if ((from.x == to.x && from.y == to.y) || rx == 0 || ry == 0) return 0;
  const double phi = std::fmod(degrees, 360.0) * kPi / 180;
  const double c = std::cos(phi), s = std::sin(phi);
  // The half chord in the ellipse's own axes.
  const double hx = (from.x - to.x) / 2, hy = (from.y - to.y) / 2;
  const double x1 = c * hx + s * hy, y1 = -s * hx + c * hy;
  // Radii that cannot span the chord grow, keeping their ratio, until the centre sits on it.
  const double reach = x1 * x1 / (rx * rx) + y1 * y1 / (ry * ry);
  if (reach > 1) {
    rx *= std::sqrt(reach);
    ry *= std::sqrt(reach);
  }
  const double rx2 = rx * rx, ry2 = ry * ry;
  const double den = rx2 * y1 * y1 + ry2 * x1 * x1;
  double k = std::sqrt(std::max(0.0, (rx2 * ry2 - den) / den));
  if (large == sweep) k = -k;
  const double cx1 = k * rx * y1 / ry, cy1 = -k * ry * x1 / rx;
  const double cx = c * cx1 - s * cy1 + (from.x + to.x) / 2;
  const double cy = s * cx1 + c * cy1 + (from.y + to.y) / 2;
  const double start = Angle(1, 0, (x1 - cx1) / rx, (y1 - cy1) / ry);
  double span = Angle((x1 - cx1) / rx, (y1 - cy1) / ry, (-x1 - cx1) / rx, (-y1 - cy1) / ry);
  if (!sweep && span > 0) span -= 2 * kPi;
  if (sweep && span < 0) span += 2 * kPi;

  // A cubic follows a quarter turn of a circle to 2.7e-4 of the radius; shorter pieces closer.
  const int n = std::max(1, static_cast<int>(std::ceil(std::fabs(span) / (kPi / 2) - 1e-9)));
  const double step = span / n;
  const double handle = 4.0 / 3.0 * std::tan(step / 4);
  // A point of the unit circle's frame on the ellipse.
  auto map = [&](double ux, double uy) {
    return Pd{cx + c * rx * ux - s * ry * uy, cy + s * rx * ux + c * ry * uy};
  };
  double a = start;
  for (int i = 0; i < n; ++i) {
    const double b = i + 1 == n ? start + span : a + step;
    const double ca = std::cos(a), sa = std::sin(a), cb = std::cos(b), sb = std::sin(b);
    controls.push_back(map(ca - handle * sa, sa + handle * ca));
    controls.push_back(map(cb + handle * sb, sb - handle * cb));
    controls.push_back(i + 1 == n ? to : map(cb, sb));
    a = b;
  }
  return n;
}
