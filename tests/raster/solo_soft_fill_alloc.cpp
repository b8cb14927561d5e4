// The soft fill's memory: its table of the raster plus margin is taken once per call, and a
// failed allocation at any point lets std::bad_alloc through with nothing kept (leak detection
// under AddressSanitizer) and the context's opacity as it was. A failure while making the clip
// step's mask leaves the unclipped result.
#include <zv/gc.h>
#include <zv/path2f.h>
#include <zv/rect2f.h>

#include <gtest/gtest.h>

#include "tests/support/failing_allocator.h"

namespace {
std::size_t g_tableBytes = 0;
int g_tables = 0;
void CountTables(std::size_t n) {
  if (n >= g_tableBytes) ++g_tables;
}

ZvPath2f Square(float x0, float y0, float x1, float y1) {
  return ZvPath2f(ZvRect2f({x0, y0}, {x1, y1}));
}
}  // namespace

TEST(SoftFillMemory, OneTablePerCallAndNothingKeptOnFailure) {
  const ZvPath2f square = Square(10, 10, 50, 40);
  ZvGC gc;
  gc.featherInner = 4;  // R = 4
  gc.opacity = 0.75;
  ZvRaster<float> raster(64, 48, 0);
  g_tableBytes = (64 + 8) * (48 + 8) * sizeof(double);
  zv_test::g_observer = CountTables;
  ASSERT_EQ(square.SoftFill(gc, raster, nullptr), 1);
  zv_test::g_observer = nullptr;
  EXPECT_EQ(g_tables, 1);
  const ZvRaster<float> complete(raster);

  ZvRaster<float> target(64, 48, 0);
  const auto check = [&](bool threw) {
    EXPECT_EQ(gc.opacity, 0.75);
    // Only the clip step catches its own failure: the blur is complete, merely unclipped.
    if (!threw) {
      EXPECT_GT(target.GetVal(30, 25), 0.74f);
    }
  };
  const int failures =
      zv_test::ForEachFailure([&] { target = ZvRaster<float>(64, 48, 0); },
                              [&] { square.SoftFill(gc, target, nullptr); }, check);
  EXPECT_EQ(gc.opacity, 0.75);
  for (int i = 0; i < target.GetSize(); ++i)
    ASSERT_EQ(target.GetVal(i), complete.GetVal(i));
  EXPECT_GT(failures, 3);
}
