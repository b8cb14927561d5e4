// Keeping a dragged segment a function: the intervals in which one handle's parameter may lie
// with the other fixed, and the choice between sliding the far handle and pulling the near one
// back.
#include "fcurve/std_tgt_mover_impl.h"

#include <cmath>
#include <utility>

namespace {

// The roots of x*x - s*x - g = 0, ordered, the interval between them shrunk by a millionth of
// its width at each end so that rounding cannot put its ends outside. The cubic X is monotone
// exactly where F(x) = x*x - s*x - g <= 0, a parabola opening upward, so the interval is where
// the moving handle may go.
bool ShrunkRootInterval(double s, double g, double& lo, double& hi) {
  double a, b;
  if (std::fabs(s) <= 1e-07) {
    if (g < 0.0) return false;
    a = -std::sqrt(g);
    b = std::sqrt(g);
  } else {
    const double d = s * s + 4.0 * g;
    if (d < 0.0) return false;
    // The root of larger magnitude from the sum of same-signed terms, the other from the
    // product of the roots (-g), which avoids the cancellation of the school formula.
    const double w = s + std::copysign(std::sqrt(d), s);
    a = w / 2.0;
    b = g / (-0.5 * w);
    if (a > b) std::swap(a, b);
  }
  const double shrink = (b - a) * 1e-06;
  lo = a + shrink;
  hi = b - shrink;
  return hi >= lo;
}

bool Near(double a, double b) {
  return std::fabs(a - b) <= 1e-15;
}

}  // namespace

int ComputeP2ValidInterval(double x0, double x1, double x3, double& lo, double& hi) {
  const double s = x0 + x1, d = x1 - x0, g = d * x3 - x1 * x1;
  double a, b;
  if (!ShrunkRootInterval(s, g, a, b)) return 0;
  // Each end must pass the same test the curve applies to its segments.
  auto good = [&](double x) {
    return x1 - x <= 1e-09 || (Near(d, 0.0) && Near(x, x3)) ||
           x1 * x1 + x * x - (d * x3 + s * x) <= 1e-09;
  };
  if (!good(a) || !good(b)) return 0;
  lo = a;
  hi = b;
  return 1;
}

int ComputeP1ValidInterval(double x0, double x2, double x3, double& lo, double& hi) {
  const double s = x2 + x3, d = x2 - x3, g = d * x0 - x2 * x2;
  double a, b;
  if (!ShrunkRootInterval(s, g, a, b)) return 0;
  auto good = [&](double x) {
    return x - x2 <= 1e-09 || (Near(x, x0) && Near(d, 0.0)) ||
           x2 * x2 + x * x - ((x + x0) * x2 + (x - x0) * x3) <= 1e-09;
  };
  if (!good(a) || !good(b)) return 0;
  lo = a;
  hi = b;
  return 1;
}

namespace {

double Nearer(double lo, double hi, double x) {
  return std::fabs(lo - x) <= std::fabs(hi - x) ? lo : hi;
}

}  // namespace

bool ZvTgtMover_FixSegment(const ZvTgtMoverSide& s, ZvPoint2<double>& handle, ZvPoint2<double>& far,
                           ZvTgtSegmentFix& fix) {
  fix = ZvTgtSegmentFix::Kept;
  far = s.far;
  if (!s.hasSegment) return true;
  // Every Update starts again from the saved far handle: it only leaves its place while the
  // drag needs it to.
  if (ZvStdFCurve_IsCubicSegmentValid(s.key, handle, s.savedFar, s.farKey)) {
    far = s.savedFar;
    return true;
  }
  const double x0 = s.key.x, x1 = handle.x, x2 = s.savedFar.x, x3 = s.farKey.x;
  double lo, hi;
  // A far handle standing on its key has no line to slide along.
  if (std::fabs(x2 - x3) > 1e-07 && ComputeP2ValidInterval(x0, x1, x3, lo, hi)) {
    const double x = Nearer(lo, hi, x2);
    far = {x, s.farKey.y + (s.savedFar.y - s.farKey.y) * (x - x3) * s.inverseFarDx};
    return true;
  }
  // The far handle cannot give: the dragged one goes back along its line, against the far
  // handle where the last Update left it.
  const double cx = s.far.x;
  if (std::fabs(x1 - x0) <= 1e-07 || !(x1 > cx) || !ComputeP1ValidInterval(x0, cx, x3, lo, hi)) {
    return false;
  }
  const double x = Nearer(lo, hi, x1);
  handle = {x, s.key.y + (handle.y - s.key.y) * (x - x0) / (x1 - x0)};
  fix = ZvTgtSegmentFix::PulledBack;
  return true;
}
