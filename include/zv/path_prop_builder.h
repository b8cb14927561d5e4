// Pen-with-pressure builders: a stream of pen points, each with a scalar property (pressure,
// stroke width), turned into a ZvPath2fProp1d while the pen is still moving.
//
// They do for points with a property what the builders of path_builder.h do for points alone
// (same mapping by the context's transform, merging within gc.pointMergeDistance, smoothing,
// sampling every gc.sampleSpacing path units), and besides build the subpath's property curve:
// a ZvRawFCurve over the arc length of the input polyline, in path units, whose values are the
// input properties smoothed with a 1/4, 1/2, 1/4 kernel and thinned within
// gc.propertyTolerance as they come in. At the end of the subpath the curve is fitted once more
// over the whole input (same tolerance). Every batch of samples comes with a parallel array of
// property values, one per sample, read from the curve at the sample's arc length, so that the
// caller can stamp a stroke point by point.
//
//   ZvLinearPathPropBuilder     lines through the kept input points.
//   ZvBezierFitPathPropBuilder  least-squares Bezier segments between corners, as
//                               ZvBezierFitPathBuilder; densified input points get the property
//                               interpolated between their neighbours, and the arc lengths of the
//                               committed input are scaled to those of the fitted segments.
//
// Calling order: AddInputPoint for every pen point (the first one starts the subpath), with
// GetTrailingSamples between them at will; then either EndSubpathAndGetTrailingSamples, or
// EndSubpath followed by GetTrailingSamples: EndSubpath only takes the last point and records
// that the subpath ends (closed or not), and the next GetTrailingSamples commits and finishes
// it. Once finished, the builder starts a new subpath on the same path at the next
// AddInputPoint; Reset drops the input of an unfinished subpath (what it committed stays in the
// path). A subpath of a lone point gets a Moveto and a constant curve.
//
// The target path is not owned; it and the ZvGC must outlive the builder. The builder writes
// only at the end of the path: the points it appended before, and the curves of other subpaths,
// stay. Samples are returned by reference to an array the builder owns and overwrites at the
// next call; the caller's `values` array is emptied and refilled at each call.
//
// A builder belongs to one thread and has no lock; the path is locked call by call by its own
// operations. Allocation failures pass to the caller as std::bad_alloc, after which the builder
// may only be destroyed.
#ifndef ZV_PATH_PROP_BUILDER_H
#define ZV_PATH_PROP_BUILDER_H

#include <zv/api.h>
#include <zv/arrays.h>
#include <zv/bezier_fit.h>
#include <zv/point.h>

class ZvGC;
class ZvPath2fProp1d;

class ZV_API ZvBasePathPropBuilder {
 public:
  ZvBasePathPropBuilder(const ZvGC& gc, ZvPath2fProp1d* path);
  ZvBasePathPropBuilder(const ZvBasePathPropBuilder&) = delete;
  ZvBasePathPropBuilder& operator=(const ZvBasePathPropBuilder&) = delete;
  virtual ~ZvBasePathPropBuilder();

  // Takes a pen point with its property. `force` non-zero keeps it whatever its distance from
  // the last one.
  virtual void AddInputPoint(const ZvPoint2<float>& p, double property, int force) = 0;
  // Takes `p` as the last point (unless it coincides with the last one, within 1e-7 per axis)
  // and records that the subpath ends, closed when `close` is non-zero; the next
  // GetTrailingSamples commits it.
  virtual void EndSubpath(const ZvPoint2<float>& p, double property, int close);
  // Commits what came in since the last commit and returns its samples, `values` receiving
  // their properties (as many as samples).
  virtual const ZvPoint2fArray& GetTrailingSamples(ZvDoubleArray& values) = 0;
  // EndSubpath and GetTrailingSamples in one.
  virtual const ZvPoint2fArray& EndSubpathAndGetTrailingSamples(const ZvPoint2<float>& p,
                                                                double property,
                                                                ZvDoubleArray& values, int close);
  // Back to the start state, the next point starting a new subpath; the path stays.
  virtual void Reset();

  ZvPath2fProp1d* GetPath() const { return path; }

 protected:
  // Refits the whole curve after the final commit and clears the end flags; after the final
  // commit the next input point starts a subpath of its own.
  void FinishCommit(int final);
  // Closing appends the first point, and its property, when the ends are apart, so that the
  // closing edge is sampled and carries the property back to the first value.
  void CloseInput();
  // The per-subpath state back to the start (samples stay).
  virtual void ClearSubpath();

