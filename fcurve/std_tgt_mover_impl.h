// The implementation of ZvStdTgtMover.
//
// Each side of the key is held in its own frame, in which the side's handle points toward +X:
// the right side as the curve has it, the left side mirrored in X (x -> -x) and read from the
// key outward, so that the left segment Q0 Q1 Q2 Q3 is held as -Q3, -Q2, -Q1, -Q0. The test
// that keeps a cubic a function is the same in both frames, so one algorithm serves both
// handles and both far handles.
#ifndef ZV_FCURVE_STD_TGT_MOVER_IMPL_H
#define ZV_FCURVE_STD_TGT_MOVER_IMPL_H

#include <zv/std_tgt_mover.h>

// One side of the key and the segment on it, in that side's frame.
struct ZvTgtMoverSide {
  double sign;                // +1 for the right side, -1 for the mirrored left side
  ZvPoint2<double> key;       // the key with its value on this side
  ZvPoint2<double> handle;    // the key's handle on this side, as saved
  ZvPoint2<double> far;       // the other handle of the segment, where the last Update left it
  ZvPoint2<double> farKey;    // the other key of the segment
  ZvPoint2<double> savedFar;  // `far` as saved
  double inverseFarDx;        // 1 / (savedFar.x - farKey.x), 0 when they coincide
  double dx2, dy2;            // the saved handle's squared extents
  bool hasSegment;            // a key lies beyond on this side

  ZvPoint2<double> ToFrame(const ZvPoint2<double>& p) const { return {sign * p.x, p.y}; }
  ZvPoint2<double> FromFrame(const ZvPoint2<double>& p) const { return {sign * p.x, p.y}; }
  // The saved handle's length on screen, Y counted times ratio.
  double VisualLength(double ratio) const;
};

// What becomes of a segment whose near handle moved.
enum class ZvTgtSegmentFix {
  Kept,       // valid, with the far handle saved or slid along its line into `far`
  PulledBack  // the near handle was pulled back along its line; the far handle stays
};

class ZvStdTgtMoverImpl {
 public:
  ZvStdTgtMoverImpl(ZvStdFCurve& curve, double keyParameter, ZvBaseFCurve::KeySide side,
                    double tolerance);
  int Update(const ZvPoint2<double>& handle, int tangentContinuity, int lengthContinuity,
             double ratio, ZvExtent2<double>& modifiedExtent);
  int UpdateRight(const ZvPoint2<double>& handle, int tangentContinuity, int lengthContinuity,
                  double ratio, ZvExtent2<double>& modifiedExtent);
  int UpdateLeft(const ZvPoint2<double>& handle, int tangentContinuity, int lengthContinuity,
                 double ratio, ZvExtent2<double>& modifiedExtent);

 private:
  // The drag of `dragged`'s handle to p (absolute), the other side following on request.
  int UpdateSide(ZvTgtMoverSide& dragged, ZvTgtMoverSide& other, const ZvPoint2<double>& p,
                 int tangentContinuity, int lengthContinuity, double ratio,
                 ZvExtent2<double>& modifiedExtent);
  // The wanted position (frame of s) under the key's locks and flat constraints, kept on its
  // side of the key. false when the key's constraints forbid any move.
  bool ConstrainHandle(const ZvTgtMoverSide& s, unsigned short flags, const ZvPoint2<double>& p,
                       double ratio, ZvPoint2<double>& out) const;
  // The key's stored handle on the side, in its frame.
  ZvPoint2<double> CurrentHandle(const ZvTgtMoverSide& s) const;
  // Writes a side's handle and far handle, recording old and new positions in the extent.
  void WriteSide(const ZvTgtMoverSide& s, const ZvPoint2<double>& handle,
                 ZvExtent2<double>& modifiedExtent);
  void UpdateContinuityFlags(int tangentContinuity, int lengthContinuity, double ratio);

  ZvStdFCurve* m_curve;
  ZvTgtMoverSide m_right;
  ZvTgtMoverSide m_left;
  double m_keyParameter;
  unsigned int m_index;
  ZvBaseFCurve::KeySide m_side;
  bool m_valid;
  bool m_firstUpdate;
};

// The length of v on screen, Y counted times ratio, and v scaled to a length on screen.
double ZvTgtMover_ScreenLength(const ZvPoint2<double>& v, double ratio);
ZvPoint2<double> ZvTgtMover_WithScreenLength(const ZvPoint2<double>& v, double length,
                                             double ratio);

// The other handle of the key in its own frame, from the candidate position h of `from`'s
// handle (frame of `from`): along the opposite direction with tangent continuity (its Y
// unmirrored when the key's tangents are mirror images), at the same on-screen length with
// length continuity, and otherwise as `to` saved it.
ZvPoint2<double> ZvTgtMover_OtherHandle(const ZvTgtMoverSide& from, const ZvTgtMoverSide& to,
                                        const ZvPoint2<double>& h, bool mirrored,
                                        int tangentContinuity, int lengthContinuity, double ratio);

// Keeps the segment of s a function with its near handle at `handle` (frame of s): the far
// handle goes back to where it was saved, or slides along its line (into `far`), or the near
// handle is pulled back along its line. false when none of these gives a valid segment.
bool ZvTgtMover_FixSegment(const ZvTgtMoverSide& s, ZvPoint2<double>& handle, ZvPoint2<double>& far,
                           ZvTgtSegmentFix& fix);

#endif
