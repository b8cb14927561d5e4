// The work of the fitting builders that does not depend on what the points carry: densifying
// the input as it comes, and fitting what is new at each commit. The point builder and the
// property builder both run it on their own arrays.
#ifndef ZV_SHAPE_PATH_BUILDER_FIT_STEPS_H
#define ZV_SHAPE_PATH_BUILDER_FIT_STEPS_H

#include <zv/arrays.h>
#include <zv/bezier_fit.h>
#include <zv/gc.h>
#include <zv/path2f.h>
#include <zv/point.h>

#include "shape/path_builder_steps.h"

// Degree 1 could never fit under a fixed direction and would split forever; the path holds at
// most degree 8.
inline unsigned int zvClampFitDegree(unsigned int d) {
  return d < 2 ? 2 : (d > 8 ? 8 : d);
}

// Appends the mapped pen point p to the input. Unless `force` (or the input is empty), a p near
// the last point is dropped, and an edge between densifySpacing and longChordDistance long
// (octagonal) first gets points about densifySpacing apart, p then replacing the last of them
// when it lies near it. Dense input lets the fits see the shape of the stroke between sparse pen
// events; long edges are left alone and drawn as single cubics. `placed(index, t)` is called for
// every input slot written, t being its position from the old last point (0) to p (1), so that
// a caller can keep values parallel to the points. Allocates only when the input grows past its
// capacity.
template <class Placed>
void zvAddDensifiedInputPoint(const ZvGC& gc, ZvPoint2fArray& input, const ZvPoint2<float>& p,
                              int force, double densifySpacing, double longChordDistance,
                              Placed placed) {
  if (!force && input.size) {
    const ZvPoint2<float> last = input[input.size - 1];
    if (zvBuilderNear(gc, p, last)) return;
    const double d = zvOctagonalDistance(last, p);
    if (densifySpacing > 0.0 && densifySpacing < d && d <= longChordDistance) {
      const double step = densifySpacing / d;
      for (double t = step; t < 1.0; t += step) {
        input.Add(last.x + (double(p.x) - last.x) * t, last.y + (double(p.y) - last.y) * t);
        placed(input.size - 1, t);
        ++cAddPts;
      }
      if (zvBuilderNear(gc, p, input[input.size - 1])) {
        input[input.size - 1] = p;
        placed(input.size - 1, 1.0);
        --cAddPts;
        return;
      }
    }
  }
  input.Add(p);
  placed(input.size - 1, 1.0);
}

// Fits the input from lastProcessed to its end onto the path, whose subpath has had its Moveto:
// closing appends the first point to the input when the ends are apart; corners are detected
// (one flag per point in cornerFlags) and the input is smoothed between them; chordLengths is
// brought up to date; then runs of short edges are fitted or interpolated and long edges drawn
// as single cubics, ending on the input's last point.
void zvFitTrailingInputPoints(const ZvGC& gc, double longChordDistance, double fitError,
                              unsigned int fitDegree, unsigned int lastProcessed, int close,
                              ZvPoint2fArray& input, ZvDoubleArray& chordLengths,
                              ZvBoolArray& cornerFlags, ZvBezierTool& tool, ZvPath2f* path);

#endif
