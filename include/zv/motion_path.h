// ZvMotionPath3d: a 3-D path along which something travels in time.
//
// Geometry. Control points run node, outgoing handle, incoming handle, node, ... so a path of K
// nodes holds 3 (K - 1) + 1 points; control point i is a node when i is divisible by 3, and
// node index = i / 3. Each segment is a cubic Bezier, or a straight line when its start node
// carries the line flag (then its two handles are ignored for the shape). Coordinates are
// doubles in the host's units; nothing here assumes an axis convention, except the projections.
//
// Timing. Every node carries a time (the host's unit, seconds for instance), strictly
// increasing along the path. Between two nodes the position is found by arc length: the time
// is mapped to a distance along the segment by a cubic whose end speeds come from the tangent
// information of the two nodes (see TangentInfo), then that distance is walked along the
// segment's flattened polyline. Straight segments are timed linearly whatever their tangents.
// Before the first node time the path sits on its first point, after the last on its last.
//
// Tolerance. Evaluation and rendering flatten cubics to `tolerance` (same units as the points,
// positive). The number of polyline points grows with the ratio of a segment's size to the
// tolerance, so keep the tolerance in proportion to the path. Flattened segments are kept, per
// tolerance, until the path is next edited, so repeated evaluation costs a search rather than a
// flatten; a different tolerance starts afresh. Cached and fresh evaluations give the same bits.
//
// Indices are control point indices unless named otherwise; a node index argument is a control
// point index divisible by 3. Operations returning int give 1 (or a positive count) on success
// and 0 on failure, and a refused edit leaves the path unchanged. Allocation failure raises
// std::bad_alloc, which passes through with the lock released; only
// ZvMotionPath3d_CreateFromBufferBody swallows it.
//
// Threads. Every public operation holds the path's recursive lock for its whole duration, so
// one path may be shared between threads; operations on two paths lock `this` first.
#ifndef ZV_MOTION_PATH_H
#define ZV_MOTION_PATH_H

#include <zv/api.h>
#include <zv/arrays.h>
#include <zv/critical_section.h>
#include <zv/point.h>

#include <cmath>

class ZvMotionPath3dImpl;
class ZvPath2f;
class ZvTransfo4;

class ZV_API ZvMotionPath3d {
 public:
  // How arc length runs with time near a node, on each side of it.
  enum TangentInfo {
    Undefined = 0,  // treated as Smooth
    Hold = 1,       // right side only: the path stays at the node until the next node time
    Constant = 2,   // Constant on both ends of a segment gives constant speed over it
    Smooth = 3,     // default: speed taken from the neighbouring segments
    Ease = 4        // speed 0 at the node on that side
  };

  // What GetControlPointKind reports.
  enum PointKind {
    LineStartNode = 0,
    LineFirstHandle = 1,
    LineSecondHandle = 2,
    LastNodeAfterLine = 3,  // last node whose own flags carry the line flag
    CubicStartNode = 4,
    CubicFirstHandle = 5,
    CubicSecondHandle = 6,
    LastNode = 7,  // last node whose own flags carry no line flag
    SinglePoint = 8
  };

  // The plane GetProjectedPath projects on; other values are reserved and refused.
  enum Projection {
    ProjectXY = 0,  // (x, y)
    ProjectZY = 1,  // (-z, y)
    ProjectXZ = 2   // (x, -z)
  };

  // Node flag bit 0: the segment leaving the node is a straight line.
  static constexpr unsigned char sm_LINENODE = 1;
  // Node flag bit 1: G1 continuity is locked at the node.
  static constexpr unsigned char sm_G1LOCKED = 2;

  // ---- Construction -------------------------------------------------------------------------
  ZvMotionPath3d();  // empty: grows by Moveto, then Lineto/Curveto or their Pre forms
  // A straight segment from p0 at t0 to p3 at t1 (t1 must exceed t0 for it to be usable).
  ZvMotionPath3d(const ZvPoint3<double>& p0, const ZvPoint3<double>& p3, double t0, double t1);
  // A cubic segment p0, p1, p2, p3 from t0 to t1.
  ZvMotionPath3d(const ZvPoint3<double>& p0, const ZvPoint3<double>& p3, double t0, double t1,
                 const ZvPoint3<double>& p1, const ZvPoint3<double>& p2);
  ZvMotionPath3d(const ZvMotionPath3d& other);
  // Copies the other path's data (client pointers included) by value; on itself a no-op.
  ZvMotionPath3d& operator=(const ZvMotionPath3d& other);
  virtual ~ZvMotionPath3d();

