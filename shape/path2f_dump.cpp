// Text dump of ZvPath2f for debugging.
#include <zv/path2f.h>

#include <ostream>

#include "shape/shape_lock.h"

std::ostream& operator<<(std::ostream& out, const ZvPath2f& path) {
  ZvShapeLock guard(path);
  const unsigned int n = path.NumPoints();
  out << "Statistics for this path: " << std::endl;
  out << "NumPoints: " << n << std::endl;
  out << "NumSegments: " << path.NumSegments() << std::endl;
  out << "NumSubpaths: " << path.NumSubpaths() << std::endl;
  out << "LargestDegree: " << path.LargestDegree() << std::endl;
  out << "The points: " << std::endl;
  for (unsigned int i = 0; i < n; ++i) {
    unsigned int first = 0, last = 0;
    path.GetSegmentIndices(i, first, last);
    const ZvPoint2<float> p = path.GetPoint(i);
    out << "Index: " << i << " X: " << p.x << " Y: " << p.y << " First: " << first
        << " Last: " << last << std::endl;
  }
  return out;
}
