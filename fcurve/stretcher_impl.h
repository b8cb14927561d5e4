// The state of one stretch of keys: which keys move and how each one's place depends on the
// scale, the range of scales no rule forbids, and the layouts of CFCKeyDrag.
//
// Every moved coordinate is start + (scale - 1) * slope: a key scaled about the pivot has its
// distance from the pivot as slope, a key a ripple carries the distance of the box side it
// follows. Each rule (a key neither passing nor nearing an unmoved key, keys staying apart and
// inside the bounds) is then a bound on the scale, and all the rules together one interval of
// scales on each side of zero, found once at construction.
#ifndef ZV_FCURVE_STRETCHER_IMPL_H
#define ZV_FCURVE_STRETCHER_IMPL_H

#include <zv/fcurve.h>

#include "fcurve/key_drag.h"

#include <vector>

class ZvFCurveStretcherImpl : private CFCKeyDrag {
 public:
  ZvFCurveStretcherImpl(ZvBaseFCurve& curve, const ZvExtent2<double>& box,
                        const ZvDoubleArray& selectedParameters, const ZvExtent2<double>& bounds,
                        const ZvPoint2<double>& pivot, ZvBaseFCurve::RegionHandle handle,
                        int ripple, double minimumScale);

  int Update(ZvPoint2<double>& translation, double viewStart, double viewEnd,
             ZvDoubleArray& oldParameters, ZvDoubleArray& newParameters,
             ZvExtent2<double>& modifiedExtent, ZvExtent2<double>& boxExtent, int& clamped);
  int ComputeScalingFactorAndTranslationVector(ZvPoint2<double>& translation, double& scale);
  int Finalize();

 private:
  // A coordinate that follows the scale: start + (scale - 1) * slope.
  struct Follow {
    double start, slope;
    double At(double scale) const { return start + (scale - 1.0) * slope; }
  };
  struct Moved {
    Follow parameter, left, right;
    bool scaled;                   // in the box, scaled about the pivot (parameter handles)
    bool leftScaled, rightScaled;  // each value scaled about the pivot (value handles)
  };
  // Scales allowed on one side of zero; empty when lo > hi.
  struct Range {
    double lo, hi;
    bool Holds(double s) const { return lo <= s && s <= hi; }
  };
  // a + b * scale >= c
  struct Bound {
    double a, b, c;
  };

  bool InParameter() const {
    return m_handle == ZvBaseFCurve::LeftHandle || m_handle == ZvBaseFCurve::RightHandle;
  }
  bool Gather(const ZvDoubleArray& selected);
  bool GatherParameters(const std::vector<double>& keys, const std::vector<char>& selected);
  bool GatherValues(const std::vector<double>& keys, const std::vector<char>& selected);
  Follow Carried(double v, double low, double high, double pivot) const;
  void FindScaleRanges();
  static Range Solve(const std::vector<Bound>& bounds, double lo, double hi);
  int ClampScale(ZvPoint2<double>& translation, double& scale) const;

  ZvExtent2<double> m_box, m_bounds;
  ZvPoint2<double> m_pivot;
  ZvBaseFCurve::RegionHandle m_handle;
  int m_kind;
  bool m_ripple;
  bool m_offEdge = false;  // the pivot is off the side opposite the handle
  bool m_mirrorable = false;
  bool m_active = false;
  double m_minimumScale;
  double m_range = 0;       // the dragged side's distance from the pivot
  double m_reciprocal = 0;  // of the box's size along the stretch
  double m_margin;          // 0.001 in parameter, 1e-6 in value
  std::vector<Moved> m_moved;
  std::vector<unsigned int> m_ascending;
  Range m_positive{1, 1}, m_negative{1, 0};
};

#endif
