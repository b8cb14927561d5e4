// ZvPath2fProp1d: a path that carries one scalar property (pen pressure, stroke width) along the
// arc length of any of its subpaths.
//
// The property of a subpath is a ZvRawFCurve owned by the path: its parameter is the arc length
// from the subpath's start, in path units (pixels of the path's own frame), and its values are
// the property. A subpath without a curve counts as having the constant gc.defaultProperty in
// the sampling operations below (and 0.0 in the plain flattening with values).
//
// The curves are held in records ordered by their subpath's start index (the index of its code 1
// point); every index argument below may be any point of the subpath unless it says otherwise.
// The edits that change point counts (ReplaceSubpathSection in its three forms, ReplaceSegment,
// RemoveSubpath, RemoveSubpathSection, and the non-virtual CloseSubpath and Clear redone here)
// renumber the records, so that a curve stays with its subpath.
//
// Everything else is the path's: the shape contract's Flatten, Sample, fills and strokes ignore
// the property. Transforms move the points only: a curve keeps its arc lengths, and the
// flattening with values stretches it onto the subpath's new length. QueryShapeKind answers only
// KindPathProp, never KindPath.
//
// Locking. Public operations take the shape's lock; an operation on two shapes locks this first.
// The ...InsideCriticalSection forms take no lock and want the subpath's start index itself.
//
// Block layout (R records, P the size of the inner path block, C_i the size of curve block i):
//   0     u32  body length                  4  u16  kind 4      6  u16  version 0x0100
//   8     the whole ZvPath2f block (P bytes, its length prefix included)
//   8+P   u32  R
//   12+P  R x (u32 subpath start, a whole ZvRawFCurve block of C_i bytes)
// Total: P + 12 + sum of (4 + C_i). Blocks of the first format (version 0) hold standard curves;
// they are read and turned into polygonal raw curves.
#ifndef ZV_PATH2F_PROP1D_H
#define ZV_PATH2F_PROP1D_H

#include <zv/path2f.h>
#include <zv/raw_fcurve.h>

#include <cstddef>

class ZvPath2fProp1dImpl;
class ZvShapeLock;

class ZV_API ZvPath2fProp1d : public ZvPath2f {
 public:
  // ---- Construction and copying -------------------------------------------------------------
  // An empty path; `reserve` only sizes the arrays.
  explicit ZvPath2fProp1d(unsigned int reserve = 1);
  // Deep copy: the curves are copied, never shared.
  ZvPath2fProp1d(const ZvPath2fProp1d& other);
  // The geometry of `path`, with no curves.
  explicit ZvPath2fProp1d(const ZvPath2f& path);
  // Frees this path's curves and deep-copies the source's. If the curves cannot be allocated
  // this path takes the source's geometry without curves; if the geometry cannot, it ends up
  // empty, as a path's assignment does. Nothing throws. On itself a no-op.
  ZvPath2fProp1d& operator=(const ZvPath2fProp1d& other);
  ~ZvPath2fProp1d() override;

  // ---- The shape contract -------------------------------------------------------------------
  // From another property path: as operator= above. From a plain path: its geometry, no curves.
  ZvShape2f& operator=(const ZvShape2f& other) override;
  // This object for KindPathProp, null for any other kind (KindPath included).
  ZvShape2f* QueryShapeKind(Kind kind) const override;
  // A new ZvPath2fProp1d owned by the caller; null if it could not be allocated.
  ZvShape2f* Clone() const override;
  unsigned int WriteToBuffer(void* buffer) const override;
  unsigned int GetBufferSize() const override;
  // Reads a trusted body (the block past its length prefix). 0 and no change for another kind
  // or for a version between the first format and the current one. The result is the inner
  // path's body length + 12 + the sum over the records of (4 + the curve's body length): 4 less
  // per record than the body really holds, so walk a buffer by its length prefix, not by this
  // result. A failed allocation restores the object as it was and lets std::bad_alloc through.
  unsigned int ReadFromBufferBody(const void* body) override;
  // Reads a whole block of `size` bytes from an untrusted source, length prefix included. Refused
  // (0, no change) when the block would be read past its end, or when it describes a property
  // path that breaks its own rules: an inner path whose codes do not parse, a record that does
  // not name a subpath start, records out of order or twice on one subpath, a curve block its
  // reader refuses. On success the size of the whole block (4 + its stated length). Never
  // throws.
  unsigned int ReadFromBuffer(const void* buffer, std::size_t size);

