// Transforms of ZvPath2f: every point changes in place, the codes stay.
#include <zv/path2f.h>
#include <zv/transfo4.h>

#include "shape/shape_lock.h"

ZvShape2f& ZvPath2f::Translate(const ZvPoint2<float>& offset) {
  ZvShapeLock guard(*this);
  for (unsigned int i = 0; i < points.size; ++i)
    points[i] += offset;
  return *this;
}

ZvShape2f& ZvPath2f::Rotate(double degrees, const ZvPoint2<float>& center) {
  ZvTransfo4 t;
  t.Rotate(degrees, ZvPoint3<double>{center.x, center.y, 0.0},
           ZvPoint3<double>{center.x, center.y, 1.0});
  return Transform(t);
}

ZvShape2f& ZvPath2f::Scale(double sx, double sy, const ZvPoint2<float>& center) {
  ZvTransfo4 t;
  t.Scale(sx, sy, 1.0, ZvPoint3<double>{center.x, center.y, 0.0});
  return Transform(t);
}

ZvShape2f& ZvPath2f::ShearX(double a, double b) {
  ZvTransfo4 t;
  t.ShearXZ(a, 0.0, ZvPoint3<double>{0.0, b, 0.0});
  return Transform(t);
}

ZvShape2f& ZvPath2f::ShearY(double a, double b) {
  ZvTransfo4 t;
  t.ShearYZ(a, 0.0, ZvPoint3<double>{b, 0.0, 0.0});
  return Transform(t);
}

ZvShape2f& ZvPath2f::Transform(const ZvTransfo4& transform) {
  ZvShapeLock guard(*this);
  transform.MapInPlace(points.data, points.size);
  return *this;
}
