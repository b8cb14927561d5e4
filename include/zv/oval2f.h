// ZvOval2f: the ellipse inscribed in a parallelogram held by three corners.
//
// The frame and its nine handles are those of ZvRect2f (a to b the width edge, a to c the height
// edge, d = b + c - a never stored); the middle handles 1, 3, 5, 7 lie on the oval, the corner
// handles 2, 4, 6, 8 outside it. Coordinates are the shape's own units (pixels once mapped by a
// context's transform), in single precision. Most operations work on the outline path of four
// cubics (SetupPathRep); the plain and radial fills convert the oval directly.
//
// Every operation takes the shape's lock around its access to the corners; the temporary paths
// of the delegated operations are built under it and worked on after it is released.
#ifndef ZV_OVAL2F_H
#define ZV_OVAL2F_H

#include <zv/shape.h>

class ZvPath2f;
class ZvTransfo4;

class ZV_API ZvOval2f : public ZvShape2f {
 public:
  // The constructors frame the oval as ZvRect2f's build the rectangle.
  ZvOval2f();
  ZvOval2f(const ZvPoint2<float>& center, float width, float height);
  ZvOval2f(const ZvPoint2<float>& p, const ZvPoint2<float>& q);
  ZvOval2f(const ZvPoint2<float>& a, const ZvPoint2<float>& b, const ZvPoint2<float>& c);
  ZvOval2f(const ZvOval2f& other);
  ZvOval2f& operator=(const ZvOval2f& other);
  ~ZvOval2f() override;

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
  // Hit tests on the outline path.
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
  // Flatten, Sample, AAFill and Stroke work on the outline path (SetupPathRep).
  unsigned int Flatten(const ZvGC& gc, ZvPoint2fArray& points,
                       ZvPointTagArray& tags) const override;
  unsigned int Sample(const ZvGC& gc, ZvPoint2fArray& points, ZvPointTagArray& tags) const override;
  // Fill paints the oval mapped by the context's transform with the full value of the pixel
  // type (255, 1.0, 16384), overwriting, by direct scan conversion: every pixel whose centre is
  // inside (an axis-aligned oval is taken about its centre snapped to a pixel corner, so that it
  // is symmetric in whole pixels), plus one pixel in each row whose chord misses all centres and
  // whatever joins consecutive rows, so that a thin oval stays connected. Callback and box are
  // not consulted. 0 when the oval misses the raster, else 1.
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
  //   0  u32  body length 28    4  u16  kind 3    6  u16  0
  //   8  f32 a.x, a.y    16  f32 b.x, b.y    24  f32 c.x, c.y
  unsigned int WriteToBuffer(void* buffer) const override;
  unsigned int GetBufferSize() const override;
  // 28, or 0 and no change when the kind word is not 3.
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
  // Appends the outline to `path`: Moveto handle 1, then four cubics through handles 3, 5, 7
  // and back to 1 (the quarters at the corners d, c, a, b), Closeto.
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
  // The radial fill's frame: `toUnit` maps the mapped oval onto the circle of radius `radius`
  // (the profile's largest key) about the origin, `profile` the profile flattened at 0.001.
  // 0 when the profile has no keys or the oval is collapsed.
  int CalculateRadialFillParameters(const ZvGC& gc, ZvTransfo4& toUnit, ZvPoint2dArray& profile,
                                    double& radius) const;

 private:
  template <class S>
  friend struct ZvFrameShape;  // the slots shared with the other three-corner shape

  ZvPoint2<float> a;
  ZvPoint2<float> b;
  ZvPoint2<float> c;
};

#endif