  // ---- Edits that keep the records with their subpaths --------------------------------------
  // Each forwards to the path's operation and, on success, moves the start of every record
  // behind the edited section by the change in point count. Results as the path's.
  int ReplaceSegment(unsigned int index, const ZvPoint2<float>* points,
                     unsigned int degree) override;
  int ReplaceSubpathSection(unsigned int start, unsigned int end) override;
  int ReplaceSubpathSection(unsigned int start, unsigned int end, const ZvPoint2<float>& c1,
                            const ZvPoint2<float>& c2) override;
  int ReplaceSubpathSection(unsigned int start, unsigned int end, const ZvPath2f& source,
                            unsigned int first, unsigned int last) override;
  // Removes the subpath and its curve.
  int RemoveSubpath(unsigned int index) override;
  // Nodes start < end of one subpath (refused otherwise). A cut through the middle splits the
  // subpath in two, and both halves carry a copy of the curve it had (with its arc lengths as
  // they were: the second half does not restart at 0).
  int RemoveSubpathSection(unsigned int start, unsigned int end) override;

  // The path's non-virtual edits that change point counts, redone here so that the records
  // follow; called through a ZvPath2f reference they would leave the records behind.
  // Empties the path and drops every curve; never throws.
  void Clear();
  // Closes the subpath holding `index` as the path's CloseSubpath does (a line may be added).
  int CloseSubpath(unsigned int index);

  // ---- Property curves ----------------------------------------------------------------------
  // 1 if the subpath holding `index` has a curve, else 0 (also for an index outside the path).
  int HasPropCurve(unsigned int index) const;
  // The curve of the subpath holding `index`, owned by this path and valid until the next edit
  // of the path. A subpath without a curve answers a shared, keyless curve of value 0.0: ask
  // HasPropCurve first.
  const ZvRawFCurve& GetPropCurve(unsigned int index) const;
  // Each (re)places the curve of the subpath holding `index` / `to` with a copy, keeping the
  // records in order. 0 and no change for an index outside the path.
  int SetPropCurve(unsigned int index, const ZvRawFCurve& curve);
  // From (arc length, value) pairs in ascending arc length: one pair gives a one-key curve at
  // arc length 0 with its value, two pairs a line from (0, y0) to (x1, y1), more a polyline that
  // keeps a key where the pairs leave the current piece by more than `tolerance` (in value).
  // 0 for an empty array.
  int SetPropCurve(unsigned int index, const ZvPoint2dArray& points, double tolerance);
  // The curve of the subpath holding `from`, copied. Nothing (0) when that subpath has none or
  // both indices are in the same subpath.
  int SetPropCurve(unsigned int to, unsigned int from);
  // The curve of `source`'s subpath holding `from`. Nothing (0) when it has none. Locks this
  // path, then the source.
  int SetPropCurve(unsigned int to, const ZvPath2fProp1d& source, unsigned int from);
  // Extend the curve of the subpath holding `index` by a key at (parameter, value), which must
  // lie right of its last key; the second form moves the last key instead when the new point
  // lies within `tolerance` (in value) of the line through the last two keys. The subpath must
  // have a curve: 0 without one, or when the curve refuses the key.
  unsigned int AppendLinearSegment(unsigned int index, double parameter, double value);
  unsigned int AppendOrExtendLinearSegment(unsigned int index, double parameter, double value,
                                           double tolerance);
  // The property at arc length `parameter`; 0.0 when the subpath has no curve.
  double EvalPropCurve(unsigned int index, double parameter) const;
  // One value per parameter, appended to `values`. Result: values added, 0 with no curve.
  unsigned int EvalPropCurve(unsigned int index, const ZvDoubleArray& parameters,
                             ZvDoubleArray& values) const;
  // The curve's largest key parameter: the arc length it covers. 0.0 with no curve or no keys.
  double GetLargestArcLength(unsigned int index) const;
  // The curve parameter of node `node`: its normalized arc length along the subpath (measured on
  // the polyline flattened at `tolerance`) times the curve's largest arc length L, clamped to
  // 0..L, and 0.0 when either is within 1e-7 of 0. 0 (parameter untouched) when `node` is not a
  // node or its subpath has no curve.
  int GetPropCurveParameter(unsigned int node, double tolerance, double& parameter) const;

