// Free functions over point arrays seen as polylines.
//
// A name says how the array is read: `ZvPoint2fArray_...` works on the array (or a range of it,
// or its tagged pieces), `ZvPoint2fArraySingleComponent_...` treats the whole array as one
// connected polyline.
//
// Chord-length tables ("chords") hold one cumulative arc length per vertex, starting at 0. Edge
// lengths are guarded: an edge whose squared length is at most 1e-9 counts as 0 long. The tables
// are appended to, so a caller that wants one entry per vertex passes an empty array.
//
// Results follow the library rule: 1 for success, 0 for input the function cannot take (sizes
// that do not match, ranges outside the array), in which case nothing is written.
#ifndef ZV_POLYLINE_H
#define ZV_POLYLINE_H

#include <zv/api.h>
#include <zv/arrays.h>
#include <zv/point.h>

// ---- Tests -------------------------------------------------------------------------------------

// 0 when two neighbours agree within 1e-7 (float form) or 1e-9 (double form) on both axes, else 1.
// Fewer than 2 points give 1.
ZV_API int ZvPoint2fArray_ConsecutivePointsDiffer(const ZvPoint2fArray& a);
ZV_API int ZvPoint2dArray_ConsecutivePointsDiffer(const ZvPoint2dArray& a);

// 1 when x grows strictly from each point to the next and no two neighbours coincide within 1e-9
// on both axes. Fewer than 2 points give 1.
ZV_API int ZvPoint2dArray_IsStrictlyIncreasingX(const ZvPoint2dArray& a);

// ---- Tagged polylines --------------------------------------------------------------------------

// Appends to out/outTags the tagged polyline in/tags without repeated vertices. A point is
// compared with the last point of out, within 1e-9 on both axes:
//   tag 0 (first): always added with tag 0;
//   tag 1 (continue): skipped when equal, otherwise added with tag 1;
//   tag 2 (last): when equal and the last output tag is not 0, that tag becomes 2 and nothing is
//   added; otherwise the point is added with tag 2.
// So a piece that loses its last vertex stays terminated, and a one-point piece keeps two entries.
// Result 0 when tags is shorter than in, or an output array is its input.
ZV_API int ZvPoint2dArray_Filter(const ZvPoint2dArray& in, const ZvPointTagArray& tags,
                                 ZvPoint2dArray& out, ZvPointTagArray& outTags);

// ---- Tangents ----------------------------------------------------------------------------------

// Unit direction of the first or last edge. An edge within 1e-9 on both axes comes back as it
// is, unnormalised. Fewer than 2 points give (0, 0).
ZV_API ZvPoint2<double> ZvPoint2dArray_FirstTangent(const ZvPoint2dArray& a);
ZV_API ZvPoint2<double> ZvPoint2dArray_LastTangent(const ZvPoint2dArray& a);

// ---- Chord lengths -----------------------------------------------------------------------------

// Appends 0, then the running lengths of the edges from vertex first to vertex last:
// last - first + 1 values. Result 0 when first > last or last is not a vertex.
ZV_API int ZvPoint2fArray_ComputeChordLength(const ZvPoint2fArray& a, unsigned int first,
                                             unsigned int last, ZvDoubleArray& out);
ZV_API int ZvPoint2dArray_ComputeChordLength(const ZvPoint2dArray& a, unsigned int first,
                                             unsigned int last, ZvDoubleArray& out);

// Brings a table up to date after the vertices from first on changed or were appended: out keeps
// its entries up to out[first] and receives the running lengths of vertices first + 1 .. last
// after it. A table still empty with first 0 starts with a 0. Result 0 when first > last, last
// is not a vertex, or out has no entry at first (other than that empty start).
ZV_API int ZvPoint2fArray_ComputeIncrementalChordLength(const ZvPoint2fArray& a, unsigned int first,
                                                        unsigned int last, ZvDoubleArray& out);

// One entry per vertex of a tagged polyline. The total runs on across pieces without the gaps
// between them: the first vertex of a piece (tag 0, or any vertex after a tag 2) repeats the
// running total. Result 0 when tags is shorter than a.
ZV_API int ZvPoint2fArray_ComputeChordLength(const ZvPoint2fArray& a, const ZvPointTagArray& tags,
                                             ZvDoubleArray& out);

// The whole array as one polyline: appends one entry per vertex (nothing for an empty array) and
// returns the total length.
ZV_API double ZvPoint2fArraySingleComponent_ComputeChordLength(const ZvPoint2fArray& a,
                                                               ZvDoubleArray& out);
ZV_API double ZvPoint3dArraySingleComponent_ComputeChordLength(const ZvPoint3dArray& a,
                                                               ZvDoubleArray& out);

// Total guarded length of the polyline.
ZV_API double ZvPoint2fArraySingleComponent_ComputeLength(const ZvPoint2fArray& a);

// ---- Positions by arc length -------------------------------------------------------------------

// The point at arc length s, given the chords of a. s within 1e-9 of 0 gives the first point, s
// at or beyond the total the last one; a vertex hit exactly is returned as it is, and between
// vertices the edge is interpolated linearly. A negative s beyond 1e-9 extends the first edge
// backwards. Result 0 when a is empty, chords does not have one entry per vertex, or s is NaN.
ZV_API int ZvPoint3dArraySingleComponent_ComputePosition(const ZvPoint3dArray& a,
                                                         const ZvDoubleArray& chords, double s,
                                                         ZvPoint3<double>& out);

