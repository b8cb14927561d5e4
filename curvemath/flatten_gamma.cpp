// Flattening of a gamma segment: a power-law piece carried in a cubic's four points.
#include <zv/bezier_tool.h>

#include <cmath>

unsigned int ZvBezierTool_FlattenGamma(const ZvPoint2<double>* p, double /*tolerance*/,
                                       ZvPoint2dArray* out, int skipFirst) {
  if (!p || !out) return 0;
  const ZvPoint2<double> p0 = p[0], p1 = p[1], p2 = p[2], p3 = p[3];
  const unsigned int before = out->size;
  if (!skipFirst) out->Add(p0);

  const double xRange = p3.x - p0.x;
  const double yDrop = p0.y - p3.y;
  const double u2 = (p2.x - p0.x) / xRange;
  const double u1 = (p1.x - p0.x) / xRange;
  // The exponent is recovered from whichever on-curve point has a usable abscissa.
  double gamma = 1.0;
  if (u1 > 0) {
    gamma = std::log10((p0.y - p1.y) / yDrop) / std::log10(u1);
  } else if (u2 > 0) {
    gamma = std::log10((p0.y - p2.y) / yDrop) / std::log10(u2);
  }

  // Within 0.001 of 1 the piece is a straight line and needs no interior point.
  if (std::fabs(gamma - 1.0) > 0.001) {
    // Steeper power laws get proportionally more steps, at most 150 over the unit range.
    const double steps = gamma < 1.0 ? 30.0 / gamma : 30.0 * gamma;
    const double step = 1.0 / std::fmin(150.0, steps);
    // A true gamma piece has 0 <= u1 < u2 <= 1, so the walk takes at most 1/step steps; the
    // bound stops a corrupt piece with a huge u range from running away.
    double maxSteps = std::floor(1.0 / step) + 2.0;
    for (double u = u1 + step; u > u1 && u < u2 && maxSteps > 0.0; u += step, maxSteps -= 1.0) {
      // The points are rounded to float because a gamma piece comes out of a float path. They
      // round through memory: g++ 12's vectoriser folds the float round trip away otherwise.
      volatile float x = static_cast<float>(xRange * u + p0.x);
      volatile float y = static_cast<float>(p0.y - std::pow(u, gamma) * yDrop);
      out->Add(x, y);
    }
  }
  // The piece ends at the second on-curve point, not at P3.
  out->Add(p2);
  return out->size - before;
}
