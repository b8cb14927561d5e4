// The outline of a stroke: closed contours around a flattened polyline, filled afterwards under
// the non-zero winding rule.
//
// Each open subpath gives one contour (forward side, end cap, backward side, start cap); each
// closed subpath two, one per side, running in opposite directions so that the winding rule
// leaves a ring. Only the outer side of a turn gets a join: the inner side is routed through
// the vertex itself, and the overlaps this makes are harmless under the winding rule.
#ifndef ZV_RASTER_STROKE_OUTLINE_H
#define ZV_RASTER_STROKE_OUTLINE_H

#include <zv/arrays.h>
#include <zv/gc.h>
#include <zv/path2f.h>

// c is the vertex, a the offset vector arriving at it, b the one leaving it, radius the half
// width there (weight included).
using ZvStrokeJoin = void (*)(const ZvPoint2<double>& a, const ZvPoint2<double>& b,
                              const ZvPoint2<double>& c, double radius, double miterLimit,
                              ZvPath2f& outline);
// The outline stands at `from`; the cap ends at `to`. Its size comes from their distance.
using ZvStrokeCap = void (*)(const ZvPoint2<double>& from, const ZvPoint2<double>& to,
                             double radius, ZvPath2f& outline);

void JoinBevel(const ZvPoint2<double>& a, const ZvPoint2<double>& b, const ZvPoint2<double>& c,
               double radius, double miterLimit, ZvPath2f& outline);
void JoinMiter(const ZvPoint2<double>& a, const ZvPoint2<double>& b, const ZvPoint2<double>& c,
               double radius, double miterLimit, ZvPath2f& outline);
void JoinRound(const ZvPoint2<double>& a, const ZvPoint2<double>& b, const ZvPoint2<double>& c,
               double radius, double miterLimit, ZvPath2f& outline);
void EndCapRound(const ZvPoint2<double>& from, const ZvPoint2<double>& to, double radius,
                 ZvPath2f& outline);
void EndCapSquare(const ZvPoint2<double>& from, const ZvPoint2<double>& to, double radius,
                  ZvPath2f& outline);
void EndCapFlat(const ZvPoint2<double>& from, const ZvPoint2<double>& to, double radius,
                ZvPath2f& outline);

// The join and cap of the last stroke. Chosen once per outline from the context's styles; a
// style outside 0..2 keeps the previous choice. Shared by all strokes, so two concurrent strokes
// with different styles can interfere: outlining is not reentrant.
extern ZvStrokeJoin pJoin;
extern ZvStrokeCap pEndCap;

// Per-point width weights of tagged polylines: 1 everywhere, or with `taper` 4t(1 - t) for t
// the point's share of its subpath's chord length (0 for a subpath of no length).
void ZvStrokeWeights(const ZvPoint2dArray& points, const ZvPointTagArray& tags, int taper,
                     double* weights);

// Appends the outline of `numSubPaths` subpaths of the filtered polyline points/tags (each
// ending at a point tagged 2) to `outline`. Reads the context's flatten tolerance, miter limit,
// line width and join and cap styles.
void ComputeStrokeOutline(const ZvGC& gc, const ZvPoint2dArray& points, ZvPointTagArray tags,
                          unsigned int numSubPaths, const double* weights, ZvPath2f& outline);

#endif
