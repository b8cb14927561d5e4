// ZvPath2f: a list of subpaths built of Bezier segments of degree 1 to 8.
//
// Storage is two parallel arrays of equal length: the points (single precision, all subpaths in
// drawing order) and one code byte per point. All structure (subpaths, segments, degrees,
// nodes, closedness, tangent locks) is read from the codes; no other index is kept, so every
// structure query is a linear scan and a path costs 9 bytes a point.
//
// A code byte holds the segment code in bits 0..5, the G1 lock of the node in bit 7 (never
// persisted) and a bit 6 that is kept whenever a code is rewritten. Segment codes:
//
//   1          start of a subpath
//   degree d   the d points of a segment (d-1 control points, then its end node) carry
//              base(d) .. base(d)+d-1 with base(d) = d(d+1)/2 + 2; the first control point of
//              the segment is the point before them. If the end node closes its subpath it
//              carries base(d)+d instead, the closed end code.
//
//   degree 1: 3 (closed 4)   2: 5 6 (7)   3: 8 9 10 (11)   4: 12..15 (16)   5: 17..21 (22)
//   degree 6: 23..28 (29)    7: 30..36 (37)   8: 38..45 (46)
//
// Codes 0, 2 and above 46 are illegal; the queries treat such a point as unknown and answer 0.
// A closed subpath stores its end point, which coincides with its start within 1e-7 per axis;
// closing never adds an implicit segment. Two paths are siblings when they have the same point
// count and the same segment codes, lock bits aside.
//
// Failure. An appending call that fails to allocate chops both arrays back to their length on
// entry, releases the lock and lets std::bad_alloc through. Clone, Clear, operator= and the
// readers swallow it, leaving the documented result.
#ifndef ZV_PATH2F_H
#define ZV_PATH2F_H

#include <zv/shape.h>

#include <iosfwd>

class ZvRect2f;
class ZvOval2f;
class ZvByteReader;
class CFillContext;

class ZV_API ZvPath2f : public ZvShape2f {
 public:
  // ---- Construction and copying -------------------------------------------------------------
  // An empty path; `reserve` only sizes the arrays.
  explicit ZvPath2f(unsigned int reserve = 1);
  ZvPath2f(const ZvPath2f& other);
  // Points first..last of `source`, made well formed: the first point starts a subpath, and a
  // cut through a closed subpath opens it and frees its tangent locks. Ends that fall inside a
  // segment (on a control point) move inwards to the segment's nodes, so that only whole
  // segments are copied. An empty path when the range is not inside the source or holds no
  // node.
  ZvPath2f(const ZvPath2f& source, unsigned int first, unsigned int last);
  // A five-point closed polyline starting at corner 2 of the rectangle (defined with ZvRect2f).
  explicit ZvPath2f(const ZvRect2f& rect);
  // Four cubics through the oval's edge handles (defined with ZvOval2f).
  explicit ZvPath2f(const ZvOval2f& oval);
  // On itself a no-op. If the copy cannot be allocated the path ends up empty; nothing throws.
  ZvPath2f& operator=(const ZvPath2f& other);
  ~ZvPath2f() override;
  // Empties the path; never throws.
  void Clear();

