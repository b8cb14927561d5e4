// The state and workers behind ZvMorpher.
#ifndef ZV_SHAPE_MORPHER_IMPL_H
#define ZV_SHAPE_MORPHER_IMPL_H

#include <zv/arrays.h>
#include <zv/morpher.h>
#include <zv/path2f.h>

class ZvBezierTool;
class ZvGC;
class ZvPath2fProp1d;

// A section end for LinearMotionPathMorph: a point of A, a point of B and the path between them.
struct MPathData {
  unsigned int indexA;
  unsigned int indexB;
  const ZvPath2f* motionPath;  // not owned, may be null
};

// One subpath flattened for resampling: its polyline, the cumulative chords and where it starts.
struct ZvMorphFlat {
  ZvPoint2fArray points;
  ZvDoubleArray chords;
  double length = 0.0;
  unsigned int start = 0;
  int closed = 0;
};

class ZvMorpherImpl {
 public:
  ZvMorpherImpl(const ZvPath2fProp1d* a, const ZvPath2fProp1d* b, const ZvGC& gc);

  int LinearMorph(double t, ZvPath2fProp1d& output);
  int TurtleMorph(double t, ZvPath2fProp1d& output);
  int LinearMotionPathMorph(double t, ZvPath2fProp1d& output);
  int SetMotionPath(unsigned int indexA, unsigned int indexB, const ZvPath2f* path);

  // The property curve of output subpath `outputIndex`, blended at t from subpath indexA of A and
  // indexB of B, both resampled in `steps` even steps over their curves' parameter range. A
  // curve on one side only is copied as it is; with none, nothing is set.
  void SetThePropertyCurve(double t, ZvPath2fProp1d& output, unsigned int steps,
                           unsigned int indexA, unsigned int indexB, unsigned int outputIndex);
  // The same for a stretch of `count` resampled points that starts at step startA of a subpath
  // of A resampled in stepsA steps, and at step startB of one of B resampled in stepsB steps.
  // Curves of one key or none blend as constants, laid out at positions 0, 1, 2...
  void SetThePropertyCurve(double t, unsigned int indexA, unsigned int startA, unsigned int stepsA,
                           unsigned int indexB, unsigned int startB, unsigned int stepsB,
                           unsigned int count, ZvPath2fProp1d& output, unsigned int outputIndex);

  // Flattens the subpath starting at `start` at the step and measures it. Result: points made.
  unsigned int FlattenSubpath(const ZvPath2f& path, unsigned int start, ZvMorphFlat& flat) const;

  // A blend of two evenly resampled polylines of one size into out, which has that size already:
  // point by point, or as turtle walks.
  using Blend = int (*)(const ZvPoint2fArray& a, const ZvPoint2fArray& b, double t,
                        ZvPoint2fArray& out);
  // Resamples the measured polylines a and b in the same number of even steps, blends them at t
  // and fits the result onto output as one open subpath, whose property curve blends those of the
  // first subpaths. Result 0, output unchanged, when the steps would be too many or a side holds
  // no segment to resample.
  int BlendOpen(double t, const ZvMorphFlat& a, const ZvMorphFlat& b, Blend blend,
                ZvPath2fProp1d& output);

 private:
  int EqualCountMorph(double t, ZvPath2fProp1d& output);
  int UnequalCountMorph(double t, ZvPath2fProp1d& output);
  // 1 when the context's step can drive a resampling: positive and finite.
  int UsableStep() const;
  // The number of steps of about s that cover `length`, at least 1; 0 when that is more than
  // ZvMorpher::kMaxSteps or `length` is not a number.
  unsigned int StepsFor(double length) const;
  // Fits `points` onto output as a new subpath, closed or open. outputIndex receives the index
  // the new subpath starts at; the result is 0 when the fit appended nothing.
  int Fit(ZvBezierTool& tool, const ZvPoint2fArray& points, int closed, ZvPath2fProp1d& output,
          unsigned int& outputIndex) const;

  const ZvPath2fProp1d* pathA;
  const ZvPath2fProp1d* pathB;
  const ZvGC& gc;
  ZvDynArray<MPathData> motionPaths;
};

#endif
