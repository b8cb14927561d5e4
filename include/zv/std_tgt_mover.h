// Interactive dragging of one tangent handle of a key of a standard curve.
//
// A cubic segment is a Bezier in (parameter, value) and must stay a function of the parameter,
// so its two handles must keep the cubic's parameter coordinate monotonic. The mover takes the
// wanted position of the handle, applies the key's direction and length locks, keeps the handle
// on its own side of the key, and then keeps the segment a function: it slides the far handle
// of the segment along its own line, or, when that cannot be done, pulls the dragged handle
// back along its line. With tangent or length continuity asked for, the key's other handle
// follows and its segment is kept a function in the same way.
//
// Coordinates are those of the curve: X the parameter, Y the value; positions are absolute.
// The curve is owned by the caller and must outlive the mover. Construction freezes the key's
// evaluated handles into its stored handles and saves the two segments of the key; every
// Update works from that saved state, so a drag is a sequence of Updates with the pointer's
// current position and no Update depends on the one before (beyond where the far handles
// were left when an Update pulls the dragged handle back).
#ifndef ZV_STD_TGT_MOVER_H
#define ZV_STD_TGT_MOVER_H

#include <zv/api.h>
#include <zv/fcurve.h>
#include <zv/point.h>
#include <zv/std_fcurve.h>

class ZvStdTgtMoverImpl;

class ZV_API ZvStdTgtMover {
 public:
  // Drags the handle on `side` of the key closest to keyParameter within `tolerance` (half
  // width of the interval searched). With no key there, or fewer than two keys, the mover is
  // invalid and every Update answers 0 without touching the curve.
  ZvStdTgtMover(ZvStdFCurve& curve, double keyParameter, ZvBaseFCurve::KeySide side,
                double tolerance);
  ~ZvStdTgtMover();
  ZvStdTgtMover(const ZvStdTgtMover&) = delete;
  ZvStdTgtMover& operator=(const ZvStdTgtMover&) = delete;

  // Moves the handle toward `handle`. `tangentContinuity` keeps the other handle of the key
  // collinear with this one, `lengthContinuity` gives it the same length; the key's locks are
  // set or cleared to match. Lengths are measured on screen, Y counted times `ratio` (the
  // view's aspect; 1 for plain lengths). The boxes of the handles before and after, and of
  // the control polygons of the touched segments, are added to `modifiedExtent` (never
  // shrunk). The first Update clears the key's FlatTangent, FlatAtExtremum and AutoTangent.
  // Result: 1 when the handle moved, and also on a read-only curve (which is left alone); 0
  // when it could not move (both locks on the key, a collapsed handle, a flat handle under a
  // lock, no valid place, an invalid mover): the curve is then as the previous Update left it.
  int Update(const ZvPoint2<double>& handle, int tangentContinuity, int lengthContinuity,
             double ratio, ZvExtent2<double>& modifiedExtent);

 private:
  ZvStdTgtMoverImpl* m_impl;
};

// For a cubic whose parameter coordinates are x0, x1, x2, x3, the interval [lo, hi] of x2 (with
// the others fixed) in which the cubic stays monotonic, slightly shrunk so that its ends are
// safely inside. 1 with the interval; 0, writing nothing, when there is none.
ZV_API int ComputeP2ValidInterval(double x0, double x1, double x3, double& lo, double& hi);
// The same for x1, with x0, x2 and x3 fixed.
ZV_API int ComputeP1ValidInterval(double x0, double x2, double x3, double& lo, double& hi);

#endif
