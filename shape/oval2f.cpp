// ZvOval2f: construction and the slots of the three-corner frame it shares with ZvRect2f.
#include <zv/oval2f.h>

#include "shape/frame_shape.h"

namespace {
using Shared = ZvFrameShape<ZvOval2f>;
}  // namespace

ZvOval2f::ZvOval2f() : a{0, 0}, b{0, 0}, c{0, 0} {}
ZvOval2f::ZvOval2f(const ZvPoint2<float>& center, float width, float height)
    : a{center.x - 0.5f * width, center.y - 0.5f * height},
      b{center.x + 0.5f * width, center.y - 0.5f * height},
      c{center.x - 0.5f * width, center.y + 0.5f * height} {}
ZvOval2f::ZvOval2f(const ZvPoint2<float>& p, const ZvPoint2<float>& q)
    : a(p), b{q.x, p.y}, c{p.x, q.y} {}
ZvOval2f::ZvOval2f(const ZvPoint2<float>& pa, const ZvPoint2<float>& pb, const ZvPoint2<float>& pc)
    : a(pa), b(pb), c(pc) {}
ZvOval2f::ZvOval2f(const ZvOval2f& other) : ZvShape2f(other) {
  const ZvFrame2f f = Shared::Get(other);
  a = f.a;
  b = f.b;
  c = f.c;
}
ZvOval2f& ZvOval2f::operator=(const ZvOval2f& other) {
  Shared::Assign(*this, other);
  return *this;
}
ZvOval2f::~ZvOval2f() {}

ZvShape2f& ZvOval2f::operator=(const ZvShape2f& other) {
  return Shared::AssignShape(*this, other, KindOval);
}
ZvShape2f* ZvOval2f::QueryShapeKind(Kind kind) const {
  return kind == KindOval ? const_cast<ZvOval2f*>(this) : nullptr;
}
ZvShape2f* ZvOval2f::Clone() const {
  return Shared::Clone(*this);
}
unsigned int ZvOval2f::NumPoints() const {
  return 9;
}

ZvExtent2<float>& ZvOval2f::GetExtent(ZvExtent2<float>& extent) const {
  return extent = Shared::Get(*this).Extent();
}
ZvExtent2<double>& ZvOval2f::GetExtent(ZvExtent2<double>& extent) const {
  return Shared::Extent(*this, extent);
}
ZvExtent2<float>& ZvOval2f::GetTightExtent(ZvExtent2<float>& extent) const {
  return GetExtent(extent);
}
ZvExtent2<double>& ZvOval2f::GetTightExtent(ZvExtent2<double>& extent) const {
  return GetExtent(extent);
}
int ZvOval2f::GetPoint(unsigned int index, ZvPoint2<float>& point) const {
  if (index >= 9) return 0;
  point = Shared::Get(*this).Handle(index);
  return 1;
}
ZvPoint2<float> ZvOval2f::GetPoint(unsigned int index) const {
  return Shared::Get(*this).Handle(index);
}
ZvPoint2<float>* ZvOval2f::GetPoints(unsigned int first, unsigned int last,
                                     ZvPoint2<float>* dst) const {
  return Shared::Points(*this, first, last, dst);
}
ZvPoint2<double>* ZvOval2f::GetPoints(unsigned int first, unsigned int last,
                                      ZvPoint2<double>* dst) const {
  return Shared::Points(*this, first, last, dst);
}
int ZvOval2f::GetClosePointIndex(const ZvPoint2<float>& point, double size,
                                 unsigned int* index) const {
  return Shared::Get(*this).ClosePointIndex(point, size, index);
}
unsigned int ZvOval2f::GetPointsInExtentIndices(const ZvExtent2<float>& extent,
                                                ZvULongArray* indices) const {
  return Shared::Get(*this).PointsInExtent(extent, indices);
}

