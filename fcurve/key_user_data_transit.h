// Key user data taken out of a curve while its keys are rebuilt, and given back to the rebuilt
// keys: what turning a curve about the middle of its keys needs, whatever its kind of key.
#ifndef ZV_FCURVE_KEY_USER_DATA_TRANSIT_H
#define ZV_FCURVE_KEY_USER_DATA_TRANSIT_H

#include <zv/arrays.h>
#include <zv/fcurve.h>

class CFCKeyUserDataInTransit {
 public:
  // Copies the sets of the n keys, parameterAt(i) giving key i's parameter.
  template <class ParameterAt>
  CFCKeyUserDataInTransit(ZvBaseFCurve& curve, unsigned int n, ParameterAt parameterAt)
      : m_curve(curve), m_sets(n) {
    for (unsigned int i = 0; i < n; ++i) {
      const CFCUserDataSet* set = curve.GetUserDataSet(parameterAt(i));
      m_sets.Add(set ? new CFCUserDataSet(*set) : nullptr);
    }
  }
  ~CFCKeyUserDataInTransit() {
    for (unsigned int i = 0; i < m_sets.size; ++i)
      delete m_sets[i];
  }
  CFCKeyUserDataInTransit(const CFCKeyUserDataInTransit&) = delete;
  CFCKeyUserDataInTransit& operator=(const CFCKeyUserDataInTransit&) = delete;

  // Replaces the curve's key user data: the set of old key i goes to new key n - 1 - i.
  template <class ParameterAt>
  void GiveBackReversed(ParameterAt parameterAt) {
    m_curve.RemoveAllKeyUserData();
    const unsigned int n = m_sets.size;
    for (unsigned int j = 0; j < n; ++j) {
      const CFCUserDataSet* set = m_sets[n - 1 - j];
      if (set) m_curve.SetUserDataSet(*set, parameterAt(j));
    }
  }

 private:
  ZvBaseFCurve& m_curve;
  ZvDynArray<CFCUserDataSet*> m_sets;
};

#endif
