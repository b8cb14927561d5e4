// Mapping of points, vectors and extents by a ZvTransfo4.
//
// Each dimension's formula is written once, in the Affine2 / Affine3 workers below, and every
// Map form - value, into, many, in place, float or double - goes through it. The workers copy
// the six or twelve elements that matter into locals, so the array loops keep them in registers
// and carry no test on what the transform contains: mapping by the identity costs the same as
// by any other matrix, which keeps shape transformation predictable.
#include <zv/transfo4.h>

namespace {

// The 2-D part: a point is taken with z = 0, and the bottom row is ignored.
struct Affine2 {
  double a, b, c, d, e, f;
  explicit Affine2(const double* m) : a(m[0]), b(m[1]), c(m[4]), d(m[5]), e(m[12]), f(m[13]) {}

  template <class T>
  ZvPoint2<T> operator()(const ZvPoint2<T>& p) const {
    const double x = p.x, y = p.y;
    return {static_cast<T>(a * x + c * y + e), static_cast<T>(b * x + d * y + f)};
  }
};

// The affine 3-D part; the bottom row is ignored (no perspective divide).
struct Affine3 {
  double m0, m1, m2, m4, m5, m6, m8, m9, m10, m12, m13, m14;
  explicit Affine3(const double* m)
      : m0(m[0]),
        m1(m[1]),
        m2(m[2]),
        m4(m[4]),
        m5(m[5]),
        m6(m[6]),
        m8(m[8]),
        m9(m[9]),
        m10(m[10]),
        m12(m[12]),
        m13(m[13]),
        m14(m[14]) {}

  template <class T>
  ZvPoint3<T> operator()(const ZvPoint3<T>& p) const {
    const double x = p.x, y = p.y, z = p.z;
    return {static_cast<T>(m0 * x + m4 * y + m8 * z + m12),
            static_cast<T>(m1 * x + m5 * y + m9 * z + m13),
            static_cast<T>(m2 * x + m6 * y + m10 * z + m14)};
  }
};

template <class P>
struct AffineFor;
template <class T>
struct AffineFor<ZvPoint2<T>> {
  using type = Affine2;
};
template <class T>
struct AffineFor<ZvPoint3<T>> {
  using type = Affine3;
};

// The one array loop. Each element is read whole before it is written, so out may equal in.
template <class P>
void MapArray(const double* m, const P* in, unsigned int count, P* out) {
  const typename AffineFor<P>::type map(m);
  for (unsigned int i = 0; i < count; ++i)
    out[i] = map(in[i]);
}

template <class P>
P MapOne(const double* m, const P& p) {
  return typename AffineFor<P>::type(m)(p);
}

template <class T>
ZvExtent2<T> MapExtent(const double* m, const ZvExtent2<T>& e) {
  if (e.kind != ZvExtent2<T>::Regular) return e;
  const ZvPoint2<T> corners[4] = {
      {e.xmin, e.ymin}, {e.xmax, e.ymin}, {e.xmax, e.ymax}, {e.xmin, e.ymax}};
  const Affine2 map(m);
  ZvExtent2<T> box;  // Empty: the first corner sets it
  for (const ZvPoint2<T>& c : corners)
    box.AddPoint(map(c));
  return box;
}

}  // namespace

