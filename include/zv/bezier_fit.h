// ZvBezierTool: flattening and least-squares fitting of Bezier curves of any degree up to 8.
//
// Flattening. A curve of degree d is given as d + 1 consecutive control points. It is cut up
// front into 2^depth pieces by midpoint subdivision, depth being fixed from its third
// differences, and each piece is walked by ordered forward differencing in a power-of-two
// number of steps chosen from how far its second differences stray from its chord. The start
// values of the difference registers come from the Bezier differences of the piece through the
// integer table `beta`, scaled by exact powers of two, so a walk costs d additions a point and
// never evaluates the curve. As with the cubic free functions of <zv/bezier_tool.h>, the point
// count is a pure function of the control points and the tolerance, and the last point added
// is the last control point itself. For a cubic the counts agree with ZvBezierTool_FlattenCubic2f.
// Like the cubic free functions, a flatten never grows its array beyond 2^24 points: when one
// of its pieces would, it throws std::bad_alloc (the pieces before it stay added).
//
// Fitting. OpenFit and ClosedFit turn a polyline (pen input, samples) into Bezier segments
// appended to a path. The polyline is cut at sharp corners; each stretch between corners is
// fitted by least squares with chord-length parameters, ends fixed and end directions fixed
// along the polyline's own end tangents. A fit is kept when its flattened polyline is close to
// the stretch in the sense of ZvPoint2fArray_PolylinesAreClose (every inner input vertex within
// the tolerance of the curve point at the same arc length); otherwise the stretch is halved at
// its middle vertex, both halves sharing the direction there, so the result is G1 inside each
// stretch. The SingleCurveFit forms fit one segment under given end conditions and report where
// a failed fit strayed, for builders that choose their own split points.
//
// An object holds the state of one call at a time: one thread per object. It has no lock and no
// virtual operations.
#ifndef ZV_BEZIER_FIT_H
#define ZV_BEZIER_FIT_H

#include <zv/api.h>
#include <zv/arrays.h>
#include <zv/point.h>

class ZvPath2f;
class ZvMatrix;

class ZV_API ZvBezierTool {
 public:
  ZvBezierTool();
  ZvBezierTool(const ZvBezierTool&) = delete;
  ZvBezierTool& operator=(const ZvBezierTool&) = delete;

  static unsigned int MaxDegreeForThisImplementation() { return 8; }

  // Binomial coefficients, rows 0..8 (Pascal's triangle; unused entries 0).
  static constexpr unsigned int Blaise[9][9] = {
      {1},
      {1, 1},
      {1, 2, 1},
      {1, 3, 3, 1},
      {1, 4, 6, 4, 1},
      {1, 5, 10, 10, 5, 1},
      {1, 6, 15, 20, 15, 6, 1},
      {1, 7, 21, 35, 35, 21, 7, 1},
      {1, 8, 28, 56, 70, 56, 28, 8, 1},
  };
  // d(d - 1) / 2 per degree d: the number of second differences that add up in the flatness
  // bound of a piece.
  static constexpr unsigned int dd2[9] = {0, 0, 1, 3, 6, 10, 15, 21, 28};
  // beta[d][k][i] = Blaise[d][k] i! S(k, i), S the Stirling numbers of the second kind: the
  // weight of the k-th Bezier difference (scaled to the step) in forward difference register i.
  // Entries outside 1 <= i <= k <= d are 0.
  static constexpr unsigned int beta[9][9][9] = {
      {},
      {{}, {0, 1}},
      {{}, {0, 2}, {0, 1, 2}},
      {{}, {0, 3}, {0, 3, 6}, {0, 1, 6, 6}},
      {{}, {0, 4}, {0, 6, 12}, {0, 4, 24, 24}, {0, 1, 14, 36, 24}},
      {{}, {0, 5}, {0, 10, 20}, {0, 10, 60, 60}, {0, 5, 70, 180, 120}, {0, 1, 30, 150, 240, 120}},
      {{},
       {0, 6},
       {0, 15, 30},
       {0, 20, 120, 120},
       {0, 15, 210, 540, 360},
       {0, 6, 180, 900, 1440, 720},
       {0, 1, 62, 540, 1560, 1800, 720}},
      {{},
       {0, 7},
       {0, 21, 42},
       {0, 35, 210, 210},
       {0, 35, 490, 1260, 840},
       {0, 21, 630, 3150, 5040, 2520},
       {0, 7, 434, 3780, 10920, 12600, 5040},
       {0, 1, 126, 1806, 8400, 16800, 15120, 5040}},
      {{},
       {0, 8},
       {0, 28, 56},
       {0, 56, 336, 336},
       {0, 70, 980, 2520, 1680},
       {0, 56, 1680, 8400, 13440, 6720},
       {0, 28, 1736, 15120, 43680, 50400, 20160},
       {0, 8, 1008, 14448, 67200, 134400, 120960, 40320},
       {0, 1, 254, 5796, 40824, 126000, 191520, 141120, 40320}},
  };

