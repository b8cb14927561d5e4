// ZvTransfo4: the one transform type of the library, a 4x4 matrix of doubles.
//
// Storage is 16 doubles with element (row r, column c) at m[r + 4c], so memory runs down the
// columns. Points are column vectors:
//   x' = m[0] x + m[4] y + m[8]  z + m[12]
//   y' = m[1] x + m[5] y + m[9]  z + m[13]
//   z' = m[2] x + m[6] y + m[10] z + m[14]
// The bottom row (m[3], m[7], m[11], m[15]) is carried along by products but ignored by every
// point Map: there is no perspective divide. A 2-D point is taken with z = 0, so only m[0], m[1],
// m[4], m[5], m[12] and m[13] act on it.
//
// Composition: a point mapped by A then by B is mapped by the product B A. Every editing call
// (Translate, Scale, Rotate, Shear) post-multiplies: it acts on points before the existing
// transform, that is in the transform's local frame, and returns the object itself.
//
// Angles are degrees, counter-clockwise when y points up (so clockwise on a y-down screen).
//
// A plain value: no kind flags, no cached inverse, no lock.
#ifndef ZV_TRANSFO4_H
#define ZV_TRANSFO4_H

#include <zv/api.h>
#include <zv/point.h>

#include <iosfwd>

class ZV_API ZvTransfo4 {
 public:
  // --- Construction --------------------------------------------------------------------------
  ZvTransfo4();  // identity
  ZvTransfo4(const ZvTransfo4& other);
  explicit ZvTransfo4(const double* m16);  // 16 doubles in storage order
  ZvTransfo4& operator=(const ZvTransfo4& other);

  ZvTransfo4& SetToIdentity();
  ZvTransfo4& ResetToIdentity();
  void SetMatrix(const double* m16);
  void GetMatrix(double* m16) const;
  const double* GetMatrixPtr() const { return m; }
  double GetMatrixElement(unsigned int row, unsigned int column) const {
    return m[row + 4 * column];
  }

  // --- Mapping -------------------------------------------------------------------------------
  // T is float or double. Products are formed in double; a float result narrows at the end.
  // The array forms have no special case for any kind of transform: one loop for all.
  template <class T>
  ZvPoint2<T> Map(const ZvPoint2<T>& p) const;
  template <class T>
  ZvPoint3<T> Map(const ZvPoint3<T>& p) const;
  template <class T>
  void Map(const ZvPoint2<T>& p, ZvPoint2<T>& result) const;
  template <class T>
  void Map(const ZvPoint3<T>& p, ZvPoint3<T>& result) const;
  // Element by element; `out` may be `in` but must not otherwise overlap it.
  template <class T>
  void Map(const ZvPoint2<T>* in, unsigned int count, ZvPoint2<T>* out) const;
  template <class T>
  void Map(const ZvPoint3<T>* in, unsigned int count, ZvPoint3<T>* out) const;

  // Full homogeneous product of 4 doubles, bottom row included. `out` may be `in`.
  void Map(const double* in, double* out) const;

  // Empty and Infinite are copied unchanged. A Regular box becomes the box of its four mapped
  // corners (compared in T), so a rotation gives the axis-aligned hull, not a rotated box.
  template <class T>
  ZvExtent2<T> Map(const ZvExtent2<T>& e) const;
  template <class T>
  void Map(const ZvExtent2<T>& e, ZvExtent2<T>& result) const;

  template <class T>
  void MapInPlace(ZvPoint2<T>& p) const;
  template <class T>
  void MapInPlace(ZvPoint3<T>& p) const;
  template <class T>
  void MapInPlace(ZvPoint2<T>* p, unsigned int count) const;
  template <class T>
  void MapInPlace(ZvPoint3<T>* p, unsigned int count) const;
  template <class T>
  void MapInPlace(ZvExtent2<T>& e) const;
  template <class T>
  void MapInPlace(ZvExtent2<T>* e, unsigned int count) const;

  // --- Inverse and predicates ----------------------------------------------------------------
  // Gauss-Jordan with partial pivoting; `out` starts as the identity. 0 when a pivot is at most
  // 1e-15, `out` then holding a partial result.
  int Inverse(ZvTransfo4& out) const;
  // 1 when the inverse exists and both M M^-1 and M^-1 M pass IsIdentity.
  int TestInverse() const;
  int IsSingular() const;

  // Strict tests. Diagonal m[0], m[5], m[10], m[15] within 1e-10 of 1, all else within 1e-7 of 0.
  int IsIdentity() const;
  // Diagonal within 1e-10 of 1; the nine non-translation off-diagonal elements within 1e-15 of 0.
  int IsTranslation() const;
  // Only m[15] within 1e-10 of 1; the same nine elements within 1e-15 of 0.
  int IsScalingAndTranslation() const;

  // --- Products ------------------------------------------------------------------------------
  ZvTransfo4& PostMultiply(const ZvTransfo4& t);  // M = M t: t is applied to points first
  ZvTransfo4& PreMultiply(const ZvTransfo4& t);   // M = t M: t is applied to points last
  void Transpose(ZvTransfo4& out) const;          // `out` may be this object

