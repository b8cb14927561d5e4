// The three-corner frame of rectangles and ovals: handles, sizes, picking, transforms, block.
#include "shape/frame2f.h"

#include <cmath>
#include <initializer_list>

#include "core/le_bytes.h"

ZvPoint2<float> ZvFrame2f::Handle(unsigned int i) const {
  switch (i) {
    case 1:
      return b + (c - a) * 0.5f;
    case 2:
      return D();
    case 3:
      return c + (b - a) * 0.5f;
    case 4:
      return c;
    case 5:
      return a + (c - a) * 0.5f;
    case 6:
      return a;
    case 7:
      return a + (b - a) * 0.5f;
    case 8:
      return b;
    default:
      return (b + c) * 0.5f;
  }
}

ZvExtent2<float> ZvFrame2f::Extent() const {
  ZvExtent2<float> e;
  e.AddPoint(a);
  e.AddPoint(b);
  e.AddPoint(c);
  e.AddPoint(D());
  return e;
}

double ZvFrame2f::EdgeLength(const ZvPoint2<float>& from, const ZvPoint2<float>& to) {
  const double dx = double(to.x) - from.x, dy = double(to.y) - from.y;
  const double l2 = dx * dx + dy * dy;
  return l2 <= 1e-9 ? 0.0 : std::sqrt(l2);
}

void ZvFrame2f::SetEdgeLength(ZvPoint2<float>& end, float length, bool alongX) const {
  ZvPoint2<float> v = end - a;
  if (std::fabs(v.x) <= 1e-7f && std::fabs(v.y) <= 1e-7f) {
    // A collapsed edge has no direction of its own: it grows along its axis.
    if (alongX)
      end.x = a.x + length;
    else
      end.y = a.y + length;
    return;
  }
  const float l2 = v.x * v.x + v.y * v.y;
  const float l = l2 <= 1e-7f ? 0.0f : std::sqrt(l2);
  if (l > 0.0f) v = v / l;
  end = a + v * length;
}

int ZvFrame2f::ClosePointIndex(const ZvPoint2<float>& p, double size, unsigned int* index) const {
  if (!index) return 0;
  const float h = static_cast<float>(size * 0.5);
  // From index 0: a click on the centre of a small shape picks the centre, not a corner.
  for (unsigned int i = 0; i < 9; ++i) {
    const ZvPoint2<float> q = Handle(i);
    if (q.x >= p.x - h && q.x <= p.x + h && q.y >= p.y - h && q.y <= p.y + h) {
      *index = i;
      return 1;
    }
  }
  return 0;
}

unsigned int ZvFrame2f::PointsInExtent(const ZvExtent2<float>& e, ZvULongArray* indices) const {
  if (!indices || e.kind == ZvExtent2<float>::Empty) return 0;
  const unsigned int before = indices->size;
  for (unsigned int i = 0; i < 9; ++i) {
    const ZvPoint2<float> q = Handle(i);
    if (e.kind == ZvExtent2<float>::Infinite ||
        (q.x >= e.xmin && q.x <= e.xmax && q.y >= e.ymin && q.y <= e.ymax))
      indices->Add(i);
  }
  return indices->size - before;
}

void ZvFrame2f::Map(const ZvTransfo4& t) {
  t.MapInPlace(a);
  t.MapInPlace(b);
  t.MapInPlace(c);
}

void ZvFrame2f::Translate(const ZvPoint2<float>& offset) {
  a += offset;
  b += offset;
  c += offset;
}

void ZvFrame2f::Write(void* buffer, unsigned int kind) const {
  ZvByteWriter out(buffer);
  out.U32(28);
  out.U16(static_cast<std::uint16_t>(kind));
  out.U16(0);
  for (const ZvPoint2<float>* p : {&a, &b, &c}) {
    out.F32(&p->x);
    out.F32(&p->y);
  }
}

unsigned int ZvFrame2f::Read(const void* body, unsigned int kind) {
  ZvByteReader in(body);
  if (in.U16() != kind) return 0;
  in.U16();
  for (ZvPoint2<float>* p : {&a, &b, &c}) {
    in.F32(&p->x);
    in.F32(&p->y);
  }
  return 28;
}

ZvTransfo4 ZvShapeRotation(double degrees, const ZvPoint2<float>& center) {
  ZvTransfo4 t;
  t.Rotate(degrees, ZvPoint3<double>{center.x, center.y, 0.0},
           ZvPoint3<double>{center.x, center.y, 1.0});
  return t;
}

ZvTransfo4 ZvShapeScaling(double sx, double sy, const ZvPoint2<float>& center) {
  ZvTransfo4 t;
  t.Scale(sx, sy, 1.0, ZvPoint3<double>{center.x, center.y, 0.0});
  return t;
}

ZvTransfo4 ZvShapeShearX(double a, double b) {
  ZvTransfo4 t;
  t.ShearXZ(a, 0.0, ZvPoint3<double>{0.0, b, 0.0});
  return t;
}

ZvTransfo4 ZvShapeShearY(double a, double b) {
  ZvTransfo4 t;
  t.ShearYZ(a, 0.0, ZvPoint3<double>{b, 0.0, 0.0});
  return t;
}