template <class T>
ZvPoint2<T> ZvTransfo4::Map(const ZvPoint2<T>& p) const {
  return MapOne(m, p);
}
template <class T>
ZvPoint3<T> ZvTransfo4::Map(const ZvPoint3<T>& p) const {
  return MapOne(m, p);
}
template <class T>
void ZvTransfo4::Map(const ZvPoint2<T>& p, ZvPoint2<T>& result) const {
  result = MapOne(m, p);
}
template <class T>
void ZvTransfo4::Map(const ZvPoint3<T>& p, ZvPoint3<T>& result) const {
  result = MapOne(m, p);
}
template <class T>
void ZvTransfo4::Map(const ZvPoint2<T>* in, unsigned int count, ZvPoint2<T>* out) const {
  MapArray(m, in, count, out);
}
template <class T>
void ZvTransfo4::Map(const ZvPoint3<T>* in, unsigned int count, ZvPoint3<T>* out) const {
  MapArray(m, in, count, out);
}
template <class T>
void ZvTransfo4::MapInPlace(ZvPoint2<T>& p) const {
  p = MapOne(m, p);
}
template <class T>
void ZvTransfo4::MapInPlace(ZvPoint3<T>& p) const {
  p = MapOne(m, p);
}
template <class T>
void ZvTransfo4::MapInPlace(ZvPoint2<T>* p, unsigned int count) const {
  MapArray(m, p, count, p);
}
template <class T>
void ZvTransfo4::MapInPlace(ZvPoint3<T>* p, unsigned int count) const {
  MapArray(m, p, count, p);
}

template <class T>
ZvExtent2<T> ZvTransfo4::Map(const ZvExtent2<T>& e) const {
  return MapExtent(m, e);
}
template <class T>
void ZvTransfo4::Map(const ZvExtent2<T>& e, ZvExtent2<T>& result) const {
  result = MapExtent(m, e);
}
template <class T>
void ZvTransfo4::MapInPlace(ZvExtent2<T>& e) const {
  e = MapExtent(m, e);
}
template <class T>
void ZvTransfo4::MapInPlace(ZvExtent2<T>* e, unsigned int count) const {
  for (unsigned int i = 0; i < count; ++i)
    e[i] = MapExtent(m, e[i]);
}

void ZvTransfo4::Map(const double* in, double* out) const {
  double r[4];
  for (int row = 0; row < 4; ++row) {
    r[row] = m[row] * in[0] + m[row + 4] * in[1] + m[row + 8] * in[2] + m[row + 12] * in[3];
  }
  for (int row = 0; row < 4; ++row)
    out[row] = r[row];
}

// The exported forms: float and double of every template above.
#define ZV_TRANSFO4_MAP_FORMS(T)                                                              \
  template ZV_API ZvPoint2<T> ZvTransfo4::Map(const ZvPoint2<T>&) const;                      \
  template ZV_API ZvPoint3<T> ZvTransfo4::Map(const ZvPoint3<T>&) const;                      \
  template ZV_API void ZvTransfo4::Map(const ZvPoint2<T>&, ZvPoint2<T>&) const;               \
  template ZV_API void ZvTransfo4::Map(const ZvPoint3<T>&, ZvPoint3<T>&) const;               \
  template ZV_API void ZvTransfo4::Map(const ZvPoint2<T>*, unsigned int, ZvPoint2<T>*) const; \
  template ZV_API void ZvTransfo4::Map(const ZvPoint3<T>*, unsigned int, ZvPoint3<T>*) const; \
  template ZV_API void ZvTransfo4::MapInPlace(ZvPoint2<T>&) const;                            \
  template ZV_API void ZvTransfo4::MapInPlace(ZvPoint3<T>&) const;                            \
  template ZV_API void ZvTransfo4::MapInPlace(ZvPoint2<T>*, unsigned int) const;              \
  template ZV_API void ZvTransfo4::MapInPlace(ZvPoint3<T>*, unsigned int) const;              \
  template ZV_API ZvExtent2<T> ZvTransfo4::Map(const ZvExtent2<T>&) const;                    \
  template ZV_API void ZvTransfo4::Map(const ZvExtent2<T>&, ZvExtent2<T>&) const;             \
  template ZV_API void ZvTransfo4::MapInPlace(ZvExtent2<T>&) const;                           \
  template ZV_API void ZvTransfo4::MapInPlace(ZvExtent2<T>*, unsigned int) const;

ZV_TRANSFO4_MAP_FORMS(float)
ZV_TRANSFO4_MAP_FORMS(double)
