// The slots that rectangles and ovals share, written once over the shape class S (which holds
// the corners a, b, c and befriends this template). Each takes S's lock around its access to
// the corners.
#ifndef ZV_SHAPE_FRAME_SHAPE_H
#define ZV_SHAPE_FRAME_SHAPE_H

#include <zv/path2f.h>
#include <zv/shape.h>

#include <new>

#include "shape/frame2f.h"
#include "shape/shape_lock.h"

template <class S>
struct ZvFrameShape {
  static ZvFrame2f Get(const S& s) {
    ZvShapeLock guard(s);
    return {s.a, s.b, s.c};
  }
  static void Set(S& s, const ZvFrame2f& f) {
    ZvShapeLock guard(s);
    s.a = f.a;
    s.b = f.b;
    s.c = f.c;
  }

  static void Assign(S& s, const S& other) {
    // Read under the source's lock, then written under this one's: never both at once.
    if (&s != &other) Set(s, Get(other));
  }
  static ZvShape2f& AssignShape(S& s, const ZvShape2f& other, ZvShape2f::Kind kind) {
    if (const ZvShape2f* same = other.QueryShapeKind(kind)) {
      Assign(s, *static_cast<const S*>(same));
      return s;
    }
    return s.ZvShape2f::operator=(other);
  }
  static ZvShape2f* Clone(const S& s) { return new (std::nothrow) S(s); }

  static ZvExtent2<double>& Extent(const S& s, ZvExtent2<double>& extent) {
    const ZvExtent2<float> e = Get(s).Extent();
    extent.xmin = e.xmin;
    extent.ymin = e.ymin;
    extent.xmax = e.xmax;
    extent.ymax = e.ymax;
    extent.kind = e.kind;
    return extent;
  }
  template <class T>
  static ZvPoint2<T>* Points(const S& s, unsigned int first, unsigned int last, ZvPoint2<T>* dst) {
    const ZvFrame2f f = Get(s);
    for (unsigned int i = first; i <= last && i < 9; ++i) {
      const ZvPoint2<float> h = f.Handle(i);
      dst[i - first] = {h.x, h.y};
    }
    return dst;
  }

  static ZvShape2f& Transform(S& s, const ZvTransfo4& t) {
    ZvShapeLock guard(s);
    t.MapInPlace(s.a);
    t.MapInPlace(s.b);
    t.MapInPlace(s.c);
    return s;
  }
  static ZvShape2f& Translate(S& s, const ZvPoint2<float>& offset) {
    ZvShapeLock guard(s);
    s.a += offset;
    s.b += offset;
    s.c += offset;
    return s;
  }

  static unsigned int Read(S& s, const void* body, ZvShape2f::Kind kind) {
    ZvShapeLock guard(s);
    ZvFrame2f f = Get(s);
    if (!f.Read(body, kind)) return 0;
    Set(s, f);
    return 28;
  }

  static void SetEdge(S& s, float length, bool width) {
    ZvShapeLock guard(s);
    ZvFrame2f f = Get(s);
    f.SetEdgeLength(width ? f.b : f.c, length, width);
    Set(s, f);
  }

  static int HandleTranslate(S& s, unsigned int index, const ZvPoint2<float>& p) {
    ZvShapeLock guard(s);
    s.Translate(p - Get(s).Handle(index));
    return 1;
  }
  static int HandleRotate(S& s, unsigned int index, const ZvPoint2<float>& p, int style) {
    ZvShapeLock guard(s);
    const ZvFrame2f f = Get(s);
    const ZvPoint2<float> fixed = f.FixedPoint(index, style);
    double degrees = 0;
    if (!ZvPoint2_AngleInDegrees(f.Handle(index) - fixed, p - fixed, degrees)) return 0;
    s.Rotate(degrees, fixed);  // through the slot, as any other rotation
    return 1;
  }
  // Runs f on the outline path, built under the lock and worked on after it is released.
  template <class F>
  static auto OnOutline(const S& s, F f) {
    ZvPath2f path(16);
    s.SetupPathRep(path);
    return f(path);
  }

  // Runs op on a copy of the frame and keeps the result when op answers 1.
  template <class Op>
  static int Edit(S& s, Op op) {
    ZvShapeLock guard(s);
    ZvFrame2f f = Get(s);
    if (!op(f)) return 0;
    Set(s, f);
    return 1;
  }
};

#endif
