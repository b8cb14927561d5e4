// Free functions on single cubic Bezier curves.
//
// A cubic is always passed as a pointer to four consecutive control points P0, P1, P2, P3.
// These functions sit under every path, function-curve and motion-path renderer, so the number
// and order of the points they produce is part of their contract, not an implementation detail.
#ifndef ZV_BEZIER_TOOL_H
#define ZV_BEZIER_TOOL_H

#include <zv/api.h>
#include <zv/arrays.h>
#include <zv/point.h>

// ---------------------------------------------------------------------------------------------
// Flattening
//
// A flatten appends a polyline that follows the cubic to about `tolerance` and returns the
// number of points it appended. (The flatness measure looks across each piece's chord only, so
// at tight turns the polyline can stray well beyond it.) With `skipFirst` 0 the first appended
// point is P0; otherwise the array is taken to end at P0 already and P0 is not added. The last
// point is always P3 itself, copied from the control point, never recomputed.
//
// The subdivision is fixed up front from the length of the third difference of the control
// points: the curve is halved floor(log8(|D| / tolerance + 0.5)) times, and each piece is then
// walked by forward differencing in a power-of-two number of steps chosen from how far its
// second differences stray from its chord. The point count is therefore a pure function of the
// control points and the tolerance, which callers rely on.
//
// The 2d form never produces more than 1023 interior points per piece; the 2f and 3d forms have
// no such cap. The 2f form computes in double and rounds each point to float as it is added.
// The tolerance must be positive. A negative one yields P0 and P3 only; zero yields at most the
// deepest subdivision (1023 midpoints) with no walk inside the pieces.
//
// No flatten grows its output array beyond 2^24 points: one that would (coordinates near the
// float range, a vanishing tolerance) throws std::bad_alloc before adding anything, as a failed
// allocation would.
// ---------------------------------------------------------------------------------------------

ZV_API unsigned int ZvBezierTool_FlattenCubic2d(const ZvPoint2<double>* p, double tolerance,
                                                ZvPoint2dArray* out, int skipFirst);
ZV_API unsigned int ZvBezierTool_FlattenCubic2f(const ZvPoint2<float>* p, double tolerance,
                                                ZvPoint2fArray* out, int skipFirst);
ZV_API unsigned int ZvBezierTool_FlattenCubic3d(const ZvPoint3<double>* p, double tolerance,
                                                ZvPoint3dArray* out, int skipFirst);

// A gamma segment is a power-law piece y = P0.y - u^gamma * (P0.y - P3.y), x = P0.x + u *
// (P3.x - P0.x), stored in a cubic's four points: P0 and P3 give the whole range, P1 and P2 are
// two points on the curve. The walk runs from P1 to P2 in at most 150 steps per unit of u and
// ends by adding P2 (P0 first when `skipFirst` is 0). Interior points are rounded to float,
// because gamma pieces come from single-precision paths. `tolerance` is not used.
ZV_API unsigned int ZvBezierTool_FlattenGamma(const ZvPoint2<double>* p, double tolerance,
                                              ZvPoint2dArray* out, int skipFirst);

// ---------------------------------------------------------------------------------------------
// Clipped flattening into tagged polylines
//
// These append to three parallel arrays: the points, a tag per point (ZvPointTag_First,
// _Continue, _Last) and a flag per point. A new polyline piece starts with a First tag; when a
// piece is interrupted, its last vertex is re-tagged Last. A piece that continues from the
// array's last point (equal within 1e-9 on both axes) is joined to it without a new vertex.
// ---------------------------------------------------------------------------------------------

// Flattens the cubic into the arrays, clipped to `extent`. Empty extents add nothing. When the
// control box lies in the extent (or the extent is Infinite) the curve is flattened directly;
// otherwise its polyline is clipped segment by segment. A piece interrupted by a direct
// flatten gets flag 0 on its last vertex; one interrupted by clipping gets flag 1.
ZV_API void ZvBezierTool_ClipAndFlattenCubic2d(const ZvPoint2<double>* p, double tolerance,
                                               const ZvExtent2<double>& extent,
                                               ZvPoint2dArray* points, ZvPointTagArray* tags,
                                               ZvBoolArray* flags);

