// Scaling an interval's parameters about a pivot and offsetting them, through the contract, for
// every keyed kind.
//
// The work happens on a copy, which replaces the curve only when everything succeeded and the
// copy is valid. A bulk change of part of the keys must obey the collision and clamp rules of
// an interactive drag: a scale of part of the keys is one Update of the stretcher, an offset one
// Update of the key mover. When the change concerns every key it is a plain scale, mirror or
// shift of the whole curve, and is done here.
#ifndef ZV_FCURVE_CFC_SCALE_OFFSET_H
#define ZV_FCURVE_CFC_SCALE_OFFSET_H

#include <zv/fcurve.h>

#include "fcurve/key_mover_impl.h"
#include "fcurve/stretcher_impl.h"

#include <algorithm>
#include <cfloat>
#include <cmath>

// Moves the keys of [start, end] by offset as one drag would, with its collision rules. The
// interval reaches to the last key when the head moves forwards or the tail backwards, and to the
// first key the other way round. An interval without keys moves temporary keys made at its ends,
// which are removed afterwards.
template <class Curve>
bool CFCOffsetPartOfKeys(Curve& work, double start, double end, double offset, int moveHead,
                         int moveTail) {
  double first = 0.0, last = 0.0;
  work.GetSmallestKeyParameter(first);
  work.GetLargestKeyParameter(last);
  if ((moveHead && offset > 0.0) || (moveTail && offset < 0.0)) end = std::max(end, last);
  if ((moveHead && offset < 0.0) || (moveTail && offset > 0.0)) start = std::min(start, first);
  ZvDoubleArray selected(8);
  bool temporary = false;
  if (work.GetKeyParameters(start, end, selected, 0, 0) == 0) {
    if (!work.CreateNonModifyingKey(start, 1) || !work.CreateNonModifyingKey(end, 1)) return false;
    temporary = true;
    if (work.GetKeyParameters(start, end, selected, 0, 0) == 0) return false;
  }
  const ZvExtent2<double> everywhere(-DBL_MAX, -DBL_MAX, DBL_MAX, DBL_MAX);
  ZvFCurveKeyMoverImpl mover(work, selected, everywhere, ZvExtent2<double>());
  ZvPoint2<double> translation{offset, 0.0};
  ZvDoubleArray moved;
  ZvExtent2<double> modified, box;
  mover.Update(translation, moved, modified, box, -DBL_MAX, DBL_MAX);
  mover.Finalize();
  if (temporary) {
    work.RemoveKey(start + offset, 1e-6);
    work.RemoveKey(end + offset, 1e-6);
  }
  return true;
}

// Scales the selected keys of [start, end] about the pivot as one stretch of their box would,
// the box's side away from the pivot dragged, and with ripple the keys behind it carried along.
// A negative scale mirrors them, which the stretcher allows only where nothing lies between them;
// a mirror it cannot make refuses the change. A clamped scale is the one the curve gets, as a
// drag would. `moved` tells where the keys at start and end went.
template <class Curve>
bool CFCStretchPartOfKeys(Curve& work, const ZvDoubleArray& selected, double start, double end,
                          double pivot, double scale, int moveHead,
                          ZvBaseFCurve::RegionHandle region, double& movedStart, double& movedEnd) {
  using C = ZvBaseFCurve;
  const double lo = std::min(start, end), hi = std::max(start, end);
  // The side named is dragged if it lies away from the pivot; otherwise the other side is.
  const bool right = region == C::RightHandle ? hi - pivot > 0.001 : !(pivot - lo > 0.001);
  const C::RegionHandle handle = right ? C::RightHandle : C::LeftHandle;
  const ZvExtent2<double> box(lo, -DBL_MAX, hi, DBL_MAX),
      everywhere(-DBL_MAX, -DBL_MAX, DBL_MAX, DBL_MAX);
  ZvFCurveStretcherImpl stretcher(work, box, selected, everywhere, ZvPoint2<double>{pivot, 0.0},
                                  handle, moveHead, 0.001);
  const double edge = right ? hi : lo;
  ZvPoint2<double> translation{(edge - pivot) * (scale - 1.0), 0.0}, dry = translation;
  double reached = 1.0;
  stretcher.ComputeScalingFactorAndTranslationVector(dry, reached);
  if (scale < 0.0 && !(reached < 0.0)) return false;
  ZvDoubleArray before, after;
  ZvExtent2<double> modified, stretched;
  int clamped = 0;
  if (!stretcher.Update(translation, -DBL_MAX, DBL_MAX, before, after, modified, stretched,
                        clamped)) {
    return false;
  }
  stretcher.Finalize();
  for (unsigned int i = 0; i < before.size; ++i) {
    if (before[i] == start) movedStart = after[i];
    if (before[i] == end) movedEnd = after[i];
  }
  return true;
}

