// Paths shared by the motion path tests.
#ifndef ZV_TESTS_MOTION_FIXTURES_H
#define ZV_TESTS_MOTION_FIXTURES_H

#include <zv/motion_path.h>

#include <random>
#include <vector>

#include "tests/support/byte_blocks.h"

using P3 = ZvPoint3<double>;
// Four nodes of cubics at times 0, 1, 2.5, 3, winding through space.
inline ZvMotionPath3d Wave() {
  ZvMotionPath3d path;
  path.Moveto({0, 0, 0}, 0.0);
  path.Curveto({10, 20, 0}, {30, 20, 5}, {40, 0, 5}, 1.0);
  path.Curveto({50, -20, 5}, {70, -25, 0}, {80, 0, -10}, 2.5);
  path.Curveto({90, 25, -20}, {100, 10, -20}, {110, 5, -30}, 3.0);
  return path;
}

// `nodes` nodes of random cubics and lines at random increasing times, with random tangents.
inline ZvMotionPath3d RandomPath(std::mt19937& rng, unsigned int nodes) {
  std::uniform_real_distribution<double> coord(-100.0, 100.0), gap(0.1, 2.0);
  std::uniform_int_distribution<int> info(0, 4), coin(0, 3);
  const auto point = [&] { return P3{coord(rng), coord(rng), coord(rng)}; };
  ZvMotionPath3d path;
  double t = gap(rng) - 1.0;
  path.Moveto(point(), t);
  for (unsigned int k = 1; k < nodes; ++k) {
    t += gap(rng);
    if (coin(rng) == 0) {
      path.Lineto(point(), t);
    } else {
      const P3 c1 = point(), c2 = point();
      path.Curveto(c1, c2, point(), t);
    }
  }
  for (unsigned int k = 0; k < nodes; ++k) {
    path.SetLeftTangentInfo(3 * k, static_cast<ZvMotionPath3d::TangentInfo>(info(rng)));
    path.SetRightTangentInfo(3 * k, static_cast<ZvMotionPath3d::TangentInfo>(info(rng)));
  }
  return path;
}

#endif