  // ---- Polylines with values (appended to the caller's arrays, never cleared) ---------------
  // Points and tags as the path's Flatten (tags 0, 1..., 2 per subpath), and one value per point
  // in `values`. A subpath with a curve gets a vertex at each of the curve's breakpoints
  // (flattened at gc.propertyTolerance and stretched to the subpath's length) unless one lies
  // within gc.pointMergeDistance of the last vertex; a subpath without a curve gets values 0.0.
  // Result: points added.
  using ZvPath2f::Flatten;
  unsigned int Flatten(const ZvGC& gc, ZvPoint2fArray& points, ZvPointTagArray& tags,
                       ZvDoubleArray& values) const;
  // Points and tags as the path's Sample. With a curve, the k samples of a subpath get values at
  // k even steps over the curve's arc length, and a last sample on the subpath's end takes the
  // curve's value beyond its last key; without one, gc.defaultProperty. A closed subpath whose
  // repeated start the path's Sample chopped keeps the value of that sample: `values` then holds
  // one more entry than `points` gained. Result: points added.
  using ZvPath2f::Sample;
  unsigned int Sample(const ZvGC& gc, ZvPoint2fArray& points, ZvPointTagArray& tags,
                      ZvDoubleArray& values) const;
  // Samples spaced by the property: after a sample of value v the next lies v *
  // gc.sampleSpacing further along, kept within gc.pointMergeDistance..gc.sampleSpacing. Without
  // a curve the path's even sampling with gc.defaultProperty. One value per point. Result:
  // points added.
  unsigned int PropertySample(const ZvGC& gc, ZvPoint2fArray& points, ZvPointTagArray& tags,
                              ZvDoubleArray& values) const;
  // The path's IntersectSamplePointsExtent over Sample, and over PropertySample, keeping the
  // value of each point kept. Result: points added.
  using ZvPath2f::IntersectSamplePointsExtent;
  unsigned int IntersectSamplePointsExtent(const ZvGC& gc, const ZvExtent2<float>& extent,
                                           ZvPoint2fArray& points, ZvPointTagArray& tags,
                                           ZvDoubleArray& values, int noQuickReject) const;
  unsigned int IntersectPropertySamplePointsExtent(const ZvGC& gc, const ZvExtent2<float>& extent,
                                                   ZvPoint2fArray& points, ZvPointTagArray& tags,
                                                   ZvDoubleArray& values, int noQuickReject) const;

  // ---- Whole-path operations ----------------------------------------------------------------
  // The path's AddFittedSamplesFromPath, each new subpath taking a copy of its source subpath's
  // curve. Locks this path, then the source. Result: points added.
  using ZvPath2f::AddFittedSamplesFromPath;
  unsigned int AddFittedSamplesFromPath(const ZvGC& gc, const ZvPath2fProp1d& source);
  // This path becomes the blend of siblings a and b at t (0 gives a, 1 gives b): points
  // a*(1-t) + b*t, and for each subpath where both have a curve, one resampled at n + 1 even
  // steps (n = ceil of the longer subpath's length over `spacing`) and blended the same way,
  // kept to `tolerance`. Where only a has a curve it is copied; where only b has one, none.
  // Locks this, a and b, in that order, for the whole call. 0 and no change when a and b are
  // not siblings.
  int SetToLerpAB(const ZvPath2fProp1d& a, const ZvPath2fProp1d& b, double t, double spacing,
                  double tolerance);

  // ---- For callers that hold the lock ---------------------------------------------------------
  // `start` is a subpath's start index. The curve, or null.
  const ZvRawFCurve* GetPropCurveInsideCriticalSection(unsigned int start) const;
  // Places a copy of `curve` for that subpath. Result 1.
  int SetPropCurveInsideCriticalSection(unsigned int start, const ZvRawFCurve& curve);
  // After the subpath first..last was removed: drops the record at `first`, if any, and moves
  // every record behind it back by the removed point count. Result: 1 if a record was dropped.
  int RemovePropCurveInsideCriticalSection(unsigned int first, unsigned int last);
  // The number of subpaths with a curve.
  unsigned int GetNumPropCurves() const;

 private:
  ZvPath2fProp1d(const ZvPath2fProp1d& other, const ZvShapeLock& held);
  // The reader behind ReadFromBufferBody and ReadFromBuffer; `bounded` adds the checks an
  // untrusted block needs.
  unsigned int ReadBody(const unsigned char* body, std::size_t size, bool bounded);
  // Sample with values; `keepChoppedValue` keeps the value of a closing sample that the even
  // sampling chopped.
  unsigned int SampleWithValues(const ZvGC& gc, ZvPoint2fArray& points, ZvPointTagArray& tags,
                                ZvDoubleArray& values, bool keepChoppedValue) const;
  // Exchanges points, codes and open flag with `other`; allocates nothing.
  void SwapGeometry(ZvPath2fProp1d& other);
  // Runs a path edit of the subpath holding `index` and moves the records of the subpaths behind
  // it by the change in point count.
  template <class Edit>
  int EditKeepingRecords(unsigned int index, Edit edit);

  ZvPath2fProp1dImpl* m_impl;
};

#endif
