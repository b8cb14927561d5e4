#include <zv/fcurve_userdata.h>

#include "fcurve/key_params.h"

#include <cmath>
#include <memory>

CFCUserDataStore::CFCUserDataStore() {}

CFCUserDataStore::CFCUserDataStore(const CFCUserDataStore& other) : CFCUserDataSet(other) {
  try {
    for (const auto& entry : other.m_keySets)
      m_keySets.emplace_hint(m_keySets.end(), entry.first, new CFCUserDataSet(*entry.second));
  } catch (...) {
    RemoveAllKeySets();
    throw;
  }
}

CFCUserDataStore& CFCUserDataStore::operator=(const CFCUserDataStore& other) {
  if (this != &other) {
    CFCUserDataStore copy(other);
    CFCUserDataSet::operator=(other);
    m_keySets.swap(copy.m_keySets);
  }
  return *this;
}

CFCUserDataStore::~CFCUserDataStore() {
  RemoveAllKeySets();
}

unsigned int CFCUserDataStore::GetKeySetCount() const {
  return static_cast<unsigned int>(m_keySets.size());
}

CFCUserDataStore::key_const_iterator CFCUserDataStore::key_begin() const {
  return m_keySets.begin();
}

CFCUserDataStore::key_const_iterator CFCUserDataStore::key_end() const {
  return m_keySets.end();
}

CFCUserDataSet* CFCUserDataStore::FindKeySet(double parameter) const {
  // A NaN is equivalent to every key under the map's order: keep it out.
  if (std::isnan(parameter)) return nullptr;
  const KeySetMap::const_iterator it = m_keySets.find(parameter);
  return it == m_keySets.end() ? nullptr : it->second;
}

CFCUserDataSet* CFCUserDataStore::GetOrCreateKeySet(double parameter) {
  if (std::isnan(parameter)) return nullptr;
  const KeySetMap::iterator it = m_keySets.lower_bound(parameter);
  if (it != m_keySets.end() && !(parameter < it->first)) return it->second;
  std::unique_ptr<CFCUserDataSet> set(new CFCUserDataSet);
  m_keySets.emplace_hint(it, parameter, set.get());
  return set.release();
}

void CFCUserDataStore::SetKeySet(double parameter, const CFCUserDataSet& set) {
  if (std::isnan(parameter)) return;
  if (set.IsEmpty()) {
    // No entry is kept without items: an entry means "this key has data".
    RemoveKeySet(parameter);
    return;
  }
  CFCUserDataSet* existing = FindKeySet(parameter);
  if (existing == &set) return;
  std::unique_ptr<CFCUserDataSet> copy(new CFCUserDataSet(set));
  if (existing != nullptr) {
    m_keySets[parameter] = copy.release();
    delete existing;
  } else {
    m_keySets.emplace(parameter, copy.get());
    copy.release();
  }
}

void CFCUserDataStore::AdoptKeySet(double parameter, CFCUserDataSet* set) {
  std::unique_ptr<CFCUserDataSet> owned(set);
  if (owned == nullptr || std::isnan(parameter)) return;
  const KeySetMap::iterator it = m_keySets.lower_bound(parameter);
  if (it != m_keySets.end() && !(parameter < it->first)) {
    it->second->MergeUserData(*owned);
    return;
  }
  m_keySets.emplace_hint(it, parameter, owned.get());
  owned.release();
}

unsigned int CFCUserDataStore::RemoveKeySet(double parameter) {
  if (std::isnan(parameter)) return 0;
  const KeySetMap::iterator it = m_keySets.find(parameter);
  if (it == m_keySets.end()) return 0;
  delete it->second;
  m_keySets.erase(it);
  return 1;
}

unsigned int CFCUserDataStore::RemoveKeyUserData(double parameter, const _zvUID& uid) {
  if (std::isnan(parameter)) return 0;
  const KeySetMap::iterator it = m_keySets.find(parameter);
  if (it == m_keySets.end() || !it->second->RemoveUserData(uid)) return 0;
  if (it->second->IsEmpty()) {
    delete it->second;
    m_keySets.erase(it);
  }
  return 1;
}

void CFCUserDataStore::RemoveAllKeySets() {
  for (auto& entry : m_keySets)
    delete entry.second;
  m_keySets.clear();
}

template <class F>
void CFCUserDataStore::RebuildKeySets(F newParameter) {
  // The sets change hands, they are not copied. Parameters that become equal
  // (a factor of 0, rounding) share one set rather than lose one.
  KeySetMap old;
  old.swap(m_keySets);
  try {
    for (KeySetMap::iterator it = old.begin(); it != old.end(); it = old.erase(it)) {
      CFCUserDataSet* set = it->second;
      it->second = nullptr;
      AdoptKeySet(newParameter(it->first), set);
    }
  } catch (...) {
    for (auto& entry : old)
      delete entry.second;
    throw;
  }
}

unsigned int CFCUserDataStore::TranslateKeySets(double delta) {
  if (!std::isfinite(delta)) return 0;
  RebuildKeySets([delta](double parameter) { return parameter + delta; });
  return 1;
}

unsigned int CFCUserDataStore::ScaleKeySets(double factor) {
  if (!std::isfinite(factor)) return 0;
  RebuildKeySets([factor](double parameter) { return parameter * factor; });
  return 1;
}

unsigned int CFCUserDataStore::MoveKeySetTail(const double* oldParameters,
                                              const double* newParameters, unsigned int count) {
  for (unsigned int i = 0; i < count; ++i)
    if (std::isnan(oldParameters[i]) || std::isnan(newParameters[i])) return 0;

  // Take the sets from the first old parameter to the end out of the map.
  const KeySetMap::iterator from = m_keySets.lower_bound(oldParameters[0]);
  KeySetMap moved(from, m_keySets.end());
  m_keySets.erase(from, m_keySets.end());

  // The last set that stays, if any: when the first moved set arrives on its
  // key (two keys that became one), the two sets become one.
  CFCUserDataSet* lastStaying = nullptr;
  double lastStayingParameter = 0.0;
  if (!m_keySets.empty()) {
    lastStayingParameter = m_keySets.rbegin()->first;
    lastStaying = m_keySets.rbegin()->second;
  }

  // Both lists ascend, so each moved set finds its old parameter by walking
  // forward. A set that the lists do not name stays where it is.
  unsigned int j = 0;
  bool first = true;
  try {
    for (KeySetMap::iterator it = moved.begin(); it != moved.end(); it = moved.erase(it)) {
      const double oldParameter = it->first;
      std::unique_ptr<CFCUserDataSet> set(it->second);
      it->second = nullptr;
      while (j < count && oldParameters[j] < oldParameter &&
             !zvIsSameParameter(oldParameters[j], oldParameter))
        ++j;
      double target = oldParameter;
      if (j < count && zvIsSameParameter(oldParameters[j], oldParameter)) target = newParameters[j];
      if (first && lastStaying != nullptr && zvIsSameParameter(lastStayingParameter, target)) {
        lastStaying->MergeUserData(*set);
      } else {
        AdoptKeySet(target, set.release());
      }
      first = false;
    }
  } catch (...) {
    for (auto& entry : moved)
      delete entry.second;
    throw;
  }
  return 1;
}
