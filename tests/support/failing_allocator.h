// A global allocator for test executables that fails on demand: Arm(k) makes the k-th allocation
// from now throw std::bad_alloc, once. Include this header in exactly one file of an executable
// (a solo_ test), since it replaces the process's operator new and delete.
#ifndef ZV_TESTS_FAILING_ALLOCATOR_H
#define ZV_TESTS_FAILING_ALLOCATOR_H

#include <cstdlib>
#include <new>

namespace zv_test {

inline long g_countdown = -1;  // allocations left before the failure; -1 when disarmed
inline bool g_fired = false;
inline void (*g_observer)(std::size_t) = nullptr;  // sees the size of every allocation

inline void* Allocate(std::size_t n) {
  if (g_observer) g_observer(n);
  if (g_countdown == 0) {
    g_countdown = -1;
    g_fired = true;
    throw std::bad_alloc();
  }
  if (g_countdown > 0) --g_countdown;
  if (void* p = std::malloc(n ? n : 1)) return p;
  throw std::bad_alloc();
}

// The allocation after k successful ones fails.
inline void Arm(long k) {
  g_fired = false;
  g_countdown = k;
}

// Whether the armed failure fired; disarms.
inline bool Disarm() {
  g_countdown = -1;
  return g_fired;
}

}  // namespace zv_test

void* operator new(std::size_t n) {
  return zv_test::Allocate(n);
}
void* operator new[](std::size_t n) {
  return zv_test::Allocate(n);
}
void operator delete(void* p) noexcept {
  std::free(p);
}
void operator delete[](void* p) noexcept {
  std::free(p);
}
void operator delete(void* p, std::size_t) noexcept {
  std::free(p);
}
void operator delete[](void* p, std::size_t) noexcept {
  std::free(p);
}

#endif