  // --- Frames --------------------------------------------------------------------------------
  // Columns p1 - p0, p2 - p0, p3 - p0, p0; bottom row 0 0 0 1. Maps the unit tetrahedron's
  // corners onto the four points.
  ZvTransfo4& SetTo4PointTransform(const ZvPoint3<double>& p0, const ZvPoint3<double>& p1,
                                   const ZvPoint3<double>& p2, const ZvPoint3<double>& p3);
  // The same with column 2 = (0, 0, 1 - p0.z).
  ZvTransfo4& SetTo3PointTransformXY(const ZvPoint3<double>& p0, const ZvPoint3<double>& p1,
                                     const ZvPoint3<double>& p2);
  // The 2-D affine map taking from[i] to to[i], i = 0..2 (pointers to 3 points each).
  // 0, matrix untouched, when the `from` triangle is degenerate (|det| below 1e-15).
  int SetTo3PointTransformXY(const ZvPoint2<double>* from, const ZvPoint2<double>* to);

  // --- 2-D parts -----------------------------------------------------------------------------
  // Splits the 2-D part into R(degrees) [scaleX, shear scaleY; 0, scaleY] about `center`, plus
  // a translation of the center. 0, outputs untouched, when the 2-D part is degenerate.
  int DecomposeXY(const ZvPoint2<double>& center, double& scaleX, double& scaleY, double& shear,
                  double& degrees, ZvPoint2<double>& translation) const;
  // The inverse of DecomposeXY; overwrites the whole matrix.
  ZvTransfo4& RecomposeXY(const ZvPoint2<double>& center, double scaleX, double scaleY,
                          double shear, double degrees, const ZvPoint2<double>& translation);

  // --- Editing (all post-multiply) -----------------------------------------------------------
  ZvTransfo4& Translate(double dx, double dy, double dz);
  ZvTransfo4& Translate(const ZvPoint3<float>& d);
  ZvTransfo4& Translate(const ZvPoint3<double>& d);
  ZvTransfo4& Translate(const ZvPoint2<float>& d, float z);
  ZvTransfo4& Translate(const ZvPoint2<float>& d, double z = 0.0);
  ZvTransfo4& Translate(const ZvPoint2<double>& d, double z = 0.0);

  ZvTransfo4& Scale(double sx, double sy, double sz);
  ZvTransfo4& Scale(double s);
  // Centred forms post-multiply by T(center) S T(-center).
  ZvTransfo4& Scale(double sx, double sy, double sz, const ZvPoint3<float>& center);
  ZvTransfo4& Scale(double sx, double sy, double sz, const ZvPoint3<double>& center);
  ZvTransfo4& ScaleXY(double sx, double sy, const ZvPoint2<double>& center);

  // Angles in degrees. Sine and cosine are snapped to 0, 1 or -1 when within 1e-7 of them, so
  // multiples of 90 degrees are exact. The axis is normalised by a plain square root: a null
  // axis gives non-numbers.
  ZvTransfo4& Rotate(double degrees, double ax, double ay, double az);
  // About the line from p through q.
  ZvTransfo4& Rotate(double degrees, const ZvPoint3<float>& p, const ZvPoint3<float>& q);
  ZvTransfo4& Rotate(double degrees, const ZvPoint3<double>& p, const ZvPoint3<double>& q);
  // About the z direction through center.
  ZvTransfo4& RotateXY(double degrees, const ZvPoint2<double>& center);
  // By the counter-clockwise angle from a - center to b - center; unchanged when either is null.
  ZvTransfo4& RotateXY(const ZvPoint2<double>& center, const ZvPoint2<double>& a,
                       const ZvPoint2<double>& b);
  // Local matrix Rz Ry Rx: the x turn acts first.
  ZvTransfo4& RotateXYZ(const ZvPoint3<double>& degrees);

  // ShearXY: column 2 += a column 0 + b column 1. ShearXZ: column 1 += a column 0 + b column 2.
  // ShearYZ: column 0 += a column 1 + b column 2. Centred forms: T(center) H T(-center).
  ZvTransfo4& ShearXY(double a, double b);
  ZvTransfo4& ShearXZ(double a, double b);
  ZvTransfo4& ShearYZ(double a, double b);
  ZvTransfo4& ShearXY(double a, double b, const ZvPoint3<double>& center);
  ZvTransfo4& ShearXZ(double a, double b, const ZvPoint3<double>& center);
  ZvTransfo4& ShearYZ(double a, double b, const ZvPoint3<double>& center);

  // --- Extraction ----------------------------------------------------------------------------
  // For a pure rotation Rz Ry Rx: the x, y, z angles in radians. `radians` is read as a seed
  // (typically the previous frame's angles) and receives the solution nearest to it, each angle
  // within pi of its seed.
  void ExtractXYZRotationAngles(ZvPoint3<double>& radians) const;
  // scale: lengths of columns 0..2; degrees: rotation angles of the normalised columns, seeded
  // by the incoming value of `degrees` read as radians; translation: m[12], m[13], m[14].
  void ExtractTransforms(ZvPoint3<double>& scale, ZvPoint3<double>& degrees,
                         ZvPoint3<double>& translation) const;

  // --- Measures (cheap scale estimates, x and y only) ----------------------------------------
  // (m[0] + m[4])^2 + (m[1] + m[5])^2: the image of (1, 1, 0) without translation.
  double GetXYUnitVectorSquaredLength() const;
  // (m[0] + m[4] + m[8])^2 + (m[1] + m[5] + m[9])^2.
  double GetXYZUnitVectorSquaredLength() const;

 private:
  double m[16];
};

// Four lines, one per row: "{" the row's elements separated by " " "}", each ending with endl.
ZV_API std::ostream& operator<<(std::ostream& os, const ZvTransfo4& t);

#endif
