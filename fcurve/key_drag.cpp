#include "fcurve/key_drag.h"

#include <algorithm>

bool CFCKeyDrag::CaptureKeys(const ZvDoubleArray& parameters) {
  m_keys = CFCMakeMoverKeys(m_curve);
  if (!m_keys || parameters.size == 0 || !m_keys->Capture(parameters)) {
    m_keys.reset();
    return false;
  }
  m_currentParameters.resize(parameters.size);
  for (unsigned int k = 0; k < parameters.size; ++k)
    m_currentParameters[k] = m_keys->StartParameter(k);
  return true;
}

void CFCKeyDrag::SaveUserData() {
  if (!m_curve.HasUserData()) return;
  m_userData.assign(m_currentParameters.size(), nullptr);
  for (unsigned int k = 0; k < m_userData.size(); ++k) {
    const CFCUserDataSet* set = m_curve.GetUserDataSet(m_currentParameters[k]);
    if (set == nullptr) continue;
    m_userDataOwned.push_back(std::make_unique<CFCUserDataSet>(*set));
    m_userData[k] = m_userDataOwned.back().get();
  }
}

void CFCKeyDrag::Relayout(const CFCKeyPlace* places, const unsigned int* ascending,
                          ZvExtent2<double>& modified) {
  // Sets of moving keys leave their old places before any arrives, as a key may arrive where
  // another captured key was.
  for (unsigned int k = 0; k < m_userData.size(); ++k)
    if (m_userData[k] && places[k].parameter != m_currentParameters[k])
      m_curve.RemoveKeyUserData(m_currentParameters[k]);
  m_keys->Layout(places, ascending, modified);
  for (unsigned int k = 0; k < m_userData.size(); ++k)
    if (m_userData[k] && places[k].parameter != m_currentParameters[k])
      m_curve.SetUserDataSet(*m_userData[k], places[k].parameter);
  for (unsigned int k = 0; k < m_currentParameters.size(); ++k)
    m_currentParameters[k] = places[k].parameter;
}

void CFCKeyDrag::DropUserData() {
  m_userData.clear();
  m_userDataOwned.clear();
}

CFCKeyDrag::CurveEnds::CurveEnds(const ZvBaseFCurve& curve) {
  curve.GetSmallestKeyParameter(first);
  curve.GetLargestKeyParameter(last);
}

void CFCKeyDrag::CurveEnds::Widen(ZvExtent2<double>& modified, double viewStart,
                                  double viewEnd) const {
  if (modified.kind != ZvExtent2<double>::Regular) return;
  if (touchesFirst) modified.xmin = std::min(modified.xmin, viewStart);
  if (touchesLast) modified.xmax = std::max(modified.xmax, viewEnd);
}
