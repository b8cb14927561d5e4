// Scaling an interval's parameters about a pivot and offsetting them, through the contract, for
// every keyed kind.
//
// The work happens on a copy, which replaces the curve only when everything succeeded and the
// copy is valid. A bulk change of part of the keys must obey the collision and clamp rules of
// an interactive drag, so it belongs to the key stretcher and the key mover; those are not part
// of this library yet, and such a change is refused with 0. When the change concerns every key
// it is a plain scale, mirror or shift of the whole curve, and is done here.
#ifndef ZV_FCURVE_CFC_SCALE_OFFSET_H
#define ZV_FCURVE_CFC_SCALE_OFFSET_H

#include <zv/fcurve.h>

#include <cfloat>
#include <cmath>

// Called under the curve's lock; `valid` tells whether the edited copy may replace the curve.
template <class Curve, class Valid>
unsigned int CFCScaleAndOffsetParameters(Curve& c, double start, double end, double pivot,
                                         double scale, double offset, int moveHead, int moveTail,
                                         Valid valid) {
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
  if (work.GetKeyParameters(start, end, selected, 0, 0) == 0) {
    // Temporary keys would stand for the empty interval; with keys elsewhere the selection is
    // then partial, which is the stretcher's and the mover's work.
    return 0;
  }
  const bool all = selected.size == work.GetNumKeys();
  const double factor = std::fabs(scale);
  if (scales) {
    if (!all) return 0;  // the stretcher's work
    if (!work.ScaleParameterAxis(factor) || !work.ShiftParameters((1.0 - factor) * pivot)) {
      return 0;
    }
  }
  if (scale < 0.0) {
    if (!all) return 0;  // mirroring a section and putting it back needs the stretcher too
    double first = 0.0, last = 0.0;
    work.GetSmallestKeyParameter(first);
    work.GetLargestKeyParameter(last);
    if (!work.MirrorParameters() || !work.ShiftParameters(2.0 * pivot - (first + last))) {
      return 0;
    }
  }
  if (offsets) {
    if (!all && !(moveHead && moveTail)) return 0;  // the mover's work
    if (!work.ShiftParameters(offset)) return 0;
  }
  if (!valid(work)) return 0;
  return c.Set(work);
}

#endif