  // ---- Flattening ---------------------------------------------------------------------------
  // Flattens p[first] .. p[first + degree] within `tolerance` (positive) and appends the
  // polyline; with skipFirst non-zero the first control point is not added (the array already
  // ends there). Degree 0 or 1 adds the end points only. Result: points added; 0, nothing
  // added, for a degree above 8 or a null argument.
  unsigned int Flatten(const ZvPoint2<float>* p, unsigned int first, unsigned int degree,
                       double tolerance, ZvPoint2fArray* out, int skipFirst);
  // The same on the points of an array; 0 when the curve does not lie inside it.
  unsigned int Flatten(const ZvPoint2fArray& a, unsigned int first, unsigned int degree,
                       double tolerance, ZvPoint2fArray* out, int skipFirst);
  unsigned int Flatten(const ZvPoint2<double>* p, unsigned int first, unsigned int degree,
                       double tolerance, ZvPoint2dArray* out, int skipFirst);
  // The number of points one forward differencing walk of the whole curve takes (degree + 1
  // below degree 2), which bounds what Flatten adds to an array per piece. Writes no points.
  // 0 for a degree above 8 or a null argument.
  unsigned int FlatPolylineSizeUpperBound(const ZvPoint2<float>* p, unsigned int first,
                                          unsigned int degree, double tolerance);

  // ---- Fitting polylines --------------------------------------------------------------------
  // Fits the open polyline `points` with segments of `degree` (3..8) and appends them to `path`:
  // a Moveto to the first point unless `continuing` (the path already ends there), then lines
  // and curves. Consecutive points equal within 1e-15 are dropped first unless skipCleanup is
  // set. A vertex turning back by more than a right angle, with squared cosine above
  // cornerCos2, is a corner: the fit makes a cusp there. Result: segments made (a lone point
  // answers 1 for its Moveto, or 0 when continuing); 0 and nothing appended for a degree
  // outside 3..8, a tolerance that is not positive or a null path.
  unsigned int OpenFit(const ZvPoint2fArray& points, double cornerCos2, unsigned int degree,
                       double tolerance, int skipCleanup, ZvPath2f* path, int continuing);
  // The same for a closed polyline, whose last point is expected to repeat the first: always
  // starts with a Moveto and ends with Closeto. The seam is an ordinary stretch end, so it is a
  // corner whatever its angle.
  unsigned int ClosedFit(const ZvPoint2fArray& points, double cornerCos2, unsigned int degree,
                         double tolerance, int skipCleanup, ZvPath2f* path);

