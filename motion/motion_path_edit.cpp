// Edits of nodes, segments and times of a motion path.
#include <zv/bezier_tool.h>
#include <zv/motion_path.h>
#include <zv/transfo4.h>

#include <cmath>
#include <new>

#include "core/scoped_lock.h"
#include "motion/motion_path_impl.h"

namespace {

// Removes a closed range. The arrays give memory back when they fall below half full; if that
// allocation fails the elements are already gone and the array is sound, so the failure is
// not passed on, which would leave the other arrays of the path out of step.
template <class Array>
void RemoveRange(Array& a, unsigned int first, unsigned int last) {
  try {
    a.RemoveClosedRange(first, last);
  } catch (const std::bad_alloc&) {
  }
}

// Index of a node that starts a segment, or false.
bool IsSegmentStart(const ZvMotionPath3dImpl& m, unsigned int index) {
  return m.IsNodeIndex(index) && index < m.LastIndex();
}

int InsertNodeOnLineSegment(ZvMotionPath3dImpl& m, unsigned int i, double time) {
  const unsigned int node = i / 3;
  const double u =
      (time - m.initialTimes[node]) / (m.initialTimes[node + 1] - m.initialTimes[node]);
  const ZvPoint3<double> q = m.controlPoints[i] + (m.controlPoints[i + 3] - m.controlPoints[i]) * u;
  m.Reserve(3);
  const ZvPoint3<double> copies[3] = {q, q, q};
  void* const none[3] = {nullptr, nullptr, nullptr};
  m.controlPoints.InsertBefore(i + 3, copies, 3);
  m.clientData.InsertBefore(i + 3, none, 3);
  m.InsertNodeRecord(node + 1, time, ZvMotionPath3d::sm_LINENODE);
  return 1;
}

int InsertNodeOnCubic(ZvMotionPath3dImpl& m, unsigned int i, double time, double tolerance) {
  ZvPoint3<double> point;
  double u = 0.5;
  if (m.EvalOnCubic(i, time, tolerance, point)) {
    double distance = 0.0;
    u = -1.0;
    if (!ZvBezierTool_LocatePoint3d(m.controlPoints.data + i, tolerance, point,
                                    tolerance * tolerance, distance, u) ||
        !(u > 0.0 && u < 1.0))
      return 0;
  }
  m.Reserve(3);
  ZvPoint3<double> halves[5];
  ZvBezierTool_SplitCubic3d(m.controlPoints.data + i, halves, u);
  // The halves are P0, h0, h1, h2 and h2, h3, h4, P3: h2 is the new node.
  m.controlPoints[i + 1] = halves[0];
  m.controlPoints[i + 2] = halves[1];
  void* const none[3] = {nullptr, nullptr, nullptr};
  m.controlPoints.InsertBefore(i + 3, halves + 2, 3);
  m.clientData.InsertBefore(i + 3, none, 3);
  m.InsertNodeRecord(i / 3 + 1, time, 0);
  // The search above flattened the segment as it was.
  m.arcs.Clear();
  return 1;
}

// Moves the handle of the inner node `index` on the side `side` (-1 before, +1 after) to a
// third of `chord` along the neighbouring tangent. False when that tangent is degenerate.
bool AlignHandle(ZvMotionPath3dImpl& m, unsigned int index, int side, double chord) {
  ZvPoint3<double>* p = m.controlPoints.data + index;
  // The tangent runs from the handle before the node to the handle after it.
  const ZvPoint3<double> along = side > 0 ? p[0] - p[-1] : p[1] - p[0];
  if (along.x * along.x + along.y * along.y + along.z * along.z < 1e-7) return false;
  p[side] = p[0] + zvMotionDirection(along) * (side * chord * 0.3333333333333333);
  return true;
}

}  // namespace

int ZvMotionPath3d::Transform(const ZvTransfo4& t) {
  ZvScopedLock guard(lock);
  ZvMotionPath3dImpl& m = impl->ForEdit();
  t.MapInPlace(m.controlPoints.data, m.controlPoints.size);
  return 1;
}

int ZvMotionPath3d::LinearizeSegment(unsigned int nodeIndex) {
  ZvScopedLock guard(lock);
  ZvMotionPath3dImpl& m = impl->ForEdit();
  if (!IsSegmentStart(m, nodeIndex)) return 0;
  const unsigned int node = nodeIndex / 3;
  if (m.IsLineNode(node)) return 1;
  const unsigned char unlock = static_cast<unsigned char>(~sm_G1LOCKED);
  m.nodeFlags[node] &= unlock;
  m.nodeFlags[node + 1] &= unlock;
  ZvPoint3<double>* p = m.controlPoints.data + nodeIndex;
  const ZvPoint3<double> chord = p[3] - p[0];
  p[1] = p[0] + chord * 0.3333333333333333;
  p[2] = p[0] + chord * 0.6666666666666666;
  return 1;
}

int ZvMotionPath3d::SmoothSegment(unsigned int nodeIndex) {
  ZvScopedLock guard(lock);
  ZvMotionPath3dImpl& m = impl->ForEdit();
  if (!IsSegmentStart(m, nodeIndex) || m.IsLineNode(nodeIndex / 3)) return 0;
  if (m.NumPoints() == 4) return 1;
  const unsigned int end = nodeIndex + 3;
  const bool innerStart = nodeIndex > 0, innerEnd = end < m.LastIndex();
  const double chord = zvGuardedLength(m.controlPoints[end] - m.controlPoints[nodeIndex]);
  // A refused smoothing must leave the path as it was, and the locks come last.
  const ZvMotionPath3dImpl before(m);
  bool done = (!innerStart || AlignHandle(m, nodeIndex, +1, chord)) &&
              (!innerEnd || AlignHandle(m, end, -1, chord));
  if (done && innerStart) done = m.LockG1(nodeIndex) != 0;
  if (done && innerEnd) done = m.LockG1(end) != 0;
  if (!done) m = before;
  return done;
}