  // ---- Queries ------------------------------------------------------------------------------
  unsigned int NumPoints() const;
  unsigned int NumNodes() const;
  // First and last node time; outputs untouched and 0 when the path is empty.
  int GetTimeInterval(double& first, double& last) const;
  double GetFirstTime(int = 0) const;  // 0.0 when empty
  double GetLastTime(int = 0) const;   // 0.0 when empty
  int GetNode(unsigned int index, ZvPoint3<double>& point, double& time) const;
  int IsNode(unsigned int index) const;
  int GetControlPoint(unsigned int index, ZvPoint3<double>& point) const;
  // Points first..last into points[0..]; when times is not null, the time of each node among
  // them goes to times[k] at the same offset (handles leave their slot untouched).
  int GetControlPoints(unsigned int first, unsigned int last, ZvPoint3<double>* points,
                       double* times) const;
  int GetControlPointKind(unsigned int index, PointKind& kind) const;
  // Opaque host pointers, one per control point, not owned, never persisted.
  int SetClientData(unsigned int index, void* data);
  void* GetClientData(unsigned int index) const;                  // null when out of range
  int SetLeftTangentInfo(unsigned int index, TangentInfo info);   // 0 for values outside 0..4
  int SetRightTangentInfo(unsigned int index, TangentInfo info);  // 0 for values outside 0..4
  int GetLeftTangentInfo(unsigned int index, TangentInfo& info) const;
  int GetRightTangentInfo(unsigned int index, TangentInfo& info) const;
  unsigned char GetNodeFlags(unsigned int index) const;  // 0 when not a node

  // ---- Evaluation ---------------------------------------------------------------------------
  // The position at `time`. At a node time (within 1e-15) the node itself. Returns 1, or 0 when
  // the path is empty or time is NaN (out untouched) or the segment has no length (out = its
  // start node).
  int Eval(double time, double tolerance, ZvPoint3<double>& out, int = 0) const;
  // Appends Eval(t) for t = from, from + step, ... while t <= to (t accumulated by addition).
  // Returns 1; 0 with nothing appended when the path is empty or step does not advance t.
  int EvalSequence(double from, double to, double step, double tolerance, ZvPoint3dArray& out,
                   int = 0) const;
  // Control indices of the nodes around `time`; a flag of 0 marks a side with no node. Both are
  // the same node on an exact hit. 0 when empty.
  int GetBracketingIndices(double time, double, unsigned int& low, int& lowIsValid,
                           unsigned int& high, int& highIsValid, int = 0) const;
  // The node whose time lies within `tolerance` of `time` (the nearer of two, the earlier on a
  // tie); 1 and its control index, or 0.
  int GetNodeIndexFromInitialTime(double time, double tolerance, unsigned int& index) const;
  // Whether the cubic leaving node `index` has its handles at a third and two thirds of its
  // chord (to 1e-7 squared), so that its parameter runs evenly.
  int IsCubicSegmentLinearlyParameterized(unsigned int index) const;

  // ---- Construction edits -------------------------------------------------------------------
  int Moveto(const ZvPoint3<double>& p, double time);     // empty path only
  int Lineto(const ZvPoint3<double>& p, double time);     // time after the last
  int PreLineto(const ZvPoint3<double>& p, double time);  // time before the first
  int Curveto(const ZvPoint3<double>& c1, const ZvPoint3<double>& c2, const ZvPoint3<double>& p,
              double time);
  // The path then begins c1, c2, p followed by the old first node; c1 is the new first point.
  int PreCurveto(const ZvPoint3<double>& c1, const ZvPoint3<double>& c2, const ZvPoint3<double>& p,
                 double time);
  // Re-derive the handles of the first (last) segment after a new end node; the unit tangent
  // used is written back to `tangent`.
  int AdjustFirstTwoCubics(ZvPoint3<double>& tangent);
  int AdjustLastTwoCubics(ZvPoint3<double>& tangent);

  // ---- G1 locks -----------------------------------------------------------------------------
  // Makes the two handles of an inner node collinear (keeping their lengths) and marks it.
  // Refused next to a straight segment, with fewer than 4 points or degenerate handles.
  int LockG1Continuity(unsigned int index);
  int UnlockG1Continuity(unsigned int index);
  int LockG1ContinuityAtAllNodes();  // 1 when every node locked
  int IsG1ContinuityLocked(unsigned int index) const;

