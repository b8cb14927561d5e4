// The three-corner frame that rectangles and ovals share: handles, sizes, picking, transforms,
// the interactive handle operations and the 32-byte block. Plain data, no lock: the shapes lock
// around a copy.
#ifndef ZV_SHAPE_FRAME2F_H
#define ZV_SHAPE_FRAME2F_H

#include <zv/arrays.h>
#include <zv/point.h>
#include <zv/transfo4.h>

struct ZvFrame2f {
  ZvPoint2<float> a;
  ZvPoint2<float> b;
  ZvPoint2<float> c;

  // The fourth corner, in single precision like every stored coordinate.
  ZvPoint2<float> D() const { return b + c - a; }
  // Handle i of the nine (see ZvRect2f); the centre for any index from 9 up.
  ZvPoint2<float> Handle(unsigned int i) const;
  // The box of the four corners, Regular.
  ZvExtent2<float> Extent() const;
  // |to - from| in double; 0 when its square is at most 1e-9.
  static double EdgeLength(const ZvPoint2<float>& from, const ZvPoint2<float>& to);
  // Moves `end` along the edge from a to the given length; a collapsed edge grows along x or y.
  void SetEdgeLength(ZvPoint2<float>& end, float length, bool alongX) const;

  int ClosePointIndex(const ZvPoint2<float>& p, double size, unsigned int* index) const;
  unsigned int PointsInExtent(const ZvExtent2<float>& extent, ZvULongArray* indices) const;
  void Map(const ZvTransfo4& t);
  void Translate(const ZvPoint2<float>& offset);

  // The handle operations; each answers 1, or 0 with the frame unchanged.
  ZvPoint2<float> FixedPoint(unsigned int i, int style) const;
  int Skew(unsigned int i, const ZvPoint2<float>& p);
  int CheckedSkew(unsigned int i, const ZvPoint2<float>& p);
  int Scale(unsigned int i, const ZvPoint2<float>& p, int style);
  int Scale(unsigned int i, const ZvPoint2<float>& p, const ZvPoint2<float>& q);
  // a on b, a on c (1e-7 per axis), or an area below 1e-7.
  bool Collapsed() const;

  // The 32-byte block of `kind`; Read answers 28, or 0 leaving the frame alone.
  void Write(void* buffer, unsigned int kind) const;
  unsigned int Read(const void* body, unsigned int kind);
};

// The transforms of the shape slots, as paths build them.
ZvTransfo4 ZvShapeRotation(double degrees, const ZvPoint2<float>& center);
ZvTransfo4 ZvShapeScaling(double sx, double sy, const ZvPoint2<float>& center);
ZvTransfo4 ZvShapeShearX(double a, double b);
ZvTransfo4 ZvShapeShearY(double a, double b);

#endif