  // ---- The shape contract -------------------------------------------------------------------
  ZvShape2f& operator=(const ZvShape2f& other) override;
  ZvShape2f* QueryShapeKind(Kind kind) const override;
  ZvShape2f* Clone() const override;
  unsigned int NumPoints() const override;
  // The box of all stored points, control points included; Empty (with zeros) for no points.
  ZvExtent2<float>& GetExtent(ZvExtent2<float>& extent) const override;
  ZvExtent2<double>& GetExtent(ZvExtent2<double>& extent) const override;
  ZvExtent2<float>& GetTightExtent(ZvExtent2<float>& extent) const override;
  ZvExtent2<double>& GetTightExtent(ZvExtent2<double>& extent) const override;
  int GetPoint(unsigned int index, ZvPoint2<float>& point) const override;
  ZvPoint2<float> GetPoint(unsigned int index) const override;
  ZvPoint2<float>* GetPoints(unsigned int first, unsigned int last,
                             ZvPoint2<float>* dst) const override;
  ZvPoint2<double>* GetPoints(unsigned int first, unsigned int last,
                              ZvPoint2<double>* dst) const override;
  int GetClosePointIndex(const ZvPoint2<float>& point, double size,
                         unsigned int* index) const override;
  unsigned int GetPointsInExtentIndices(const ZvExtent2<float>& extent,
                                        ZvULongArray* indices) const override;
  int IsIntersectingExtent(const ZvGC& gc, const ZvExtent2<float>& extent,
                           int noQuickReject) const override;
  int IsInteriorIntersectingExtent(const ZvGC& gc, const ZvExtent2<float>& extent,
                                   int noQuickReject) const override;
  unsigned int IntersectSamplePointsExtent(const ZvGC& gc, const ZvExtent2<float>& extent,
                                           ZvPoint2fArray& points, ZvPointTagArray& tags,
                                           int noQuickReject) const override;
  ZvShape2f& Translate(const ZvPoint2<float>& offset) override;
  ZvShape2f& Rotate(double degrees, const ZvPoint2<float>& center) override;
  ZvShape2f& Scale(double sx, double sy, const ZvPoint2<float>& center) override;
  ZvShape2f& ShearX(double a, double b) override;
  ZvShape2f& ShearY(double a, double b) override;
  ZvShape2f& Transform(const ZvTransfo4& transform) override;
  unsigned int Flatten(const ZvGC& gc, ZvPoint2fArray& points,
                       ZvPointTagArray& tags) const override;
  // Samples every gc.sampleSpacing pixels of arc length along each subpath. At most kMaxSamples
  // in one call: a path that would need more (a spacing not above 0, a length that is not
  // finite) gets none, the arrays keep their sizes and the result is 0.
  unsigned int Sample(const ZvGC& gc, ZvPoint2fArray& points, ZvPointTagArray& tags) const override;
  static constexpr unsigned int kMaxSamples = 1u << 24;
  int Fill(const ZvGC& gc, ZvRaster<unsigned char>& raster, int (*callback)(),
           const IntBbox2l* box) const override;
  int Fill(const ZvGC& gc, ZvRaster<float>& raster, int (*callback)(),
           const IntBbox2l* box) const override;
  int Fill(const ZvGC& gc, ZvRaster<short>& raster, int (*callback)(),
           const IntBbox2l* box) const override;
  int AAFill(const ZvGC& gc, ZvRaster<unsigned char>& raster, int (*callback)(),
             const IntBbox2l* box) const override;
  int AAFill(const ZvGC& gc, ZvRaster<float>& raster, int (*callback)(),
             const IntBbox2l* box) const override;
  int AAFill(const ZvGC& gc, ZvRaster<short>& raster, int (*callback)(),
             const IntBbox2l* box) const override;
  int SoftFill(const ZvGC& gc, ZvRaster<unsigned char>& raster, int (*callback)()) const override;
  int SoftFill(const ZvGC& gc, ZvRaster<float>& raster, int (*callback)()) const override;
  int SoftFill(const ZvGC& gc, ZvRaster<short>& raster, int (*callback)()) const override;
  // The path and the outline's round joins and caps are flattened whole before the fill clips
  // them, so the cost of a stroke grows with the square root of the path's size and of
  // gc.lineWidth over the tolerance: keep both within what the raster can show (near the float
  // range a cubic or a join costs about a million points).
  int Stroke(const ZvGC& gc, ZvRaster<unsigned char>& raster) const override;
  // Block layout (n points, 9n + 16 bytes):
  //   0  u32  body length 9n + 12    4  u16  kind 1    6  u16  0    8  u32  n
  //   12 n x (f32 x, f32 y)    12+8n  n x u8 segment code (lock bits dropped)
  //   12+9n  u32 currentSubpathOpen
  unsigned int WriteToBuffer(void* buffer) const override;
  unsigned int GetBufferSize() const override;
  // 0 and no change for another kind; 9n + 12 on success. A failed allocation leaves the path
  // empty and answers 0.
  unsigned int ReadFromBufferBody(const void* body) override;

