// The data of a motion path and the algorithms its public operations share.
#ifndef ZV_MOTION_PATH_IMPL_H
#define ZV_MOTION_PATH_IMPL_H

#include <zv/arrays.h>
#include <zv/motion_path.h>

#include "core/vec.h"
#include "motion/motion_arc_cache.h"

// The direction of v, normalised by the guarded length; a vector too short to normalise is
// returned as it is, so a handle sitting on its node never turns into a huge one.
inline ZvPoint3<double> zvMotionDirection(const ZvPoint3<double>& v) {
  const double length = zvGuardedLength(v);
  return length > 0.0 ? v / length : v;
}

// Tangent information on the two sides of a node.
struct ZvTwoSidedTangent {
  ZvMotionPath3d::TangentInfo left = ZvMotionPath3d::Smooth;
  ZvMotionPath3d::TangentInfo right = ZvMotionPath3d::Smooth;
  static bool IsValid(ZvMotionPath3d::TangentInfo info) {
    return static_cast<unsigned int>(info) <= ZvMotionPath3d::Ease;
  }
};

class ZvMotionPath3dImpl {
 public:
  ZvMotionPath3dImpl();
  // Arrays of capacity 1, for the data constructors which fill them at once.
  explicit ZvMotionPath3dImpl(int);

  unsigned int NumPoints() const { return controlPoints.size; }
  unsigned int NumNodes() const { return initialTimes.size; }
  unsigned int LastIndex() const { return controlPoints.size - 1; }
  bool IsNodeIndex(unsigned int i) const { return i < controlPoints.size && i % 3 == 0; }
  bool IsLineNode(unsigned int node) const {
    return (nodeFlags[node] & ZvMotionPath3d::sm_LINENODE) != 0;
  }
  bool IsG1Locked(unsigned int node) const {
    return (nodeFlags[node] & ZvMotionPath3d::sm_G1LOCKED) != 0;
  }

  // Called by every edit before it touches the data.
  ZvMotionPath3dImpl& ForEdit() {
    arcs.Clear();
    return *this;
  }

  // 1-based position of `time` among the node times: 0 before the first node, the node count
  // at or after the last, otherwise low + 1 with node low the last one at or before time.
  // isExact says whether a node time was hit within 1e-15.
  unsigned int LocateTimeValue(double time, int& isExact) const;
  int Eval(double time, double tolerance, ZvPoint3<double>& out) const;
  // Position on the cubic leaving control index i at `time`; 0 (and the start node) when the
  // segment has no length.
  int EvalOnCubic(unsigned int i, double time, double tolerance, ZvPoint3<double>& out) const;
  // The timing of the segment leaving control index i of length L, flattening the neighbours
  // through `cache` when their lengths set the end speeds.
  ZvMotionTiming SegmentTiming(unsigned int i, double length, double tolerance,
                               ZvMotionArcCache& cache) const;

  // The construction edits; the public ones lock and forward here.
  int Moveto(const ZvPoint3<double>& p, double time);
  int Lineto(const ZvPoint3<double>& p, double time);
  int Curveto(const ZvPoint3<double>& c1, const ZvPoint3<double>& c2, const ZvPoint3<double>& p,
              double time);

  int LockG1(unsigned int index);
  int ReplaceProcessingG1Lock(unsigned int index, const ZvPoint3<double>& p, int keepLength);
  // After an edit next to a locked end node: lock again, or drop the lock if that fails.
  void RelockOrClear(unsigned int index);

  // Room for `points` more points and one more node in every array, so that the insertions of
  // an edit that follow cannot fail half way and leave the arrays out of step. Throws
  // std::bad_alloc with the path unchanged.
  void Reserve(unsigned int points);
  // The time, tangents and flags of a new node.
  void InsertNodeRecord(unsigned int node, double time, unsigned char flags);

  ZvPoint3dArray controlPoints;
  ZvLPVoidArray clientData;
  ZvDoubleArray initialTimes;
  ZvUByteArray nodeFlags;
  ZvDynArray<ZvTwoSidedTangent> tangents;
  mutable ZvMotionArcCache arcs;
  // The segment of the last time search: evaluations at sequential times mostly stay in it.
  mutable unsigned int timeHint = 0;
};

#endif
