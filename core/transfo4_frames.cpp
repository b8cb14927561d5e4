// ZvTransfo4 frames from points, and the split of the 2-D part into scale, shear, rotation and
// translation.
#include <zv/transfo4.h>

#include "core/transfo4_sincos.h"

#include <cmath>

ZvTransfo4& ZvTransfo4::SetTo4PointTransform(const ZvPoint3<double>& p0, const ZvPoint3<double>& p1,
                                             const ZvPoint3<double>& p2,
                                             const ZvPoint3<double>& p3) {
  const ZvPoint3<double> cols[4] = {p1 - p0, p2 - p0, p3 - p0, p0};
  for (int c = 0; c < 4; ++c) {
    m[4 * c] = cols[c].x;
    m[4 * c + 1] = cols[c].y;
    m[4 * c + 2] = cols[c].z;
    m[4 * c + 3] = c == 3 ? 1.0 : 0.0;
  }
  return *this;
}

ZvTransfo4& ZvTransfo4::SetTo3PointTransformXY(const ZvPoint3<double>& p0,
                                               const ZvPoint3<double>& p1,
                                               const ZvPoint3<double>& p2) {
  // The third corner sits straight above p0 at height 1, so z maps onto [p0.z, 1].
  return SetTo4PointTransform(p0, p1, p2, ZvPoint3<double>{p0.x, p0.y, 1.0});
}

int ZvTransfo4::SetTo3PointTransformXY(const ZvPoint2<double>* from, const ZvPoint2<double>* to) {
  const ZvPoint2<double> f1 = from[1] - from[0], f2 = from[2] - from[0];
  const ZvPoint2<double> t1 = to[1] - to[0], t2 = to[2] - to[0];
  const double det = f1.x * f2.y - f1.y * f2.x;
  if (std::fabs(det) < 1e-15) return 0;
  const double k = 1.0 / det;
  SetToIdentity();
  m[0] = (t1.x * f2.y - f1.y * t2.x) * k;
  m[4] = (f1.x * t2.x - t1.x * f2.x) * k;
  m[12] = to[0].x - m[0] * from[0].x - m[4] * from[0].y;
  m[1] = (t1.y * f2.y - f1.y * t2.y) * k;
  m[5] = (f1.x * t2.y - t1.y * f2.x) * k;
  m[13] = to[0].y - m[1] * from[0].x - m[5] * from[0].y;
  return 1;
}

int ZvTransfo4::DecomposeXY(const ZvPoint2<double>& center, double& scaleX, double& scaleY,
                            double& shear, double& degrees, ZvPoint2<double>& translation) const {
  double sx, sy, sh, deg;
  if (std::fabs(m[1]) <= 1e-15 && std::fabs(m[4]) <= 1e-15) {
    // No rotation: the diagonal is the scale, signs included.
    sx = m[0];
    sy = m[5];
    sh = 0.0;
    deg = 0.0;
  } else if (std::fabs(m[0]) <= 1e-15 && std::fabs(m[5]) <= 1e-15) {
    // A quarter turn taken exactly rather than through the angle of a tiny vector.
    sx = m[1];
    sy = -m[4];
    sh = 0.0;
    deg = 90.0;
  } else {
    sx = std::sqrt(m[0] * m[0] + m[1] * m[1]);
    if (sx < 1e-15) return 0;
    const double det = m[0] * m[5] - m[1] * m[4];
    if (std::fabs(det) < 1e-15) return 0;
    sy = det / sx;
    sh = (m[0] * m[4] + m[1] * m[5]) / det;
    deg = AngleWithFirstAxisDegree(m[0], m[1]);
    if (deg <= 0.0 || deg == 360.0) deg = 0.0;
  }
  scaleX = sx;
  scaleY = sy;
  shear = sh;
  degrees = deg;
  translation = Map(center) - center;
  return 1;
}

ZvTransfo4& ZvTransfo4::RecomposeXY(const ZvPoint2<double>& center, double scaleX, double scaleY,
                                    double shear, double degrees,
                                    const ZvPoint2<double>& translation) {
  double s, c;
  zvSnappedSinCos(degrees, s, c);
  for (double& v : m)
    v = 0.0;
  m[0] = c * scaleX;
  m[1] = s * scaleX;
  m[4] = c * shear * scaleY - s * scaleY;
  m[5] = s * shear * scaleY + c * scaleY;
  m[12] = center.x + translation.x - m[0] * center.x - m[4] * center.y;
  m[13] = center.y + translation.y - m[1] * center.x - m[5] * center.y;
  m[10] = m[15] = 1.0;
  return *this;
}
