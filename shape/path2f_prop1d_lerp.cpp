// ZvPath2fProp1d::SetToLerpAB: the blend of two sibling property paths.
#include <zv/path2f_prop1d.h>
#include <zv/polyline.h>

#include <cmath>
#include <memory>

#include "shape/path2f_prop1d_impl.h"
#include "shape/shape_lock.h"

namespace {

// More steps than a curve sampler accepts in one go: such a blend is refused, not allocated.
constexpr double kMaxBlendSteps = 1048576.0;

float Blend(float a, float b, double t, double u) {
  return static_cast<float>(b * t) + static_cast<float>(a * u);
}

}  // namespace

int ZvPath2fProp1d::SetToLerpAB(const ZvPath2fProp1d& a, const ZvPath2fProp1d& b, double t,
                                double spacing, double tolerance) {
  ZvShapeLock guard(*this);
  ZvShapeLock guardA(a);
  ZvShapeLock guardB(b);
  if (!a.IsSiblingOf(b)) return 0;
  // Built aside and swapped in at the end, so that a refusal or a failed allocation leaves this
  // path whole, and so that this path may be a or b itself.
  ZvPath2fProp1d out(a);
  const double u = 1.0 - t;
  for (unsigned int i = 0; i < out.points.size; ++i) {
    const ZvPoint2<float>& pa = a.points[i];
    const ZvPoint2<float>& pb = b.points[i];
    out.ReplacePointIgnoringLock(i,
                                 ZvPoint2<float>{Blend(pa.x, pb.x, t, u), Blend(pa.y, pb.y, t, u)});
  }
  out.m_impl->Clear();
  ZvPath2fIter subpaths(a);
  unsigned int first = 0, last = 0;
  ZvPoint2fArray flatA(64), flatB(64);
  while (subpaths.GetNextSubPathIndices(first, last)) {
    const ZvRawFCurve* ca = a.m_impl->Find(first);
    const ZvRawFCurve* cb = b.m_impl->Find(first);
    if (!ca) continue;
    if (!cb) {
      out.m_impl->Set(first, *ca);
      continue;
    }
    flatA.Chop(0);
    flatB.Chop(0);
    a.FlattenSubpath(first, 0.5 * spacing, flatA);
    b.FlattenSubpath(first, 0.5 * spacing, flatB);
    const double la = ZvPoint2fArraySingleComponent_ComputeLength(flatA);
    const double lb = ZvPoint2fArraySingleComponent_ComputeLength(flatB);
    if (std::fabs(la) <= 1e-7) {
      out.m_impl->Set(first, *cb);
      continue;
    }
    if (std::fabs(lb) <= 1e-9) {
      out.m_impl->Set(first, *ca);
      continue;
    }
    const double n = std::ceil((la > lb ? la : lb) / spacing);
    if (!(n >= 1.0 && n <= kMaxBlendSteps)) return 0;
    double ea = 0.0, eb = 0.0;
    ca->GetLargestKeyParameter(ea);
    cb->GetLargestKeyParameter(eb);
    const double da = ea / n, db = eb / n;
    const unsigned int count = static_cast<unsigned int>(n) + 1;
    ZvPoint2dArray pairs(count);
    double pa = 0.0, pb = 0.0;
    for (unsigned int k = 0; k < count; ++k) {
      // The curve that covers more arc length gives the blend its parameter.
      const double value = ca->Eval(pa, 1) * u + cb->Eval(pb, 1) * t;
      pairs.Add(ZvPoint2<double>{da >= db ? pa : pb, value});
      pa += da;
      pb += db;
    }
    out.SetPropCurve(first, pairs, tolerance);
  }
  SwapGeometry(out);
  m_impl->Swap(*out.m_impl);
  return 1;
}
