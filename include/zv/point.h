// Plain points and boxes, and the geometric predicates every other family builds on.
//
// Points are plain values of float or double. Arrays of them are contiguous, so a cubic Bezier is
// handed around as a pointer to four consecutive points.
//
// Coordinates carry no unit of their own. A shape's points become raster pixels through the
// drawing context's transform (gc.h); in a raster, x grows along a row, y from row to row, and
// the centre of pixel (i, j) lies at (i + 0.5, j + 0.5). Geometry that tests equality does so
// within 1e-9 in double and 1e-7 in single precision.
#ifndef ZV_POINT_H
#define ZV_POINT_H

#include <zv/api.h>

template <class T>
struct ZvPoint2 {
  T x;
  T y;
};

template <class T>
struct ZvPoint3 {
  T x;
  T y;
  T z;
};

// Inline arithmetic. These leave no mark in the exported interface.
template <class T>
inline ZvPoint2<T> operator+(const ZvPoint2<T>& a, const ZvPoint2<T>& b) {
  return {a.x + b.x, a.y + b.y};
}
template <class T>
inline ZvPoint2<T> operator-(const ZvPoint2<T>& a, const ZvPoint2<T>& b) {
  return {a.x - b.x, a.y - b.y};
}
template <class T>
inline ZvPoint2<T> operator-(const ZvPoint2<T>& a) {
  return {-a.x, -a.y};
}
template <class T>
inline ZvPoint2<T> operator*(const ZvPoint2<T>& a, T s) {
  return {a.x * s, a.y * s};
}
template <class T>
inline ZvPoint2<T> operator*(T s, const ZvPoint2<T>& a) {
  return {a.x * s, a.y * s};
}
template <class T>
inline ZvPoint2<T> operator/(const ZvPoint2<T>& a, T s) {
  return {a.x / s, a.y / s};
}
template <class T>
inline ZvPoint2<T>& operator+=(ZvPoint2<T>& a, const ZvPoint2<T>& b) {
  a.x += b.x;
  a.y += b.y;
  return a;
}
template <class T>
inline ZvPoint2<T>& operator-=(ZvPoint2<T>& a, const ZvPoint2<T>& b) {
  a.x -= b.x;
  a.y -= b.y;
  return a;
}
template <class T>
inline T ZvDot(const ZvPoint2<T>& a, const ZvPoint2<T>& b) {
  return a.x * b.x + a.y * b.y;
}
// z component of the 3-D cross product of two plane vectors.
template <class T>
inline T ZvCross(const ZvPoint2<T>& a, const ZvPoint2<T>& b) {
  return a.x * b.y - a.y * b.x;
}

template <class T>
inline ZvPoint3<T> operator+(const ZvPoint3<T>& a, const ZvPoint3<T>& b) {
  return {a.x + b.x, a.y + b.y, a.z + b.z};
}
template <class T>
inline ZvPoint3<T> operator-(const ZvPoint3<T>& a, const ZvPoint3<T>& b) {
  return {a.x - b.x, a.y - b.y, a.z - b.z};
}
template <class T>
inline ZvPoint3<T> operator-(const ZvPoint3<T>& a) {
  return {-a.x, -a.y, -a.z};
}
template <class T>
inline ZvPoint3<T> operator*(const ZvPoint3<T>& a, T s) {
  return {a.x * s, a.y * s, a.z * s};
}
template <class T>
inline ZvPoint3<T> operator*(T s, const ZvPoint3<T>& a) {
  return {a.x * s, a.y * s, a.z * s};
}
template <class T>
inline ZvPoint3<T> operator/(const ZvPoint3<T>& a, T s) {
  return {a.x / s, a.y / s, a.z / s};
}
template <class T>
inline ZvPoint3<T>& operator+=(ZvPoint3<T>& a, const ZvPoint3<T>& b) {
  a.x += b.x;
  a.y += b.y;
  a.z += b.z;
  return a;
}
template <class T>
inline ZvPoint3<T>& operator-=(ZvPoint3<T>& a, const ZvPoint3<T>& b) {
  a.x -= b.x;
  a.y -= b.y;
  a.z -= b.z;
  return a;
}
template <class T>
inline T ZvDot(const ZvPoint3<T>& a, const ZvPoint3<T>& b) {
  return a.x * b.x + a.y * b.y + a.z * b.z;
}
template <class T>
inline ZvPoint3<T> ZvCross(const ZvPoint3<T>& a, const ZvPoint3<T>& b) {
  return {a.y * b.z - a.z * b.y, a.z * b.x - a.x * b.z, a.x * b.y - a.y * b.x};
}

// An axis-aligned box with an explicit kind. For Empty and Infinite the coordinates mean nothing.
template <class T>
struct ZV_API ZvExtent2 {
  enum { Regular = 0, Empty = 1, Infinite = 2 };

  T xmin;
  T ymin;
  T xmax;
  T ymax;
  int kind;

  ZvExtent2() : xmin(0), ymin(0), xmax(0), ymax(0), kind(Empty) {}
  ZvExtent2(T x0, T y0, T x1, T y1, int k = Regular)
      : xmin(x0), ymin(y0), xmax(x1), ymax(y1), kind(k) {}

