// ZvMorpher: the in-between of two property paths at a ratio t (0 gives A, 1 gives B).
//
// A morpher is built for one pair of shapes and used for any number of ratios. It copies
// nothing: both shapes, the context and any motion path handed to SetMotionPath must outlive it,
// and none of them may be edited during a morph. It takes no lock of its own; every shape
// operation it calls locks that shape for its duration. One thread per morpher.
//
// Lengths are path units (the shapes' own coordinates), angles degrees. Values read from the
// context: pointMergeDistance (s below) is both the flatten tolerance of the inputs and the
// arc-length step of their even resampling; fitTolerance is handed to the cubic fit as its
// corner threshold (a squared cosine) while s is its error bound; propertyTolerance bounds the
// blended property curves.
//
// Output. A morph appends to `output`: its subpaths and property curves are added behind what
// it held, nothing is cleared, so a caller that wants only the morph passes an empty path. The
// one exception is the sibling fast path of LinearMorph, where `output` becomes the blend of A
// and B and loses what it held. Results are refitted cubics, except on that fast path, which
// blends the control points of two paths of the same topology and keeps their codes. Blended
// property curves take the parameter scale of the longer of the two curves. A curve that only
// one side has is carried over as it stands (on the sibling fast path, only A's); a subpath
// where neither side has one gets none.
//
// Results: 1 on success. 0, with `output` untouched, when the context's pointMergeDistance is
// not a positive finite number, when the resampling would need more than kMaxSteps steps (a
// path that is huge, or has non-finite coordinates, against the step), or when TurtleMorph or
// LinearMotionPathMorph finds nothing to walk on one side (an empty shape or section). The ratio
// is not checked: values outside 0..1 extrapolate. Allocation failures pass to the caller as
// std::bad_alloc, and `output` may then hold part of the result.
#ifndef ZV_MORPHER_H
#define ZV_MORPHER_H

#include <zv/api.h>
#include <zv/point.h>

class ZvGC;
class ZvPath2f;
class ZvPath2fProp1d;
class ZvTransfo4;
class ZvMorpherImpl;

class ZV_API ZvMorpher {
 public:
  // The most evenly spaced steps a morph resamples a path into; beyond it a morph answers 0.
  static constexpr unsigned int kMaxSteps = 1u << 24;

  // Neither shape is owned; both must stay alive and unedited while the morpher is used.
  ZvMorpher(const ZvPath2fProp1d* a, const ZvPath2fProp1d* b, const ZvGC& gc);
  ZvMorpher(const ZvMorpher&) = delete;
  ZvMorpher& operator=(const ZvMorpher&) = delete;
  ~ZvMorpher();

  // Point-by-point blend along arc length.
  //  - Siblings (same point count and codes): the control points are blended and the property
  //    curves resampled in step; nothing is flattened or refitted. The fast path.
  //  - The same number of subpaths: subpath i of A is paired with subpath i of B; both are
  //    resampled into the same number of steps of about s, blended and fitted, closed when both
  //    are closed.
  //  - Different numbers of subpaths: the subpaths of each side are laid end to end on one scale
  //    of N steps shared out by length, and each stretch where one subpath of A faces one of B
  //    becomes a piece of its own, closed when its ends come within s.
  int LinearMorph(double t, ZvPath2fProp1d& output);

  // Blends headings and step lengths instead of positions: a turtle walks the same number of
  // equal steps along both shapes (all subpaths run together into one polyline) and turns by the
  // blended heading, so a shape that turns keeps its length through the morph. Headings are
  // blended as numbers with no shortest-way correction, so closed shapes need not stay closed;
  // the result is always one open subpath carrying the blend of the first subpaths' curves.
  int TurtleMorph(double t, ZvPath2fProp1d& output);

  // Carries a section of each shape along two motion paths. The first two SetMotionPath calls
  // name the section's start and end points in A and in B and the path each end travels. Each
  // side's section is moved by the similarity that takes its end points to where the two motion
  // paths have got to at t (a null motion path is the straight line from A's point to B's), and
  // the two moved sections are blended as one open subpath. Calling it before two SetMotionPath
  // calls is a misuse: the result is 0 and nothing is appended.
  int LinearMotionPathMorph(double t, ZvPath2fProp1d& output);

  // Records a section end: point indexA of A, point indexB of B, and the path it travels from
  // A's point to B's (not owned, may be null). The first call gives the section's start, the
  // second its end; later calls are kept but not read. Indices outside the shapes are a misuse.
  // Result: 1.
  int SetMotionPath(unsigned int indexA, unsigned int indexB, const ZvPath2f* path);

 private:
  ZvMorpherImpl* impl;
};

// Makes `transform` the similarity (uniform scale, rotation, translation) that takes a to b and
// c to d: it maps segment a-c onto segment b-d. Result 1; 0 with `transform` untouched when
// either segment is shorter than the library's zero-length guard.
ZV_API int SetToSimilarityXY(ZvTransfo4& transform, const ZvPoint2<double>& a,
                             const ZvPoint2<double>& b, const ZvPoint2<double>& c,
                             const ZvPoint2<double>& d);

#endif