ZvShape2f& ZvOval2f::Translate(const ZvPoint2<float>& offset) {
  return Shared::Translate(*this, offset);
}
ZvShape2f& ZvOval2f::Rotate(double degrees, const ZvPoint2<float>& center) {
  return Transform(ZvShapeRotation(degrees, center));
}
ZvShape2f& ZvOval2f::Scale(double sx, double sy, const ZvPoint2<float>& center) {
  return Transform(ZvShapeScaling(sx, sy, center));
}
ZvShape2f& ZvOval2f::ShearX(double sa, double sb) {
  return Transform(ZvShapeShearX(sa, sb));
}
ZvShape2f& ZvOval2f::ShearY(double sa, double sb) {
  return Transform(ZvShapeShearY(sa, sb));
}
ZvShape2f& ZvOval2f::Transform(const ZvTransfo4& transform) {
  return Shared::Transform(*this, transform);
}

unsigned int ZvOval2f::WriteToBuffer(void* buffer) const {
  Shared::Get(*this).Write(buffer, KindOval);
  return 32;
}
unsigned int ZvOval2f::GetBufferSize() const {
  return 32;
}
unsigned int ZvOval2f::ReadFromBufferBody(const void* body) {
  return Shared::Read(*this, body, KindOval);
}

double ZvOval2f::GetWidth() const {
  return GetWidthd();
}
float ZvOval2f::GetWidthf() const {
  return static_cast<float>(GetWidthd());
}
double ZvOval2f::GetWidthd() const {
  const ZvFrame2f f = Shared::Get(*this);
  return ZvFrame2f::EdgeLength(f.a, f.b);
}
double ZvOval2f::GetHeight() const {
  return GetHeightd();
}
float ZvOval2f::GetHeightf() const {
  return static_cast<float>(GetHeightd());
}
double ZvOval2f::GetHeightd() const {
  const ZvFrame2f f = Shared::Get(*this);
  return ZvFrame2f::EdgeLength(f.a, f.c);
}
void ZvOval2f::SetWidth(float width) {
  Shared::SetEdge(*this, width, true);
}
void ZvOval2f::SetWidth(double width) {
  SetWidth(static_cast<float>(width));
}
void ZvOval2f::SetHeight(float height) {
  Shared::SetEdge(*this, height, false);
}
void ZvOval2f::SetHeight(double height) {
  SetHeight(static_cast<float>(height));
}
ZvPoint2<float> ZvOval2f::GetCenter() const {
  return Shared::Get(*this).Handle(0);
}
void ZvOval2f::SetupPointRep(ZvPoint2<float>& pa, ZvPoint2<float>& pb, ZvPoint2<float>& pc) const {
  const ZvFrame2f f = Shared::Get(*this);
  pa = f.a;
  pb = f.b;
  pc = f.c;
}

int ZvOval2f::HandleTranslate(unsigned int index, const ZvPoint2<float>& p) {
  return Shared::HandleTranslate(*this, index, p);
}
int ZvOval2f::HandleRotate(unsigned int index, const ZvPoint2<float>& p, CenterStyle style) {
  return Shared::HandleRotate(*this, index, p, style);
}
int ZvOval2f::HandleScale(unsigned int index, const ZvPoint2<float>& p, CenterStyle style) {
  return Shared::Edit(*this, [&](ZvFrame2f& f) { return f.Scale(index, p, style); });
}
int ZvOval2f::HandleScale(unsigned int index, const ZvPoint2<float>& p, const ZvPoint2<float>& q) {
  return Shared::Edit(*this, [&](ZvFrame2f& f) { return f.Scale(index, p, q); });
}
int ZvOval2f::HandleSkew(unsigned int index, const ZvPoint2<float>& p) {
  return Shared::Edit(*this, [&](ZvFrame2f& f) { return f.Skew(index, p); });
}
int ZvOval2f::HandleSkew(unsigned int index, const ZvPoint2<float>& p, const ZvPoint2<float>&) {
  return Shared::Edit(*this, [&](ZvFrame2f& f) { return f.CheckedSkew(index, p); });
}
