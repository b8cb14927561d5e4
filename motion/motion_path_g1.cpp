// G1 locks: collinear handles at a node, kept through control point edits.
#include <zv/motion_path.h>

#include "core/scoped_lock.h"
#include "motion/motion_path_impl.h"

int ZvMotionPath3dImpl::LockG1(unsigned int index) {
  if (!IsNodeIndex(index) || NumPoints() < 4) return 0;
  const unsigned int node = index / 3;
  const bool first = index == 0, last = index == LastIndex();
  if ((!last && IsLineNode(node)) || (!first && IsLineNode(node - 1))) return 0;
  if (!first && !last) {
    ZvPoint3<double>* p = controlPoints.data + index;
    const double a = zvGuardedLength(p[-1] - p[0]);
    const double b = zvGuardedLength(p[1] - p[0]);
    if (a < 1e-7 || b < 1e-7) return 0;
    // The mean of the two handle directions: each handle turns by half the angle between them.
    const ZvPoint3<double> mean = ((p[-1] - p[0]) + (p[0] - p[1])) * 0.5;
    const double length = zvGuardedLength(mean);
    if (length < 1e-7) return 0;
    const ZvPoint3<double> d = mean / length;
    p[-1] = p[0] + d * a;
    p[1] = p[0] - d * b;
  }
  nodeFlags[node] |= ZvMotionPath3d::sm_G1LOCKED;
  return 1;
}

void ZvMotionPath3dImpl::RelockOrClear(unsigned int index) {
  const unsigned int node = index / 3;
  if (IsG1Locked(node) && !LockG1(index))
    nodeFlags[node] &= static_cast<unsigned char>(~ZvMotionPath3d::sm_G1LOCKED);
}

int ZvMotionPath3dImpl::ReplaceProcessingG1Lock(unsigned int index, const ZvPoint3<double>& p,
                                                int keepLength) {
  ZvPoint3<double>* cp = controlPoints.data;
  if (NumPoints() == 1) {
    cp[index] = p;
    return 1;
  }
  const unsigned int phase = index % 3;
  if (phase == 0) {
    const ZvPoint3<double> delta = p - cp[index];
    cp[index] = p;
    if (IsG1Locked(index / 3)) {
      if (index > 0) cp[index - 1] += delta;
      if (index < LastIndex()) cp[index + 1] += delta;
    }
    return 1;
  }
  // The node this handle belongs to, and the handle on the node's other side.
  const unsigned int node = phase == 1 ? index - 1 : index + 1;
  const bool hasOther = phase == 1 ? node > 0 : node < LastIndex();
  if (!hasOther || !IsG1Locked(node / 3) || IsLineNode(index / 3)) {
    cp[index] = p;
    return 1;
  }
  const unsigned int other = phase == 1 ? index - 2 : index + 2;
  double otherLength = zvGuardedLength(cp[other] - cp[node]);
  if (keepLength) {
    const double oldLength = zvGuardedLength(cp[index] - cp[node]);
    if (oldLength > 0.0) otherLength *= zvGuardedLength(p - cp[node]) / oldLength;
  }
  cp[index] = p;
  cp[other] = cp[node] + zvMotionDirection(cp[node] - p) * otherLength;
  return 1;
}

int ZvMotionPath3d::LockG1Continuity(unsigned int index) {
  ZvScopedLock guard(lock);
  return impl->ForEdit().LockG1(index);
}

int ZvMotionPath3d::UnlockG1Continuity(unsigned int index) {
  ZvScopedLock guard(lock);
  ZvMotionPath3dImpl& m = impl->ForEdit();
  if (!m.IsNodeIndex(index)) return 0;
  m.nodeFlags[index / 3] &= static_cast<unsigned char>(~sm_G1LOCKED);
  return 1;
}

int ZvMotionPath3d::LockG1ContinuityAtAllNodes() {
  ZvScopedLock guard(lock);
  ZvMotionPath3dImpl& m = impl->ForEdit();
  int all = m.NumPoints() > 0;
  for (unsigned int i = 0; i < m.NumPoints(); i += 3)
    all &= m.LockG1(i);
  return all;
}

int ZvMotionPath3d::IsG1ContinuityLocked(unsigned int index) const {
  ZvScopedLock guard(lock);
  return impl->IsNodeIndex(index) && impl->IsG1Locked(index / 3);
}

int ZvMotionPath3d::ReplaceControlPoint(unsigned int index, const ZvPoint3<double>& p,
                                        int keepLength) {
  ZvScopedLock guard(lock);
  ZvMotionPath3dImpl& m = impl->ForEdit();
  if (index >= m.NumPoints()) return 0;
  return m.ReplaceProcessingG1Lock(index, p, keepLength);
}

int ZvMotionPath3d::TranslateControlPoint(unsigned int index, const ZvPoint3<double>& delta,
                                          int keepLength) {
  ZvScopedLock guard(lock);
  ZvMotionPath3dImpl& m = impl->ForEdit();
  if (index >= m.NumPoints()) return 0;
  return m.ReplaceProcessingG1Lock(index, m.controlPoints[index] + delta, keepLength);
}

int ZvMotionPath3d::ReplaceControlPointIgnoringLock(unsigned int index, const ZvPoint3<double>& p) {
  ZvScopedLock guard(lock);
  ZvMotionPath3dImpl& m = impl->ForEdit();
  if (index >= m.NumPoints()) return 0;
  m.controlPoints[index] = p;
  return 1;
}
