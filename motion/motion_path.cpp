// Construction, copying and the plain queries of a motion path.
#include <zv/motion_path.h>

#include "core/scoped_lock.h"
#include "motion/motion_path_impl.h"

ZvMotionPath3dImpl::ZvMotionPath3dImpl()
    : controlPoints(4), clientData(4), initialTimes(2), nodeFlags(2), tangents(2) {}

ZvMotionPath3dImpl::ZvMotionPath3dImpl(int)
    : controlPoints(1), clientData(1), initialTimes(1), nodeFlags(1), tangents(1) {}

namespace {

// A resize that throws has already set the size; the elements are still in place.
template <class Array>
void ReserveExtra(Array& a, unsigned int extra) {
  const unsigned int size = a.size;
  try {
    a.Resize(size + extra);
  } catch (...) {
    a.Chop(size);
    throw;
  }
  a.Chop(size);
}

}  // namespace

void ZvMotionPath3dImpl::Reserve(unsigned int points) {
  ReserveExtra(controlPoints, points);
  ReserveExtra(clientData, points);
  ReserveExtra(initialTimes, 1);
  ReserveExtra(nodeFlags, 1);
  ReserveExtra(tangents, 1);
}

void ZvMotionPath3dImpl::InsertNodeRecord(unsigned int node, double time, unsigned char flags) {
  initialTimes.InsertBefore(node, time);
  nodeFlags.InsertBefore(node, flags);
  tangents.InsertBefore(node, ZvTwoSidedTangent());
}

ZvMotionPath3d::ZvMotionPath3d() : impl(new ZvMotionPath3dImpl()) {}

ZvMotionPath3d::ZvMotionPath3d(const ZvPoint3<double>& p0, const ZvPoint3<double>& p3, double t0,
                               double t1)
    : impl(new ZvMotionPath3dImpl(1)) {
  try {
    impl->Moveto(p0, t0);
    impl->Lineto(p3, t1);
  } catch (...) {
    delete impl;
    throw;
  }
}

ZvMotionPath3d::ZvMotionPath3d(const ZvPoint3<double>& p0, const ZvPoint3<double>& p3, double t0,
                               double t1, const ZvPoint3<double>& p1, const ZvPoint3<double>& p2)
    : impl(new ZvMotionPath3dImpl(1)) {
  try {
    impl->Moveto(p0, t0);
    impl->Curveto(p1, p2, p3, t1);
  } catch (...) {
    delete impl;
    throw;
  }
}

ZvMotionPath3d::ZvMotionPath3d(const ZvMotionPath3d& other) : impl(nullptr) {
  ZvScopedLock guard(other.lock);
  impl = new ZvMotionPath3dImpl(*other.impl);
}

ZvMotionPath3d& ZvMotionPath3d::operator=(const ZvMotionPath3d& other) {
  if (this == &other) return *this;
  ZvScopedLock guard(lock);
  ZvScopedLock guardOther(other.lock);
  ZvMotionPath3dImpl* copy = new ZvMotionPath3dImpl(*other.impl);
  delete impl;
  impl = copy;
  return *this;
}

ZvMotionPath3d::~ZvMotionPath3d() {
  delete impl;
}

unsigned int ZvMotionPath3d::NumPoints() const {
  ZvScopedLock guard(lock);
  return impl->NumPoints();
}

unsigned int ZvMotionPath3d::NumNodes() const {
  ZvScopedLock guard(lock);
  return impl->NumNodes();
}

int ZvMotionPath3d::GetTimeInterval(double& first, double& last) const {
  ZvScopedLock guard(lock);
  const ZvDoubleArray& t = impl->initialTimes;
  if (t.size == 0) return 0;
  first = t[0];
  last = t[t.size - 1];
  return 1;
}

double ZvMotionPath3d::GetFirstTime(int) const {
  ZvScopedLock guard(lock);
  const ZvDoubleArray& t = impl->initialTimes;
  return t.size ? t[0] : 0.0;
}

