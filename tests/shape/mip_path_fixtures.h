// Key paths for the mip path tests. Every Bar is a sibling of every other (a Moveto and two
// Linetos), so that a morph between them is the blend of their points; a bar's first x tells
// which key a result came from.
#ifndef ZV_TESTS_SHAPE_MIP_PATH_FIXTURES_H
#define ZV_TESTS_SHAPE_MIP_PATH_FIXTURES_H

#include <zv/mip_path2f_prop1d.h>
#include <zv/path2f_prop1d.h>

#include <vector>

inline ZvPath2fProp1d Bar(float x, float height = 1.0f) {
  ZvPath2fProp1d path(4);
  path.Moveto({x, 0.0f});
  path.Lineto({x + 1.0f, height});
  path.Lineto({x + 2.0f, 0.0f});
  return path;
}

inline std::vector<double> KeyParameters(const ZvMipPath2fProp1d& mip) {
  ZvDoubleArray parameters;
  mip.GetAllKeyParameters(parameters);
  return std::vector<double>(parameters.data, parameters.data + parameters.size);
}

// The first x of the sequence at t, or -1000 for an empty result.
inline float FirstXAt(ZvMipP2fP1dAgent& agent, double t) {
  const ZvPath2fProp1d& result = agent.Eval(t, 0.5, 0.1);
  return result.NumPoints() ? result.GetPoint(0).x : -1000.0f;
}

#endif
