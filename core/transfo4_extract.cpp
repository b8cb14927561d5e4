// ZvTransfo4: recovering Euler angles, scale and translation from a matrix.
//
// A rotation Rz Ry Rx has two Euler triples (and a one-parameter family at gimbal lock). For
// animation the useful one is the triple nearest to the previous frame's angles, so the caller
// passes those as a seed and gets a continuous answer instead of jumps of pi.
#include <zv/transfo4.h>

#include <cmath>

namespace {

const double kPi = 3.14159265358979323846;
const double kTwoPi = 2.0 * kPi;

// Number of whole turns to take off a so that it lands in [-pi, pi).
double Turns(double a) {
  return std::floor((a + kPi) * 0.15915494309189535);
}

double Wrap(double a) {
  return a - Turns(a) * kTwoPi;
}

// Angular distance folded to at most pi.
double Distance(double a, double seed) {
  return std::fabs(Wrap(a - seed));
}

// a plus whole turns, within pi of seed; a itself when it already is.
double NearSeed(double a, double seed) {
  return a - Turns(a - seed) * kTwoPi;
}

double Clamp1(double v) {
  return v < -1.0 ? -1.0 : (v > 1.0 ? 1.0 : v);
}

// Angle in (-pi, pi] from a sine and cosine that may have drifted past 1. Near the x axis asin
// loses precision, near the y axis acos does, so the better-conditioned one is used.
double AngleOf(double s, double c) {
  s = Clamp1(s);
  c = Clamp1(c);
  if (std::fabs(c) <= 0.707106781) {
    const double a = std::acos(c);
    return s < 0.0 ? -a : a;
  }
  const double a = std::asin(s);
  if (c >= 0.0) return a;
  return a > 0.0 ? kPi - a : -kPi - a;
}

}  // namespace

void ZvTransfo4::ExtractXYZRotationAngles(ZvPoint3<double>& radians) const {
  const ZvPoint3<double> seed = radians;
  const ZvPoint3<double> w{Wrap(seed.x), Wrap(seed.y), Wrap(seed.z)};
  const double sinY = m[2] >= 1.0 ? -1.0 : (m[2] <= -1.0 ? 1.0 : -m[2]);
  const double y1 = std::asin(sinY);
  const double y2 = y1 > 0.0 ? kPi - y1 : -kPi - y1;

  // Of two candidates, ties go to the second.
  ZvPoint3<double> r;
  if (std::fabs(std::cos(y1)) > 1e-5) {
    ZvPoint3<double> candidate[2];
    double sum[2];
    const double ys[2] = {y1, y2};
    for (int i = 0; i < 2; ++i) {
      const double cy = std::cos(ys[i]);
      candidate[i] = {AngleOf(m[6] / cy, m[10] / cy), ys[i], AngleOf(m[1] / cy, m[0] / cy)};
      sum[i] = Distance(candidate[i].x, w.x) + Distance(candidate[i].y, w.y) +
               Distance(candidate[i].z, w.z);
    }
    r = sum[1] > sum[0] ? candidate[0] : candidate[1];
  } else {
    // Gimbal lock: y is +-pi/2 and the matrix only knows x - z (y up) or x + z (y down). Keep
    // the seeds' split and spread the correction evenly over both angles.
    const bool up = y1 > 0.0;
    double d = AngleOf(up ? m[4] : -m[4], m[5]);
    const double seedCombination = up ? w.x - w.z : w.x + w.z;
    if (std::fabs(seedCombination) >= 1e-5) d -= seedCombination;
    const double half = 0.5 * d;
    r.x = w.x + half;
    r.z = up ? w.z - half : w.z + half;
    const double keep = Distance(r.x, w.x) + Distance(r.z, w.z);
    const double flip = Distance(r.x + kPi, w.x) + Distance(r.z + kPi, w.z);
    if (!(flip > keep)) {
      r.x += kPi;
      r.z += kPi;
    }
    r.y = Distance(y2, w.y) > Distance(y1, w.y) ? y1 : y2;
  }
  radians = {NearSeed(r.x, seed.x), NearSeed(r.y, seed.y), NearSeed(r.z, seed.z)};
}

void ZvTransfo4::ExtractTransforms(ZvPoint3<double>& scale, ZvPoint3<double>& degrees,
                                   ZvPoint3<double>& translation) const {
  double len[3];
  ZvTransfo4 rotation(*this);
  for (int c = 0; c < 3; ++c) {
    const double* col = m + 4 * c;
    len[c] = std::sqrt(col[0] * col[0] + col[1] * col[1] + col[2] * col[2]);
    for (int row = 0; row < 3; ++row)
      rotation.m[row + 4 * c] = col[row] / len[c];
  }
  // The incoming degrees seed the extraction as they stand, read as radians.
  ZvPoint3<double> angles = degrees;
  rotation.ExtractXYZRotationAngles(angles);
  scale = {len[0], len[1], len[2]};
  degrees = angles * 57.29577951308232;
  translation = {m[12], m[13], m[14]};
}