  // ---- Editing (in place, under the lock for the whole call) --------------------------------
  // Every edit keeps the path well formed: the codes parse, closed subpaths stay closed (their
  // start and last point move together) and G1-locked nodes keep their handles in line. A
  // refusal answers 0 and changes nothing; so does an index outside the path. An edit that runs
  // out of memory lets std::bad_alloc through and leaves the path as it was. "Coincide" means
  // within 1e-7 on each axis in single precision.

  // Moves point `index` to p, dragging what is tied to it. A locked node takes both handles
  // along by the same delta (the outgoing one is projected back in line if rounding broke the
  // alignment). A handle beside a locked node turns its partner handle to the opposite side:
  // with `scale` non-zero the ratio of the two handle lengths is kept, with 0 the partner's
  // length. The start or last point of a closed subpath moves both.
  void ReplacePoint(unsigned int index, const ZvPoint2<float>& p, int scale);
  // Stores p at `index` and nothing else, locks or not.
  void ReplacePointIgnoringLock(unsigned int index, const ZvPoint2<float>& p);
  // Sets the handles around `node` to node - v and node + v (at a closed subpath's start or end,
  // the last handle and the first one). 0 when `node` is not a node, or ends an open subpath.
  int ReplaceTangentVectorDirections(unsigned int node, const ZvPoint2<float>& v);

  // Replaces the segment holding `index` by the Bezier of `degree` + 1 `points`, whose first and
  // last must coincide with the segment's ends (else 0). A line or quadratic is refused at a
  // locked end. The new handles go through ReplacePoint when the old segment had handles of its
  // own, so a locked neighbour follows them. A degree above 8 answers 1 after cutting the
  // segment down: a segment of degree 3 or more keeps only its first and last handle and becomes
  // a cubic on them, a quadratic becomes a line, a line stays. Degree 0 over a segment of zero
  // length answers 1 and changes nothing. A lone start point has no segment to replace: 0.
  virtual int ReplaceSegment(unsigned int index, const ZvPoint2<float>* points,
                             unsigned int degree);
  // The section between nodes start < end of one subpath becomes one line. Refused at a locked
  // node. Replacing the whole of a closed subpath leaves a closing line on its start.
  virtual int ReplaceSubpathSection(unsigned int start, unsigned int end);
  // The section becomes one cubic with control points c1 and c2 (through ReplacePoint when the
  // section had points to hold them, so locked ends turn their partners). Locks are not refused.
  virtual int ReplaceSubpathSection(unsigned int start, unsigned int end, const ZvPoint2<float>& c1,
                                    const ZvPoint2<float>& c2);
  // The section becomes the stretch between nodes first < last of one subpath of `source`, whose
  // ends must coincide with this section's ends. A locked end needs a handle of its own from the
  // source (a segment of degree 3 or more on that side), else 0. The end code is made closed or
  // open to fit this path. Locks this path, then the source.
  virtual int ReplaceSubpathSection(unsigned int start, unsigned int end, const ZvPath2f& source,
                                    unsigned int first, unsigned int last);
  // Removes the whole subpath holding `index`; the last subpath's openness then follows the new
  // last subpath.
  virtual int RemoveSubpath(unsigned int index);
  // Cuts out the section between nodes start < end of one subpath: the subpath is opened (a
  // closed one is cut open even in its middle) and the locks at both nodes are released. A cut
  // through the middle leaves two subpaths; a part of a single point vanishes.
  virtual int RemoveSubpathSection(unsigned int start, unsigned int end);

