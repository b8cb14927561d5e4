// ZvPath2f: construction, copying, point access and drawing.
#include <zv/path2f.h>

#include <cstring>
#include <functional>
#include <new>

#include "shape/path_codes.h"
#include "shape/shape_lock.h"

using namespace zv_path;

ZvPath2f::ZvPath2f(unsigned int reserve) : points(reserve), codes(reserve), currentSubpathOpen(0) {}

ZvPath2f::ZvPath2f(const ZvPath2f& other) : ZvShape2f(other), points(1), codes(1) {
  ZvShapeLock guard(other);
  points = other.points;
  codes = other.codes;
  currentSubpathOpen = other.currentSubpathOpen;
}

ZvPath2f::ZvPath2f(const ZvPath2f& source, unsigned int first, unsigned int last)
    : points(1), codes(1), currentSubpathOpen(0) {
  {
    ZvShapeLock guard(source);
    if (first > last || last >= source.points.size) return;
    // Ends inside a segment move to its nodes, inwards, so that only whole segments are copied.
    const CodeInfo head = Decode(source.codes[first]);
    if (!IsNode(source.codes[first])) first += head.degree - head.position;
    const CodeInfo tail = Decode(source.codes[last]);
    if (!IsNode(source.codes[last])) last -= tail.position;
    if (first > last) return;
    points.Add(source.points.data + first, last - first + 1);
    codes.Add(source.codes.data + first, last - first + 1);
  }
  ZvShapeLock guard(*this);
  codes[0] = static_cast<unsigned char>(kStart | (codes[0] & kKeepBits));
  const unsigned int e = points.size - 1;
  const unsigned int s = SubpathStart(e);
  if (!(Coincide(points[e], points[s]) && IsClosedEnd(codes[e] & kCodeMask))) {
    // A cut through a closed subpath opens it and frees its locks.
    UnlockG1(s);
    UnlockG1(e);
    OpenSubpath(e);
  }
  currentSubpathOpen = IsClosedEnd(codes[e] & kCodeMask) ? 0 : 1;
}

ZvPath2f& ZvPath2f::operator=(const ZvPath2f& other) {
  if (this == &other) return *this;
  ZvShapeLock guard(*this);
  ZvShapeLock guardOther(other);
  try {
    points = other.points;
    codes = other.codes;
    currentSubpathOpen = other.currentSubpathOpen;
  } catch (const std::bad_alloc&) {
    // Half a copy would break the arrays' pairing: leave an empty path instead.
    points.Chop(0);
    codes.Chop(0);
    currentSubpathOpen = 0;
  }
  return *this;
}

ZvShape2f& ZvPath2f::operator=(const ZvShape2f& other) {
  if (const ZvPath2f* path = dynamic_cast<const ZvPath2f*>(&other)) return *this = *path;
  return ZvShape2f::operator=(other);
}

ZvPath2f::~ZvPath2f() {}

void ZvPath2f::Clear() {
  ZvShapeLock guard(*this);
  currentSubpathOpen = 0;
  try {
    points.ChopAndResize(0);
    codes.ChopAndResize(0);
  } catch (const std::bad_alloc&) {
    // Shrinking moves to a small fresh block; without one the old block stays, empty.
    points.Chop(0);
    codes.Chop(0);
  }
}

ZvShape2f* ZvPath2f::QueryShapeKind(Kind kind) const {
  return kind == KindPath ? const_cast<ZvPath2f*>(this) : nullptr;
}

ZvShape2f* ZvPath2f::Clone() const {
  try {
    return new ZvPath2f(*this);
  } catch (const std::bad_alloc&) {
    return nullptr;
  }
}

unsigned int ZvPath2f::NumPoints() const {
  ZvShapeLock guard(*this);
  return points.size;
}

int ZvPath2f::GetPoint(unsigned int index, ZvPoint2<float>& point) const {
  ZvShapeLock guard(*this);
  if (index >= points.size) return 0;
  point = points[index];
  return 1;
}

ZvPoint2<float> ZvPath2f::GetPoint(unsigned int index) const {
  ZvShapeLock guard(*this);
  return points[index];
}

