// ZvTransfo4 editing: translate, scale, rotate and shear. Every edit post-multiplies, so it acts
// on points before the existing transform, in the transform's local frame.
#include <zv/transfo4.h>

#include "core/transfo4_sincos.h"

#include <cmath>

namespace {

ZvPoint3<double> ToDouble(const ZvPoint3<float>& p) {
  return {p.x, p.y, p.z};
}

// T(center) local T(-center): `local` acting about center instead of the origin.
ZvTransfo4 About(const ZvPoint3<double>& center, const ZvTransfo4& local) {
  ZvTransfo4 t;
  t.Translate(center).PostMultiply(local).Translate(-center);
  return t;
}

}  // namespace

ZvTransfo4& ZvTransfo4::Translate(double dx, double dy, double dz) {
  for (int row = 0; row < 4; ++row)
    m[row + 12] += dx * m[row] + dy * m[row + 4] + dz * m[row + 8];
  return *this;
}
ZvTransfo4& ZvTransfo4::Translate(const ZvPoint3<float>& d) {
  return Translate(d.x, d.y, d.z);
}
ZvTransfo4& ZvTransfo4::Translate(const ZvPoint3<double>& d) {
  return Translate(d.x, d.y, d.z);
}
ZvTransfo4& ZvTransfo4::Translate(const ZvPoint2<float>& d, float z) {
  return Translate(d.x, d.y, z);
}
ZvTransfo4& ZvTransfo4::Translate(const ZvPoint2<float>& d, double z) {
  return Translate(d.x, d.y, z);
}
ZvTransfo4& ZvTransfo4::Translate(const ZvPoint2<double>& d, double z) {
  return Translate(d.x, d.y, z);
}

ZvTransfo4& ZvTransfo4::Scale(double sx, double sy, double sz) {
  for (int row = 0; row < 4; ++row) {
    m[row] *= sx;
    m[row + 4] *= sy;
    m[row + 8] *= sz;
  }
  return *this;
}
ZvTransfo4& ZvTransfo4::Scale(double s) {
  return Scale(s, s, s);
}
ZvTransfo4& ZvTransfo4::Scale(double sx, double sy, double sz, const ZvPoint3<float>& center) {
  return Scale(sx, sy, sz, ToDouble(center));
}
ZvTransfo4& ZvTransfo4::Scale(double sx, double sy, double sz, const ZvPoint3<double>& center) {
  return PostMultiply(About(center, ZvTransfo4().Scale(sx, sy, sz)));
}
ZvTransfo4& ZvTransfo4::ScaleXY(double sx, double sy, const ZvPoint2<double>& center) {
  return Scale(sx, sy, 1.0, ZvPoint3<double>{center.x, center.y, 0.0});
}

ZvTransfo4& ZvTransfo4::Rotate(double degrees, double ax, double ay, double az) {
  // Plain square root on purpose: a null axis gives non-numbers rather than a silent identity.
  const double len = std::sqrt(ax * ax + ay * ay + az * az);
  const double x = ax / len, y = ay / len, z = az / len;
  double s, c;
  zvSnappedSinCos(degrees, s, c);
  const double k = 1.0 - c;
  const double r[16] = {k * x * x + c,
                        k * x * y + s * z,
                        k * x * z - s * y,
                        0,
                        k * x * y - s * z,
                        k * y * y + c,
                        k * y * z + s * x,
                        0,
                        k * x * z + s * y,
                        k * y * z - s * x,
                        k * z * z + c,
                        0,
                        0,
                        0,
                        0,
                        1};
  return PostMultiply(ZvTransfo4(r));
}
ZvTransfo4& ZvTransfo4::Rotate(double degrees, const ZvPoint3<float>& p, const ZvPoint3<float>& q) {
  return Rotate(degrees, ToDouble(p), ToDouble(q));
}
ZvTransfo4& ZvTransfo4::Rotate(double degrees, const ZvPoint3<double>& p,
                               const ZvPoint3<double>& q) {
  const ZvPoint3<double> axis = q - p;
  return PostMultiply(About(p, ZvTransfo4().Rotate(degrees, axis.x, axis.y, axis.z)));
}
ZvTransfo4& ZvTransfo4::RotateXY(double degrees, const ZvPoint2<double>& center) {
  const ZvPoint3<double> p{center.x, center.y, 0.0}, q{center.x, center.y, 1.0};
  return Rotate(degrees, p, q);
}
ZvTransfo4& ZvTransfo4::RotateXY(const ZvPoint2<double>& center, const ZvPoint2<double>& a,
                                 const ZvPoint2<double>& b) {
  double degrees;
  if (!ZvPoint2_AngleInDegrees(a - center, b - center, degrees)) return *this;
  return RotateXY(degrees, center);
}

ZvTransfo4& ZvTransfo4::RotateXYZ(const ZvPoint3<double>& degrees) {
  double sx, cx, sy, cy, sz, cz;
  zvSnappedSinCos(degrees.x, sx, cx);
  zvSnappedSinCos(degrees.y, sy, cy);
  zvSnappedSinCos(degrees.z, sz, cz);
  // Rz Ry Rx: the x turn acts first.
  const double r[16] = {cy * cz,
                        cy * sz,
                        -sy,
                        0,
                        sx * sy * cz - cx * sz,
                        cx * cz + sx * sy * sz,
                        sx * cy,
                        0,
                        sx * sz + cx * sy * cz,
                        cx * sy * sz - sx * cz,
                        cx * cy,
                        0,
                        0,
                        0,
                        0,
                        1};
  return PostMultiply(ZvTransfo4(r));
}

// Shears add multiples of two columns to a third, in all four rows.
ZvTransfo4& ZvTransfo4::ShearXY(double a, double b) {
  for (int row = 0; row < 4; ++row)
    m[row + 8] += a * m[row] + b * m[row + 4];
  return *this;
}
ZvTransfo4& ZvTransfo4::ShearXZ(double a, double b) {
  for (int row = 0; row < 4; ++row)
    m[row + 4] += a * m[row] + b * m[row + 8];
  return *this;
}
ZvTransfo4& ZvTransfo4::ShearYZ(double a, double b) {
  for (int row = 0; row < 4; ++row)
    m[row] += a * m[row + 4] + b * m[row + 8];
  return *this;
}
ZvTransfo4& ZvTransfo4::ShearXY(double a, double b, const ZvPoint3<double>& center) {
  return PostMultiply(About(center, ZvTransfo4().ShearXY(a, b)));
}
ZvTransfo4& ZvTransfo4::ShearXZ(double a, double b, const ZvPoint3<double>& center) {
  return PostMultiply(About(center, ZvTransfo4().ShearXZ(a, b)));
}
ZvTransfo4& ZvTransfo4::ShearYZ(double a, double b, const ZvPoint3<double>& center) {
  return PostMultiply(About(center, ZvTransfo4().ShearYZ(a, b)));
}