  // ---- Parallel polylines -------------------------------------------------------------------
  // All points are taken as the vertices of one polygon, whatever their codes: the path counts as
  // closed when its first and last points agree within 1e-6 per axis, and an open one is wrapped
  // too (its first vertex takes the edge from the last point). Each vertex moves by exactly the
  // distance along the normalised sum of the unit normals of its two edges, the normal of an
  // edge from a to b being (a.y - b.y, b.x - a.x) / |b - a|: to the left of the direction of
  // travel for a positive distance, in a y-up frame. There is no miter correction, so a corner
  // lands at the distance from its vertex and not on the offset of its edges. A zero-length edge
  // has no normal, and where the two normals cancel the vertex stays. The outputs must hold as
  // many points as this path, and are written by ReplacePoint(k, q, 1); a closed path's last
  // output point repeats the first. 0, nothing written, when an output holds another number of
  // points or the path has fewer than 2. Locks this path, then the outputs.

  // `offset` to the left, or to the right when `reverse` is non-zero.
  int GetSimilarPath(float offset, int reverse, ZvPath2f& output) const;
  // For a closed polyline: `inward` to the right into `first`, `outward` to the left into
  // `second`.
  int GetInwardOutwardPaths(float inward, float outward, ZvPath2f& first, ZvPath2f& second) const;

  // ---- Drawing (each appends under the lock) ------------------------------------------------
  // A segment starts at the path's last point, so on an empty path the segment calls append
  // nothing: start with Moveto.
  void Moveto(const ZvPoint2<float>& p);  // starts a subpath and marks it open
  void Lineto(const ZvPoint2<float>& p);
  void Curveto(const ZvPoint2<float>& c, const ZvPoint2<float>& end);  // quadratic
  void Curveto(const ZvPoint2<float>& c1, const ZvPoint2<float>& c2,
               const ZvPoint2<float>& end);  // cubic
  // `degree` points (inner control points, then the end node) for degree 1..8; any other
  // degree appends nothing.
  void AltCurveto(const ZvPoint2<float>* points, unsigned int degree);
  // The same from array[first] on. Nothing when the points are not all inside the array.
  void AltAltCurveto(const ZvPoint2fArray& array, unsigned int first, unsigned int degree);
  // A polyline as one new subpath: what Moveto(points[0]), a Lineto to each further point and,
  // with `close` non-zero, Closeto would append, under one hold of the lock and with one growth
  // of the arrays. The points may lie in this path. Nothing for a count of 0.
  void AddPolyline(const ZvPoint2<float>* points, unsigned int count, int close);
  // Closes the last subpath if its end already lies within 1e-7 of its start (per axis, single
  // precision, bounds included): 1. Never adds a segment; 0 and no change when the ends are
  // apart or the path is empty.
  int Closeto();
  // Closes the subpath holding `index`, adding a line back to its start when the ends are apart.
  int CloseSubpath(unsigned int index);
  // Reopens the subpath holding `index`: its closed end code becomes the open one and a tangent
  // lock on the end is released. 0 when it was not closed.
  int OpenSubpath(unsigned int index);

  // ---- Structure queries (under the lock) ---------------------------------------------------
  // Indices of the subpath / segment holding `index`. 0, outputs untouched, when the index is
  // not below NumPoints().
  int GetSubpathIndices(unsigned int index, unsigned int& first, unsigned int& last) const;
  int GetSegmentIndices(unsigned int index, unsigned int& first, unsigned int& last) const;
  int IsStartOfSubpath(unsigned int index) const;
  // 1 if `index` ends its subpath (last point, or the next point starts one), writing whether
  // the subpath is closed; otherwise 0 with `closed` untouched.
  int IsEndOfSubpath(unsigned int index, int& closed) const;
  int IsSubpathClosed(unsigned int index) const;
  // A lone start point counts as a segment.
  unsigned int NumSegments() const;
  unsigned int NumSubpaths() const;
  unsigned int NumNodes() const;
  unsigned int NumNodesExceptLastNodeOfClosedSubpaths() const;
  unsigned int GetDegree(unsigned int index) const;
  unsigned int LargestDegree() const;
  // 1 for a non-empty path of lines only.
  int IsPolyline() const;
  int IsSiblingOf(const ZvPath2f& other) const;
  // The last point; (0, 0) for an empty path.
  ZvPoint2<float> GetCurrentPoint() const;
  unsigned int MaxDegreeForThisImplementation() const { return 8; }

