// Traced contours into a path: one closed polyline per contour, collinear unit edges joined.
#include "raster/vect_path.h"

#include <zv/path2f.h>

#include <cmath>

void VectFlush(VectClosure& c, int close) {
  c.path->AddPolyline(c.contour.data, c.contour.size, close);
  c.contour.Chop(0);
}

ObCallbackTable VectPathTable() {
  return {VectInit, VectNewComponent, VectMoveto, VectLineto, VectCloseComponent, VectClose};
}
