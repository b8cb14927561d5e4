// Path builders: a stream of pen points turned into a ZvPath2f while the pen is still moving.
//
// Points go in one by one through AddInputPoint. A builder maps each by the context's transform
// (so pen coordinates, usually device pixels, become path coordinates), drops those within
// gc.pointMergeDistance of the last kept point on both axes, smooths the rest with a
// 1/4, 1/2, 1/4 kernel, and appends finished segments to the target path. GetTrailingSamples
// commits what is certain and returns points spaced gc.sampleSpacing apart (path units, measured
// along the new part of the path flattened at gc.flattenTolerance), so that the caller can paint
// the stroke as it grows; the samples of all calls of one subpath together run evenly along it,
// the first batch starting with the subpath's first point. EndSubpath commits the rest and
// returns the last samples, adding the end point itself when the last spacing left more than a
// tenth of gc.sampleSpacing over.
//
// The kinds differ in what they commit:
//   ZvLinearPathBuilder     lines; a run of input along one line (within half the flatten
//                           tolerance, going forward) is held back as one pending point.
//   ZvCubicPathBuilder      one cubic per input edge, handles 0.4 of the chord along tangents
//                           estimated from the neighbours; the last edge waits for the point
//                           after it, so the path ends one input point behind.
//   ZvBezierFitPathBuilder  least-squares Bezier segments between corners (turns of more than
//                           90 degrees), splitting a stretch at its middle until each piece fits.
//
// The target path only grows at its end: a commit never moves a point it appended before (a
// closing subpath rewrites its last code). Samples are returned by reference to an array the
// builder owns and overwrites at the next call.
//
// Calling order: StartSubpath, any number of AddInputPoint with GetTrailingSamples between them
// at will, EndSubpath; then StartSubpath again for the next subpath (on the same path or
// another). Reset never touches the target path.
//
// Memory. The constructors reserve room for 128 input points and 64 samples, and
// ReserveInput makes room for longer strokes: AddInputPoint then never allocates (all fitting
// waits for GetTrailingSamples and EndSubpath, which only handle the points since the last
// commit). An allocation failure passes to the caller as std::bad_alloc; the builder may then
// only be destroyed.
//
// A builder belongs to one thread and has no lock; it locks the target path call by call
// through the path's own operations. The ZvGC is read at every call and must outlive the
// builder; the target path is not owned and must be set (at construction or by StartSubpath)
// before the first GetTrailingSamples or EndSubpath.
//
// Statistics: the fitting builder counts the points it adds by densifying and the points it
// hands to its fits in two process-wide counters inside the library, unguarded.
#ifndef ZV_PATH_BUILDER_H
#define ZV_PATH_BUILDER_H

#include <zv/api.h>
#include <zv/arrays.h>
#include <zv/bezier_fit.h>
#include <zv/point.h>

class ZvGC;
class ZvPath2f;

class ZV_API ZvBasePathBuilder {
 public:
  ZvBasePathBuilder(const ZvGC& gc, ZvPath2f* path);
  ZvBasePathBuilder(const ZvBasePathBuilder&) = delete;
  ZvBasePathBuilder& operator=(const ZvBasePathBuilder&) = delete;
  virtual ~ZvBasePathBuilder();

  // Resets the builder (through Reset) and takes `p` as the subpath's first input point. The
  // second form also makes `path` the target from now on.
  virtual void StartSubpath(const ZvPoint2<float>& p);
  virtual void StartSubpath(const ZvPoint2<float>& p, ZvPath2f* path);
  // Takes a pen point. `force` non-zero keeps it whatever its distance from the last one (the
  // cubic builder keeps it only for exactly 1).
  virtual void AddInputPoint(const ZvPoint2<float>& p, int force) = 0;
  // Commits what is certain and returns the samples of the newly committed part (possibly none).
  virtual const ZvPoint2fArray& GetTrailingSamples() = 0;
  // Takes `p` as the last point (unless it coincides with the last one), commits everything,
  // closing the subpath when `close` is non-zero, and returns the last samples.
  virtual const ZvPoint2fArray& EndSubpath(const ZvPoint2<float>& p, int close) = 0;
  // Back to the start state; the target path and the reservations stay.
  virtual void Reset();