  // ---- Measuring (under the lock; each appends to the caller's arrays, never clears them) ----
  // Polyline outputs pair the points with one tag per point: 0 first point of a subpath, 1 a
  // point inside, 2 its last point. A closed subpath simply ends on its start. A subpath of a
  // lone start point comes out as that point twice, tagged 0 and 2. Cubics are flattened by
  // ZvBezierTool_FlattenCubic2f / 2d, other degrees by ZvBezierTool::Flatten.

  // Flatten without a transform, at `tolerance`. Result: points added.
  unsigned int AltFlatten(double tolerance, ZvPoint2fArray& points, ZvPointTagArray& tags) const;
  // The subpath holding `index`, without tags. Result: points added; 0 for an index outside.
  unsigned int FlattenSubpath(unsigned int index, double tolerance, ZvPoint2fArray& points) const;
  // Samples at relative arc positions (0..1 over the whole flattened path, in order), tagged
  // per subpath. Result: points added.
  unsigned int Sample(const ZvGC& gc, const ZvFloatArray& positions, ZvPoint2fArray& points,
                      ZvPointTagArray& tags) const;
  // Flatten in double precision through `transform`. Result: subpaths written.
  unsigned int TransformAndFlattenPath(const ZvTransfo4& transform, double tolerance,
                                       ZvPoint2dArray& points, ZvPointTagArray& tags) const;
  // The same for the closed subpaths only. Result: closed subpaths written.
  unsigned int TransformAndFlattenClosedSubPaths(const ZvTransfo4& transform, double tolerance,
                                                 ZvPoint2dArray& points,
                                                 ZvPointTagArray& tags) const;
  // For the rasterisers: every closed subpath of more than two indices, mapped, flattened and
  // clipped as a polygon to `extent` (x >= xmin, y >= ymin, x <= xmax, y <= ymax, bounds
  // inside), so that no coordinate leaves the extent. Each polygon that keeps any area is
  // written as m points tagged 0, 1, ..., 1 plus its first point again tagged 2. An Empty extent
  // writes nothing; an Infinite one clips nothing. Result: polygons written.
  unsigned int TransformFlattenAndClipClosedSubPaths(const ZvTransfo4& transform, double tolerance,
                                                     const ZvExtent2<double>& extent,
                                                     ZvPoint2dArray& points,
                                                     ZvPointTagArray& tags) const;
  // Box of the control points of the segment holding `index`; Empty for an index outside.
  ZvExtent2<float>& GetSegmentExtent(unsigned int index, ZvExtent2<float>& extent) const;
  // The point nearest to `point` in the octagonal metric (larger axis distance plus 0.3334 times
  // the smaller); the lowest index wins a tie. 0 for an empty path.
  int GetClosePointIndex(const ZvPoint2<float>& point, unsigned int* index) const;
  // Arc length from the start of the node's subpath to the node over the subpath's length, both
  // measured on the polyline flattened at `tolerance`: 0 at the start, 1 at the end.
  double GetNodeNormalizedArcLength(unsigned int node, double tolerance) const;
  // Appends a copy of `source` resampled at gc.sampleSpacing and refitted with cubics, corners
  // at gc.fitTolerance taken as a squared cosine and gc.flattenTolerance as the fit tolerance.
  // Locks this path, then the source. Result: points added to this path.
  unsigned int AddFittedSamplesFromPath(const ZvGC& gc, const ZvPath2f& source);

  // ---- Structure queries for callers that hold the lock -------------------------------------
  // Degree of the segment `index` belongs to; for a start point, of the segment behind it (0
  // for a lone start). 0 for an illegal code.
  unsigned int Degree(unsigned int index) const;
  // First and last point of the segment holding `index`. A start point answers itself as start
  // and the end of the first segment behind it as end. 0 for an illegal code.
  unsigned int StartOfSegment(unsigned int index) const;
  unsigned int EndOfSegment(unsigned int index) const;