double ZvMotionPath3d::GetLastTime(int) const {
  ZvScopedLock guard(lock);
  const ZvDoubleArray& t = impl->initialTimes;
  return t.size ? t[t.size - 1] : 0.0;
}

int ZvMotionPath3d::GetNode(unsigned int index, ZvPoint3<double>& point, double& time) const {
  ZvScopedLock guard(lock);
  if (!impl->IsNodeIndex(index)) return 0;
  point = impl->controlPoints[index];
  time = impl->initialTimes[index / 3];
  return 1;
}

int ZvMotionPath3d::IsNode(unsigned int index) const {
  ZvScopedLock guard(lock);
  return impl->IsNodeIndex(index);
}

int ZvMotionPath3d::GetControlPoint(unsigned int index, ZvPoint3<double>& point) const {
  ZvScopedLock guard(lock);
  if (index >= impl->NumPoints()) return 0;
  point = impl->controlPoints[index];
  return 1;
}

int ZvMotionPath3d::GetControlPoints(unsigned int first, unsigned int last,
                                     ZvPoint3<double>* points, double* times) const {
  ZvScopedLock guard(lock);
  if (first > last || last >= impl->NumPoints()) return 0;
  for (unsigned int i = first; i <= last; ++i) {
    points[i - first] = impl->controlPoints[i];
    if (times && i % 3 == 0) times[i - first] = impl->initialTimes[i / 3];
  }
  return 1;
}

int ZvMotionPath3d::GetControlPointKind(unsigned int index, PointKind& kind) const {
  ZvScopedLock guard(lock);
  const ZvMotionPath3dImpl& m = *impl;
  if (index >= m.NumPoints()) return 0;
  if (m.NumPoints() == 1) {
    kind = SinglePoint;
    return 1;
  }
  const bool line = m.IsLineNode(index / 3);
  if (index == m.LastIndex()) {
    kind = line ? LastNodeAfterLine : LastNode;
  } else {
    // The kinds of a cubic segment are those of a line plus 4.
    kind = static_cast<PointKind>(index % 3 + (line ? 0 : 4));
  }
  return 1;
}

int ZvMotionPath3d::SetClientData(unsigned int index, void* data) {
  ZvScopedLock guard(lock);
  if (index >= impl->NumPoints()) return 0;
  impl->clientData[index] = data;
  return 1;
}

void* ZvMotionPath3d::GetClientData(unsigned int index) const {
  ZvScopedLock guard(lock);
  return index < impl->NumPoints() ? impl->clientData[index] : nullptr;
}

int ZvMotionPath3d::SetLeftTangentInfo(unsigned int index, TangentInfo info) {
  ZvScopedLock guard(lock);
  if (index >= impl->NumPoints() || !ZvTwoSidedTangent::IsValid(info)) return 0;
  impl->ForEdit().tangents[index / 3].left = info;
  return 1;
}

int ZvMotionPath3d::SetRightTangentInfo(unsigned int index, TangentInfo info) {
  ZvScopedLock guard(lock);
  if (index >= impl->NumPoints() || !ZvTwoSidedTangent::IsValid(info)) return 0;
  impl->ForEdit().tangents[index / 3].right = info;
  return 1;
}

int ZvMotionPath3d::GetLeftTangentInfo(unsigned int index, TangentInfo& info) const {
  ZvScopedLock guard(lock);
  if (index >= impl->NumPoints()) return 0;
  info = impl->tangents[index / 3].left;
  return 1;
}

int ZvMotionPath3d::GetRightTangentInfo(unsigned int index, TangentInfo& info) const {
  ZvScopedLock guard(lock);
  if (index >= impl->NumPoints()) return 0;
  info = impl->tangents[index / 3].right;
  return 1;
}

unsigned char ZvMotionPath3d::GetNodeFlags(unsigned int index) const {
  ZvScopedLock guard(lock);
  return impl->IsNodeIndex(index) ? impl->nodeFlags[index / 3] : 0;
}
