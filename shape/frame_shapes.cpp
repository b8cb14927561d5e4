// ZvRect2f and ZvOval2f: construction and the slots of the three-corner frame they share. The
// two classes differ in their outline, hit tests and fills, which live in files of their own;
// everything here is written once, over the class and its shape kind.
#include <zv/oval2f.h>
#include <zv/rect2f.h>

#include "shape/frame_shape.h"

namespace {
template <class S>
using Frame = ZvFrameShape<S>;
}  // namespace

#define ZV_FRAME_SHAPE_SLOTS(Class, ClassKind)                                                     \
  Class::Class() : a{0, 0}, b{0, 0}, c{0, 0} {}                                                    \
  Class::Class(const ZvPoint2<float>& center, float width, float height)                           \
      : a{center.x - 0.5f * width, center.y - 0.5f * height},                                      \
        b{center.x + 0.5f * width, center.y - 0.5f * height},                                      \
        c{center.x - 0.5f * width, center.y + 0.5f * height} {}                                    \
  Class::Class(const ZvPoint2<float>& p, const ZvPoint2<float>& q)                                 \
      : a(p), b{q.x, p.y}, c{p.x, q.y} {}                                                          \
  Class::Class(const ZvPoint2<float>& pa, const ZvPoint2<float>& pb, const ZvPoint2<float>& pc)    \
      : a(pa), b(pb), c(pc) {}                                                                     \
  Class::Class(const Class& other) : ZvShape2f(other) {                                            \
    const ZvFrame2f f = Frame<Class>::Get(other);                                                  \
    a = f.a;                                                                                       \
    b = f.b;                                                                                       \
    c = f.c;                                                                                       \
  }                                                                                                \
  Class& Class::operator=(const Class& other) {                                                    \
    Frame<Class>::Assign(*this, other);                                                            \
    return *this;                                                                                  \
  }                                                                                                \
  Class::~Class() {}                                                                               \
                                                                                                   \
  ZvShape2f& Class::operator=(const ZvShape2f& other) {                                            \
    return Frame<Class>::AssignShape(*this, other, ClassKind);                                     \
  }                                                                                                \
  ZvShape2f* Class::QueryShapeKind(Kind kind) const {                                              \
    return kind == ClassKind ? const_cast<Class*>(this) : nullptr;                                 \
  }                                                                                                \
  ZvShape2f* Class::Clone() const {                                                                \
    return Frame<Class>::Clone(*this);                                                             \
  }                                                                                                \
  unsigned int Class::NumPoints() const {                                                          \
    return 9;                                                                                      \
  }                                                                                                \
                                                                                                   \
  ZvExtent2<float>& Class::GetExtent(ZvExtent2<float>& extent) const {                             \
    return extent = Frame<Class>::Get(*this).Extent();                                             \
  }                                                                                                \
  ZvExtent2<double>& Class::GetExtent(ZvExtent2<double>& extent) const {                           \
    return Frame<Class>::Extent(*this, extent);                                                    \
  }                                                                                                \
  ZvExtent2<float>& Class::GetTightExtent(ZvExtent2<float>& extent) const {                        \
    return GetExtent(extent);                                                                      \
  }                                                                                                \
  ZvExtent2<double>& Class::GetTightExtent(ZvExtent2<double>& extent) const {                      \
    return GetExtent(extent);                                                                      \
  }                                                                                                \
  int Class::GetPoint(unsigned int index, ZvPoint2<float>& point) const {                          \
    if (index >= 9) return 0;                                                                      \
    point = Frame<Class>::Get(*this).Handle(index);                                                \
    return 1;                                                                                      \
  }                                                                                                \
  ZvPoint2<float> Class::GetPoint(unsigned int index) const {                                      \
    return Frame<Class>::Get(*this).Handle(index);                                                 \
  }                                                                                                \
  ZvPoint2<float>* Class::GetPoints(unsigned int first, unsigned int last, ZvPoint2<float>* dst)   \
      const {                                                                                      \
    return Frame<Class>::Points(*this, first, last, dst);                                          \
  }                                                                                                \
  ZvPoint2<double>* Class::GetPoints(unsigned int first, unsigned int last, ZvPoint2<double>* dst) \
      const {                                                                                      \
    return Frame<Class>::Points(*this, first, last, dst);                                          \
  }                                                                                                \
  int Class::GetClosePointIndex(const ZvPoint2<float>& point, double size, unsigned int* index)    \
      const {                                                                                      \
    return Frame<Class>::Get(*this).ClosePointIndex(point, size, index);                           \
  }                                                                                                \
  unsigned int Class::GetPointsInExtentIndices(const ZvExtent2<float>& extent,                     \
                                               ZvULongArray* indices) const {                      \
    return Frame<Class>::Get(*this).PointsInExtent(extent, indices);                               \
  }                                                                                                \
                                                                                                   \
  ZvShape2f& Class::Translate(const ZvPoint2<float>& offset) {                                     \
    return Frame<Class>::Translate(*this, offset);                                                 \
  }                                                                                                \
  ZvShape2f& Class::Rotate(double degrees, const ZvPoint2<float>& center) {                        \
    return Transform(ZvShapeRotation(degrees, center));                                            \
  }                                                                                                \
  ZvShape2f& Class::Scale(double sx, double sy, const ZvPoint2<float>& center) {                   \
    return Transform(ZvShapeScaling(sx, sy, center));                                              \
  }                                                                                                \
  ZvShape2f& Class::ShearX(double sa, double sb) {                                                 \
    return Transform(ZvShapeShearX(sa, sb));                                                       \
  }                                                                                                \
  ZvShape2f& Class::ShearY(double sa, double sb) {                                                 \
    return Transform(ZvShapeShearY(sa, sb));                                                       \
  }                                                                                                \
  ZvShape2f& Class::Transform(const ZvTransfo4& transform) {                                       \
    return Frame<Class>::Transform(*this, transform);                                              \
  }                                                                                                \
                                                                                                   \
  unsigned int Class::WriteToBuffer(void* buffer) const {                                          \
    Frame<Class>::Get(*this).Write(buffer, ClassKind);                                             \
    return 32;                                                                                     \
  }                                                                                                \
  unsigned int Class::GetBufferSize() const {                                                      \
    return 32;                                                                                     \
  }                                                                                                \
  unsigned int Class::ReadFromBufferBody(const void* body) {                                       \
    return Frame<Class>::Read(*this, body, ClassKind);                                             \
  }                                                                                                \
                                                                                                   \
  double Class::GetWidth() const {                                                                 \
    return GetWidthd();                                                                            \
  }                                                                                                \
  float Class::GetWidthf() const {                                                                 \
    return static_cast<float>(GetWidthd());                                                        \
  }                                                                                                \
  double Class::GetWidthd() const {                                                                \
    const ZvFrame2f f = Frame<Class>::Get(*this);                                                  \
    return ZvFrame2f::EdgeLength(f.a, f.b);                                                        \
  }                                                                                                \
  double Class::GetHeight() const {                                                                \
    return GetHeightd();                                                                           \
  }                                                                                                \
  float Class::GetHeightf() const {                                                                \
    return static_cast<float>(GetHeightd());                                                       \
  }                                                                                                \
  double Class::GetHeightd() const {                                                               \
    const ZvFrame2f f = Frame<Class>::Get(*this);                                                  \
    return ZvFrame2f::EdgeLength(f.a, f.c);                                                        \
  }                                                                                                \
  void Class::SetWidth(float width) {                                                              \
    Frame<Class>::SetEdge(*this, width, true);                                                     \
  }                                                                                                \
  void Class::SetWidth(double width) {                                                             \
    SetWidth(static_cast<float>(width));                                                           \
  }                                                                                                \
  void Class::SetHeight(float height) {                                                            \
    Frame<Class>::SetEdge(*this, height, false);                                                   \
  }                                                                                                \
  void Class::SetHeight(double height) {                                                           \
    SetHeight(static_cast<float>(height));                                                         \
  }                                                                                                \
  ZvPoint2<float> Class::GetCenter() const {                                                       \
    return Frame<Class>::Get(*this).Handle(0);                                                     \
  }                                                                                                \
  void Class::SetupPointRep(ZvPoint2<float>& pa, ZvPoint2<float>& pb, ZvPoint2<float>& pc) const { \
    const ZvFrame2f f = Frame<Class>::Get(*this);                                                  \
    pa = f.a;                                                                                      \
    pb = f.b;                                                                                      \
    pc = f.c;                                                                                      \
  }                                                                                                \
                                                                                                   \
  int Class::HandleTranslate(unsigned int index, const ZvPoint2<float>& p) {                       \
    return Frame<Class>::HandleTranslate(*this, index, p);                                         \
  }                                                                                                \
  int Class::HandleRotate(unsigned int index, const ZvPoint2<float>& p, CenterStyle style) {       \
    return Frame<Class>::HandleRotate(*this, index, p, style);                                     \
  }                                                                                                \
  int Class::HandleScale(unsigned int index, const ZvPoint2<float>& p, CenterStyle style) {        \
    return Frame<Class>::Edit(*this, [&](ZvFrame2f& f) { return f.Scale(index, p, style); });      \
  }                                                                                                \
  int Class::HandleScale(unsigned int index, const ZvPoint2<float>& p, const ZvPoint2<float>& q) { \
    return Frame<Class>::Edit(*this, [&](ZvFrame2f& f) { return f.Scale(index, p, q); });          \
  }                                                                                                \
  int Class::HandleSkew(unsigned int index, const ZvPoint2<float>& p) {                            \
    return Frame<Class>::Edit(*this, [&](ZvFrame2f& f) { return f.Skew(index, p); });              \
  }                                                                                                \
  int Class::HandleSkew(unsigned int index, const ZvPoint2<float>& p, const ZvPoint2<float>&) {    \
    return Frame<Class>::Edit(*this, [&](ZvFrame2f& f) { return f.CheckedSkew(index, p); });       \
  }

ZV_FRAME_SHAPE_SLOTS(ZvRect2f, KindRect)
ZV_FRAME_SHAPE_SLOTS(ZvOval2f, KindOval)
