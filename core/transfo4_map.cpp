// Mapping of points, vectors and extents by a ZvTransfo4.
//
// Each dimension's formula is written once, in the Affine2 / Affine3 workers below, and every
// Map form - value, into, many, in place, float or double - goes through it. The workers copy
// the six or twelve elements that matter into locals, so the array loops keep them in registers
// and carry no test on what the transform contains: mapping by the identity costs the same as
// by any other matrix, which keeps shape transformation predictable.
//
// Array mapping is the hot path of shape transformation. On x86 the one loop is also compiled
// for AVX2 and AVX-512 and the widest the processor offers is chosen once. Those copies are
// kept from fusing multiply and add (the baseline instruction set has no fused form), so every
// path rounds each product and sum exactly as the single-point forms do: results are the same
// bits on every machine.
#include <zv/transfo4.h>

// Clang contracts a * b + c within an expression unless told not to; the pragma must sit in the
// body that holds the expression.
#if defined(__clang__)
#define ZV_NO_FP_CONTRACT _Pragma("clang fp contract(off)")
#else
#define ZV_NO_FP_CONTRACT
#endif

namespace {

// The 2-D part: a point is taken with z = 0, and the bottom row is ignored.
struct Affine2 {
  double a, b, c, d, e, f;
  explicit Affine2(const double* m) : a(m[0]), b(m[1]), c(m[4]), d(m[5]), e(m[12]), f(m[13]) {}

  template <class T>
  void operator()(const ZvPoint2<T>& p, ZvPoint2<T>& r) const {
    ZV_NO_FP_CONTRACT
    const double x = p.x, y = p.y;
    const T rx = static_cast<T>(a * x + c * y + e), ry = static_cast<T>(b * x + d * y + f);
    r.x = rx;
    r.y = ry;
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
  void operator()(const ZvPoint3<T>& p, ZvPoint3<T>& r) const {
    ZV_NO_FP_CONTRACT
    const double x = p.x, y = p.y, z = p.z;
    const T rx = static_cast<T>(m0 * x + m4 * y + m8 * z + m12);
    const T ry = static_cast<T>(m1 * x + m5 * y + m9 * z + m13);
    const T rz = static_cast<T>(m2 * x + m6 * y + m10 * z + m14);
    r.x = rx;
    r.y = ry;
    r.z = rz;
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

// The one array loop. Iterations are independent, each element being read whole before it is
// written, so out may be in itself; a partial overlap is not supported.
template <class P>
inline __attribute__((always_inline)) void MapLoop(const double* m, const P* in, unsigned int count,
                                                   P* out) {
  const typename AffineFor<P>::type map(m);
#if defined(__clang__)
#pragma clang loop vectorize(assume_safety)
#else
#pragma GCC ivdep
#endif
  for (unsigned int i = 0; i < count; ++i)
    map(in[i], out[i]);
}

#if defined(__x86_64__) || defined(__i386__)
// The wide copies of the loop. For GCC they also turn off fused multiply-add (its default lets
// it fuse across statements) and ask for the full vectoriser cost model even in -O2 builds.
#if defined(__clang__)
#define ZV_WIDE_LOOP(isa) __attribute__((target(isa)))
#else
#define ZV_WIDE_LOOP(isa) \
  __attribute__((target(isa), optimize("fp-contract=off", "vect-cost-model=dynamic")))
#endif

template <class P>
ZV_WIDE_LOOP("avx512f,avx512vl,avx512dq")
void MapLoopAvx512(const double* m, const P* in, unsigned int count, P* out) {
  MapLoop(m, in, count, out);
}

template <class P>
ZV_WIDE_LOOP("avx2")
void MapLoopAvx2(const double* m, const P* in, unsigned int count, P* out) {
  MapLoop(m, in, count, out);
}

enum class Isa { Base, Avx2, Avx512 };

Isa DetectIsa() {
  __builtin_cpu_init();
  if (__builtin_cpu_supports("avx512f") && __builtin_cpu_supports("avx512vl") &&
      __builtin_cpu_supports("avx512dq")) {
    return Isa::Avx512;
  }
  return __builtin_cpu_supports("avx2") ? Isa::Avx2 : Isa::Base;
}

// Asked once per process; a read-only value afterwards.
Isa ProcessorIsa() {
  static const Isa isa = DetectIsa();
  return isa;
}

template <class P>
void MapArray(const double* m, const P* in, unsigned int count, P* out) {
  const Isa isa = ProcessorIsa();
  if (isa == Isa::Avx512) {
    MapLoopAvx512(m, in, count, out);
  } else if (isa == Isa::Avx2) {
    MapLoopAvx2(m, in, count, out);
  } else {
    MapLoop(m, in, count, out);
  }
}
#else
template <class P>
void MapArray(const double* m, const P* in, unsigned int count, P* out) {
  MapLoop(m, in, count, out);
}
#endif

template <class P>
P MapOne(const double* m, const P& p) {
  const typename AffineFor<P>::type map(m);
  P r;
  map(p, r);
  return r;
}

template <class T>
ZvExtent2<T> MapExtent(const double* m, const ZvExtent2<T>& e) {
  if (e.kind != ZvExtent2<T>::Regular) return e;
  const ZvPoint2<T> corners[4] = {
      {e.xmin, e.ymin}, {e.xmax, e.ymin}, {e.xmax, e.ymax}, {e.xmin, e.ymax}};
  ZvExtent2<T> box;  // Empty: the first corner sets it
  for (const ZvPoint2<T>& c : corners)
    box.AddPoint(MapOne(m, c));
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