ZvPoint2<float>* ZvPath2f::GetPoints(unsigned int first, unsigned int last,
                                     ZvPoint2<float>* dst) const {
  ZvShapeLock guard(*this);
  for (unsigned int i = first; i <= last; ++i)
    dst[i - first] = points[i];
  return dst;
}

ZvPoint2<double>* ZvPath2f::GetPoints(unsigned int first, unsigned int last,
                                      ZvPoint2<double>* dst) const {
  ZvShapeLock guard(*this);
  for (unsigned int i = first; i <= last; ++i)
    dst[i - first] = ZvPoint2<double>{points[i].x, points[i].y};
  return dst;
}

// ---- Drawing ----------------------------------------------------------------------------------

void ZvPath2f::GrowBoth(unsigned int count) {
  const unsigned int n = points.size;
  try {
    points.Resize(n + count);
    codes.Resize(n + count);
  } catch (const std::bad_alloc&) {
    points.Chop(n);
    codes.Chop(n);
    throw;
  }
}

void ZvPath2f::Append(const ZvPoint2<float>* p, unsigned int count, unsigned char firstCode) {
  // The source may be in this path's own storage, which growing moves.
  ZvPoint2<float> copy[kMaxDegree];
  for (unsigned int i = 0; i < count; ++i)
    copy[i] = p[i];
  const unsigned int n = points.size;
  GrowBoth(count);
  for (unsigned int i = 0; i < count; ++i) {
    points[n + i] = copy[i];
    codes[n + i] = static_cast<unsigned char>(firstCode + i);
  }
}

void ZvPath2f::Moveto(const ZvPoint2<float>& p) {
  ZvShapeLock guard(*this);
  Append(&p, 1, kStart);
  currentSubpathOpen = 1;
}

void ZvPath2f::AddPolyline(const ZvPoint2<float>* p, unsigned int count, int close) {
  if (count == 0) return;
  ZvShapeLock guard(*this);
  const unsigned int n = points.size;
  // The source may be this path's own storage, which growing moves: find it again after.
  const std::less<const ZvPoint2<float>*> before;
  const bool own = !before(p, points.data) && before(p, points.data + n);
  const std::size_t offset = own ? static_cast<std::size_t>(p - points.data) : 0;
  GrowBoth(count);
  std::memmove(points.data + n, own ? points.data + offset : p, count * sizeof(ZvPoint2<float>));
  codes[n] = kStart;
  std::memset(codes.data + n + 1, Base(1), count - 1);
  currentSubpathOpen = 1;
  // Closeto without its search for the subpath's start, which is known here.
  const unsigned int last = n + count - 1;
  if (!close || !Coincide(points[last], points[n])) return;
  if (count > 1) codes[last] = ClosedFromOpen(codes[last]);
  currentSubpathOpen = 0;
}

void ZvPath2f::AppendSegment(const ZvPoint2<float>* p, unsigned int degree) {
  ZvShapeLock guard(*this);
  // A segment needs a point to start from: on an empty path there is none.
  if (points.size == 0) return;
  Append(p, degree, static_cast<unsigned char>(Base(degree)));
}

void ZvPath2f::Lineto(const ZvPoint2<float>& p) {
  AppendSegment(&p, 1);
}

void ZvPath2f::Curveto(const ZvPoint2<float>& c, const ZvPoint2<float>& end) {
  const ZvPoint2<float> p[2] = {c, end};
  AppendSegment(p, 2);
}

void ZvPath2f::Curveto(const ZvPoint2<float>& c1, const ZvPoint2<float>& c2,
                       const ZvPoint2<float>& end) {
  const ZvPoint2<float> p[3] = {c1, c2, end};
  AppendSegment(p, 3);
}

void ZvPath2f::AltCurveto(const ZvPoint2<float>* p, unsigned int degree) {
  if (degree < 1 || degree > kMaxDegree) return;
  AppendSegment(p, degree);
}

void ZvPath2f::AltAltCurveto(const ZvPoint2fArray& array, unsigned int first, unsigned int degree) {
  if (degree < 1 || degree > kMaxDegree) return;
  if (first > array.size || degree > array.size - first) return;  // also catches overflow
  AppendSegment(array.data + first, degree);
}
