// Tight bounding extents of plane cubics, from the control points of their four quarters.
#include <zv/bezier_tool.h>

#include "curvemath/cubic_steps.h"

namespace {

// Works in the precision of the curve itself, like the boxes it grows.
template <class T>
void AugmentWithTightExtent(ZvExtent2<T>& extent, const ZvPoint2<T>* p, int skipFirst) {
  if (!p) return;
  ZvPoint2<T> halves[8], quarters[16];
  zvSplitCubicAtHalf(p, halves, halves + 4);
  zvSplitCubicAtHalf(halves, quarters, quarters + 4);
  zvSplitCubicAtHalf(halves + 4, quarters + 8, quarters + 12);
  if (!skipFirst) extent.AddPoint(quarters[0]);
  // Each quarter contributes its two inner controls and its end point, ending with P3.
  for (int q = 0; q < 4; ++q) {
    for (int i = 1; i < 4; ++i)
      extent.AddPoint(quarters[4 * q + i]);
  }
}

}  // namespace

void ZvBezierTool_AugmentExtentWithCubic2fTightExtent(ZvExtent2<float>& extent,
                                                      const ZvPoint2<float>* p, int skipFirst) {
  AugmentWithTightExtent(extent, p, skipFirst);
}

void ZvBezierTool_AugmentExtentWithCubic2dTightExtent(ZvExtent2<double>& extent,
                                                      const ZvPoint2<double>* p, int skipFirst) {
  AugmentWithTightExtent(extent, p, skipFirst);
}