  // Other Empty or this Infinite: unchanged. Other Infinite: this becomes Infinite with its
  // coordinates left alone. This Empty: a copy of other. Both Regular: the bounding union.
  ZvExtent2& Union(const ZvExtent2& other) {
    if (other.kind == Empty || kind == Infinite) return *this;
    if (other.kind == Infinite) {
      kind = Infinite;
    } else if (kind == Empty) {
      *this = other;
    } else {
      if (other.xmin < xmin) xmin = other.xmin;
      if (other.ymin < ymin) ymin = other.ymin;
      if (other.xmax > xmax) xmax = other.xmax;
      if (other.ymax > ymax) ymax = other.ymax;
    }
    return *this;
  }

  // The max test runs only when the coordinate is not below the min: a Regular box never needs
  // both, and the order is observable with NaN coordinates.
  template <class P>
  void AddPoint(const P& p) {
    if (kind == Infinite) return;
    if (kind == Empty) {
      xmin = xmax = static_cast<T>(p.x);
      ymin = ymax = static_cast<T>(p.y);
      kind = Regular;
      return;
    }
    const T x = static_cast<T>(p.x), y = static_cast<T>(p.y);
    if (x < xmin) {
      xmin = x;
    } else if (x > xmax) {
      xmax = x;
    }
    if (y < ymin) {
      ymin = y;
    } else if (y > ymax) {
      ymax = y;
    }
  }

  // Does segment a-b touch the box? Empty never, Infinite always. Writes nothing.
  int IsIntersecting(const ZvPoint2<T>& a, const ZvPoint2<T>& b) const;

  // Liang-Barsky clip of segment p-q in place; the kind is not examined. 1 when anything is left.
  int ClipLineSegmentWhenRegular(ZvPoint2<T>& p, ZvPoint2<T>& q) const;
};

template <class T>
struct ZvExtent3 {
  enum { Regular = 0, Empty = 1, Infinite = 2 };

  T xmin;
  T ymin;
  T zmin;
  T xmax;
  T ymax;
  T zmax;
  int kind;

  ZvExtent3() : xmin(0), ymin(0), zmin(0), xmax(0), ymax(0), zmax(0), kind(Empty) {}

  template <class P>
  void AddPoint(const P& p) {
    if (kind == Infinite) return;
    if (kind == Empty) {
      xmin = xmax = static_cast<T>(p.x);
      ymin = ymax = static_cast<T>(p.y);
      zmin = zmax = static_cast<T>(p.z);
      kind = Regular;
      return;
    }
    const T c[3] = {static_cast<T>(p.x), static_cast<T>(p.y), static_cast<T>(p.z)};
    T* lo[3] = {&xmin, &ymin, &zmin};
    T* hi[3] = {&xmax, &ymax, &zmax};
    for (int i = 0; i < 3; ++i) {
      if (c[i] < *lo[i]) {
        *lo[i] = c[i];
      } else if (c[i] > *hi[i]) {
        *hi[i] = c[i];
      }
    }
  }
};

extern template struct ZvExtent2<float>;
extern template struct ZvExtent2<double>;

// Squared distances throughout. 1 when the closest point of segment a-b lies within
// maxDistance2 of p; outT receives the raw projection parameter even when the call fails.
template <class T>
ZV_API int ZvPoint2_FindClosestPointOnLineSegment(const ZvPoint2<T>& p, const ZvPoint2<T>& a,
                                                  const ZvPoint2<T>& b, double maxDistance2,
                                                  double& outDistance2, double& outT);
template <class T>
ZV_API int ZvPoint3_FindClosestPointOnLineSegment(const ZvPoint3<T>& p, const ZvPoint3<T>& a,
                                                  const ZvPoint3<T>& b, double maxDistance2,
                                                  double& outDistance2, double& outT);

// Counter-clockwise sweep in degrees from u to v, in [0, 360). 0 when either vector is null.
template <class T>
ZV_API int ZvPoint2_AngleInDegrees(const ZvPoint2<T>& u, const ZvPoint2<T>& v, double& outDegrees);

// Projects p on the line a-b along direction (orthogonally when direction is null).
template <class T>
ZV_API int ZvPoint2_ParallelProjectionOnLineAB(const ZvPoint2<T>& p, const ZvPoint2<T>& a,
                                               const ZvPoint2<T>& b, const ZvPoint2<T>& direction,
                                               ZvPoint2<T>& outPoint);

// Inside or on the boundary of triangle a-b-c, with 1e-7 slack on the edges.
template <class T>
ZV_API int ZvPoint2_IsInTriangle(const ZvPoint2<T>& p, const ZvPoint2<T>& a, const ZvPoint2<T>& b,
                                 const ZvPoint2<T>& c);

// On segment a-b within a squared distance of 1e-7.
template <class T>
ZV_API int ZvPoint2_IsInLineSegment(const ZvPoint2<T>& p, const ZvPoint2<T>& a,
                                    const ZvPoint2<T>& b);

// Angle of (x, y) from the positive x axis, in [0, 2 pi) or [0, 360).
ZV_API double AngleWithFirstAxisRadian(double x, double y);
ZV_API double AngleWithFirstAxisDegree(double x, double y);

#endif
