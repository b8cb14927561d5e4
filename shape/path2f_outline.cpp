// Path outlines of rectangles and ovals, read through the shape contract from their handles.
#include <zv/path2f.h>

#include "shape/shape_lock.h"

void ZvPath2f::SetToRectOutline(const ZvShape2f& rect) {
  // Corners 2, 4, 6, 8 and back to 2: a closed polyline of five points.
  ZvShapeLock guard(*this);
  Moveto(rect.GetPoint(2));
  Lineto(rect.GetPoint(4));
  Lineto(rect.GetPoint(6));
  Lineto(rect.GetPoint(8));
  Lineto(rect.GetPoint(2));
  Closeto();
}

void ZvPath2f::SetToOvalOutline(const ZvShape2f& oval) {
  // Handles 1..8 alternate between points on the oval (even positions here) and corners of the
  // bounding parallelogram (odd positions); the first is repeated as a ninth.
  ZvPoint2<double> p[9];
  oval.GetPoints(1, 8, p);
  p[8] = p[0];
  // The cubic handle length of a quarter ellipse, as a fraction of the way to the corner.
  const double k = 0.5522847498307935;
  const auto narrow = [](const ZvPoint2<double>& q) {
    return ZvPoint2<float>{static_cast<float>(q.x), static_cast<float>(q.y)};
  };
  ZvShapeLock guard(*this);
  Moveto(narrow(p[0]));
  for (int j = 0; j < 8; j += 2)
    Curveto(narrow(p[j] + (p[j + 1] - p[j]) * k), narrow(p[j + 2] + (p[j + 1] - p[j + 2]) * k),
            narrow(p[j + 2]));
  Closeto();
}
