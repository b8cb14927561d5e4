// ZvRect2f: a rectangle under any affine map, that is a parallelogram, held by three corners.
//
// a to b is the width edge, a to c the height edge; the fourth corner d = b + c - a is never
// stored. Coordinates are the shape's own units (pixels once mapped by a context's transform),
// in single precision. Nine handles serve picking and interactive editing:
//
//   0 centre (b + c) / 2     1 middle of b-d     2 corner d     3 middle of c-d    4 corner c
//   5 middle of a-c          6 corner a          7 middle of a-b                   8 corner b
//
// Every operation takes the shape's lock around its access to the corners; the temporary paths
// of the delegated operations are built under it and worked on after it is released.
#ifndef ZV_RECT2F_H
#define ZV_RECT2F_H

#include <zv/shape.h>

class ZvPath2f;
class ZvTransfo4;

class ZV_API ZvRect2f : public ZvShape2f {
 public:
  // All corners at the origin.
  ZvRect2f();
  // Axis-aligned, `width` by `height` about `center`: a is its smallest corner.
  ZvRect2f(const ZvPoint2<float>& center, float width, float height);
  // Axis-aligned from corner a = p to the opposite corner q.
  ZvRect2f(const ZvPoint2<float>& p, const ZvPoint2<float>& q);
  // The three corners as they are.
  ZvRect2f(const ZvPoint2<float>& a, const ZvPoint2<float>& b, const ZvPoint2<float>& c);
  ZvRect2f(const ZvRect2f& other);
  ZvRect2f& operator=(const ZvRect2f& other);
  ~ZvRect2f() override;

  // ---- The shape contract -------------------------------------------------------------------
  ZvShape2f& operator=(const ZvShape2f& other) override;
  ZvShape2f* QueryShapeKind(Kind kind) const override;
  ZvShape2f* Clone() const override;
  // Always 9: the handles.
  unsigned int NumPoints() const override;
  // The box of the four corners, always Regular: the frame, not the tight box of the outline.
  ZvExtent2<float>& GetExtent(ZvExtent2<float>& extent) const override;
  ZvExtent2<double>& GetExtent(ZvExtent2<double>& extent) const override;
  ZvExtent2<float>& GetTightExtent(ZvExtent2<float>& extent) const override;
  ZvExtent2<double>& GetTightExtent(ZvExtent2<double>& extent) const override;
  // Handle `index`; 0 and `point` untouched from 9 up.
  int GetPoint(unsigned int index, ZvPoint2<float>& point) const override;
  // Handle `index` (the centre from 9 up).
  ZvPoint2<float> GetPoint(unsigned int index) const override;
  ZvPoint2<float>* GetPoints(unsigned int first, unsigned int last,
                             ZvPoint2<float>* dst) const override;
  ZvPoint2<double>* GetPoints(unsigned int first, unsigned int last,
                              ZvPoint2<double>* dst) const override;
  // The first handle, from index 0 (the centre beats the corners), inside the box of side
  // `size` about `point`.
  int GetClosePointIndex(const ZvPoint2<float>& point, double size,
                         unsigned int* index) const override;
  unsigned int GetPointsInExtentIndices(const ZvExtent2<float>& extent,
                                        ZvULongArray* indices) const override;
  // The corners and edges, mapped by the context's transform, against `extent`; the last
  // argument is not used.
  int IsIntersectingExtent(const ZvGC& gc, const ZvExtent2<float>& extent,
                           int noQuickReject) const override;
  // The same, or the extent's middle inside the parallelogram (also one collapsed to a line).
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
  // Flatten, Sample, AAFill and Stroke work on the outline path (SetupPathRep).
  unsigned int Flatten(const ZvGC& gc, ZvPoint2fArray& points,
                       ZvPointTagArray& tags) const override;
  unsigned int Sample(const ZvGC& gc, ZvPoint2fArray& points, ZvPointTagArray& tags) const override;
  // Fill paints every pixel whose centre lies in the parallelogram mapped by the context's
  // transform (a centre on an edge is inside) with the full value of the pixel type (255, 1.0,
  // 16384), overwriting. Direct: no path, callback and box not consulted. 0 when the shape
  // misses the raster, else 1.
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
  // Not available yet for this shape: answer 0 and paint nothing.
  int SoftFill(const ZvGC& gc, ZvRaster<unsigned char>& raster, int (*callback)()) const override;
  int SoftFill(const ZvGC& gc, ZvRaster<float>& raster, int (*callback)()) const override;
  int SoftFill(const ZvGC& gc, ZvRaster<short>& raster, int (*callback)()) const override;
  int Stroke(const ZvGC& gc, ZvRaster<unsigned char>& raster) const override;
  // Block, always 32 bytes, no version:
  //   0  u32  body length 28    4  u16  kind 2    6  u16  0
  //   8  f32 a.x, a.y    16  f32 b.x, b.y    24  f32 c.x, c.y
  unsigned int WriteToBuffer(void* buffer) const override;
  unsigned int GetBufferSize() const override;
  // 28, or 0 and no change when the kind word is not 2.
  unsigned int ReadFromBufferBody(const void* body) override;

