// The key records a drag works on, kept apart from the drag's rules: the rules (states, locks,
// collisions, clamps) are told once in ZvFCurveKeyMoverImpl for every kind, and this layer
// saves the records of a store at the start of a drag and lays them out again at each Update.
//
// Records are copied whole (flags, handles, segment kind), so a key that is moved and moved
// back is the same key bit for bit. The number of keys never changes during a drag, so a
// layout writes the store's arrays in place, and only where something changed: the stretches
// between each moved key's last place and its new one, and their neighbours. A drag of a few
// keys on a long curve costs what those keys cost, not what the curve does.
#ifndef ZV_FCURVE_KEY_MOVER_KEYS_H
#define ZV_FCURVE_KEY_MOVER_KEYS_H

#include <zv/arrays.h>
#include <zv/point.h>

#include <climits>
#include <cmath>
#include <memory>

class ZvBaseFCurve;

// An integer key keeps the whole part of a moved value; a value that missed a whole number by
// rounding alone is that number, so that a drag by whole units lands on whole units.
inline int CFCWholeKeyValue(double v) {
  const double near = std::round(v);
  if (std::fabs(v - near) <= 1e-9) v = near;
  if (!(v > INT_MIN)) return INT_MIN;
  if (!(v < INT_MAX)) return INT_MAX;
  return static_cast<int>(v);
}

// Where one captured key goes. Values are in the curve's units (degrees for a rotation
// component); kinds with one value per key take `value`. A Bezier key's handles keep their offset
// from the key, scaled along the parameter by `handleScaleX` and in value by the scale of their own
// side; a negative `handleScaleX` turns the key round, so its left handle becomes its right one.
struct CFCKeyPlace {
  double parameter;
  double value;      // the right value
  double leftValue;  // Bezier keys only
  double handleScaleX;
  double leftHandleScaleY;
  double rightHandleScaleY;
};

class CFCMoverKeys {
 public:
  virtual ~CFCMoverKeys() = default;

  // Saves the start of the drag; false when a parameter is not a key (within 1e-15) or names a
  // key twice.
  virtual bool Capture(const ZvDoubleArray& selected) = 0;
  virtual bool ReadOnly() const = 0;
  virtual unsigned int NumKeys() const = 0;
  // Of the selected key i, in the order of the selection, at the start of the drag.
  virtual double StartParameter(unsigned int i) const = 0;
  virtual double StartValue(unsigned int i) const = 0;      // the right value
  virtual double StartLeftValue(unsigned int i) const = 0;  // the same but for Bezier keys
  virtual unsigned short StartFlags(unsigned int i) const = 0;
  // Is an unmoved key within `tolerance` of t?
  virtual bool UnmovedKeyNear(double t, double tolerance) const = 0;
  // The parameters of the nearest unmoved keys strictly below and above t; minus and plus
  // infinity where there is none.
  virtual void UnmovedAround(double t, double& below, double& above) const = 0;
  // Lays the keys out: selected key i at places[i], `ascending` the selected keys ordered by new
  // parameter. The parameters must keep every key apart. `modified` is widened by the moved keys
  // before and after, and by their neighbours on both occasions.
  virtual void Layout(const CFCKeyPlace* places, const unsigned int* ascending,
                      ZvExtent2<double>& modified) = 0;
};

// The records of the curve's own kind, or null for a kind that cannot be dragged.
std::unique_ptr<CFCMoverKeys> CFCMakeMoverKeys(ZvBaseFCurve& curve);

#endif