  // ---- Fitting one segment ------------------------------------------------------------------
  // One segment of `degree` through points[first..last], with `chords` the cumulative chord
  // lengths of `points` (one per vertex). The end points are the end vertices; C0 leaves a
  // direction free, G1 fixes it: the first inner control point lies on the line through the
  // start along startTangent, the last inner one on the line through the end along endTangent.
  // controlPoints receives degree + 1 points. Result 1 when the segment, flattened at half the
  // tolerance, passes ZvPoint2fArray_PolylinesAreClose against the range at the full tolerance;
  // 0 otherwise, with splitIndex set to the index where the comparison failed when a segment was
  // computed. A singular system, a range outside the arrays or fewer than two points, or a
  // degree the conditions cannot hold (above 8; below 1, 2 or 3 for C0C0, one G1 end, G1G1) give
  // 0 with both outputs untouched.
  int SingleCurveFitC0C0(const ZvPoint2fArray& points, const ZvDoubleArray& chords,
                         unsigned int first, unsigned int last, double tolerance,
                         unsigned int degree, ZvPoint2<float>* controlPoints,
                         unsigned int& splitIndex);
  int SingleCurveFitG1C0(const ZvPoint2fArray& points, const ZvDoubleArray& chords,
                         unsigned int first, unsigned int last,
                         const ZvPoint2<double>& startTangent, double tolerance,
                         unsigned int degree, ZvPoint2<float>* controlPoints,
                         unsigned int& splitIndex);
  int SingleCurveFitC0G1(const ZvPoint2fArray& points, const ZvDoubleArray& chords,
                         unsigned int first, unsigned int last, const ZvPoint2<double>& endTangent,
                         double tolerance, unsigned int degree, ZvPoint2<float>* controlPoints,
                         unsigned int& splitIndex);
  int SingleCurveFitG1G1(const ZvPoint2fArray& points, const ZvDoubleArray& chords,
                         unsigned int first, unsigned int last,
                         const ZvPoint2<double>& startTangent, const ZvPoint2<double>& endTangent,
                         double tolerance, unsigned int degree, ZvPoint2<float>* controlPoints,
                         unsigned int& splitIndex);
  // A cubic in double precision with the start direction fixed; compared with
  // ZvPoint2dArray_PolylinesAreClose after ZvBezierTool_FlattenCubic2d.
  int SingleCubicFitG1C0(const ZvPoint2dArray& points, const ZvDoubleArray& chords,
                         unsigned int first, unsigned int last,
                         const ZvPoint2<double>& startTangent, double tolerance,
                         ZvPoint2<double>* controlPoints, unsigned int& splitIndex);

  // ---- Tangents of the polyline being fitted ------------------------------------------------
  // Unit vectors at vertex i of the current fit's polyline: toward i + 1, toward i - 1, and
  // along i - 1 to i + 1. A vector within 1e-9 on both axes comes back unnormalised. (0, 0)
  // outside a fit or when a neighbour is missing.
  ZvPoint2<double> UnitTangentVectorFirst(unsigned int i) const;
  ZvPoint2<double> UnitTangentVectorLast(unsigned int i) const;
  ZvPoint2<double> UnitTangentVectorCenter(unsigned int i) const;

 private:
  // ---- Flattening workers -------------------------------------------------------------------
  // Points added in the current call go to outDouble when useDouble, else to outFloat.
  unsigned int FlattenPoints(const ZvPoint2<double>* p, unsigned int degree, int skipFirst);
  // Fills the difference triangle of the d + 1 points and picks numLevels and numSteps.
  void ContextInitOne(const ZvPoint2<double>* p);
  // Loads the forward difference registers for 2^numLevels steps.
  void ContextInitTwo();
  void OFDInnerLoop();
  void PMSOFD(const ZvPoint2<double>* p, unsigned int depth);
  void Emit(const ZvPoint2<double>& q);
  // Row k of the difference triangle starts here; row k holds degree + 1 - k entries.
  ZvPoint2<double>* Row(unsigned int k);

  // ---- Fitting workers ----------------------------------------------------------------------
  unsigned int Fit(const ZvPoint2fArray& points, double cornerCos2, unsigned int degree,
                   double tolerance, int skipCleanup, ZvPath2f* path, int continuing, int closed);
  void OpenFit2DPrivate(unsigned int first, const ZvPoint2<double>& t0, unsigned int last,
                        const ZvPoint2<double>& t1, unsigned int degree);
  void ClearFitContext();

  // ---- Flatten context ----------------------------------------------------------------------
  unsigned int degree;
  double tolerance;
  unsigned int numSteps;
  unsigned int numAdded;
  unsigned int numLevels;
  ZvPoint2fArray* outFloat;
  ZvPoint2dArray* outDouble;
  int useDouble;
  ZvPoint2<double> differences[45];
  ZvPoint2<double> forward[9];

  // ---- Fit context --------------------------------------------------------------------------
  double fitTolerance;
  double fitTolerance2;
  const ZvPoint2fArray* fitPoints;
  ZvDoubleArray* fitChords;
  ZvPath2f* fitPath;
  unsigned int fitCount;
};

#endif