// Appends n + 1 points at even arc distances total / n along a, from the first point to the last.
// Interior points are interpolated in double and narrowed to float. A polyline of no length gives
// its first point n + 1 times. Result 0 when n is 0, a is empty, chords does not have one entry
// per vertex, or out is a.
ZV_API int ZvPoint2fArraySingleComponent_EvenSubdivide(const ZvPoint2fArray& a,
                                                       const ZvDoubleArray& chords, unsigned int n,
                                                       ZvPoint2fArray& out);

// ---- Blending ----------------------------------------------------------------------------------

// Point-by-point blend a (1 - t) + b t, in double, narrowed to float. t within 1e-9 of 0 copies
// a, t within 1e-15 of 1 copies b (the tolerances differ on purpose). out must already have the
// size of a and is not resized. Result 0 when b or out differ in size from a.
ZV_API int ZvPoint2fArraySingleComponent_Lerp(const ZvPoint2fArray& a, const ZvPoint2fArray& b,
                                              double t, ZvPoint2fArray& out);

// The same between the vertex ranges a0..a1 and b0..b1, which may have different counts. Every
// vertex of a's range is paired with the point of b's range at the same fraction of the range's
// length (the ends with the ends), and the pairs are blended as above; ranges of equal count and
// even spacing thus pair vertex with vertex. out, another array than a and b, is resized to
// a1 - a0 + 1 points. Result 0 when a range is reversed or leaves its array, or out is a or b.
ZV_API int ZvPoint2fArraySingleComponent_Lerp(const ZvPoint2fArray& a, unsigned int a0,
                                              unsigned int a1, const ZvPoint2fArray& b,
                                              unsigned int b0, unsigned int b1, double t,
                                              ZvPoint2fArray& out);

// Blends two polylines as turtle walks, by edge headings instead of positions. The start is the
// blend of both starts; every step has the blended length of the first edges (both inputs are
// meant to be evenly subdivided) and the heading u ha + t hb of the matching edges, u = 1 - t,
// headings by AngleWithFirstAxisRadian. Headings are blended as numbers, with no shortest-way
// correction: 350 and 10 degrees meet at 180. t within 1e-9 of 0 copies a, within 1e-15 of 1
// copies b. out must already have the size of a. Result 0 when b or out differ in size from a.
ZV_API int ZvPoint2fArraySingleComponent_TurtleInterp(const ZvPoint2fArray& a,
                                                      const ZvPoint2fArray& b, double t,
                                                      ZvPoint2fArray& out);

// ---- Closeness ---------------------------------------------------------------------------------

// Is polyline b (vertices bFirst..bLast) within tolerance of polyline a (aFirst..aLast)? Each
// inner vertex k of b is compared with the point of a at the same arc length from the range's
// start (from the chord tables); once a's range runs out, with a's last vertex. b's end vertices
// are not compared. Result 1 when all pass; 0 at the first vertex farther than tolerance, whose
// index goes to index. Ranges outside the arrays or tables also give 0, with index untouched.
ZV_API int ZvPoint2fArray_PolylinesAreClose(const ZvPoint2fArray& a, const ZvDoubleArray& chordsA,
                                            unsigned int aFirst, unsigned int aLast,
                                            const ZvPoint2fArray& b, const ZvDoubleArray& chordsB,
                                            unsigned int bFirst, unsigned int bLast,
                                            double tolerance, unsigned int& index);
ZV_API int ZvPoint2dArray_PolylinesAreClose(const ZvPoint2dArray& a, const ZvDoubleArray& chordsA,
                                            unsigned int aFirst, unsigned int aLast,
                                            const ZvPoint2dArray& b, const ZvDoubleArray& chordsB,
                                            unsigned int bFirst, unsigned int bLast,
                                            double tolerance, unsigned int& index);

// ---- Profiles ----------------------------------------------------------------------------------

// y at x of a polyline sorted by increasing x, by linear interpolation. x within 1e-15 of the
// first or last x gives that point's y. There is no extrapolation: x outside the range gives the
// y of the nearer end, and an empty array gives 0.
ZV_API double ZvPoint2dArray_EvalYInSortedArray(const ZvPoint2dArray& a, double x);

// ---- Convex hulls ------------------------------------------------------------------------------

// Appends to out the corners of the convex hull of points[0..count), counter-clockwise from the
// corner of smallest x (then smallest y). Points inside an edge and repeated points are left out:
// equal points give one corner, collinear points the two ends. Result 1 on success; 0 when count
// is not positive, a pointer is null or a coordinate is not finite, and out is then untouched.
ZV_API int ZvGetConvexHull2D(int count, ZvPoint2<float>* points, ZvPoint2fArray* out);

// Appends to out the counter-clockwise convex polygon grown by distance, with round corners made
// of steps of degreesPerStep. Points closer than a squared distance of 1e-5 count as one; a
// polygon that reduces to one point gives a circle of points at angles 0, degreesPerStep, ...
// below 360. A negative distance counts as 0. Result 0 (nothing appended) for an empty polygon, a
// null out, or a degreesPerStep that is not positive and finite.
ZV_API int ZvExpandConvexPolygon2D(ZvPoint2fArray& polygon, double distance, double degreesPerStep,
                                   ZvPoint2fArray* out);

#endif
