// ZvStdFCurve::ScaleAndOffsetParameters, through the shared scale and offset of keyed curves.
#include <zv/std_fcurve.h>

#include "fcurve/cfc_scale_offset.h"
#include "fcurve/fcurve_lock.h"
#include "fcurve/std_fcurve_impl.h"

unsigned int ZvStdFCurve::ScaleAndOffsetParameters(double start, double end, double pivot,
                                                   double scale, double offset, int moveHead,
                                                   int moveTail, RegionHandle region) {
  ZvFCurveLockGuard guard(*this);
  return CFCScaleAndOffsetParameters(*this, start, end, pivot, scale, offset, moveHead, moveTail,
                                     region,
                                     [](const ZvStdFCurve& work) { return work.IsValid() != 0; });
}
