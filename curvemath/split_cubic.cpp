// De Casteljau split of a space cubic at an arbitrary parameter.
#include <zv/bezier_tool.h>

namespace {

ZvPoint3<double> Lerp(const ZvPoint3<double>& a, const ZvPoint3<double>& b, double t) {
  return a + (b - a) * t;
}

}  // namespace

void ZvBezierTool_SplitCubic3d(const ZvPoint3<double>* p, ZvPoint3<double>* out, double t) {
  if (!p || !out) return;
  // Everything is computed before anything is written: out may overlap p.
  const ZvPoint3<double> a01 = Lerp(p[0], p[1], t);
  const ZvPoint3<double> a12 = Lerp(p[1], p[2], t);
  const ZvPoint3<double> a23 = Lerp(p[2], p[3], t);
  const ZvPoint3<double> b0 = Lerp(a01, a12, t);
  const ZvPoint3<double> b1 = Lerp(a12, a23, t);
  const ZvPoint3<double> mid = Lerp(b0, b1, t);
  out[0] = a01;
  out[1] = b0;
  out[2] = mid;
  out[3] = b1;
  out[4] = a23;
}
