// Position from time, and the searches over node times.
#include <zv/motion_path.h>
#include <zv/polyline.h>

#include <cmath>

#include "core/scoped_lock.h"
#include "motion/motion_path_impl.h"

int ZvMotionPath3dImpl::EvalOnCubic(unsigned int i, double time, double tolerance,
                                    ZvPoint3<double>& out) const {
  const ZvMotionSegmentArc& arc = arcs.Segment(controlPoints, i, tolerance);
  if (arc.length < 1e-7) {
    out = controlPoints[i];
    return 0;
  }
  const ZvMotionTiming timing = SegmentTiming(i, arc.length, tolerance, arcs);
  ZvPoint3dArraySingleComponent_ComputePosition(arc.polyline, arc.chords, timing.ArcLength(time),
                                                out);
  return 1;
}

int ZvMotionPath3dImpl::Eval(double time, double tolerance, ZvPoint3<double>& out) const {
  if (controlPoints.size == 0 || std::isnan(time)) return 0;
  int exact = 0;
  const unsigned int at = LocateTimeValue(time, exact);
  if (at == 0) {
    out = controlPoints[0];
    return 1;
  }
  if (at == NumNodes()) {
    out = controlPoints[LastIndex()];
    return 1;
  }
  const unsigned int node = at - 1;
  const unsigned int i = 3 * node;
  if (exact || tangents[node].right == ZvMotionPath3d::Hold) {
    out = controlPoints[i];
    return 1;
  }
  if (IsLineNode(node)) {
    const double u = (time - initialTimes[node]) / (initialTimes[node + 1] - initialTimes[node]);
    out = controlPoints[i] + (controlPoints[i + 3] - controlPoints[i]) * u;
    return 1;
  }
  return EvalOnCubic(i, time, tolerance, out);
}

int ZvMotionPath3d::Eval(double time, double tolerance, ZvPoint3<double>& out, int) const {
  ZvScopedLock guard(lock);
  return impl->Eval(time, tolerance, out);
}

int ZvMotionPath3d::EvalSequence(double from, double to, double step, double tolerance,
                                 ZvPoint3dArray& out, int) const {
  ZvScopedLock guard(lock);
  // A step that does not move t would never end the walk.
  if (impl->NumPoints() == 0 || !(from + step > from)) return 0;
  ZvPoint3<double> p;
  for (double t = from; t <= to; t += step) {
    impl->Eval(t, tolerance, p);
    out.Add(p);
    if (!(t + step > t)) break;
  }
  return 1;
}

int ZvMotionPath3d::GetBracketingIndices(double time, double, unsigned int& low, int& lowIsValid,
                                         unsigned int& high, int& highIsValid, int) const {
  ZvScopedLock guard(lock);
  const ZvMotionPath3dImpl& m = *impl;
  if (m.NumPoints() == 0) return 0;
  lowIsValid = 1;
  highIsValid = 1;
  int exact = 0;
  const unsigned int at = m.LocateTimeValue(time, exact);
  if (at == 0) {
    lowIsValid = 0;
    high = 0;
  } else if (exact) {
    low = high = 3 * (at - 1);
  } else if (at == m.NumNodes()) {
    low = m.LastIndex();
    highIsValid = 0;
  } else {
    low = 3 * (at - 1);
    high = low + 3;
  }
  return 1;
}

int ZvMotionPath3d::GetNodeIndexFromInitialTime(double time, double tolerance,
                                                unsigned int& index) const {
  ZvScopedLock guard(lock);
  const ZvMotionPath3dImpl& m = *impl;
  if (m.NumPoints() == 0) return 0;
  int exact = 0;
  const unsigned int at = m.LocateTimeValue(time, exact);
  const double* t = m.initialTimes.data;
  if (exact) {
    index = 3 * (at - 1);
    return 1;
  }
  if (at == 0) {
    if (!(time + tolerance > t[0])) return 0;
    index = 0;
    return 1;
  }
  if (at == m.NumNodes()) {
    if (!(time - tolerance <= t[at - 1])) return 0;
    index = m.LastIndex();
    return 1;
  }
  const unsigned int a = at - 1;
  const bool nearA = time - tolerance <= t[a];
  const bool nearB = time + tolerance > t[a + 1];
  if (!nearA && !nearB) return 0;
  const bool takeA = nearA && (!nearB || time - t[a] <= t[a + 1] - time);
  index = 3 * (takeA ? a : a + 1);
  return 1;
}

int ZvMotionPath3d::IsCubicSegmentLinearlyParameterized(unsigned int index) const {
  ZvScopedLock guard(lock);
  const ZvMotionPath3dImpl& m = *impl;
  if (m.NumPoints() < 2 || !m.IsNodeIndex(index) || index == m.LastIndex() ||
      m.IsLineNode(index / 3))
    return 0;
  const ZvPoint3<double>* p = m.controlPoints.data + index;
  const ZvPoint3<double> chord = p[3] - p[0];
  const auto near = [](const ZvPoint3<double>& a, const ZvPoint3<double>& b) {
    const ZvPoint3<double> d = a - b;
    return d.x * d.x + d.y * d.y + d.z * d.z < 1e-7;
  };
  return near(p[1], p[0] + chord * 0.3333333333333333) &&
         near(p[2], p[0] + chord * 0.6666666666666666);
}
