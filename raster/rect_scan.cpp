// Plain fill of a rectangle under any affine map: its four edges swept in row order.
#include <cmath>
#include <cstdlib>

#include "raster/oval_scan.h"
#include "raster/oval_span.h"

namespace {
// The slope stored for a horizontal edge: such an edge has no crossing, only its x range.
constexpr double kHorizontal = 3.4028234663852886e38;
}  // namespace

void AppendEdge(S_Edge* edges, double x0, double y0, double x1, double y1, double offset,
                unsigned int& count) {
  if (y0 > y1) {
    std::swap(x0, x1);
    std::swap(y0, y1);
  }
  S_Edge& e = edges[count];
  e.yTop = y0;
  e.yBottom = y1;
  const double t = y0 - offset;
  double row = std::trunc(t);
  // The first row whose centre is not above the top; a top a hair above a centre keeps it.
  if (t >= 0 && t - row >= 1e-09) row = std::trunc(t + 1);
  if (row < 0) row = 0;
  if (row > zv_oval::kCoordinateLimit) row = zv_oval::kCoordinateLimit;
  e.firstRow = static_cast<int>(row);
  if (y1 == y0) {
    e.dxdy = kHorizontal;
    e.x = x0 < x1 ? x0 : x1;
  } else {
    e.dxdy = (x1 - x0) / (y1 - y0);
    e.x = e.dxdy * (offset - y0 + row) + x0;
  }
  const double f0 = std::floor(x0 < x1 ? x0 : x1), f1 = std::floor(x0 < x1 ? x1 : x0);
  const double lim = zv_oval::kCoordinateLimit;
  e.xMinPixel = static_cast<int>(f0 < -lim ? -lim : f0 > lim ? lim : f0);
  e.xMaxPixel = static_cast<int>(f1 < -lim ? -lim : f1 > lim ? lim : f1);
  ++count;
}

int CompareEdgesY(const void* a, const void* b) {
  const S_Edge& p = *static_cast<const S_Edge*>(a);
  const S_Edge& q = *static_cast<const S_Edge*>(b);
  if (p.yTop < q.yTop) return -1;
  if (p.yTop > q.yTop) return 1;
  return q.x < p.x ? 1 : -1;
}

template <class T>
void ScanConvert(const ZvPoint2<float>& p0, const ZvPoint2<float>& p1, const ZvPoint2<float>& p2,
                 double o, ZvRaster<T>& raster, T value, ZvRaster<float>& distance,
                 RectFillMode mode) {
  // Outline disks of a rectangle have no radius of their own: they mark the outline pixels.
  zv_oval::SpanWriter<T> out(raster, value, distance, 0, mode == RectFillOutlineDisks);
  const ZvPoint2<float> p3 = p1 + p2 - p0;  // the fourth corner, in single precision as stored
  const ZvPoint2<double> c[4] = {
      {p0.x, p0.y}, {p1.x, p1.y}, {p3.x, p3.y}, {p2.x, p2.y}};  // around the outline
  for (const ZvPoint2<double>& p : c)
    if (!(std::fabs(p.x) < zv_oval::kCoordinateLimit && std::fabs(p.y) < zv_oval::kCoordinateLimit))
      return;
  const double area = (c[1].x - c[0].x) * (c[3].y - c[0].y) - (c[1].y - c[0].y) * (c[3].x - c[0].x);
  if (std::fabs(area) < 1e-7) {
    if (mode < RectFillDegenerate) return;
    // Collapsed onto a line: the longer diagonal spans it.
    const double d02 = std::hypot(c[2].x - c[0].x, c[2].y - c[0].y);
    const double d13 = std::hypot(c[3].x - c[1].x, c[3].y - c[1].y);
    const int i = d02 >= d13 ? 0 : 1;
    out.Segment(c[i].x, c[i].y, c[i + 2].x, c[i + 2].y);
    return;
  }
  S_Edge edges[4];
  unsigned int count = 0;
  for (int i = 0; i < 4; ++i)
    AppendEdge(edges, c[i].x, c[i].y, c[(i + 1) & 3].x, c[(i + 1) & 3].y, o, count);
  std::qsort(edges, count, sizeof(S_Edge), CompareEdgesY);
  double bottom = edges[0].yBottom;
  for (const S_Edge& e : edges)
    if (e.yBottom > bottom) bottom = e.yBottom;
  const int h = out.Height(), w = out.Width();
  const double lastRow = std::floor(bottom - o);
  const int rowLast = lastRow > h - 1 ? h - 1 : static_cast<int>(lastRow);
  // A convex outline: each row's span runs from the leftmost to the rightmost crossing of the
  // edges that hold the row's centre. A horizontal edge adds nothing: a centre on it is also the
  // end of both its neighbours, which cross there.
  for (int row = edges[0].firstRow; row <= rowLast; ++row) {
    const double y = row + o;
    double left = 0, right = -1;
    bool any = false;
    for (S_Edge& e : edges) {
      if (e.dxdy == kHorizontal || row < e.firstRow || y > e.yBottom) continue;
      if (!any || e.x < left) left = e.x;
      if (!any || e.x > right) right = e.x;
      any = true;
      e.x += e.dxdy;
    }
    if (!any) continue;
    const int x0 = zv_oval::ClampIndex(std::ceil(left - o), w);
    const int x1 = zv_oval::ClampIndex(std::floor(right - o), w);
    if (x0 > x1) continue;
    out.Span(row, x0, x1);
    if (out.Disks()) {
      out.Disk(x0, row);
      out.Disk(x1, row);
    }
  }
}

#define ZV_RECT_SCAN(T)                                                                           \
  template void ScanConvert<T>(const ZvPoint2<float>&, const ZvPoint2<float>&,                    \
                               const ZvPoint2<float>&, double, ZvRaster<T>&, T, ZvRaster<float>&, \
                               RectFillMode);
ZV_RECT_SCAN(unsigned char)
ZV_RECT_SCAN(short)
ZV_RECT_SCAN(float)
