// ZvPath2fProp1d: construction, copying and the property curves of its subpaths.
#include <zv/path2f_prop1d.h>

#include <cmath>
#include <memory>
#include <new>

#include "shape/path2f_prop1d_impl.h"
#include "shape/path_codes.h"
#include "shape/shape_lock.h"

ZvPath2fProp1d::ZvPath2fProp1d(unsigned int reserve)
    : ZvPath2f(reserve), m_impl(new ZvPath2fProp1dImpl) {}

ZvPath2fProp1d::ZvPath2fProp1d(const ZvPath2fProp1d& other)
    : ZvPath2fProp1d(other, ZvShapeLock(other)) {}

// The source stays locked across both copies, so that its geometry and curves agree.
ZvPath2fProp1d::ZvPath2fProp1d(const ZvPath2fProp1d& other, const ZvShapeLock& /*held*/)
    : ZvPath2f(other), m_impl(new ZvPath2fProp1dImpl(*other.m_impl)) {}

ZvPath2fProp1d::ZvPath2fProp1d(const ZvPath2f& path)
    : ZvPath2f(path), m_impl(new ZvPath2fProp1dImpl) {}

ZvPath2fProp1d::~ZvPath2fProp1d() {
  delete m_impl;
}

ZvPath2fProp1d& ZvPath2fProp1d::operator=(const ZvPath2fProp1d& other) {
  if (this == &other) return *this;
  ZvShapeLock guard(*this);
  ZvShapeLock guardOther(other);
  m_impl->Clear();
  ZvPath2fProp1dImpl copy;
  try {
    ZvPath2fProp1dImpl(*other.m_impl).Swap(copy);
  } catch (const std::bad_alloc&) {
    // The geometry alone is still a valid property path: its subpaths have no curves.
  }
  ZvPath2f::operator=(other);
  // The path's assignment leaves it empty when its copy fails; records would then name no
  // subpath.
  if (points.size == other.points.size) m_impl->Swap(copy);
  return *this;
}

ZvShape2f& ZvPath2fProp1d::operator=(const ZvShape2f& other) {
  if (const ZvPath2fProp1d* prop = dynamic_cast<const ZvPath2fProp1d*>(&other))
    return *this = *prop;
  if (const ZvPath2f* path = dynamic_cast<const ZvPath2f*>(&other)) {
    ZvShapeLock guard(*this);
    ZvPath2f::operator=(*path);
    m_impl->Clear();
    return *this;
  }
  return ZvPath2f::operator=(other);
}

ZvShape2f* ZvPath2fProp1d::QueryShapeKind(Kind kind) const {
  // Deliberately not a KindPath: callers that handle plain paths must not drop the property.
  return kind == KindPathProp ? const_cast<ZvPath2fProp1d*>(this) : nullptr;
}

ZvShape2f* ZvPath2fProp1d::Clone() const {
  try {
    return new ZvPath2fProp1d(*this);
  } catch (const std::bad_alloc&) {
    return nullptr;
  }
}

void ZvPath2fProp1d::SwapGeometry(ZvPath2fProp1d& other) {
  std::swap(points.size, other.points.size);
  std::swap(points.capacity, other.points.capacity);
  std::swap(points.data, other.points.data);
  std::swap(codes.size, other.codes.size);
  std::swap(codes.capacity, other.codes.capacity);
  std::swap(codes.data, other.codes.data);
  std::swap(currentSubpathOpen, other.currentSubpathOpen);
}

// ---- Records under the caller's lock ------------------------------------------------------------

const ZvRawFCurve* ZvPath2fProp1d::GetPropCurveInsideCriticalSection(unsigned int start) const {
  return m_impl->Find(start);
}

int ZvPath2fProp1d::SetPropCurveInsideCriticalSection(unsigned int start,
                                                      const ZvRawFCurve& curve) {
  m_impl->Set(start, curve);
  return 1;
}

int ZvPath2fProp1d::RemovePropCurveInsideCriticalSection(unsigned int first, unsigned int last) {
  const bool removed = m_impl->Remove(first);
  m_impl->Shift(first, static_cast<long long>(first) - 1 - last);
  return removed ? 1 : 0;
}

unsigned int ZvPath2fProp1d::GetNumPropCurves() const {
  ZvShapeLock guard(*this);
  return static_cast<unsigned int>(m_impl->records.size());
}

// ---- Property curves
// ------------------------------------------------------------------------------

namespace {

// The start of the subpath holding `index`, or false for an index outside the path.
bool SubpathStartOf(const ZvPath2f& path, unsigned int index, unsigned int& start) {
  unsigned int last = 0;
  return path.GetSubpathIndices(index, start, last) != 0;
}

}  // namespace

int ZvPath2fProp1d::HasPropCurve(unsigned int index) const {
  ZvShapeLock guard(*this);
  unsigned int s = 0;
  return SubpathStartOf(*this, index, s) && m_impl->Find(s) ? 1 : 0;
}

const ZvRawFCurve& ZvPath2fProp1d::GetPropCurve(unsigned int index) const {
  // A misuse gets a harmless answer rather than a dangling one.
  static const ZvRawFCurve kNoCurve(0.0);
  ZvShapeLock guard(*this);
  unsigned int s = 0;
  const ZvRawFCurve* curve = SubpathStartOf(*this, index, s) ? m_impl->Find(s) : nullptr;
  return curve ? *curve : kNoCurve;
}

