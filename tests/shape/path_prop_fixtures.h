// Small and random property paths shared by the property path tests.
#ifndef ZV_TESTS_SHAPE_PATH_PROP_FIXTURES_H
#define ZV_TESTS_SHAPE_PATH_PROP_FIXTURES_H

#include <zv/path2f_prop1d.h>

#include <random>
#include <vector>

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

// The same with a curve on each subpath: rising on the first, falling on the second.
inline ZvPath2fProp1d TwoLinesWithCurves() {
  ZvPath2fProp1d path = TwoLines();
  path.SetPropCurve(0, ZvRawFCurve(0.0, 1.0, 10.0, 2.0));
  path.SetPropCurve(2, ZvRawFCurve(0.0, 2.0, 10.0, 0.5));
  return path;
}

// One to four subpaths of lines and cubics, some closed, about half with a curve of one to six
// keys along a length near the subpath's.
inline ZvPath2fProp1d RandomPropPath(std::mt19937& rng) {
  std::uniform_real_distribution<float> coord(-50.0f, 50.0f);
  std::uniform_int_distribution<int> small(1, 4);
  ZvPath2fProp1d path;
  const int subpaths = small(rng);
  for (int s = 0; s < subpaths; ++s) {
    const unsigned int start = path.NumPoints();
    const ZvPoint2<float> first{coord(rng), coord(rng)};
    path.Moveto(first);
    const int segments = small(rng);
    for (int k = 0; k < segments; ++k) {
      if (rng() % 2)
        path.Lineto(ZvPoint2<float>{coord(rng), coord(rng)});
      else
        path.Curveto(ZvPoint2<float>{coord(rng), coord(rng)},
                     ZvPoint2<float>{coord(rng), coord(rng)},
                     ZvPoint2<float>{coord(rng), coord(rng)});
    }
    if (rng() % 3 == 0) path.CloseSubpath(start);
    if (rng() % 2) {
      ZvRawFCurve curve(0.0, 0.5 + (rng() % 100) / 50.0);
      double at = 0.0;
      for (int k = 1 + static_cast<int>(rng() % 6); k > 1; --k) {
        at += 1.0 + rng() % 40;
        curve.AppendLinearSegment(ZvPoint2<double>{at, (rng() % 100) / 25.0});
      }
      path.SetPropCurve(start, curve);
    }
  }
  return path;
}

// Every record names a subpath start: as many curves are found at the starts as are held.
inline bool PropRecordsHold(const ZvPath2fProp1d& path) {
  ZvPath2fIter it(path);
  unsigned int first = 0, last = 0, found = 0;
  while (it.GetNextSubPathIndices(first, last))
    found += path.GetPropCurveInsideCriticalSection(first) ? 1 : 0;
  return found == path.GetNumPropCurves();
}

// The value each subpath's curve has at 0, subpath by subpath; -1 for none.
inline std::vector<double> StartValues(const ZvPath2fProp1d& path) {
  std::vector<double> out;
  ZvPath2fIter it(path);
  unsigned int first = 0, last = 0;
  while (it.GetNextSubPathIndices(first, last))
    out.push_back(path.HasPropCurve(first) ? path.EvalPropCurve(first, 0.0) : -1.0);
  return out;
}

#endif
