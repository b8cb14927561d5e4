// Small property paths shared by the property path tests.
#ifndef ZV_TESTS_SHAPE_PATH_PROP_FIXTURES_H
#define ZV_TESTS_SHAPE_PATH_PROP_FIXTURES_H

#include <zv/path2f_prop1d.h>

// An open line 0..1 and an open polyline 2..4.
inline ZvPath2fProp1d TwoLines() {
  ZvPath2fProp1d path;
  path.Moveto(ZvPoint2<float>{0, 0});
  path.Lineto(ZvPoint2<float>{10, 0});
  path.Moveto(ZvPoint2<float>{0, 5});
  path.Lineto(ZvPoint2<float>{5, 5});
  path.Lineto(ZvPoint2<float>{10, 5});
  return path;
}

#endif
