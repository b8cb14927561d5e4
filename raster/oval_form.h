// The implicit quadratic form of an oval in any position, and its walk over the rows.
#ifndef ZV_RASTER_OVAL_FORM_H
#define ZV_RASTER_OVAL_FORM_H

#include <zv/point.h>

#include <cmath>

#include "raster/oval_scan.h"

namespace zv_oval {

// Q(dx, dy) = A dx^2 + B dx dy + C dy^2 about the centre (mx, my) is the squared radius of a
// point once the frame's matrix is undone: the oval is Q <= 1.
class OvalForm {
 public:
  OvalForm(const ZvPoint2<float>& p0, const ZvPoint2<float>& p1, const ZvPoint2<float>& p2);

  // No area: a side of squared length at most 1e-9, two sides parallel to a squared sine of
  // 1e-12, or a centre beyond any raster.
  bool Degenerate() const { return degenerate_; }
  // Half sides u, v and centre m: the oval is m + s u + t v for s^2 + t^2 <= 1.
  double ux, uy, vx, vy, mx, my;
  double A = 0, B = 0, C = 0;

  // Walks the rows first..last (drawing rows, clipped to -1..height-1) whose centres lie within
  // the oval's height, calling f(row, s, e, middle): the pixels s..e of the row whose centres
  // have Q <= 1.000001 (s > e when none has), and, for such an empty row, the column of the
  // chord's middle. s and e are
  // whole numbers in double; the first and last are exact only within a pixel of the raster.
  template <class F>
  void Rows(double o, int w, int h, F f) const;

 private:
  bool degenerate_;
};

template <class F>
void OvalForm::Rows(double o, int w, int h, F f) const {
  // The bound sits a hair above 1 so that a centre exactly on the outline stays inside whatever
  // the rounding of the coefficients.
  const double K = 1.000001;
  // Rows where Q - K has real roots in dx: its discriminant as a function of dy.
  double lo, hi;
  if (!SolveQuadraticEquation(lo, hi, B * B - 4 * A * C, 0.0, 4 * A * K)) return;
  const double first = std::ceil(my + lo - o), last = std::floor(my + hi - o);
  // Row -1 is walked (not written) when the oval reaches above the raster: row 0 may widen
  // towards it.
  const int rowFirst = !(first > -1) ? -1 : first > h ? h : static_cast<int>(first);
  const int rowLast = !(last < h - 1) ? h - 1 : last < -2 ? -2 : static_cast<int>(last);
  const double inv2A = 0.5 / A;
  for (int row = rowFirst; row <= rowLast; ++row) {
    const double dy = row + o - my, bx = B * dy, cdy = C * dy * dy;
    const auto q = [&](double i) {
      const double dx = i + o - mx;
      return (A * dx + bx) * dx + cdy;
    };
    double s = 1, e = 0;
    const double disc = bx * bx - 4 * A * (cdy - K);
    if (disc >= 0) {
      const double root = std::sqrt(disc);
      const double ts = mx + (-bx - root) * inv2A - o, te = mx + (-bx + root) * inv2A - o;
      s = std::ceil(ts);
      e = std::floor(te);
      // The roots only place the ends; where a root lies within its rounding error of a whole
      // number the bound on Q decides, pixel by pixel. The error grows as the chord shrinks
      // (the roots are ill-conditioned where the row touches the outline). Only the columns
      // that matter are refined: one beyond each side of the raster stands for all beyond.
      // The slack is kept multiplied by the root, so that no row divides.
      const double slackRoot =
          (1e-9 + 1e-13 * (std::fabs(mx) + std::fabs(ts) + std::fabs(te))) * root +
          2e-15 * (bx * bx + 4 * A * std::fabs(cdy - K)) * inv2A;
      const bool nearS = (s - ts) * root <= slackRoot || (ts - (s - 1)) * root <= slackRoot;
      const bool nearE = (te - e) * root <= slackRoot || ((e + 1) - te) * root <= slackRoot;
      if (nearS && s >= -2 && s <= w + 1) {
        while (s > -2 && q(s - 1) <= K)
          --s;
        while (s <= e && s <= w + 1 && q(s) > K)
          ++s;
      }
      if (nearE && e >= -2 && e <= w + 1) {
        while (e < w + 1 && q(e + 1) <= K)
          ++e;
        while (e >= s && e >= -2 && q(e) > K)
          --e;
      }
    }
    // The chord's middle column matters only to a row whose chord misses every centre.
    f(row, s, e, s > e ? std::floor(mx - bx * inv2A - o + 0.5) : 0.0);
  }
}

}  // namespace zv_oval

#endif