// Called under the curve's lock; `valid` tells whether the edited copy may replace the curve.
template <class Curve, class Valid>
unsigned int CFCScaleAndOffsetParameters(Curve& c, double start, double end, double pivot,
                                         double scale, double offset, int moveHead, int moveTail,
                                         int region, Valid valid) {
  if (!std::isfinite(start) || !std::isfinite(end) || !std::isfinite(pivot) ||
      !std::isfinite(scale) || !std::isfinite(offset)) {
    return 0;
  }
  if (c.IsReadOnly() || c.AreAnyParametersLockedInInterval(-DBL_MAX, DBL_MAX, 0, 0)) return 0;
  if (std::fabs(scale) <= 1e-7) return 0;
  const bool scales = std::fabs(scale - 1.0) > 1e-7, offsets = std::fabs(offset) > 1e-7;
  if (!scales && !offsets) return 1;
  if (c.GetNumKeys() == 0) return 1;

  Curve work(c);  // user data included
  work.GetNearestKeyParameterInCenteredInterval(start, 1e-6);
  work.GetNearestKeyParameterInCenteredInterval(end, 1e-6);
  ZvDoubleArray selected(8);
  // An empty interval is scaled through temporary keys at its ends, taken out again afterwards.
  bool temporary = false;
  if (work.GetKeyParameters(start, end, selected, 0, 0) == 0 && scales) {
    if (!work.CreateNonModifyingKey(start, 1) || !work.CreateNonModifyingKey(end, 1)) return 0;
    temporary = true;
    if (work.GetKeyParameters(start, end, selected, 0, 0) == 0) return 0;
  }
  const bool all = selected.size == work.GetNumKeys();
  const double factor = std::fabs(scale);
  double movedStart = (start - pivot) * scale + pivot, movedEnd = (end - pivot) * scale + pivot;
  if (scales && !all) {
    if (!CFCStretchPartOfKeys(work, selected, start, end, pivot, scale, moveHead,
                              ZvBaseFCurve::RegionHandle(region), movedStart, movedEnd)) {
      return 0;
    }
  } else if (scales) {
    if (!work.ScaleParameterAxis(factor) || !work.ShiftParameters((1.0 - factor) * pivot)) {
      return 0;
    }
    if (scale < 0.0) {
      double first = 0.0, last = 0.0;
      work.GetSmallestKeyParameter(first);
      work.GetLargestKeyParameter(last);
      if (!work.MirrorParameters() || !work.ShiftParameters(2.0 * pivot - (first + last))) {
        return 0;
      }
    }
  }
  if (temporary) {
    work.RemoveKey(movedStart, 1e-6);
    work.RemoveKey(movedEnd, 1e-6);
  }
  if (scales) start = std::min(movedStart, movedEnd), end = std::max(movedStart, movedEnd);
  if (offsets) {
    if (all || (moveHead && moveTail)) {
      if (!work.ShiftParameters(offset)) return 0;
    } else if (!CFCOffsetPartOfKeys(work, start, end, offset, moveHead, moveTail)) {
      return 0;
    }
  }
  if (!valid(work)) return 0;
  return c.Set(work);
}

#endif
