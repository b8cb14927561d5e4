// ZvRect2f: construction and the slots of the three-corner frame it shares with ZvOval2f.
#include <zv/rect2f.h>

#include "shape/frame_shape.h"

namespace {
using Shared = ZvFrameShape<ZvRect2f>;
}  // namespace

ZvRect2f::ZvRect2f() : a{0, 0}, b{0, 0}, c{0, 0} {}
ZvRect2f::ZvRect2f(const ZvPoint2<float>& center, float width, float height)
    : a{center.x - 0.5f * width, center.y - 0.5f * height},
      b{center.x + 0.5f * width, center.y - 0.5f * height},
      c{center.x - 0.5f * width, center.y + 0.5f * height} {}
ZvRect2f::ZvRect2f(const ZvPoint2<float>& p, const ZvPoint2<float>& q)
    : a(p), b{q.x, p.y}, c{p.x, q.y} {}
ZvRect2f::ZvRect2f(const ZvPoint2<float>& pa, const ZvPoint2<float>& pb, const ZvPoint2<float>& pc)
    : a(pa), b(pb), c(pc) {}
ZvRect2f::ZvRect2f(const ZvRect2f& other) : ZvShape2f(other) {
  const ZvFrame2f f = Shared::Get(other);
  a = f.a;
  b = f.b;
  c = f.c;
}
ZvRect2f& ZvRect2f::operator=(const ZvRect2f& other) {
  Shared::Assign(*this, other);
  return *this;
}
ZvRect2f::~ZvRect2f() {}

ZvShape2f& ZvRect2f::operator=(const ZvShape2f& other) {
  return Shared::AssignShape(*this, other, KindRect);
}
ZvShape2f* ZvRect2f::QueryShapeKind(Kind kind) const {
  return kind == KindRect ? const_cast<ZvRect2f*>(this) : nullptr;
}
ZvShape2f* ZvRect2f::Clone() const {
  return Shared::Clone(*this);
}
unsigned int ZvRect2f::NumPoints() const {
  return 9;
}

ZvExtent2<float>& ZvRect2f::GetExtent(ZvExtent2<float>& extent) const {
  return extent = Shared::Get(*this).Extent();
}
ZvExtent2<double>& ZvRect2f::GetExtent(ZvExtent2<double>& extent) const {
  return Shared::Extent(*this, extent);
}
ZvExtent2<float>& ZvRect2f::GetTightExtent(ZvExtent2<float>& extent) const {
  return GetExtent(extent);
}
ZvExtent2<double>& ZvRect2f::GetTightExtent(ZvExtent2<double>& extent) const {
  return GetExtent(extent);
}
int ZvRect2f::GetPoint(unsigned int index, ZvPoint2<float>& point) const {
  if (index >= 9) return 0;
  point = Shared::Get(*this).Handle(index);
  return 1;
}
ZvPoint2<float> ZvRect2f::GetPoint(unsigned int index) const {
  return Shared::Get(*this).Handle(index);
}
ZvPoint2<float>* ZvRect2f::GetPoints(unsigned int first, unsigned int last,
                                     ZvPoint2<float>* dst) const {
  return Shared::Points(*this, first, last, dst);
}
ZvPoint2<double>* ZvRect2f::GetPoints(unsigned int first, unsigned int last,
                                      ZvPoint2<double>* dst) const {
  return Shared::Points(*this, first, last, dst);
}
int ZvRect2f::GetClosePointIndex(const ZvPoint2<float>& point, double size,
                                 unsigned int* index) const {
  return Shared::Get(*this).ClosePointIndex(point, size, index);
}
unsigned int ZvRect2f::GetPointsInExtentIndices(const ZvExtent2<float>& extent,
                                                ZvULongArray* indices) const {
  return Shared::Get(*this).PointsInExtent(extent, indices);
}

