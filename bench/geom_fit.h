// lib2geom's Bezier fitting call, for the fitting benchmarks. Its public header pulls in Boost,
// which a machine may lack while the library itself is installed; then the call is declared
// here over a point of the library's layout (two doubles), which is all the call reads and
// writes, and the library is linked as usual.
#ifndef ZV_BENCH_GEOM_FIT_H
#define ZV_BENCH_GEOM_FIT_H

#if ZV_HAVE_2GEOM
#if __has_include(<boost/operators.hpp>)
#include <2geom/bezier-utils.h>
#else
namespace Geom {
class Point {
 public:
  Point() : pt{0.0, 0.0} {}
  Point(double x, double y) : pt{x, y} {}
  double operator[](unsigned int i) const { return pt[i]; }

 private:
  double pt[2];
};
int bezier_fit_cubic_r(Point bezier[], Point const data[], int len, double error,
                       unsigned max_beziers);
}  // namespace Geom
#endif
#endif

#endif
