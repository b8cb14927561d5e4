// Quaternion construction, normalisation, the Hamilton product and the conversion back to the
// Euler angles nearest a seed.
#include <zv/quat.h>

#include <cmath>

namespace {

constexpr double kPi = 3.141592653589793;
constexpr double kTwoPi = 6.283185307179586;
constexpr double kInvTwoPi = 0.15915494309189535;

// The angle of (sin, cos), both clamped to [-1, 1] since they come from matrix terms divided by
// a cosine. Near the axes acos and asin each lose precision, so each is used only where the
// other is steep: acos while |cos| is at most about 1/sqrt(2), asin beyond.
double AngleOf(double s, double c) {
  s = s < -1.0 ? -1.0 : (s > 1.0 ? 1.0 : s);
  c = c < -1.0 ? -1.0 : (c > 1.0 ? 1.0 : c);
  if (std::fabs(c) <= 0.70710679) {
    const double a = std::acos(c);
    return s < 0.0 ? -a : a;
  }
  const double a = std::asin(s);
  if (c >= 0.0) return a;
  return s >= 0.0 ? kPi - a : -kPi - a;
}

// a moved by whole turns to lie within pi of `near`.
double WrapNear(double a, double near) {
  return a - kTwoPi * std::floor((a - near) * kInvTwoPi + 0.5);
}

// The angular distance between two angles, whatever turns separate them.
double TurnDistance(double a, double b) {
  return std::fabs(WrapNear(a, b) - b);
}

double SeedDistance(const ZvPoint3<double>& r, const ZvPoint3<double>& seed) {
  return TurnDistance(r.x, seed.x) + TurnDistance(r.y, seed.y) + TurnDistance(r.z, seed.z);
}

}  // namespace

ZvQuat::ZvQuat(const ZvPoint3<double>& radians) {
  const double cx = std::cos(radians.x * 0.5), sx = std::sin(radians.x * 0.5);
  const double cy = std::cos(radians.y * 0.5), sy = std::sin(radians.y * 0.5);
  const double cz = std::cos(radians.z * 0.5), sz = std::sin(radians.z * 0.5);
  w = cx * cy * cz + sx * sy * sz;
  x = sx * cy * cz - cx * sy * sz;
  y = sx * cy * sz + cx * sy * cz;
  z = cx * cy * sz - sx * sy * cz;
  Normalize();
}

void ZvQuat::Normalize() {
  const double l = w * w + x * x + y * y + z * z;
  if (std::fabs(l - 1.0) >= 1e-12) {
    if (l < 1e-12) {
      w = 1.0;
      x = y = z = 0.0;
    } else {
      const double k = 1.0 / std::sqrt(l);
      w *= k;
      x *= k;
      y *= k;
      z *= k;
    }
  }
  if (w > 1.0) w = 1.0;
  if (w < -1.0) w = -1.0;
}

void ZvQuat::Get(ZvPoint3<double>& radians) const {
  Get(radians, ZvPoint3<double>{0.0, 0.0, 0.0});
}

void ZvQuat::Get(ZvPoint3<double>& radians, const ZvPoint3<double>& seed) const {
  // Terms of the rotation matrix of Rz Ry Rx: a, b give x; c, d give z; sinY gives y.
  const double a = 2.0 * (y * z + w * x), b = 1.0 - 2.0 * (x * x + y * y);
  const double c = 2.0 * (x * y + w * z), d = 1.0 - 2.0 * (y * y + z * z);
  double sinY = 2.0 * (w * y - x * z);
  sinY = sinY < -1.0 ? -1.0 : (sinY > 1.0 ? 1.0 : sinY);

  const double y1 =
      std::fabs(std::fabs(sinY) - 1.0) <= 1e-12 ? (sinY > 0 ? kPi / 2 : -kPi / 2) : std::asin(sinY);
  const double y2 = y1 > 0.0 ? kPi - y1 : -kPi - y1;
  const double cos1 = std::cos(y1);
  ZvPoint3<double> best;
  if (std::fabs(cos1) > 1e-6) {
    const double cos2 = std::cos(y2);
    const ZvPoint3<double> r1{AngleOf(a / cos1, b / cos1), y1, AngleOf(c / cos1, d / cos1)};
    const ZvPoint3<double> r2{AngleOf(a / cos2, b / cos2), y2, AngleOf(c / cos2, d / cos2)};
    best = SeedDistance(r1, seed) < SeedDistance(r2, seed) ? r1 : r2;
  } else {
    // Gimbal lock: with y at +pi/2 the matrix only knows x - z, at -pi/2 only x + z. The seed's
    // x and z move by halves of the change of that combination, which keeps both as near the
    // seed as the rotation allows.
    const double s = 2.0 * (x * y - w * z), co = 1.0 - 2.0 * (x * x + z * z);
    const bool difference = sinY > 0.0;
    const double known = difference ? AngleOf(s, co) : AngleOf(-s, co);
    const double seeded = difference ? seed.x - seed.z : seed.x + seed.z;
    const double change = WrapNear(known, seeded) - seeded;
    const double half = std::fabs(change) <= 1e-6 ? 0.0 : change * 0.5;
    best.x = seed.x + half;
    best.y = y1;
    best.z = difference ? seed.z - half : seed.z + half;
  }
  radians.x = WrapNear(best.x, seed.x);
  radians.y = WrapNear(best.y, seed.y);
  radians.z = WrapNear(best.z, seed.z);
}

ZvQuat ZvQuat::operator*(const ZvQuat& q) const {
  return ZvQuat(w * q.w - x * q.x - y * q.y - z * q.z, w * q.x + x * q.w + y * q.z - z * q.y,
                w * q.y - x * q.z + y * q.w + z * q.x, w * q.z + x * q.y - y * q.x + z * q.w);
}