  const ZvGC& gc;
  ZvPoint2fArray inputPoints;       // mapped input
  unsigned int lastProcessedIndex;  // input index up to which segments are made
  int subpathEnded;                 // set by EndSubpath, acted on by GetTrailingSamples
  int endClosed;                    // the `close` given to EndSubpath
  int firstSamplePending;           // the next batch starts with the subpath's first point
  int firstPointPending;            // the path has not had this subpath's Moveto yet
  double sampleResidual;            // arc length since the last sample
  ZvPoint2fArray samples;           // the batch returned to the caller
  ZvPath2fProp1d* path;
  ZvDoubleArray chordLengths;     // cumulative chord lengths of inputPoints
  ZvDoubleArray inputProperties;  // one per input point
  unsigned int firstPathIndex;    // path index of this subpath's start point
};

class ZV_API ZvLinearPathPropBuilder : public ZvBasePathPropBuilder {
 public:
  ZvLinearPathPropBuilder(const ZvGC& gc, ZvPath2fProp1d* path);
  void AddInputPoint(const ZvPoint2<float>& p, double property, int force) override;
  const ZvPoint2fArray& GetTrailingSamples(ZvDoubleArray& values) override;

 protected:
  void AddTrailingInputPoints(int close);
  void ComputeTrailingSamplePoints(ZvDoubleArray& values, int final);
};

// The fitting parameters are those of ZvBezierFitPathBuilder: input edges longer than
// longChordDistance (octagonal distance) are drawn as single cubics, shorter ones densified to
// about densifySpacing and fitted by curves of fitDegree (2..8, other values clamped) within
// fitError.
class ZV_API ZvBezierFitPathPropBuilder : public ZvBasePathPropBuilder {
 public:
  ZvBezierFitPathPropBuilder(const ZvGC& gc, ZvPath2fProp1d* path, double longChordDistance,
                             double densifySpacing, double fitError, unsigned int fitDegree);
  void AddInputPoint(const ZvPoint2<float>& p, double property, int force) override;
  const ZvPoint2fArray& GetTrailingSamples(ZvDoubleArray& values) override;

 protected:
  void ClearSubpath() override;
  void AddTrailingInputPoints(int close);
  void AddPropDataAndComputeTrailingSamplePoints(unsigned int firstNewIndex, ZvDoubleArray& values,
                                                 int final, int close);

  double longChordDistance;
  double densifySpacing;
  unsigned int fitDegree;
  double fitError;
  ZvBezierTool bezierTool;
  ZvBoolArray cornerFlags;  // one per input point processed
  ZvPoint2fArray flattenedWork;
};

// The steps the builders share, for hosts that build property curves along their own input.
// `lengths` holds the cumulative arc length of each input point, `properties` one value each;
// `pathIndex` is any point of the target subpath.

// Records properties[first..last] at lengths[first..last] into the subpath's curve: the inner
// values first+1..last-1 are smoothed in place (1/4, 1/2, 1/4 of their unsmoothed neighbours);
// a subpath without a curve, at first 0, gets one starting at (0, properties[0]); each further
// value extends the last linear piece when it lies within `tolerance` of its line, or adds a
// key. With `close`, when the last input point is not the first one, the curve goes on by the
// chord back to it, to the first value. The subpath must already have a curve unless first is
// 0. Result 1; 0, nothing done, for last below first or arrays too short for last.
ZV_API unsigned int AddPropCurveStretch(const ZvPoint2fArray& points, const ZvDoubleArray& lengths,
                                        ZvDoubleArray& properties, unsigned int first,
                                        unsigned int last, ZvPath2fProp1d* path,
                                        unsigned int pathIndex, double tolerance, int close);

// Replaces the subpath's curve by a polyline through (lengths[k], properties[k]) thinned within
// `tolerance`. One entry gives a constant piece from 0 to 1, two a single line. Entries whose
// length does not rise above the one kept before them (repeated input points) are left out.
// Result 1; 0, nothing changed, with no entries or arrays of different sizes.
ZV_API unsigned int FitPropCurve(const ZvDoubleArray& lengths, const ZvDoubleArray& properties,
                                 double tolerance, ZvPath2fProp1d* path, unsigned int pathIndex);

// Appends to `values` the properties of `count` samples just made along arc lengths from..to:
// the first at from + spacing - residual, then every spacing, read from the subpath's curve
// (flattened within `tolerance`); a last sample beyond the grid takes the value at `to`.
// Exactly `count` values are appended. The subpath must have a curve. Result: count.
ZV_API unsigned int SamplePropCurve(ZvPath2fProp1d* path, unsigned int pathIndex, double from,
                                    double to, double spacing, double residual, double tolerance,
                                    unsigned int count, ZvDoubleArray& values);

#endif