  // Makes room for strokes of up to `count` input points (after densifying, for the fitting
  // builder), so that AddInputPoint allocates nothing. Never shrinks.
  virtual void ReserveInput(unsigned int count);
  ZvPath2f* GetPath() const { return path; }

 protected:
  // The input point as the path sees it.
  ZvPoint2<float> MapInput(const ZvPoint2<float>& p) const;
  // Appends p unless the input already ends on it within 1e-7 per axis.
  void AddEndPoint(const ZvPoint2<float>& p);
  // Flattens the path's segments from firstNewIndex on (with the node before them, or the
  // subpath's first point when that is new) into `work` and samples them into `samples`,
  // carrying sampleResidual; lastProcessedIndex moves to the input's last point.
  void ComputeTrailingSamplePoints(unsigned int firstNewIndex, int final, ZvBezierTool& tool,
                                   ZvPoint2fArray& work);

  const ZvGC& gc;
  ZvPath2f* path;
  ZvPoint2fArray inputPoints;       // mapped input
  unsigned int lastProcessedIndex;  // input index up to which segments are made
  unsigned int firstPathIndex;      // path index of this subpath's start point
  int firstSamplePending;           // the next batch starts with the subpath's first point
  int firstPointPending;            // the path has not had this subpath's Moveto yet
  double sampleResidual;            // arc length since the last sample
  ZvPoint2fArray samples;           // the batch returned to the caller
};

class ZV_API ZvLinearPathBuilder : public ZvBasePathBuilder {
 public:
  ZvLinearPathBuilder(const ZvGC& gc, ZvPath2f* path);
  void AddInputPoint(const ZvPoint2<float>& p, int force) override;
  const ZvPoint2fArray& GetTrailingSamples() override;
  const ZvPoint2fArray& EndSubpath(const ZvPoint2<float>& p, int close) override;
  void Reset() override;

 protected:
  void FlushPendingPoint();
  void AddTrailingInputPoints(int close);
  void ComputeTrailingSamplePoints(int final);

  ZvPoint2<float> direction;  // unit direction of the run in progress
  ZvPoint2<float> pendingPoint;
  int hasPendingPoint;
};

class ZV_API ZvCubicPathBuilder : public ZvBasePathBuilder {
 public:
  ZvCubicPathBuilder(const ZvGC& gc, ZvPath2f* path);
  void AddInputPoint(const ZvPoint2<float>& p, int force) override;
  const ZvPoint2fArray& GetTrailingSamples() override;
  const ZvPoint2fArray& EndSubpath(const ZvPoint2<float>& p, int close) override;

 protected:
  void AddTrailingInputPoints(int close, int final);
  const ZvPoint2fArray& Commit(int close, int final);
};

// Input edges longer than longChordDistance (octagonal distance: the larger axis difference plus
// 0.3334 times the smaller) are drawn as single cubics; shorter ones are densified to points
// about densifySpacing apart (0 or less: not at all) and fitted by curves of fitDegree (2..8,
// other values are clamped) within fitError of the input at equal arc length. Input edges
// within fitError on both axes never make a corner.
class ZV_API ZvBezierFitPathBuilder : public ZvBasePathBuilder {
 public:
  ZvBezierFitPathBuilder(const ZvGC& gc, ZvPath2f* path, double longChordDistance,
                         double densifySpacing, double fitError, unsigned int fitDegree);
  void AddInputPoint(const ZvPoint2<float>& p, int force) override;
  const ZvPoint2fArray& GetTrailingSamples() override;
  const ZvPoint2fArray& EndSubpath(const ZvPoint2<float>& p, int close) override;
  void Reset() override;
  void ReserveInput(unsigned int count) override;

 protected:
  void AddTrailingInputPoints(int close);

  double longChordDistance;
  double densifySpacing;
  unsigned int fitDegree;
  double fitError;
  ZvDoubleArray chordLengths;  // cumulative chord lengths of inputPoints
  ZvBezierTool bezierTool;
  ZvBoolArray cornerFlags;  // one per input point processed
  ZvPoint2fArray flattenedWork;
};

#endif
