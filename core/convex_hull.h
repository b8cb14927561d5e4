// Planar convex hull used by ZvGetConvexHull2D.
//
// The hull is a small self-contained piece of geometry with its own vector
// type, so that the polyline code hands it plain coordinates and receives
// plain coordinates back. Nothing here is exported from the library.
#ifndef ZV_CORE_CONVEX_HULL_H
#define ZV_CORE_CONVEX_HULL_H

template <class T>
class CQNVector2 {
 public:
  CQNVector2() : m_v{T(0), T(0)} {}
  CQNVector2(T x, T y) : m_v{x, y} {}
  ~CQNVector2() = default;

  // 0 is x, 1 is y.
  T& operator[](int i) { return m_v[i]; }
  const T& operator[](int i) const { return m_v[i]; }

 private:
  T m_v[2];
};

class CQNGeometry {
 public:
  // Writes the vertices of the convex hull of points[0..count) to hull,
  // counter-clockwise, starting at the vertex of smallest x (smallest y
  // among equals), and their number to hullCount. hull must have room for
  // count vectors; the hull never has more vertices than the input.
  //
  // Only corners are reported: points lying inside an edge and repeated
  // points are left out. All points equal give one vertex, all points on
  // one line give the two ends.
  //
  // Result 1 on success. Result 0 when count is not positive, a pointer is
  // null, a coordinate is not finite or memory runs out; hull and hullCount
  // are then untouched.
  template <class T>
  static int BuildConvexHull(int count, const CQNVector2<T>* points, int& hullCount,
                             CQNVector2<T>* hull);

  // Sign of the turn a -> b -> c: 1 counter-clockwise, -1 clockwise, 0 on one
  // line. Exact for all finite inputs whose products neither overflow nor
  // underflow, so the hull never sees contradictory answers.
  static int Orientation(const CQNVector2<double>& a, const CQNVector2<double>& b,
                         const CQNVector2<double>& c);
};

extern template int CQNGeometry::BuildConvexHull<double>(int, const CQNVector2<double>*, int&,
                                                         CQNVector2<double>*);

#endif