  // ---- Size -----------------------------------------------------------------------------------
  // |b - a| and |c - a| in double, 0 when the square is at most 1e-9.
  double GetWidth() const;  // the float forms narrow it
  float GetWidthf() const;
  double GetWidthd() const;
  double GetHeight() const;
  float GetHeightf() const;
  double GetHeightd() const;
  // Moves b (c) along its edge to the given length; a collapsed edge grows along x (along y).
  void SetWidth(float width);
  void SetWidth(double width);
  void SetHeight(float height);
  void SetHeight(double height);
  ZvPoint2<float> GetCenter() const;

  // ---- Handles --------------------------------------------------------------------------------
  // The fixed point of a drag: the centre, or the handle opposite the one dragged (index
  // ((i + 3) & 7) + 1). Any other value fixes the origin.
  enum CenterStyle { CenterStyleCenter = 0, CenterStyleOpposite = 1 };
  // Moves the whole shape so that handle `index` lands on `p`. 1.
  int HandleTranslate(unsigned int index, const ZvPoint2<float>& p);
  // Rotates about the fixed point by the angle from handle `index` to `p`, seen from there.
  // 0 when the angle is undefined (the handle or p on the fixed point).
  int HandleRotate(unsigned int index, const ZvPoint2<float>& p, CenterStyle style);
  // Drags handle `index` to `p`: a middle handle moves its edge along the edge's normal, a
  // corner moves with both edge directions kept. 0, no change, when a projection fails.
  int HandleScale(unsigned int index, const ZvPoint2<float>& p, CenterStyle style);
  // The same about the explicit anchor `q`, for scaling along non-orthogonal axes. 0, no
  // change, for a collapsed shape or one the drag would collapse.
  int HandleScale(unsigned int index, const ZvPoint2<float>& p, const ZvPoint2<float>& q);
  // Moves the corners on the dragged handle's side by p - handle: 1, 2 move b; 3, 4 move c;
  // 5, 6 move a and c; 7, 8 move a and b; 0 and 9 up nothing. 1.
  int HandleSkew(unsigned int index, const ZvPoint2<float>& p);
  // The same, refused (0, no change) for a collapsed shape or one the drag would collapse.
  int HandleSkew(unsigned int index, const ZvPoint2<float>& p, const ZvPoint2<float>& q);

  // ---- Representations ------------------------------------------------------------------------
  // Appends the outline to `path`: Moveto a, Lineto b, d, c, a, Closeto.
  void SetupPathRep(ZvPath2f& path) const;
  // Copies a, b, c, under the lock.
  void SetupPointRep(ZvPoint2<float>& a, ZvPoint2<float>& b, ZvPoint2<float>& c) const;

  // Every pixel of the raster from the context's feather profile: 0 outside the shape, inside
  // the profile at the pixel centre's distance from the shape's centre, scaled so that the
  // outline sits at the profile's largest key parameter (for a rectangle the distance is the
  // larger of the two axis distances in the rectangle's own frame). Values are rounded to the
  // pixel type's full scale. 0, raster untouched, when the shape misses the raster, is
  // collapsed or the profile has no keys; 1 otherwise.
  int RadialFill(const ZvGC& gc, ZvRaster<unsigned char>& raster) const;
  int RadialFill(const ZvGC& gc, ZvRaster<float>& raster) const;
  int RadialFill(const ZvGC& gc, ZvRaster<short>& raster) const;

 private:
  template <class S>
  friend struct ZvFrameShape;  // the slots shared with the other three-corner shape

  ZvPoint2<float> a;
  ZvPoint2<float> b;
  ZvPoint2<float> c;
};

// Handle geometry, each 1 on success and 0 when refused.
// The point that divides a-c as b divides a-d (on the side of a that b lies on).
ZV_API int ComputePointWithSameRatio(const ZvPoint2<float>& a, const ZvPoint2<float>& b,
                                     const ZvPoint2<float>& c, const ZvPoint2<float>& d,
                                     ZvPoint2<float>& out);
// New positions of a middle handle and its opposite for a drag from b to e along direction c.
ZV_API int ComputeMidPointNewPositions(const ZvPoint2<float>& a, const ZvPoint2<float>& b,
                                       const ZvPoint2<float>& c, const ZvPoint2<float>& d,
                                       const ZvPoint2<float>& e, ZvPoint2<float>& outA,
                                       ZvPoint2<float>& outB);
// New position of a corner: a, e and f projected on line b-c along d, then the same ratio.
ZV_API int ComputeNewPosition(const ZvPoint2<float>& a, const ZvPoint2<float>& b,
                              const ZvPoint2<float>& c, const ZvPoint2<float>& d,
                              const ZvPoint2<float>& e, const ZvPoint2<float>& f,
                              ZvPoint2<float>& out);

#endif
