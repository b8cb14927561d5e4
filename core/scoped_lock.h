// Holds a critical section for the life of a scope, so every exit path releases it.
#ifndef ZV_CORE_SCOPED_LOCK_H
#define ZV_CORE_SCOPED_LOCK_H

#include <zv/critical_section.h>

class ZvScopedLock {
 public:
  explicit ZvScopedLock(ZvCriticalSection& cs) : m_cs(cs) { m_cs.Lock(); }
  ~ZvScopedLock() { m_cs.Unlock(); }
  ZvScopedLock(const ZvScopedLock&) = delete;
  ZvScopedLock& operator=(const ZvScopedLock&) = delete;

 private:
  ZvCriticalSection& m_cs;
};

#endif
