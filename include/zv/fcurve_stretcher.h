// Stretching a selected box of keys of a function curve by dragging one side of the box.
//
// A ZvFCurveStretcher is built when the drag starts, receives the absolute translation of the
// dragged side at every Update, and is closed by Finalize. Every Update starts again from the keys
// as they were at construction, so a drag brought back to (0, 0) gives back the curve it started
// from. Units are the curve's: x is the parameter (usually time), y the value (degrees for a
// rotation component).
//
// The selected keys in the box (parameter and one of their values inside it) scale about the
// pivot: left and right handles scale parameters, top and bottom handles scale values. The
// scale is the dragged side's new distance from the pivot over its old one; a drag past the pivot
// gives a negative scale, which mirrors the keys through it. With ripple on, keys beyond the box on
// the dragged side shift with that side (and, when the pivot is not on the opposite side, keys
// beyond that side shift with it).
//
// Rules of a stretch; a drag that breaks one is cut back, handed back changed, and flagged:
// - no key moved in parameter passes a key that does not move, nor comes nearer to it than
//   0.001 (or than it started); keys that do not move include the locked ones, so a box is never
//   shrunk past a locked key;
// - moved keys stay inside `bounds` (when it is Regular), by 0.001 in parameter, 1e-6 in value;
// - the stretched box stays larger than 0.001 in parameter (1e-6 in value): the scale's size
//   stays above 0.001 / width (1e-6 / height), and at or above `minimumScale`;
// - a mirror in parameter is allowed only when the moved keys are exactly those scaled in the box
//   and nothing lies between them: otherwise the scale stops at its smallest positive value.
// A key whose parameter is locked keeps it, a key whose value is locked keeps that. Tangent
// handles follow their key: under a parameter stretch a scaled key's handles scale along the
// parameter, under a value stretch along the value. Per-key user data follow their keys.
// A boolean curve's values cannot be stretched: top and bottom handles do nothing.
//
// The curve's lock is held for the whole of each call, and during construction. Between
// construction and Finalize the curve must not be changed by anything else.
#ifndef ZV_FCURVE_STRETCHER_H
#define ZV_FCURVE_STRETCHER_H

#include <zv/api.h>
#include <zv/arrays.h>
#include <zv/fcurve.h>
#include <zv/point.h>

class ZvFCurveStretcherImpl;

class ZV_API ZvFCurveStretcher {
 public:
  // `box` is the stretch box around the selection (Regular; at least 0.001 wide for a left or
  // right handle, 0.001 high for top or bottom); `selectedParameters` are parameters of keys
  // (within 1e-7), in any order; `pivot` is the fixed point of the scale, normally on the side
  // opposite `handle`, and must lie more than 0.001 (1e-6 in value) inside from the dragged side;
  // `minimumScale` is at least 0.001. Otherwise, or when nothing could move, the stretcher is
  // inert: every call answers 0 and changes nothing. The curve must outlive the stretcher.
  ZvFCurveStretcher(ZvBaseFCurve& curve, ZvExtent2<double>& box,
                    const ZvDoubleArray& selectedParameters, const ZvExtent2<double>& bounds,
                    const ZvPoint2<double>& pivot, ZvBaseFCurve::RegionHandle handle, int ripple,
                    double minimumScale);
  ~ZvFCurveStretcher();
  ZvFCurveStretcher(const ZvFCurveStretcher&) = delete;
  ZvFCurveStretcher& operator=(const ZvFCurveStretcher&) = delete;

  // Moves the dragged side by `translation` (its x for left and right handles, its y for top and
  // bottom) from where it was at construction. A drag that breaks a rule is cut back in place and
  // `clamped` is set to 1 (else 0). `oldParameters` and `newParameters` must be empty; they
  // receive the parameters of the keys that move (the selection and what a ripple carries),
  // before and after, both in the keys' order at the start.
  // `modifiedExtent` is widened (Union) by what changed on screen, out to `viewStart` /
  // `viewEnd` when an end key of the curve moved; `boxExtent` receives the stretched box.
  // 0, with nothing changed (translation included), when the stretcher is inert, an array is
  // not empty, viewStart > viewEnd, the curve is read-only, or the translation is not finite,
  // would scale a key's parameter or value past the double range, or would round two moving keys
  // onto one parameter; else 1.
  int Update(ZvPoint2<double>& translation, double viewStart, double viewEnd,
             ZvDoubleArray& oldParameters, ZvDoubleArray& newParameters,
             ZvExtent2<double>& modifiedExtent, ZvExtent2<double>& boxExtent, int& clamped);

  // What Update would do to `translation`, without changing the curve: cuts it back in place and
  // gives the scale. The result is the clamped flag. An inert stretcher gives (0, 0), 1.0 and 0.
  int ComputeScalingFactorAndTranslationVector(ZvPoint2<double>& translation, double& scale);

  // Ends the stretch; the curve keeps the last Update. 0 if the stretcher was inert, else 1.
  int Finalize();

 private:
  ZvFCurveStretcherImpl* m_impl;
};

#endif
