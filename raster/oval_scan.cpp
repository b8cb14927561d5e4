// Plain fills of ovals: the elliptic walk for axis-aligned ones, the quadratic form for the rest.
#include "raster/oval_scan.h"

#include <cmath>

#include "raster/oval_form.h"
#include "raster/oval_span.h"

int SolveQuadraticEquation(double& lo, double& hi, double a, double b, double c) {
  const double h = b * 0.5;
  const double d = h * h - a * c;
  if (d < 0.0) return 0;
  double s = std::sqrt(d);
  if (std::fabs(h) >= 1e-07) s = std::copysign(s, h);
  // q has the magnitude of the larger root's numerator: no cancellation in either quotient.
  const double q = -(h + s);
  double r0 = q / a, r1 = c / q;
  if (r0 > r1) std::swap(r0, r1);
  lo = r0;
  hi = r1;
  return 1;
}

namespace {

using zv_oval::kCoordinateLimit;

// Below this a half side counts as nothing: the frame has collapsed to a segment or a point.
constexpr double kThinSide = 9.9999997e-05;

// Half width (along x) and half height (along y) of an axis-aligned frame, whichever of its two
// sides runs along x.
void IsotheticHalfSides(const ZvPoint2<float>& p0, const ZvPoint2<float>& p1,
                        const ZvPoint2<float>& p2, double& a, double& b) {
  const double ux = double(p1.x) - p0.x, uy = double(p1.y) - p0.y;
  const double vx = double(p2.x) - p0.x, vy = double(p2.y) - p0.y;
  if (std::fabs(ux) + std::fabs(vy) >= std::fabs(uy) + std::fabs(vx)) {
    a = 0.5 * std::fabs(ux);
    b = 0.5 * std::fabs(vy);
  } else {
    a = 0.5 * std::fabs(vx);
    b = 0.5 * std::fabs(uy);
  }
}

}  // namespace

template <class T>
void ScanConvertIsothetic(const ZvPoint2<float>& p0, const ZvPoint2<float>& p1,
                          const ZvPoint2<float>& p2, double o, ZvRaster<T>& raster, T value,
                          ZvRaster<float>& distance, int radius, OvalFillMode mode) {
  zv_oval::SpanWriter<T> out(raster, value, distance, radius, mode == OvalFillOutlineDisks);
  double a, b;
  IsotheticHalfSides(p0, p1, p2, a, b);
  const double mx = (double(p1.x) + p2.x) / 2, my = (double(p1.y) + p2.y) / 2;
  if (!(std::fabs(mx) < kCoordinateLimit && std::fabs(my) < kCoordinateLimit)) return;
  if (a < kThinSide || b < kThinSide) {
    if (mode < OvalFillDegenerate) return;
    // What is left of the oval: a one-pixel row, column or single pixel through its centre.
    const double ha = a < kThinSide ? 0.0 : a, hb = b < kThinSide ? 0.0 : b;
    out.Segment(mx - ha, my - hb, mx + ha, my + hb);
    return;
  }
  // The centre snapped to a pixel corner makes the oval symmetric in whole pixels, so that one
  // walk serves the four quarters.
  const int cx = static_cast<int>(std::floor(mx + 0.5)),
            cy = static_cast<int>(std::floor(my + 0.5));
  const int w = out.Width(), h = out.Height();
  // Pair r holds rows cy + r and cy - r - 1; walk only the pairs of which a row can be seen.
  long long rLo, rHi;
  zv_oval::MirroredRange(cy, h, rLo, rHi);
  const double rmax = std::ceil(b) - 1;
  if (rHi > rmax) rHi = static_cast<long long>(rmax);
  if (rHi < rLo) return;
  int r = static_cast<int>(rHi);
  const double aa = a * a, bb = b * b, limit = aa * bb;
  // e(x, r) = b^2 (x + o)^2 + a^2 (r + o)^2 kept as its row and column terms, each stepped by
  // its exact forward difference, whose own increment is constant.
  double er = aa * (r + o) * (r + o), der = aa * (1 - 2 * o - 2 * r);
  double ex = bb * o * o, dex = bb * (1 + 2 * o);
  while (r >= rLo && ex + er > limit) {
    er += der;
    der += 2 * aa;
    --r;
  }
  // Once the span reaches past both sides of the raster the wider rows below cover it too; the
  // walk stops there rather than crossing an enormous oval pixel by pixel.
  long long seenLo, reach;
  zv_oval::MirroredRange(cx, w, seenLo, reach);
  if (out.Disks()) reach += radius + 1;
  long long x = 0;
  long long prevK = -1;
  const auto col = [w](long long v) { return static_cast<int>(v < -1 ? -1 : v > w ? w : v); };
  for (; r >= rLo; --r) {
    // Seen far from its centre, a wide oval's edge can lie millions of pixels out: jump close
    // below it (and back to where e is inside, should rounding put the jump beyond) rather than
    // step there one pixel at a time.
    const double t = (r + o) / b, guess = a * std::sqrt(t < 1 ? 1 - t * t : 0.0) - o - 2;
    if (guess > x + 64 && reach > x) {
      x = guess < reach ? static_cast<long long>(guess) : reach;
      for (;; --x) {
        ex = bb * (x + o) * (x + o);
        dex = bb * (2 * x + 1 + 2 * o);
        if (x == 0 || ex + er <= limit) break;
      }
    }
    while (x < reach && ex + dex + er <= limit) {
      ex += dex;
      dex += 2 * bb;
      ++x;
    }
    out.Span(cy + r, col(cx - x - 1), col(cx + x));
    out.Span(cy - r - 1, col(cx - x - 1), col(cx + x));
    if (out.Disks()) {
      for (long long k = prevK + 1; k <= x; ++k)
        out.Disks(static_cast<int>(k), r, cx, cy);
      if (x == prevK) out.Disks(static_cast<int>(x), r, cx, cy);
    }
    prevK = x;
    er += der;
    der += 2 * aa;
  }
}

