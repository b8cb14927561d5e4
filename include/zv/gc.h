// ZvGC, the drawing and sampling parameters, and ZvIsoView, a 2-D view.
//
// ZvGC is a plain record read directly by every operation that flattens, samples, fits, fills
// or strokes a shape; operations take it by constant reference and never keep it. It owns its
// feather profile, a curve with a lock and a heap store, so copying a context is not free:
// change one field on one copy rather than copying per call. Read-only sharing between threads
// is safe; writing is not (soft fills write briefly into the context they are given).
//
// Units. Every operation first maps the shape's points by `transform`; distances below
// (tolerances, spacing, line width, feather distances) are measured after that mapping, that
// is in pixels when the result is a raster. `featherRadius` alone counts sub-samples of the
// antialiasing grid (a quarter or an eighth of a pixel). Angles elsewhere in the library are
// degrees.
//
// Rasters. A fill or stroke overwrites every pixel it touches with its coverage and leaves all
// others as they were; it never blends with what a pixel held. Clear or composite yourself.
//
// ZvIsoView maps between world and view coordinates through a pair of mutually inverse
// transforms. Its edits never leave a singular transform: an edit whose inverse fails is
// undone in full.
#ifndef ZV_GC_H
#define ZV_GC_H

#include <zv/api.h>
#include <zv/point.h>
#include <zv/std_fcurve.h>
#include <zv/transfo4.h>

class ZV_API ZvGC {
 public:
  // Values of fillRule, capStyle, joinStyle and samplingRate. The fields stay plain ints.
  enum FillRule { EvenOddRule = 0, NonZeroRule = 1 };
  enum CapStyle { RoundCap = 0, SquareCap = 1, FlatCap = 2 };
  enum JoinStyle { BevelJoin = 0, MiterJoin = 1, RoundJoin = 2 };
  enum SamplingRate { Sampling4x4 = 4, Sampling8x8 = 8 };

  ZvGC();
  ZvGC(const ZvGC& other);  // deep copy of the feather profile
  ZvGC& operator=(const ZvGC& other);
  ~ZvGC();

  // Chord tolerance of the flatteners, in pixels. The fills and stroking use max(0.25, value),
  // and stroking its square as the equality threshold of offset vectors.
  double flattenTolerance;    // 1.0
  double sampleSpacing;       // 1.0: distance aimed at between samples
  double propertyTolerance;   // 0.1: flatten and extension tolerance of property curves
  double defaultProperty;     // 1.0: a property's value where none is given
  double pointMergeDistance;  // 0.5: builders merge closer input points; morpher step
  double fitTolerance;        // 0.82139380484, unrounded: error bound of the Bezier fitters
  double miterLimit;          // 1.0; values below 1.0 count as 1.0
  double lineWidth;           // 1.0 pixel; the half width is 0.5 times this
  double featherInner;        // 0.0 \ soft fill: the two feather distances,
  double featherOuter;        // 0.0 / whose sum is the filter width
  int featherRadius;          // 0: antialiased fill blur in sub-samples, clamped to 0..4 or 0..8
  int samplingRate;           // Sampling4x4 (4): 4x4 coverage cells; any other value 8x8
  double opacity;             // 1.0: multiplies the output of AAFill and SoftFill
  int fillRule;               // NonZeroRule (1) or EvenOddRule (0)
  int capStyle;               // FlatCap (2), RoundCap (0) or SquareCap (1)
  int joinStyle;              // MiterJoin (1), BevelJoin (0) or RoundJoin (2)
  int taper;                  // 0; non-zero: stroke width goes to zero at subpath ends
  int clipToShape;            // 1; exactly 1: soft fill ends multiplied by the shape's coverage
  ZvTransfo4 transform;       // identity: applied to shape points before everything above
  // Feather weight by normalised distance: 1.0 at 0.0 falling to 0.0 at 1.0, one cubic segment.
  ZvStdFCurve featherProfile;
};

class ZV_API ZvIsoView {
 public:
  // A view of width x height centred on the world origin, one view unit being scaleX, scaleY
  // and scaleZ world units along the axes. A singular result is kept; IsValid() shows it.
  ZvIsoView(double width, double scaleX, double height, double scaleY, double scaleZ);

  // Sizes not negative and both transforms invertible.
  int IsValid() const;
  void SetViewWidth(double width) { viewWidth = width; }
  void SetViewHeight(double height) { viewHeight = height; }
  // Moves the view by `delta` in view coordinates.
  void Pan(const ZvPoint2<double>& delta);
  // Scales the view about `center`, in view coordinates.
  void Zoom(double sx, double sy, double sz, const ZvPoint2<double>& center);
  // Fits `extent` (world) inside the view with one uniform factor, keeping proportions. Ignored
  // for a view of width or height within 1e-9 of 0.
  void SetFromExtent(const ZvExtent2<double>& extent);
  // (0, 0) to (width, height), corners ordered; Regular.
  void GetViewExtentInViewCS(ZvExtent2<double>& extent) const;
  // The same mapped to the world: the axis-aligned hull.
  void GetViewExtentInWorldCS(ZvExtent2<double>& extent) const;
  // Length of the view's (1, 1) diagonal in the world, and of the world's in the view.
  double GetViewUnitVectorLengthInWorld() const;
  double GetWorldUnitVectorLengthInView() const;

  // Read freely; edit through the operations above, which keep the two inverse to each other.
  ZvTransfo4 worldToView;
  ZvTransfo4 viewToWorld;
  double viewWidth;
  double viewHeight;

 private:
  // Sets worldToView to the inverse of viewToWorld, or restores `saved` when there is none.
  void InvertOrRestore(const ZvIsoView& saved);
};

#endif
