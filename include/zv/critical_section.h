// The recursive mutex embedded in every shared object of the library.
#ifndef ZV_CRITICAL_SECTION_H
#define ZV_CRITICAL_SECTION_H

#include <zv/api.h>

#include <pthread.h>

// Recursive on purpose: objects call their own public, locking operations while holding the lock.
// Results of the platform calls are not looked at.
class ZV_API ZvCriticalSection {
 public:
  ZvCriticalSection();
  ~ZvCriticalSection();
  ZvCriticalSection(const ZvCriticalSection&) = delete;
  ZvCriticalSection& operator=(const ZvCriticalSection&) = delete;

  void Lock() { pthread_mutex_lock(&m_mutex); }
  void Unlock() { pthread_mutex_unlock(&m_mutex); }

 private:
  pthread_mutex_t m_mutex;
  pthread_mutexattr_t m_attr;
};

#endif
