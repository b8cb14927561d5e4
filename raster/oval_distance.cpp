// Distance rasters of ovals, and the disks that the outline mode stamps.
#include <zv/transfo4.h>

#include <cmath>

#include "raster/oval_form.h"
#include "raster/oval_scan.h"
#include "raster/oval_span.h"

namespace {
// Below this a half side counts as nothing, as in the plain fill.
constexpr double kThinSide = 9.9999997e-05;
}  // namespace

void FillDistanceRasterIsothetic(const ZvPoint2<float>& p0, const ZvPoint2<float>& p1,
                                 const ZvPoint2<float>& p2, double o, ZvRaster<float>& distance) {
  const double ux = double(p1.x) - p0.x, uy = double(p1.y) - p0.y;
  const double vx = double(p2.x) - p0.x, vy = double(p2.y) - p0.y;
  const bool uAlongX = std::fabs(ux) + std::fabs(vy) >= std::fabs(uy) + std::fabs(vx);
  const double a = 0.5 * std::fabs(uAlongX ? ux : vx), b = 0.5 * std::fabs(uAlongX ? vy : uy);
  const double mx = (double(p1.x) + p2.x) / 2, my = (double(p1.y) + p2.y) / 2;
  if (a < kThinSide || b < kThinSide ||
      !(std::fabs(mx) < zv_oval::kCoordinateLimit && std::fabs(my) < zv_oval::kCoordinateLimit))
    return;
  const int cx = static_cast<int>(std::floor(mx + 0.5)),
            cy = static_cast<int>(std::floor(my + 0.5));
  const int w = distance.GetWidth(), h = distance.GetHeight();
  const double aa = a * a, bb = b * b, limit = aa * bb, ab = a * b;
  const auto put = [&](long long x, long long row, double e) {
    if (x < 0 || x >= w || row < 0 || row >= h) return;
    const double d = std::sqrt(e) / ab;
    distance.SetValWhenSmaller(static_cast<int>(x),
                               distance.ConvertBottomUpY(static_cast<int>(row)),
                               static_cast<float>(d < 1.0 ? d : 1.0));
  };
  // Top to middle as in the plain fill, over the pairs of rows and the columns of which one
  // can be seen; each inside pixel serves its four mirror images.
  long long first, reach, rLo, rHi;
  zv_oval::MirroredRange(cx, w, first, reach);
  zv_oval::MirroredRange(cy, h, rLo, rHi);
  const double rmax = std::ceil(b) - 1;
  if (rHi > rmax) rHi = static_cast<long long>(rmax);
  if (rHi < rLo || reach < first) return;
  int r = static_cast<int>(rHi);
  double er = aa * (r + o) * (r + o), der = aa * (1 - 2 * o - 2 * r);
  for (; r >= rLo; --r, er += der, der += 2 * aa) {
    const long long up = static_cast<long long>(cy) + r, down = static_cast<long long>(cy) - r - 1;
    double ex = bb * (first + o) * (first + o), dex = bb * (2 * first + 1 + 2 * o);
    for (long long x = first; x <= reach && ex + er <= limit; ++x, ex += dex, dex += 2 * bb) {
      double e = ex + er;
      // The steps accumulate rounding; near the centre that could dip below 0.
      if (e < 0) e = bb * (x + o) * (x + o) + aa * (r + o) * (r + o);
      if (e < 0) e = 0;
      put(cx + x, up, e);
      put(cx - x - 1, up, e);
      put(cx + x, down, e);
      put(cx - x - 1, down, e);
    }
  }
}

void FillDistanceRaster(const ZvPoint2<float>& p0, const ZvPoint2<float>& p1,
                        const ZvPoint2<float>& p2, double o, ZvRaster<float>& distance) {
  const zv_oval::OvalForm form(p0, p1, p2);
  if (form.Degenerate()) return;
  // The unit square onto the frame, undone: s and t run 0..1 across it, the unit circle's
  // coordinates are 2s - 1 and 2t - 1.
  ZvTransfo4 frame, inverse;
  frame.SetTo4PointTransform({p0.x, p0.y, 0.0}, {p1.x, p1.y, 0.0}, {p2.x, p2.y, 0.0},
                             {p0.x, p0.y, 1.0});
  if (!frame.Inverse(inverse)) return;
  const double su = 2 * inverse.GetMatrixElement(0, 0), sv = 2 * inverse.GetMatrixElement(1, 0);
  const double tu = 2 * inverse.GetMatrixElement(0, 1), tv = 2 * inverse.GetMatrixElement(1, 1);
  const double ou = 2 * inverse.GetMatrixElement(0, 3) - 1,
               ov = 2 * inverse.GetMatrixElement(1, 3) - 1;
  const int w = distance.GetWidth();
  form.Rows(o, w, distance.GetHeight(), [&](int row, double s, double e, double) {
    if (row < 0 || s > e) return;
    const int x0 = s < 0 ? 0 : static_cast<int>(s), x1 = e > w - 1 ? w - 1 : static_cast<int>(e);
    const double y = row + o;
    double u = su * (x0 + o) + tu * y + ou, v = sv * (x0 + o) + tv * y + ov;
    const int stored = distance.ConvertBottomUpY(row);
    for (int x = x0; x <= x1; ++x, u += su, v += sv) {
      const double d = std::sqrt(u * u + v * v);
      distance.SetValWhenSmaller(x, stored, static_cast<float>(d < 1.0 ? d : 1.0));
    }
  });
}

void DiskRasterSetup(ZvRaster<float>& disk, int r) {
  for (int i = 0; i <= r; ++i) {
    for (int j = 0; j <= r; ++j) {
      const double d2 = double(i) * i + double(j) * j;
      const double d = d2 <= 1e-09 ? 0.0 : std::sqrt(d2);
      if (d > r) break;
      const float v = static_cast<float>(d);
      disk.SetValWhenSmaller(r + i, r + j, v);
      disk.SetValWhenSmaller(r - i, r + j, v);
      disk.SetValWhenSmaller(r + i, r - j, v);
      disk.SetValWhenSmaller(r - i, r - j, v);
    }
  }
}

void StampDisk(const ZvRaster<float>& disk, int r, int x, int row, ZvRaster<float>& target) {
  const int w = target.GetWidth(), h = target.GetHeight();
  for (int j = 0; j <= 2 * r; ++j) {
    const int y = row - r + j;
    if (y < 0 || y >= h) continue;
    const int stored = target.ConvertBottomUpY(y);
    for (int i = 0; i <= 2 * r; ++i) {
      const int px = x - r + i;
      if (px >= 0 && px < w) target.SetValWhenSmaller(px, stored, disk.GetVal(i, j));
    }
  }
}

void FillDisks(int dx, int dy, double cx, double cy, int r, const ZvRaster<float>& disk,
               ZvRaster<float>& target) {
  const int x = static_cast<int>(cx), y = static_cast<int>(cy);
  StampDisk(disk, r, x + dx, y + dy, target);
  StampDisk(disk, r, x - dx - 1, y + dy, target);
  StampDisk(disk, r, x + dx, y - dy - 1, target);
  StampDisk(disk, r, x - dx - 1, y - dy - 1, target);
}