// The same for a gamma segment, whose visible part runs from P1 to P2. The power-law walk is
// used when the extent is Infinite or the segment is well formed (monotone, with every span at
// least `tolerance`); otherwise only the chord P1-P2 is clipped and added.
ZV_API void ZvBezierTool_ClipAndFlattenGamma(const ZvPoint2<double>* p, double tolerance,
                                             const ZvExtent2<double>& extent,
                                             ZvPoint2dArray* points, ZvPointTagArray* tags,
                                             ZvBoolArray* flags);

// Clips segment a-b to a Regular extent in place and appends what is left: a continues the
// last piece when it equals the last point, otherwise the last piece is closed (tag Last, flag
// 1) and a new one starts at a. Returns the clip result: 0 when nothing is left (and nothing is
// added), 1 otherwise.
ZV_API int ClipAndAddLineSegment(ZvPoint2<double>& a, ZvPoint2<double>& b,
                                 const ZvExtent2<double>& extent, ZvPoint2dArray& points,
                                 ZvPointTagArray& tags, ZvBoolArray& flags);

// ---------------------------------------------------------------------------------------------
// Point location
//
// Finds the parameter of the point of the curve nearest to `point`, by walking the same
// polyline a flatten would produce (without the 1023 cap). Returns 1 and writes the squared
// distance and the parameter when one is found whose squared distance is at most `distance`.
// Note: the squared distance is compared with the plain `distance`, and segments are searched
// within tolerance * tolerance + distance. Both mixes of squared and plain values are part of
// the behaviour hit tests depend on. Returns 0 with both outputs unchanged otherwise.
// The 2d form gives up at once when the point lies farther than `distance` from the control
// box; the 3d form uses the search limit for that test instead.
// ---------------------------------------------------------------------------------------------

ZV_API int ZvBezierTool_LocatePoint2d(const ZvPoint2<double>* p, double tolerance,
                                      const ZvPoint2<double>& point, double distance,
                                      double& outDistance2, double& outT);
// Widens the curve and the point to double and runs the 2d form.
ZV_API int ZvBezierTool_LocatePoint2f(const ZvPoint2<float>* p, double tolerance,
                                      const ZvPoint2<float>& point, double distance,
                                      double& outDistance2, double& outT);
ZV_API int ZvBezierTool_LocatePoint3d(const ZvPoint3<double>* p, double tolerance,
                                      const ZvPoint3<double>& point, double distance,
                                      double& outDistance2, double& outT);

// ---------------------------------------------------------------------------------------------
// Splitting and bounds
// ---------------------------------------------------------------------------------------------

// De Casteljau split at t. Writes the five points that lie between P0 and P3 in the two halves:
// the left half is P0, out[0], out[1], out[2] and the right half out[2], out[3], out[4], P3.
// P0 and P3 themselves are not written, so a caller can split in place inside a point array.
ZV_API void ZvBezierTool_SplitCubic3d(const ZvPoint3<double>* p, ZvPoint3<double>* out, double t);

// Grows `extent` (by the rules of AddPoint) by the control points of the cubic cut into four
// quarters, which bounds it far more tightly than its own control box. P0 is left out when
// `skipFirst` is non-zero. An Infinite extent stays Infinite.
ZV_API void ZvBezierTool_AugmentExtentWithCubic2fTightExtent(ZvExtent2<float>& extent,
                                                             const ZvPoint2<float>* p,
                                                             int skipFirst);
ZV_API void ZvBezierTool_AugmentExtentWithCubic2dTightExtent(ZvExtent2<double>& extent,
                                                             const ZvPoint2<double>* p,
                                                             int skipFirst);

#endif
