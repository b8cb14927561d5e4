// A global allocator for test executables that fails on demand: Arm(k) makes the k-th allocation
// from now throw std::bad_alloc, once, and ForEachFailure tries every k in turn. Include this
// header in exactly one file of an executable (a solo_ test), since it replaces the process's
// operator new and delete.
#ifndef ZV_TESTS_FAILING_ALLOCATOR_H
#define ZV_TESTS_FAILING_ALLOCATOR_H

#include <gtest/gtest.h>

#include <cstdlib>
#include <new>
#include <string>

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

// Runs `op` with the k-th allocation failing, for k = 0, 1, 2, ... until a run completes without
// the failure firing. `setup` runs before each arming, so what it allocates is not counted; after
// each failed run `check(threw)` is told whether op let std::bad_alloc through, with k in the
// trace of anything it reports. Stops at a fatal test failure. Result: the number of failed runs.
template <class Setup, class Op, class Check>
int ForEachFailure(Setup&& setup, Op&& op, Check&& check) {
  for (long k = 0;; ++k) {
    setup();
    Arm(k);
    bool threw = false;
    try {
      op();
    } catch (const std::bad_alloc&) {
      threw = true;
    }
    if (!Disarm()) return static_cast<int>(k);
    SCOPED_TRACE("failing allocation " + std::to_string(k));
    check(threw);
    if (::testing::Test::HasFatalFailure()) return static_cast<int>(k);
  }
}

template <class Op, class Check>
int ForEachFailure(Op&& op, Check&& check) {
  return ForEachFailure([] {}, op, check);
}

}  // namespace zv_test

void* operator new(std::size_t n) {
  return zv_test::Allocate(n);
}
void* operator new[](std::size_t n) {
  return zv_test::Allocate(n);
}
// The non-throwing forms fail on the same count, answering null; they must be replaced too, or
// their blocks would come from another allocator than the one that frees them.
void* operator new(std::size_t n, const std::nothrow_t&) noexcept {
  try {
    return zv_test::Allocate(n);
  } catch (const std::bad_alloc&) {
    return nullptr;
  }
}
void* operator new[](std::size_t n, const std::nothrow_t&) noexcept {
  return operator new(n, std::nothrow);
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