  // ---- Tangent locks ------------------------------------------------------------------------
  // Whether the node's two handles are parallel within a squared sine of 1e-6 and not a cusp.
  // A handle of zero length counts as continuous. At a subpath's start or end, only for a closed
  // subpath of at least three index steps.
  int IsG1Continuous(unsigned int index) const;
  // Marks a G1-continuous node between two segments of degree 3 or more (at a closed subpath's
  // start and end, both ends are marked). 0 when refused.
  int LockG1(unsigned int index);
  int UnlockG1(unsigned int index);

  // ---- Rasterising (the fills above, and strokes into the other pixel types) ----------------
  // Strokes of the unsigned char variant above into the other rasteriser types: the outline
  // filled with full values, never antialiased.
  int Stroke(const ZvGC& gc, ZvRaster<short>& raster) const;
  int Stroke(const ZvGC& gc, ZvRaster<float>& raster) const;
  // The shared front end of the fills: the pixel box (columns xMin..xMax-1, rows yMin..yMax-1)
  // of the closed subpaths mapped by the context's transform, clipped to the raster and to
  // `box` (whose last column and row stay outside, on purpose), and the edge tables of their
  // polygon, flattened at max(0.25, tolerance) pixels and then scaled by `scale`. Answers 0 when
  // there is nothing to fill.
  int CalculateFillParameters(const ZvGC& gc, int rasterWidth, int rasterHeight, double scale,
                              CFillContext& ctx, int& xMin, int& yMin, int& xMax, int& yMax,
                              int& numVertices, const IntBbox2l* box) const;

 protected:
  // Builds the outline of a rectangle from the handles of `shape` read through GetPoint (corners
  // 2, 4, 6, 8), or of an oval from its handles 1..8 read through GetPoints. These carry the
  // constructors from ZvRect2f and ZvOval2f, which only supply the shape.
  void SetToRectOutline(const ZvShape2f& rect);
  void SetToOvalOutline(const ZvShape2f& oval);

  ZvPoint2fArray points;
  ZvUByteArray codes;
  unsigned int currentSubpathOpen;

 private:
  template <class T>
  int StrokeImp(const ZvGC& gc, ZvRaster<T>& raster) const;
  friend class ZvPath2fMeasure;  // the measuring code reads the arrays directly
  friend class ZvOval2f;         // its outline is the one built by SetToOvalOutline
  friend ZvShape2f* ZvShape2f_CreateFromBuffer(const void*, std::size_t, unsigned int&);
  // The body reader behind ReadFromBufferBody and the bounded factory.
  unsigned int ReadBody(ZvByteReader& in);
  // Makes room for `count` more points in both arrays, or restores them and rethrows.
  void GrowBoth(unsigned int count);
  void Append(const ZvPoint2<float>* p, unsigned int count, unsigned char firstCode);
  // Appends a segment of `degree` points; nothing on an empty path.
  void AppendSegment(const ZvPoint2<float>* p, unsigned int degree);
  unsigned int SubpathStart(unsigned int index) const;
  unsigned int SubpathEnd(unsigned int index) const;
  int IsSubpathBoundary(unsigned int index) const;
};

// A cursor over the subpaths of a path it does not own.
class ZV_API ZvPath2fIter {
 public:
  explicit ZvPath2fIter(const ZvPath2f& source) : path(&source), next(0) {}
  // The next subpath's first and last index; 0 when there is none left.
  int GetNextSubPathIndices(unsigned int& first, unsigned int& last);
  void Reset() { next = 0; }

 private:
  const ZvPath2f* path;
  unsigned int next;
};

// Debug dump: statistics, then one line per point with its segment's first and last index.
ZV_API std::ostream& operator<<(std::ostream& out, const ZvPath2f& path);

#endif