  // ---- Point edits --------------------------------------------------------------------------
  // Moves a control point, keeping locked nodes G1: a locked node carries its handles along; a
  // handle of a locked inner node turns the opposite handle with it, keeping its length, or
  // scaling it with the moved handle when keepLength is non-zero.
  int ReplaceControlPoint(unsigned int index, const ZvPoint3<double>& p, int keepLength);
  int TranslateControlPoint(unsigned int index, const ZvPoint3<double>& delta, int keepLength);
  int ReplaceControlPointIgnoringLock(unsigned int index, const ZvPoint3<double>& p);
  int Transform(const ZvTransfo4& t);  // maps every control point; times unchanged
  // Handles at 1/3 and 2/3 of the chord; the line flag is not changed. Clears both G1 locks.
  int LinearizeSegment(unsigned int nodeIndex);
  // Handles turned along the neighbouring tangents at a third of the chord, then G1 locked.
  int SmoothSegment(unsigned int nodeIndex);
  // Inner nodes: handle before = node - d, handle after = node + d.
  int ReplaceTangentVectorDirections(unsigned int nodeIndex, const ZvPoint3<double>& d);
  // Moves a node and its time; the time must stay more than minGap inside its neighbours'.
  int ReplaceNode(unsigned int index, const ZvPoint3<double>& p, double time, double minGap);
  // Splits the segment at `time` without changing the shape. Returns 1 with the new node's
  // index; 0 otherwise, with isExisting = 1 and index set when a node lies within minGap.
  int InsertNode(double time, double minGap, double tolerance, unsigned int& index,
                 int& isExisting);
  // Removes nodes first..last (control indices) with their adjoining handles; returns the
  // number of points removed.
  unsigned int RemoveNodes(unsigned int first, unsigned int last);
  // time * scale + offset for every node (scale within 1e-9 of 0 means no scaling). Refused
  // when the times would not stay strictly increasing.
  int ScaleAndOffsetInitialTimes(double scale, double offset);
  // The nearest control point within `tolerance` on each axis (line handles skipped).
  int GetClosestControlPointIndex(const ZvPoint3<double>& p, double tolerance,
                                  unsigned int& index) const;

  // ---- Rendering ----------------------------------------------------------------------------
  // One vertex list in path order: the flattened polylines with time ticks every timeStep.
  // Each vertex appends its position, kind (RenderKind), time and segment node index to the
  // four arrays (appended to, never cleared). A segment is drawn without ticks when it holds
  // or would need more than maxTicks. Returns 1; 0 when the path is empty or timeStep is not
  // positive.
  enum RenderKind {
    RenderFirstVertex = 0,
    RenderVertex = 1,
    RenderFirstTick = 3,
    RenderTick = 4,
    RenderLastVertex = 5
  };
  int Render(double timeStep, double tolerance, unsigned int maxTicks, ZvPoint3dArray& points,
             ZvUByteArray& kinds, ZvDoubleArray& times, ZvULongArray& segments) const;
  // Replaces `path` by the projection (one subpath, lines as lines, cubics as cubics, float
  // coordinates). 0 with `path` unchanged for an empty path or a reserved projection.
  int GetProjectedPath(Projection projection, ZvPath2f& path) const;

  // ---- Persistence --------------------------------------------------------------------------
  // A little-endian block, identical from every build: a 32-bit body length, then the body.
  // Client data is not stored and non-finite coordinates or times are stored as 0.
  unsigned int GetBufferSize() const;
  unsigned int WriteToBuffer(void* buffer) const;  // returns GetBufferSize()
  // Reads a body (the block past its length field); the path changes only on success. Returns
  // the bytes consumed, or 0. The bounded form never reads beyond `size` bytes.
  unsigned int ReadFromBufferBody(const void* body);
  unsigned int ReadFromBufferBody(const void* body, unsigned int size);

 private:
  ZvMotionPath3dImpl* impl;
  mutable ZvCriticalSection lock;
};

// The size of a block's length field: 4.
ZV_API unsigned int ZvMotionPath3d_GetBufferBodyLengthSize();
// A new path (owned by the caller) read from a body, with the bytes consumed; null and 0 on
// any failure, allocation failure included. The bounded form reads at most `size` bytes.
ZV_API ZvMotionPath3d* ZvMotionPath3d_CreateFromBufferBody(const void* body,
                                                           unsigned int& bytesRead);
ZV_API ZvMotionPath3d* ZvMotionPath3d_CreateFromBufferBody(const void* body, unsigned int size,
                                                           unsigned int& bytesRead);

// Whether |p - q| is at most halfSize on all three axes.
inline bool IsInEXtent(const ZvPoint3<double>& p, double halfSize, const ZvPoint3<double>& q) {
  return std::fabs(p.x - q.x) <= halfSize && std::fabs(p.y - q.y) <= halfSize &&
         std::fabs(p.z - q.z) <= halfSize;
}

// Whether b may follow a as the next node time: later, and by more than 1e-30.
inline bool CanBeAdjacentTimeValues(double a, double b) {
  return b > a && b - a > 1e-30;
}

#endif
