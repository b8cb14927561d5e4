// ZvStdFCurve: flattening for display and sampling, through the shared assembly of a keyed
// curve's polyline.
#include <zv/std_fcurve.h>

#include "fcurve/cfc_flatten.h"
#include "fcurve/fcurve_lock.h"
#include "fcurve/std_fcurve_impl.h"

unsigned int ZvStdFCurve::Flatten(const ZvTransfo4& transfo, double tolerance,
                                  ZvPoint2dArray& points, ZvPointTagArray& tags,
                                  int clamped) const {
  ZvFCurveLockGuard guard(*this);
  return CFCFlatten(*m_impl, transfo, tolerance, points, tags, clamped);
}

unsigned int ZvStdFCurve::FlattenFromTo(const ZvExtent2<double>& box, const ZvTransfo4& transfo,
                                        double tolerance, ZvPoint2dArray& points,
                                        ZvPointTagArray& tags, ZvBoolArray& extrapolated,
                                        int clamped) const {
  ZvFCurveLockGuard guard(*this);
  return CFCFlattenFromTo(*m_impl, box, transfo, tolerance, points, tags, extrapolated, clamped);
}

unsigned int ZvStdFCurve::EvalSequence(double start, double end, double step, double tolerance,
                                       ZvDoubleArray& parameters, ZvDoubleArray& values,
                                       int clamped) const {
  ZvFCurveLockGuard guard(*this);
  return CFCEvalSequence(*m_impl, start, end, step, tolerance, parameters, values, clamped);
}
