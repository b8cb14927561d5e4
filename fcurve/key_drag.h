// What every interactive tool that moves keys shares: the curve, its captured key records, each
// captured key's parameter as the last Update left it, and the key user data carried along.
// Keys are laid out anew from their start records at each Update, while user data live beside
// the curve, keyed by parameter: they are lifted off the keys that move and set down again.
#ifndef ZV_FCURVE_KEY_DRAG_H
#define ZV_FCURVE_KEY_DRAG_H

#include <zv/arrays.h>
#include <zv/fcurve.h>
#include <zv/fcurve_userdata.h>

#include "fcurve/key_mover_keys.h"

#include <memory>
#include <vector>

class CFCKeyDrag {
 protected:
  explicit CFCKeyDrag(ZvBaseFCurve& curve) : m_curve(curve) {}

  // Captures the keys at `parameters` (within 1e-15, each once); false, with nothing captured,
  // when the curve's kind cannot be dragged or a parameter names no key.
  bool CaptureKeys(const ZvDoubleArray& parameters);
  // Copies the user data of the captured keys, to carry them through the layouts.
  void SaveUserData();
  // Lays the captured keys out at `places` (`ascending` orders them by new parameter) and
  // carries their user data; the current parameters follow.
  void Relayout(const CFCKeyPlace* places, const unsigned int* ascending,
                ZvExtent2<double>& modified);
  void DropUserData();

  // Whether a layout moves the curve's first or last key, which changes what is extrapolated:
  // then the whole view beyond it is to be redrawn.
  class CurveEnds {
   public:
    explicit CurveEnds(const ZvBaseFCurve& curve);
    // A key moving from `was` to `now`.
    void Note(double was, double now) {
      touchesFirst |= was <= first || now <= first;
      touchesLast |= was >= last || now >= last;
    }
    void Widen(ZvExtent2<double>& modified, double viewStart, double viewEnd) const;

   private:
    double first = 0, last = 0;
    bool touchesFirst = false, touchesLast = false;
  };

  ZvBaseFCurve& m_curve;
  std::unique_ptr<CFCMoverKeys> m_keys;
  std::vector<double> m_currentParameters;

 private:
  std::vector<const CFCUserDataSet*> m_userData;  // null where a key had none
  std::vector<std::unique_ptr<CFCUserDataSet>> m_userDataOwned;
};

#endif
