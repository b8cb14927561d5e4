// The lock and the assignment of the abstract shape.
#include <zv/shape.h>

ZvShape2f::~ZvShape2f() {}

ZvShape2f& ZvShape2f::operator=(const ZvShape2f& other) {
  // Nothing to copy at this level; the locks are passed through in the two-shape order.
  Lock();
  other.Lock();
  other.Unlock();
  Unlock();
  return *this;
}

void ZvShape2f::Lock() const {
  cs.Lock();
  ++lockCount;
}

void ZvShape2f::Unlock() const {
  --lockCount;
  cs.Unlock();
}

unsigned int ZvShape2f::GetLockCount() const {
  cs.Lock();
  const unsigned int count = lockCount;
  cs.Unlock();
  return count;
}