ZvShape2f& ZvRect2f::Translate(const ZvPoint2<float>& offset) {
  return Shared::Translate(*this, offset);
}
ZvShape2f& ZvRect2f::Rotate(double degrees, const ZvPoint2<float>& center) {
  return Transform(ZvShapeRotation(degrees, center));
}
ZvShape2f& ZvRect2f::Scale(double sx, double sy, const ZvPoint2<float>& center) {
  return Transform(ZvShapeScaling(sx, sy, center));
}
ZvShape2f& ZvRect2f::ShearX(double sa, double sb) {
  return Transform(ZvShapeShearX(sa, sb));
}
ZvShape2f& ZvRect2f::ShearY(double sa, double sb) {
  return Transform(ZvShapeShearY(sa, sb));
}
ZvShape2f& ZvRect2f::Transform(const ZvTransfo4& transform) {
  return Shared::Transform(*this, transform);
}

unsigned int ZvRect2f::WriteToBuffer(void* buffer) const {
  Shared::Get(*this).Write(buffer, KindRect);
  return 32;
}
unsigned int ZvRect2f::GetBufferSize() const {
  return 32;
}
unsigned int ZvRect2f::ReadFromBufferBody(const void* body) {
  return Shared::Read(*this, body, KindRect);
}

double ZvRect2f::GetWidth() const {
  return GetWidthd();
}
float ZvRect2f::GetWidthf() const {
  return static_cast<float>(GetWidthd());
}
double ZvRect2f::GetWidthd() const {
  const ZvFrame2f f = Shared::Get(*this);
  return ZvFrame2f::EdgeLength(f.a, f.b);
}
double ZvRect2f::GetHeight() const {
  return GetHeightd();
}
float ZvRect2f::GetHeightf() const {
  return static_cast<float>(GetHeightd());
}
double ZvRect2f::GetHeightd() const {
  const ZvFrame2f f = Shared::Get(*this);
  return ZvFrame2f::EdgeLength(f.a, f.c);
}
void ZvRect2f::SetWidth(float width) {
  Shared::SetEdge(*this, width, true);
}
void ZvRect2f::SetWidth(double width) {
  SetWidth(static_cast<float>(width));
}
void ZvRect2f::SetHeight(float height) {
  Shared::SetEdge(*this, height, false);
}
void ZvRect2f::SetHeight(double height) {
  SetHeight(static_cast<float>(height));
}
ZvPoint2<float> ZvRect2f::GetCenter() const {
  return Shared::Get(*this).Handle(0);
}
void ZvRect2f::SetupPointRep(ZvPoint2<float>& pa, ZvPoint2<float>& pb, ZvPoint2<float>& pc) const {
  const ZvFrame2f f = Shared::Get(*this);
  pa = f.a;
  pb = f.b;
  pc = f.c;
}

int ZvRect2f::HandleTranslate(unsigned int index, const ZvPoint2<float>& p) {
  return Shared::HandleTranslate(*this, index, p);
}
int ZvRect2f::HandleRotate(unsigned int index, const ZvPoint2<float>& p, CenterStyle style) {
  return Shared::HandleRotate(*this, index, p, style);
}
int ZvRect2f::HandleScale(unsigned int index, const ZvPoint2<float>& p, CenterStyle style) {
  return Shared::Edit(*this, [&](ZvFrame2f& f) { return f.Scale(index, p, style); });
}
int ZvRect2f::HandleScale(unsigned int index, const ZvPoint2<float>& p, const ZvPoint2<float>& q) {
  return Shared::Edit(*this, [&](ZvFrame2f& f) { return f.Scale(index, p, q); });
}
int ZvRect2f::HandleSkew(unsigned int index, const ZvPoint2<float>& p) {
  return Shared::Edit(*this, [&](ZvFrame2f& f) { return f.Skew(index, p); });
}
int ZvRect2f::HandleSkew(unsigned int index, const ZvPoint2<float>& p, const ZvPoint2<float>&) {
  return Shared::Edit(*this, [&](ZvFrame2f& f) { return f.CheckedSkew(index, p); });
}
