// Evaluation of the keyed curves must not allocate: a global operator new that counts while a
// flag is up.
#include <gtest/gtest.h>

#include <zv/raw_fcurve.h>
#include <zv/std_fcurve.h>
#include <zv/step_fcurve.h>

#include <atomic>
#include <cstdlib>
#include <new>

namespace {
std::atomic<bool> g_counting{false};
std::atomic<long> g_allocations{0};
}  // namespace

// This file replaces the global allocator with malloc and free; g++ cannot see that the pair
// matches once the replacement is inlined.
#if defined(__GNUC__) && !defined(__clang__)
#pragma GCC diagnostic ignored "-Wmismatched-new-delete"
#endif

void* operator new(std::size_t size) {
  if (g_counting) ++g_allocations;
  void* p = std::malloc(size ? size : 1);
  if (p == nullptr) throw std::bad_alloc();
  return p;
}
void operator delete(void* p) noexcept {
  std::free(p);
}
void operator delete(void* p, std::size_t) noexcept {
  std::free(p);
}

namespace {

TEST(StdCurveNoAlloc, TheCounterSeesLibraryAllocations) {
  g_allocations = 0;
  g_counting = true;
  {
    ZvStdFCurve curve;
    curve.CreateKey(0.0, 1.0);
  }
  g_counting = false;
  EXPECT_GT(g_allocations.load(), 0);
  g_allocations = 0;
}

TEST(StdCurveNoAlloc, EvaluationAllocatesNothing) {
  ZvStdFCurve curve;
  for (int i = 0; i < 1000; ++i)
    curve.CreateKey(i * 0.01, (i * 37 % 101) * 0.1);
  double at = 5.0;
  curve.SetConstraint(at, ZvBaseFCurve::AutoTangent, 1, 0.0);
  curve.CreateKey(7.0, 1.0, ZvBaseFCurve::LinearSegment, ZvBaseFCurve::ConstantSegment);
  double sum = 0.0;
  g_counting = true;
  for (int method = 1; method <= 4; ++method) {
    curve.SetExtrapolationMethod(static_cast<ZvBaseFCurve::ExtrapolationMethod>(method));
    for (int i = 0; i < 20000; ++i) {
      const double t = -3.0 + i * 0.0008;
      sum += curve.Eval(t, 1) + curve.EvalLeft(t, 0);
      sum += curve.Eval((i * 7919 % 20000) * 0.0008 - 3.0, 0);
    }
  }
  g_counting = false;
  EXPECT_EQ(g_allocations.load(), 0);
  EXPECT_TRUE(sum == sum);
}

// Sequential and scattered evaluation of the single-value kinds, under every method they take.
TEST(SingleValueCurveNoAlloc, EvaluationAllocatesNothing) {
  ZvRawFCurve raw;
  ZvIntegerFCurve steps;
  for (int i = 0; i < 1000; ++i) {
    raw.CreateKey(i * 0.01, (i * 37 % 101) * 0.1);
    steps.CreateKey(i * 0.01, i * 37 % 101);
  }
  double sum = 0.0;
  g_counting = true;
  for (int method = 1; method <= 4; ++method) {
    raw.SetExtrapolationMethod(static_cast<ZvBaseFCurve::ExtrapolationMethod>(method));
    steps.SetExtrapolationMethod(static_cast<ZvBaseFCurve::ExtrapolationMethod>(method));
    for (int i = 0; i < 20000; ++i) {
      const double t = -3.0 + i * 0.0008, scattered = (i * 7919 % 20000) * 0.0008 - 3.0;
      sum += raw.Eval(t, 1) + raw.Eval(scattered, 0) + steps.Eval(t, 0) + steps.Eval(scattered, 0);
    }
  }
  g_counting = false;
  EXPECT_EQ(g_allocations.load(), 0);
  EXPECT_TRUE(sum == sum);
}

}  // namespace
