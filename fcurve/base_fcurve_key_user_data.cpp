// ZvBaseFCurve: user data attached to keys. Sets are stored at the exact
// parameters of their keys; every entry point that takes a tolerance first
// snaps the caller's parameter onto a key.
#include <zv/fcurve.h>

#include "fcurve/fcurve_lock.h"

#include <cmath>

namespace {

// Snaps the parameter onto the nearest key within the tolerance and leaves
// the key's parameter in it; false, with the parameter untouched, when the
// curve has no key there.
bool SnapToKey(const ZvBaseFCurve& curve, double& parameter, double tolerance) {
  if (curve.GetNumKeys() == 0) return false;
  double key = parameter;
  if (!curve.GetNearestKeyParameterInCenteredInterval(key, tolerance) || std::isnan(key))
    return false;
  parameter = key;
  return true;
}

}  // namespace

unsigned int ZvBaseFCurve::SetKeyUserData(double& parameter, const _zvUID& uid,
                                          const unsigned char* data, unsigned int size,
                                          double tolerance) {
  ZvFCurveLockGuard guard(*this);
  if (!SnapToKey(*this, parameter, tolerance)) return 0;
  GetOrCreateUserDataStore().GetOrCreateKeySet(parameter)->SetUserData(uid, data, size);
  return 1;
}

unsigned int ZvBaseFCurve::GetKeyUserData(double& parameter, const _zvUID& uid,
                                          const unsigned char*& data, unsigned int& size,
                                          double tolerance) const {
  ZvFCurveLockGuard guard(*this);
  if (!SnapToKey(*this, parameter, tolerance)) return 0;
  const CFCUserDataSet* set = m_userData != nullptr ? m_userData->FindKeySet(parameter) : nullptr;
  const CFCUserDataValue* value = set != nullptr ? set->FindUserData(uid) : nullptr;
  if (value == nullptr) return 0;
  data = value->GetData();
  size = value->GetSize();
  return 1;
}

unsigned int ZvBaseFCurve::RemoveKeyUserData(double& parameter, const _zvUID& uid,
                                             double tolerance) {
  ZvFCurveLockGuard guard(*this);
  if (!SnapToKey(*this, parameter, tolerance)) return 0;
  return m_userData != nullptr ? m_userData->RemoveKeyUserData(parameter, uid) : 0;
}

unsigned int ZvBaseFCurve::RemoveKeyUserData(double parameter) {
  ZvFCurveLockGuard guard(*this);
  return m_userData != nullptr ? m_userData->RemoveKeySet(parameter) : 0;
}

unsigned int ZvBaseFCurve::HasUserData(double parameter) const {
  ZvFCurveLockGuard guard(*this);
  if (GetNumKeys() == 0 || m_userData == nullptr) return 0;
  return m_userData->FindKeySet(parameter) != nullptr ? 1 : 0;
}

unsigned int ZvBaseFCurve::CopyKeyUserData(const ZvBaseFCurve& source, double sourceParameter,
                                           double parameter) {
  ZvFCurveLockGuard guard(*this);
  ZvFCurveLockGuard sourceGuard(source);
  const CFCUserDataSet* set =
      source.m_userData != nullptr ? source.m_userData->FindKeySet(sourceParameter) : nullptr;
  if (set == nullptr || set->IsEmpty() || std::isnan(parameter)) return 1;
  GetOrCreateUserDataStore().GetOrCreateKeySet(parameter)->MergeUserData(*set);
  return 1;
}

const CFCUserDataSet* ZvBaseFCurve::GetUserDataSet(double parameter) const {
  ZvFCurveLockGuard guard(*this);
  return m_userData != nullptr ? m_userData->FindKeySet(parameter) : nullptr;
}

unsigned int ZvBaseFCurve::SetUserDataSet(const CFCUserDataSet& set, double parameter) {
  if (std::isnan(parameter)) return 0;
  ZvFCurveLockGuard guard(*this);
  if (set.IsEmpty() && m_userData == nullptr) return 1;
  GetOrCreateUserDataStore().SetKeySet(parameter, set);
  return 1;
}

unsigned int ZvBaseFCurve::RemoveAllKeyUserData() {
  ZvFCurveLockGuard guard(*this);
  if (m_userData != nullptr) m_userData->RemoveAllKeySets();
  return 1;
}

unsigned int ZvBaseFCurve::TranslateAllKeyUserData(double delta) {
  if (!std::isfinite(delta)) return 0;
  ZvFCurveLockGuard guard(*this);
  return m_userData != nullptr ? m_userData->TranslateKeySets(delta) : 1;
}

unsigned int ZvBaseFCurve::ScaleAllKeyUserData(double factor) {
  if (!std::isfinite(factor)) return 0;
  ZvFCurveLockGuard guard(*this);
  return m_userData != nullptr ? m_userData->ScaleKeySets(factor) : 1;
}

unsigned int ZvBaseFCurve::MoveKeyUserDataTail(const ZvDoubleArray& oldParameters,
                                               const ZvDoubleArray& newParameters) {
  // Callers always pass at least one key. The empty list answers 1 and
  // leaves the curve locked once more: the long-standing behaviour of this
  // entry, which a caller that passes one must pair with an Unlock.
  if (oldParameters.size == 0) {
    Lock();
    return 1;
  }
  ZvFCurveLockGuard guard(*this);
  if (newParameters.size != oldParameters.size) return 0;
  if (m_userData == nullptr) return 1;
  return m_userData->MoveKeySetTail(oldParameters.data, newParameters.data, oldParameters.size);
}
