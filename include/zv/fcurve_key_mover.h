// Dragging a selection of keys of a function curve.
//
// A ZvFCurveKeyMover is built when a drag starts, receives the absolute translation of the drag
// at every Update, and is closed by Finalize. Every Update starts again from the keys as they
// were at construction, so a drag brought back to (0, 0) gives back the curve it started from.
// Translations are in curve units: x is the parameter (usually time), y the value (degrees for
// a rotation component).
//
// Rules of a drag:
// - The translation is first clamped so that the selection stays inside `bounds` (only its
//   minimum and maximum count; a bounds box that is not Regular clamps nothing).
// - A key whose parameter is locked keeps its parameter, a key whose value is locked keeps its
//   value; the other coordinate still follows.
// - Moving keys never land within 1e-6 of a key that does not move: the first key that would
//   stops where it was at the previous Update, and so do all keys behind it in the direction of
//   the drag, until a later translation clears the way. After every Update the keys are strictly
//   increasing in parameter.
// - A boolean key's value flips only when the drag passes half a unit towards the other value.
//   An integer key takes the whole part of its moved value (a value within 1e-9 of a whole
//   number is taken as that number).
// - Tangent handles travel with their keys. A cubic segment next to a moved key whose handles
//   would no longer make it a function of the parameter has its handles shortened along their
//   directions, for this Update only: the handles come back when the drag does.
// - Per-key user data follow their keys.
//
// - On a rotation curve the mover drags one component (degrees) of whole rotation keys: the time
//   moves the whole key, the other two angles and the spline parameters stay with it.
//
// The curve's lock is held for the whole of each call. Between construction and Finalize the
// curve must not be changed by anything else.
#ifndef ZV_FCURVE_KEY_MOVER_H
#define ZV_FCURVE_KEY_MOVER_H

#include <zv/api.h>
#include <zv/arrays.h>
#include <zv/fcurve.h>
#include <zv/point.h>

class ZvFCurveKeyMoverImpl;

class ZV_API ZvFCurveKeyMover {
 public:
  // `selectedParameters` are parameters of keys of `curve` (within 1e-15), in any order; if one
  // is not a key, or one key is named twice, the mover is inert. A non-empty `selectionExtent`
  // is the box drawn around the selection: Update hands it back moved. The curve must outlive
  // the mover.
  ZvFCurveKeyMover(ZvBaseFCurve& curve, const ZvDoubleArray& selectedParameters,
                   const ZvExtent2<double>& bounds, const ZvExtent2<double>& selectionExtent);
  ~ZvFCurveKeyMover();
  ZvFCurveKeyMover(const ZvFCurveKeyMover&) = delete;
  ZvFCurveKeyMover& operator=(const ZvFCurveKeyMover&) = delete;

  // Moves the selection by `translation` from where it was at construction; `translation` is
  // clamped in place. `newParameters` must be empty and receives each selected key's parameter,
  // in the order of the selection given at construction. `modifiedExtent` is widened (Union) by
  // what changed on screen, out to `viewStart` / `viewEnd` when an end key of the curve moved;
  // `selectionExtent` receives the moved selection box when one was given. 0 when nothing
  // changed, when `newParameters` is not empty, when viewStart > viewEnd, when the mover is
  // inert or the curve read-only; nothing is changed then.
  int Update(ZvPoint2<double>& translation, ZvDoubleArray& newParameters,
             ZvExtent2<double>& modifiedExtent, ZvExtent2<double>& selectionExtent,
             double viewStart, double viewEnd);

  // Ends the drag; the curve keeps the last Update. 0 if the mover was inert, else 1.
  int Finalize();

 private:
  ZvFCurveKeyMoverImpl* m_impl;
};

#endif
