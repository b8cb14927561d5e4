// Flattens a cubic Bezier at a few tolerances, locates a point on it and bounds it tightly.
//
//   zv_example_flatten_cubic                   the built-in cubic
//   zv_example_flatten_cubic x0 y0 ... x3 y3   a cubic of your own
#include <zv/zv.h>

#include <cmath>
#include <cstdio>
#include <cstdlib>

int main(int argc, char** argv) {
  ZvPoint2<double> cubic[4] = {{0, 0}, {40, 120}, {160, -60}, {200, 60}};
  if (argc == 9) {
    for (int i = 0; i < 4; ++i)
      cubic[i] = {std::atof(argv[1 + 2 * i]), std::atof(argv[2 + 2 * i])};
  } else if (argc != 1) {
    std::fprintf(stderr, "usage: %s [x0 y0 x1 y1 x2 y2 x3 y3]\n", argv[0]);
    return 2;
  }
  std::printf("cubic (%g,%g) (%g,%g) (%g,%g) (%g,%g)\n", cubic[0].x, cubic[0].y, cubic[1].x,
              cubic[1].y, cubic[2].x, cubic[2].y, cubic[3].x, cubic[3].y);

  for (double tolerance : {1.0, 0.25, 0.05}) {
    ZvPoint2dArray polyline(16);
    const unsigned int n = ZvBezierTool_FlattenCubic2d(cubic, tolerance, &polyline, 0);
    std::printf("tolerance %-5g -> %3u points:", tolerance, n);
    for (unsigned int i = 0; i < polyline.size && i < 6; ++i)
      std::printf(" (%.2f,%.2f)", polyline[i].x, polyline[i].y);
    std::printf("%s\n", polyline.size > 6 ? " ..." : "");
  }

  const ZvPoint2<double> probe = {100, 33};
  double distance2 = 0, t = 0;
  if (ZvBezierTool_LocatePoint2d(cubic, 0.25, probe, 25.0, distance2, t))
    std::printf("point (%g,%g) lies %.3f from the curve, at t = %.4f\n", probe.x, probe.y,
                std::sqrt(distance2), t);
  else
    std::printf("point (%g,%g) is not near the curve\n", probe.x, probe.y);

  ZvExtent2<double> box;
  ZvBezierTool_AugmentExtentWithCubic2dTightExtent(box, cubic, 0);
  std::printf("tight extent x [%.2f, %.2f] y [%.2f, %.2f]\n", box.xmin, box.xmax, box.ymin,
              box.ymax);
  return 0;
}
