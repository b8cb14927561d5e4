// Evaluation of the rotation curve: the spline built on first use, the Euler angles taken
// nearest the keys' own angles, and a cache of the last result.
#include <zv/quat_fcurve.h>

#include <cmath>

const ZvQuatSpline& ZvQuatCurve::Spline() const {
  if (spline == nullptr) {
    spline = new ZvQuatSpline(static_cast<int>(keys.size()), keys.data(), extrapolation);
  }
  return *spline;
}

ZvPoint3<double> ZvQuatCurve::Eval(double time) const {
  if (keys.empty()) return valueWhenNoKeys;
  if (keys.size() == 1) return keys[0].angles;
  if (spline == nullptr) {
    Spline();
    // A fresh spline may differ from what the cache was made from.
    lastTime = time + 1.0;
  }
  if (std::fabs(time - lastTime) <= 1e-9) return lastValue;
  double u;
  const int i = spline->GetEvalInterval(time, u);
  // The seed blends the angles of the keys around `time`, so that a curve keyed with angles
  // past +-180 degrees, or with many turns, evaluates on the keys' own branch.
  const ZvPoint3<double>& a = keys[i].angles;
  const ZvPoint3<double>& b = keys[i + 1].angles;
  const ZvPoint3<double> seed{a.x + (b.x - a.x) * u, a.y + (b.y - a.y) * u, a.z + (b.z - a.z) * u};
  spline->Eval(time).Get(lastValue, seed);
  lastTime = time;
  return lastValue;
}

double ZvQuatCurve::Eval(double time, unsigned int component) const {
  const ZvPoint3<double> r = Eval(time);
  return (component == 0 ? r.x : component == 1 ? r.y : r.z) * 57.29577951308232;
}
