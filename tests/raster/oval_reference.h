// Brute-force references for the direct conversions: each pixel centre tested on its own, with
// the rules that add pixels applied row by row. A reference answers false when some centre (or
// row, or chord middle) lies so close to a boundary that rounding may decide it either way; the
// caller then draws another shape.
#ifndef ZV_TESTS_RASTER_OVAL_REFERENCE_H
#define ZV_TESTS_RASTER_OVAL_REFERENCE_H

#include <zv/point.h>

#include <cmath>
#include <vector>

// A set of drawing-row pixels, 1 for painted.
struct Mask {
  int w, h;
  std::vector<int> px;
  Mask(int width, int height) : w(width), h(height), px(static_cast<std::size_t>(width) * height) {}
  void Span(int row, long long x0, long long x1) {
    if (row < 0 || row >= h) return;
    for (long long x = x0 < 0 ? 0 : x0; x <= x1 && x < w; ++x)
      px[static_cast<std::size_t>(row) * w + x] = 1;
  }
  int At(int x, int row) const { return px[static_cast<std::size_t>(row) * w + x]; }
};

// Axis-aligned: centre snapped to a pixel corner, b^2 dx^2 + a^2 dy^2 <= a^2 b^2.
inline bool IsotheticReference(const ZvPoint2<float>& p0, const ZvPoint2<float>& p1,
                               const ZvPoint2<float>& p2, Mask& m) {
  const double a = 0.5 * std::fabs(double(p1.x) - p0.x), b = 0.5 * std::fabs(double(p2.y) - p0.y);
  const double cx = std::floor((double(p1.x) + p2.x) / 2 + 0.5);
  const double cy = std::floor((double(p1.y) + p2.y) / 2 + 0.5);
  const double limit = a * a * b * b;
  for (int y = 0; y < m.h; ++y)
    for (int x = 0; x < m.w; ++x) {
      const double dx = x + 0.5 - cx, dy = y + 0.5 - cy;
      const double e = b * b * dx * dx + a * a * dy * dy;
      if (std::fabs(e - limit) <= 1e-9 * limit) return false;
      if (e <= limit) m.px[static_cast<std::size_t>(y) * m.w + x] = 1;
    }
  return true;
}

// Squared radius of (x, y) in the frame's unit circle, by solving p - m = s u + t v.
struct UnitCircle {
  double ux, uy, vx, vy, mx, my, det;
  UnitCircle(const ZvPoint2<float>& p0, const ZvPoint2<float>& p1, const ZvPoint2<float>& p2)
      : ux(0.5 * (double(p1.x) - p0.x)),
        uy(0.5 * (double(p1.y) - p0.y)),
        vx(0.5 * (double(p2.x) - p0.x)),
        vy(0.5 * (double(p2.y) - p0.y)),
        mx(0.5 * (double(p1.x) + p2.x)),
        my(0.5 * (double(p1.y) + p2.y)),
        det(ux * vy - uy * vx) {}
  double Q(double x, double y) const {
    const double dx = x - mx, dy = y - my;
    const double s = (dx * vy - dy * vx) / det, t = (ux * dy - uy * dx) / det;
    return s * s + t * t;
  }
};

// Any oval: centres with Q <= 1.000001; a row of the oval whose chord misses every centre gets
// the pixel under the chord's middle; each row is widened to touch the previous row's span.
inline bool GeneralReference(const ZvPoint2<float>& p0, const ZvPoint2<float>& p1,
                             const ZvPoint2<float>& p2, Mask& m) {
  const UnitCircle f(p0, p1, p2);
  const double K = 1.000001;
  const double ex = std::sqrt(f.ux * f.ux + f.vx * f.vx), ey = std::sqrt(f.uy * f.uy + f.vy * f.vy);
  const long long x0 = static_cast<long long>(std::floor(f.mx - ex)) - 3;
  const long long x1 = static_cast<long long>(std::ceil(f.mx + ex)) + 3;
  const int r0 = static_cast<int>(std::floor(f.my - ey)) - 3,
            r1 = static_cast<int>(std::ceil(f.my + ey)) + 3;
  bool havePrev = false;
  long long ps = 0, pe = 0;
  for (int row = r0; row <= r1; ++row) {
    const double y = row + 0.5;
    // Q along the row is a parabola in x: its vertex and least value from three samples.
    const double q0 = f.Q(f.mx, y), qp = f.Q(f.mx + 1, y), qm = f.Q(f.mx - 1, y);
    const double alpha = (qp - 2 * q0 + qm) / 2, beta = (qp - qm) / 2;
    const double middle = f.mx - beta / (2 * alpha), least = q0 - beta * beta / (4 * alpha);
    if (std::fabs(least - K) < 1e-9) return false;
    if (least > K) {
      havePrev = false;
      continue;
    }
    long long s = 1, e = 0;
    for (long long x = x0; x <= x1; ++x) {
      const double q = f.Q(x + 0.5, y);
      if (std::fabs(q - K) < 1e-9) return false;
      if (q <= K) {
        if (s > e) s = x;
        e = x;
      }
    }
    if (s > e) {
      if (std::fabs(middle - std::floor(middle) - 0.0) < 1e-9 ||
          std::fabs(middle - std::floor(middle) - 1.0) < 1e-9)
        return false;
      s = e = static_cast<long long>(std::floor(middle));
    }
    long long ws = s, we = e;
    if (havePrev) {
      if (ws > pe + 1) ws = pe + 1;
      if (we < ps - 1) we = ps - 1;
    }
    havePrev = true;
    ps = s;
    pe = e;
    m.Span(row, ws, we);
  }
  return true;
}

// The quadrilateral p0, p1, d = p1 + p2 - p0 (in single precision, as stored), p2: centres on
// the inner side of all four edges, or on one.
inline bool RectReference(const ZvPoint2<float>& p0, const ZvPoint2<float>& p1,
                          const ZvPoint2<float>& p2, Mask& m) {
  const ZvPoint2<float> p3 = p1 + p2 - p0;
  const ZvPoint2<float> ring[4] = {p0, p1, p3, p2};
  const double turn =
      (double(p1.x) - p0.x) * (double(p2.y) - p0.y) - (double(p1.y) - p0.y) * (double(p2.x) - p0.x);
  for (int y = 0; y < m.h; ++y)
    for (int x = 0; x < m.w; ++x) {
      double margin = 1e300;
      for (int i = 0; i < 4; ++i) {
        const ZvPoint2<float>& s = ring[i];
        const ZvPoint2<float>& e = ring[(i + 1) & 3];
        const double ex = double(e.x) - s.x, ey = double(e.y) - s.y;
        const double cross = ex * (y + 0.5 - s.y) - ey * (x + 0.5 - s.x);
        const double d = (turn > 0 ? cross : -cross) / std::sqrt(ex * ex + ey * ey);
        if (d < margin) margin = d;
      }
      if (std::fabs(margin) < 1e-7) return false;
      if (margin > 0) m.px[static_cast<std::size_t>(y) * m.w + x] = 1;
    }
  return true;
}

#endif
