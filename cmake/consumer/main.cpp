#include <zv/zv.h>

#include <cstdio>

int main() {
  ZvPoint2dArray points(1);
  points.Add(3.0, 4.0);
  ZvExtent2<double> box;
  box.AddPoint(points[0]);
  const double angle = AngleWithFirstAxisDegree(points[0].x, points[0].y);
  std::printf("consumer: %u point(s), box kind %d, angle %.3f\n", points.size, box.kind, angle);
  return box.kind == 0 ? 0 : 1;
}
