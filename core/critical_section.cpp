#include <zv/critical_section.h>

ZvCriticalSection::ZvCriticalSection() {
  pthread_mutexattr_init(&m_attr);
  pthread_mutexattr_settype(&m_attr, PTHREAD_MUTEX_RECURSIVE);
  pthread_mutex_init(&m_mutex, &m_attr);
}

ZvCriticalSection::~ZvCriticalSection() {
  pthread_mutex_destroy(&m_mutex);
  pthread_mutexattr_destroy(&m_attr);
}
