// Growing a motion path at either end, and re-deriving the handles of its end segments.
#include <zv/motion_path.h>

#include "core/scoped_lock.h"
#include "motion/motion_path_impl.h"

int ZvMotionPath3dImpl::Moveto(const ZvPoint3<double>& p, double time) {
  if (NumPoints() != 0) return 0;
  Reserve(1);
  controlPoints.Add(p);
  clientData.Add(nullptr);
  InsertNodeRecord(0, time, 0);
  return 1;
}

int ZvMotionPath3dImpl::Lineto(const ZvPoint3<double>& p, double time) {
  if (NumPoints() == 0 || !(time > initialTimes[NumNodes() - 1])) return 0;
  Reserve(3);
  nodeFlags[NumNodes() - 1] |= ZvMotionPath3d::sm_LINENODE;
  // The handles of a line sit on its end so that flattening the segment as a cubic (for the
  // speed of a neighbour) still gives the chord's length.
  for (int k = 0; k < 3; ++k) {
    controlPoints.Add(p);
    clientData.Add(nullptr);
  }
  InsertNodeRecord(NumNodes(), time, 0);
  return 1;
}

int ZvMotionPath3dImpl::Curveto(const ZvPoint3<double>& c1, const ZvPoint3<double>& c2,
                                const ZvPoint3<double>& p, double time) {
  if (NumPoints() == 0 || !(time > initialTimes[NumNodes() - 1])) return 0;
  Reserve(3);
  const unsigned int joint = LastIndex();
  controlPoints.Add(c1);
  controlPoints.Add(c2);
  controlPoints.Add(p);
  for (int k = 0; k < 3; ++k)
    clientData.Add(nullptr);
  InsertNodeRecord(NumNodes(), time, 0);
  // The former last node is an inner node now: its lock must bind the new handle too.
  RelockOrClear(joint);
  return 1;
}

int ZvMotionPath3d::Moveto(const ZvPoint3<double>& p, double time) {
  ZvScopedLock guard(lock);
  return impl->ForEdit().Moveto(p, time);
}

int ZvMotionPath3d::Lineto(const ZvPoint3<double>& p, double time) {
  ZvScopedLock guard(lock);
  return impl->ForEdit().Lineto(p, time);
}

int ZvMotionPath3d::Curveto(const ZvPoint3<double>& c1, const ZvPoint3<double>& c2,
                            const ZvPoint3<double>& p, double time) {
  ZvScopedLock guard(lock);
  return impl->ForEdit().Curveto(c1, c2, p, time);
}

int ZvMotionPath3d::PreLineto(const ZvPoint3<double>& p, double time) {
  ZvScopedLock guard(lock);
  ZvMotionPath3dImpl& m = impl->ForEdit();
  if (m.NumPoints() == 0 || !(time < m.initialTimes[0])) return 0;
  m.Reserve(3);
  const ZvPoint3<double> copies[3] = {p, p, p};
  void* const none[3] = {nullptr, nullptr, nullptr};
  m.controlPoints.InsertBefore(0, copies, 3);
  m.clientData.InsertBefore(0, none, 3);
  m.InsertNodeRecord(0, time, ZvMotionPath3d::sm_LINENODE);
  return 1;
}

int ZvMotionPath3d::PreCurveto(const ZvPoint3<double>& c1, const ZvPoint3<double>& c2,
                               const ZvPoint3<double>& p, double time) {
  ZvScopedLock guard(lock);
  ZvMotionPath3dImpl& m = impl->ForEdit();
  if (m.NumPoints() == 0 || !(time < m.initialTimes[0])) return 0;
  m.Reserve(3);
  const ZvPoint3<double> points[3] = {c1, c2, p};
  void* const none[3] = {nullptr, nullptr, nullptr};
  m.controlPoints.InsertBefore(0, points, 3);
  m.clientData.InsertBefore(0, none, 3);
  m.InsertNodeRecord(0, time, 0);
  m.RelockOrClear(3);
  return 1;
}

namespace {

// The end segment seen from its outer node: at(0) is the end node, at(1), at(2) the segment's
// handles, at(3) the next node, at(4) its other handle, at(6) the node after. The same code
// then serves both ends of the path.
struct EndView {
  ZvPoint3<double>* p;
  unsigned int last;
  bool fromEnd;
  ZvPoint3<double>& at(unsigned int k) const { return fromEnd ? p[last - k] : p[k]; }
};

int AdjustEndCubic(ZvMotionPath3dImpl& m, const EndView& v, ZvPoint3<double>& tangent) {
  const ZvPoint3<double> node = v.at(3);
  const double chord = zvGuardedLength(node - v.at(0));
  // The tangent at the next node runs parallel to the chord between its two neighbour nodes,
  // as in a Catmull-Rom spline; the host's tangent is the fallback for a folded path.
  ZvPoint3<double> d = v.at(0) - v.at(6);
  double length = zvGuardedLength(d);
  if (length < 1e-7) {
    d = tangent;
    length = zvGuardedLength(d);
  }
  if (length < 1e-7) {
    v.at(1) = v.at(0) + (node - v.at(0)) * 0.3333333333333333;
    v.at(2) = v.at(0) + (node - v.at(0)) * 0.6666666666666666;
    return 1;
  }
  d = d / length;
  tangent = d;
  // A quadratic through the end, raised to a cubic: its control point lies half a chord out
  // along the tangent, and the cubic handles two thirds of the way towards it.
  const ZvPoint3<double> control = node + d * (chord * 0.5);
  v.at(2) = node + (control - node) * 0.6666666666666666;
  v.at(1) = v.at(0) + (control - v.at(0)) * 0.6666666666666666;
  const unsigned int nodeIndex = v.fromEnd ? v.last - 3 : 3;
  if (m.IsG1Locked(nodeIndex / 3)) v.at(4) = node - d * zvGuardedLength(v.at(4) - node);
  return 1;
}

int AdjustEnd(ZvMotionPath3dImpl& m, bool fromEnd, ZvPoint3<double>& tangent) {
  const unsigned int n = m.NumPoints();
  if (n < 7) return 0;
  const unsigned int k = m.NumNodes();
  const unsigned int outer = fromEnd ? k - 2 : 0, inner = fromEnd ? k - 3 : 1;
  if (m.IsLineNode(outer) || m.IsLineNode(inner)) return 0;
  return AdjustEndCubic(m, EndView{m.controlPoints.data, n - 1, fromEnd}, tangent);
}

}  // namespace

int ZvMotionPath3d::AdjustFirstTwoCubics(ZvPoint3<double>& tangent) {
  ZvScopedLock guard(lock);
  return AdjustEnd(impl->ForEdit(), false, tangent);
}

int ZvMotionPath3d::AdjustLastTwoCubics(ZvPoint3<double>& tangent) {
  ZvScopedLock guard(lock);
  return AdjustEnd(impl->ForEdit(), true, tangent);
}
