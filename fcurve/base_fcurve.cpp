// ZvBaseFCurve: construction, assignment, the lock and curve-level user data.
#include <zv/fcurve.h>

#include "fcurve/fcurve_lock.h"

ZvBaseFCurve::ZvBaseFCurve() : m_userData(nullptr), m_lockCount(0) {}

ZvBaseFCurve::ZvBaseFCurve(const ZvBaseFCurve& other) : m_userData(nullptr), m_lockCount(0) {
  ZvFCurveLockGuard sourceGuard(other);
  if (other.m_userData != nullptr) m_userData = new CFCUserDataStore(*other.m_userData);
}

ZvBaseFCurve& ZvBaseFCurve::operator=(const ZvBaseFCurve& other) {
  ZvFCurveLockGuard guard(*this);
  if (this == &other) return *this;
  ZvFCurveLockGuard sourceGuard(other);
  // Copy before freeing, so that a failed copy leaves the curve as it was.
  CFCUserDataStore* copy =
      other.m_userData != nullptr ? new CFCUserDataStore(*other.m_userData) : nullptr;
  delete m_userData;
  m_userData = copy;
  return *this;
}

ZvBaseFCurve::~ZvBaseFCurve() {
  delete m_userData;
}

// Only the thread holding the mutex writes the count, so a plain load and store suffice; the
// count is atomic only so that other threads may read it. This keeps the lock, which every
// evaluation takes, free of a second locked instruction.
void ZvBaseFCurve::Lock() const {
  m_lock.Lock();
  m_lockCount.store(m_lockCount.load(std::memory_order_relaxed) + 1, std::memory_order_relaxed);
}

void ZvBaseFCurve::Unlock() const {
  // Releasing a lock that nobody holds is refused rather than undefined.
  const unsigned int count = m_lockCount.load(std::memory_order_relaxed);
  if (count == 0) return;
  m_lockCount.store(count - 1, std::memory_order_relaxed);
  m_lock.Unlock();
}

unsigned int ZvBaseFCurve::GetLockCount() const {
  return m_lockCount.load(std::memory_order_relaxed);
}

CFCUserDataStore& ZvBaseFCurve::GetOrCreateUserDataStore() {
  if (m_userData == nullptr) m_userData = new CFCUserDataStore;
  return *m_userData;
}

unsigned int ZvBaseFCurve::SetFCurveUserData(const _zvUID& uid, const unsigned char* data,
                                             unsigned int size) {
  ZvFCurveLockGuard guard(*this);
  GetOrCreateUserDataStore().SetUserData(uid, data, size);
  return 1;
}

unsigned int ZvBaseFCurve::GetFCurveUserData(const _zvUID& uid, const unsigned char*& data,
                                             unsigned int& size) const {
  ZvFCurveLockGuard guard(*this);
  const CFCUserDataValue* value = m_userData != nullptr ? m_userData->FindUserData(uid) : nullptr;
  if (value == nullptr) return 0;
  data = value->GetData();
  size = value->GetSize();
  return 1;
}

unsigned int ZvBaseFCurve::RemoveFCurveUserData(const _zvUID& uid) {
  ZvFCurveLockGuard guard(*this);
  return m_userData != nullptr ? m_userData->RemoveUserData(uid) : 0;
}

unsigned int ZvBaseFCurve::HasUserData() const {
  ZvFCurveLockGuard guard(*this);
  return m_userData != nullptr ? 1 : 0;
}

unsigned int ZvBaseFCurve::ExchangeUserData(ZvBaseFCurve& other) {
  ZvFCurveLockGuard guard(*this);
  ZvFCurveLockGuard otherGuard(other);
  CFCUserDataStore* mine = m_userData;
  m_userData = other.m_userData;
  other.m_userData = mine;
  return 1;
}
