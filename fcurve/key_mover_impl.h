// The state of one drag of keys: what was selected, where it started, where it is now, and the
// rules that decide each key's move at every Update, the same for every curve kind.
#ifndef ZV_FCURVE_KEY_MOVER_IMPL_H
#define ZV_FCURVE_KEY_MOVER_IMPL_H

#include <zv/fcurve.h>
#include <zv/fcurve_userdata.h>

#include "fcurve/key_drag.h"

#include <memory>
#include <vector>

class ZvFCurveKeyMoverImpl : private CFCKeyDrag {
 public:
  // What a key does at one Update.
  enum KeyState : unsigned char {
    Moves = 1,          // parameter and value follow the drag
    Held = 2,           // stays where it is
    ValueOnly = 4,      // parameter stays, value follows
    ParameterOnly = 5,  // parameter follows, value stays
    Initial = 6
  };
  // Index of a key that does not exist.
  static constexpr unsigned int kNoKey = 0xFFFFFFFFu;

  ZvFCurveKeyMoverImpl(ZvBaseFCurve& curve, const ZvDoubleArray& selectedParameters,
                       const ZvExtent2<double>& bounds, const ZvExtent2<double>& selectionExtent);

  void ClampTranslationVector(ZvPoint2<double>& translation) const;
  int Update(ZvPoint2<double>& translation, ZvDoubleArray& newParameters,
             ZvExtent2<double>& modifiedExtent, ZvExtent2<double>& selectionExtent,
             double viewStart, double viewEnd);
  int Finalize();

 private:
  double MovedValue(unsigned int k, double dy) const;
  void DecideStates(const ZvPoint2<double>& translation, double* parameters, double* values);
  void SeparateSelectedKeys(double* parameters);

  unsigned int m_numKeys = 0;
  ZvExtent2<double> m_selectionExtent;
  bool m_selectionExtentGiven = false;
  double m_minX, m_maxX, m_minY, m_maxY;
  bool m_bounded;
  // Selected keys of smallest and largest parameter, of largest and smallest value.
  unsigned int m_first = kNoKey, m_last = kNoKey, m_highest = kNoKey, m_lowest = kNoKey;
  // The same in left values, which differ from right values at a discontinuity.
  unsigned int m_highestLeft = kNoKey, m_lowestLeft = kNoKey;
  int m_kind;
  std::vector<double> m_currentValues;
  std::vector<unsigned char> m_state;
  std::vector<unsigned int> m_byStart;    // selected keys in rising start parameter
  std::vector<unsigned int> m_ascending;  // selected keys in rising current parameter
  bool m_allKeysSelected = false;
  bool m_canMove = false;
  bool m_someLocked = false;
};

#endif