int ZvMotionPath3d::ReplaceTangentVectorDirections(unsigned int nodeIndex,
                                                   const ZvPoint3<double>& d) {
  ZvScopedLock guard(lock);
  ZvMotionPath3dImpl& m = impl->ForEdit();
  if (!m.IsNodeIndex(nodeIndex) || nodeIndex == 0 || nodeIndex == m.LastIndex()) return 0;
  ZvPoint3<double>* p = m.controlPoints.data + nodeIndex;
  p[-1] = p[0] - d;
  p[1] = p[0] + d;
  return 1;
}

int ZvMotionPath3d::ReplaceNode(unsigned int index, const ZvPoint3<double>& p, double time,
                                double minGap) {
  ZvScopedLock guard(lock);
  ZvMotionPath3dImpl& m = impl->ForEdit();
  if (!(minGap >= 0.0) || !m.IsNodeIndex(index) || !std::isfinite(time)) return 0;
  const unsigned int node = index / 3;
  const double* t = m.initialTimes.data;
  if (node > 0 && !(time > t[node - 1] + minGap)) return 0;
  if (node + 1 < m.NumNodes() && !(time < t[node + 1] - minGap)) return 0;
  m.ReplaceProcessingG1Lock(index, p, 0);
  m.initialTimes[node] = time;
  return 1;
}

int ZvMotionPath3d::InsertNode(double time, double minGap, double tolerance, unsigned int& index,
                               int& isExisting) {
  ZvScopedLock guard(lock);
  ZvMotionPath3dImpl& m = impl->ForEdit();
  if (!(minGap >= 0.0) || m.NumPoints() < 4) return 0;
  int exact = 0;
  const unsigned int at = m.LocateTimeValue(time, exact);
  if (exact) {
    isExisting = 1;
    index = 3 * (at - 1);
    return 0;
  }
  if (at == 0 || at == m.NumNodes()) {
    isExisting = 0;
    return 0;
  }
  const unsigned int a = at - 1;
  if (m.initialTimes[a] + minGap > time || time > m.initialTimes[a + 1] - minGap) {
    isExisting = 1;
    index = m.initialTimes[a] + minGap > time ? 3 * a : 3 * (a + 1);
    return 0;
  }
  const unsigned int i = 3 * a;
  const int made = m.IsLineNode(a) ? InsertNodeOnLineSegment(m, i, time)
                                   : InsertNodeOnCubic(m, i, time, tolerance);
  if (!made) return 0;
  isExisting = 0;
  index = i + 3;
  return 1;
}

unsigned int ZvMotionPath3d::RemoveNodes(unsigned int first, unsigned int last) {
  ZvScopedLock guard(lock);
  ZvMotionPath3dImpl& m = impl->ForEdit();
  if (m.NumPoints() == 0 || !m.IsNodeIndex(first) || !m.IsNodeIndex(last) || first > last) return 0;
  const unsigned int n = m.NumPoints();
  if (first == 0 && last == n - 1) {
    // Everything goes: the arrays are chopped rather than shrunk, ready to grow again.
    m.controlPoints.Chop(0);
    m.clientData.Chop(0);
    m.initialTimes.Chop(0);
    m.nodeFlags.Chop(0);
    m.tangents.Chop(0);
    return n;
  }
  unsigned int from = 0, to = n - 1;
  if (first == 0) {
    to = last + 2;
  } else if (last == n - 1) {
    from = first - 2;
  } else {
    // An inner run takes one handle on each side with it; the two handles left join the
    // nodes around the gap into one segment.
    from = first - 1;
    to = last + 1;
  }
  RemoveRange(m.controlPoints, from, to);
  RemoveRange(m.clientData, from, to);
  RemoveRange(m.initialTimes, first / 3, last / 3);
  RemoveRange(m.nodeFlags, first / 3, last / 3);
  RemoveRange(m.tangents, first / 3, last / 3);
  return to - from + 1;
}

int ZvMotionPath3d::ScaleAndOffsetInitialTimes(double scale, double offset) {
  ZvScopedLock guard(lock);
  ZvMotionPath3dImpl& m = impl->ForEdit();
  const bool noScale = std::fabs(scale) <= 1e-9;
  if (m.NumPoints() == 0 || (noScale && std::fabs(offset) <= 1e-9)) return 1;
  ZvDoubleArray times(m.initialTimes.capacity);
  for (unsigned int k = 0; k < m.NumNodes(); ++k) {
    const double t = m.initialTimes[k];
    times.Add(noScale ? t + offset : t * scale + offset);
    if (k > 0 && !(times[k] > times[k - 1])) return 0;
  }
  m.initialTimes = times;
  return 1;
}

int ZvMotionPath3d::GetClosestControlPointIndex(const ZvPoint3<double>& p, double tolerance,
                                                unsigned int& index) const {
  ZvScopedLock guard(lock);
  const ZvMotionPath3dImpl& m = *impl;
  double best = 1.7976931348623157e308;
  bool found = false;
  for (unsigned int i = 0; i < m.NumPoints(); ++i) {
    // The handles of a line are not shown, so they cannot be picked.
    if (i % 3 != 0 && m.IsLineNode(i / 3)) continue;
    const ZvPoint3<double>& q = m.controlPoints[i];
    if (!IsInEXtent(p, tolerance, q)) continue;
    const ZvPoint3<double> d = q - p;
    const double d2 = d.x * d.x + d.y * d.y + d.z * d.z;
    if (d2 < best) {
      best = d2;
      index = i;
      found = true;
    }
  }
  return found;
}
