// Tracing when memory runs out: every allocation of a trace is made to fail in turn. The
// failure must come out as std::bad_alloc with everything the trace held released (the
// sanitizer builds check for leaks), the path still well formed, and the next trace whole.
#include "tests/support/failing_allocator.h"

#include <zv/gc.h>
#include <zv/path2f.h>
#include <zv/vectorizer.h>

#include "trace_support.h"

#include <memory>

#include <gtest/gtest.h>

TEST(VectorizeAlloc, EveryFailedAllocationLeavesAWellFormedPathAndNoLeak) {
  std::mt19937 rng(3);
  ZvRaster<unsigned char> r(24, 20, 0);
  PaintShapes(r, rng, 5);
  const ZvVectorizer v(0, 0);
  ZvGC gc;
  for (int fit = 0; fit < 2; ++fit) {
    ZvPath2f whole;
    const unsigned int n = fit ? v.VectorizeAndFit(r, 1, r.GetExtent2f(), gc, whole)
                               : v.Vectorize(r, 1, r.GetExtent2f(), whole);
    ASSERT_GT(n, 0u);
    std::unique_ptr<ZvPath2f> fresh;
    const int failures =
        zv_test::ForEachFailure([&] { fresh.reset(new ZvPath2f); },
                                [&] {
                                  fit ? v.VectorizeAndFit(r, 1, r.GetExtent2f(), gc, *fresh)
                                      : v.Vectorize(r, 1, r.GetExtent2f(), *fresh);
                                },
                                [&](bool threw) {
                                  const ZvPath2f& path = *fresh;
                                  EXPECT_TRUE(threw);
                                  // What was appended before the failure is whole subpaths and
                                  // lines, or a part of one.
                                  EXPECT_LE(path.NumPoints(), whole.NumPoints());
                                  EXPECT_TRUE(path.NumPoints() == 0 || path.IsStartOfSubpath(0));
                                });
    EXPECT_EQ(fresh->NumPoints(), whole.NumPoints());
    EXPECT_GT(failures, 10) << fit;
  }
}
