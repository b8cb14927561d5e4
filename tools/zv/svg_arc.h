// Elliptical arcs of SVG path data as cubic Bezier segments.
#ifndef ZV_TOOLS_SVG_ARC_H
#define ZV_TOOLS_SVG_ARC_H

#include <zv/point.h>

#include <vector>

// The arc from `from` to `to` on an ellipse of radii rx, ry whose x axis is turned by
// `degrees`, choosing of the four candidate arcs the large or small one (`large`) that runs at
// increasing (`sweep`) or decreasing angle, in SVG's y-down sense. Appends three control points
// per cubic (the start point is `from` and is not repeated), one cubic per quarter turn or less,
// and answers the number of cubics. Radii too small to reach `to` are scaled up until they just
// do. Coincident end points or a zero radius answer 0 and append nothing: the first draws
// nothing in SVG, the second a straight line, which is the caller's to draw.
int ZvSvgArcToCubics(const ZvPoint2<double>& from, double rx, double ry, double degrees, bool large,
                     bool sweep, const ZvPoint2<double>& to,
                     std::vector<ZvPoint2<double>>& controls);

#endif