int ZvPath2fProp1d::SetPropCurve(unsigned int index, const ZvRawFCurve& curve) {
  ZvShapeLock guard(*this);
  unsigned int s = 0;
  if (!SubpathStartOf(*this, index, s)) return 0;
  m_impl->Set(s, curve);
  return 1;
}

int ZvPath2fProp1d::SetPropCurve(unsigned int index, const ZvPoint2dArray& pairs,
                                 double tolerance) {
  ZvShapeLock guard(*this);
  unsigned int s = 0;
  if (pairs.size == 0 || !SubpathStartOf(*this, index, s)) return 0;
  // One or two pairs make no polyline to simplify: the curve is set up directly, starting at 0.
  std::unique_ptr<ZvRawFCurve> curve;
  if (pairs.size == 1)
    curve = std::make_unique<ZvRawFCurve>(0.0, pairs[0].y);
  else if (pairs.size == 2)
    curve = std::make_unique<ZvRawFCurve>(0.0, pairs[0].y, pairs[1].x, pairs[1].y);
  else
    curve = std::make_unique<ZvRawFCurve>(pairs, tolerance);
  m_impl->Set(s, std::move(curve));
  return 1;
}

int ZvPath2fProp1d::SetPropCurve(unsigned int to, unsigned int from) {
  ZvShapeLock guard(*this);
  unsigned int s = 0, f = 0;
  if (!SubpathStartOf(*this, to, s) || !SubpathStartOf(*this, from, f) || s == f) return 0;
  const ZvRawFCurve* curve = m_impl->Find(f);
  if (!curve) return 0;
  m_impl->Set(s, *curve);
  return 1;
}

int ZvPath2fProp1d::SetPropCurve(unsigned int to, const ZvPath2fProp1d& source, unsigned int from) {
  if (&source == this) return SetPropCurve(to, from);
  ZvShapeLock guard(*this);
  ZvShapeLock guardSource(source);
  unsigned int s = 0, f = 0;
  if (!SubpathStartOf(*this, to, s) || !SubpathStartOf(source, from, f)) return 0;
  const ZvRawFCurve* curve = source.m_impl->Find(f);
  if (!curve) return 0;
  m_impl->Set(s, *curve);
  return 1;
}

unsigned int ZvPath2fProp1d::AppendLinearSegment(unsigned int index, double parameter,
                                                 double value) {
  ZvShapeLock guard(*this);
  unsigned int s = 0;
  ZvRawFCurve* curve = SubpathStartOf(*this, index, s) ? m_impl->Find(s) : nullptr;
  return curve ? curve->AppendLinearSegment(ZvPoint2<double>{parameter, value}) : 0;
}

unsigned int ZvPath2fProp1d::AppendOrExtendLinearSegment(unsigned int index, double parameter,
                                                         double value, double tolerance) {
  ZvShapeLock guard(*this);
  unsigned int s = 0;
  ZvRawFCurve* curve = SubpathStartOf(*this, index, s) ? m_impl->Find(s) : nullptr;
  return curve ? curve->AppendOrExtendLinearSegment(ZvPoint2<double>{parameter, value}, tolerance)
               : 0;
}

double ZvPath2fProp1d::EvalPropCurve(unsigned int index, double parameter) const {
  ZvShapeLock guard(*this);
  unsigned int s = 0;
  const ZvRawFCurve* curve = SubpathStartOf(*this, index, s) ? m_impl->Find(s) : nullptr;
  return curve ? curve->Eval(parameter, 1) : 0.0;
}

unsigned int ZvPath2fProp1d::EvalPropCurve(unsigned int index, const ZvDoubleArray& parameters,
                                           ZvDoubleArray& values) const {
  ZvShapeLock guard(*this);
  unsigned int s = 0;
  const ZvRawFCurve* curve = SubpathStartOf(*this, index, s) ? m_impl->Find(s) : nullptr;
  if (!curve) return 0;
  values.Resize(values.size + parameters.size);
  double* out = values.data + values.size - parameters.size;
  for (unsigned int i = 0; i < parameters.size; ++i)
    out[i] = curve->Eval(parameters[i], 1);
  return parameters.size;
}

double ZvPath2fProp1d::GetLargestArcLength(unsigned int index) const {
  ZvShapeLock guard(*this);
  unsigned int s = 0;
  const ZvRawFCurve* curve = SubpathStartOf(*this, index, s) ? m_impl->Find(s) : nullptr;
  double largest = 0.0;
  if (curve) curve->GetLargestKeyParameter(largest);
  return largest;
}

int ZvPath2fProp1d::GetPropCurveParameter(unsigned int node, double tolerance,
                                          double& parameter) const {
  ZvShapeLock guard(*this);
  unsigned int s = 0;
  if (node >= points.size || !zv_path::IsNode(codes[node]) || !SubpathStartOf(*this, node, s))
    return 0;
  const ZvRawFCurve* curve = m_impl->Find(s);
  if (!curve) return 0;
  const double u = GetNodeNormalizedArcLength(node, tolerance);
  double largest = 0.0;
  curve->GetLargestKeyParameter(largest);
  if (std::fabs(u) <= 1e-7 || std::fabs(largest) <= 1e-7) {
    parameter = 0.0;
  } else {
    const double p = u * largest;
    parameter = p < 0.0 ? 0.0 : p > largest ? largest : p;
  }
  return 1;
}