namespace zv_oval {

OvalForm::OvalForm(const ZvPoint2<float>& p0, const ZvPoint2<float>& p1, const ZvPoint2<float>& p2)
    : ux(0.5 * (double(p1.x) - p0.x)),
      uy(0.5 * (double(p1.y) - p0.y)),
      vx(0.5 * (double(p2.x) - p0.x)),
      vy(0.5 * (double(p2.y) - p0.y)),
      mx(0.5 * (double(p1.x) + p2.x)),
      my(0.5 * (double(p1.y) + p2.y)) {
  const double uu = ux * ux + uy * uy, vv = vx * vx + vy * vy, det = ux * vy - uy * vx;
  degenerate_ = !(std::fabs(mx) < kCoordinateLimit && std::fabs(my) < kCoordinateLimit) ||
                !(4 * uu > 1e-09 && 4 * vv > 1e-09 && det * det > 1e-12 * uu * vv);
  if (degenerate_) return;
  const double m00 = vy / det, m01 = -vx / det, m10 = -uy / det, m11 = ux / det;
  A = m00 * m00 + m10 * m10;
  B = 2 * (m00 * m01 + m10 * m11);
  C = m01 * m01 + m11 * m11;
}

}  // namespace zv_oval

template <class T>
void ScanConvert(const ZvPoint2<float>& p0, const ZvPoint2<float>& p1, const ZvPoint2<float>& p2,
                 double o, ZvRaster<T>& raster, T value, ZvRaster<float>& distance, int radius,
                 OvalFillMode mode) {
  zv_oval::SpanWriter<T> out(raster, value, distance, radius, mode == OvalFillOutlineDisks);
  const zv_oval::OvalForm form(p0, p1, p2);
  if (form.Degenerate()) {
    if (mode < OvalFillDegenerate ||
        !(std::fabs(form.mx) < kCoordinateLimit && std::fabs(form.my) < kCoordinateLimit))
      return;
    // Collapsed onto the longer side's line, the oval reaches sqrt(|u|^2 + |v|^2) either way.
    const double uu = form.ux * form.ux + form.uy * form.uy;
    const double vv = form.vx * form.vx + form.vy * form.vy;
    const double lx = uu >= vv ? form.ux : form.vx, ly = uu >= vv ? form.uy : form.vy;
    const double l2 = uu >= vv ? uu : vv, k = l2 > 0.0 ? std::sqrt((uu + vv) / l2) : 0.0;
    out.Segment(form.mx - k * lx, form.my - k * ly, form.mx + k * lx, form.my + k * ly);
    return;
  }
  const int w = out.Width();
  bool havePrev = false;
  double ps = 0, pe = 0;
  // Row -1 is walked, not written: the row under it widens towards it.
  form.Rows(o, w, out.Height(), [&](int row, double s, double e, double middle) {
    // A row of the oval whose chord misses every centre still gets its middle pixel, so that a
    // thin oval does not break into pieces.
    if (s > e) s = e = middle;
    double ws = s, we = e;
    if (havePrev) {
      // Touch the previous row's own span: a steep thin oval stays connected.
      if (ws > pe + 1) ws = pe + 1;
      if (we < ps - 1) we = ps - 1;
    }
    havePrev = true;
    ps = s;
    pe = e;
    const int x0 = zv_oval::ClampIndex(ws, w), x1 = zv_oval::ClampIndex(we, w);
    out.Span(row, x0, x1);
    if (out.Disks() && out.HasRow(row)) {
      out.Disk(x0, row);
      out.Disk(x1, row);
      for (int x = x0 + 1; x < zv_oval::ClampIndex(s, w); ++x)
        out.Disk(x, row);
      for (int x = zv_oval::ClampIndex(e, w) + 1; x < x1; ++x)
        out.Disk(x, row);
    }
  });
}

#define ZV_OVAL_SCAN(T)                                                                           \
  template void ScanConvertIsothetic<T>(const ZvPoint2<float>&, const ZvPoint2<float>&,           \
                                        const ZvPoint2<float>&, double, ZvRaster<T>&, T,          \
                                        ZvRaster<float>&, int, OvalFillMode);                     \
  template void ScanConvert<T>(const ZvPoint2<float>&, const ZvPoint2<float>&,                    \
                               const ZvPoint2<float>&, double, ZvRaster<T>&, T, ZvRaster<float>&, \
                               int, OvalFillMode);
ZV_OVAL_SCAN(unsigned char)
ZV_OVAL_SCAN(short)
ZV_OVAL_SCAN(float)
