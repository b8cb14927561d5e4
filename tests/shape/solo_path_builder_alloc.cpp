// AddInputPoint allocates nothing once the builder has room for the stroke. The test's global
// operator new is armed to fail at the next allocation around every AddInputPoint call, and
// disarmed before the trailing samples, which may allocate (fits, the path's growth).
#include <zv/gc.h>
#include <zv/path2f.h>
#include <zv/path_builder.h>

#include <gtest/gtest.h>

#include <memory>
#include <random>
#include <vector>

#include "tests/curvemath/bezier_fit_strokes.h"
#include "tests/support/failing_allocator.h"

namespace {
// Feeds the strokes one after the other through one builder, the samples taken after every
// point. Returns the number of AddInputPoint calls that allocated.
int AllocatingCalls(ZvBasePathBuilder& builder, const std::vector<ZvPoint2fArray>& strokes) {
  int allocating = 0;
  for (const ZvPoint2fArray& stroke : strokes) {
    builder.StartSubpath(stroke[0]);
    for (unsigned int i = 1; i + 1 < stroke.size; ++i) {
      zv_test::Arm(0);
      try {
        builder.AddInputPoint(stroke[i], 0);
      } catch (const std::bad_alloc&) {
        // The builder may not be used after a failure: the call is counted and the test ends.
        zv_test::Disarm();
        return allocating + 1;
      }
      allocating += zv_test::Disarm();
      builder.GetTrailingSamples();
    }
    builder.EndSubpath(stroke[stroke.size - 1], 0);
  }
  return allocating;
}
}  // namespace

TEST(PathBuilderAllocation, AddInputPointUsesTheReservedRoom) {
  std::mt19937 rng(4);
  std::vector<ZvPoint2fArray> strokes;
  for (int s = 0; s < 5; ++s)
    strokes.push_back(PenStroke(rng, 300, 3.0, 0.3));
  ZvGC gc;
  for (int kind = 0; kind < 3; ++kind) {
    ZvPath2f path(8192);
    std::unique_ptr<ZvBasePathBuilder> builder;
    if (kind == 0) builder.reset(new ZvLinearPathBuilder(gc, &path));
    if (kind == 1) builder.reset(new ZvCubicPathBuilder(gc, &path));
    // Edges of at most 4.5 px densified to 1 px: about 3 points for each pen point.
    if (kind == 2) builder.reset(new ZvBezierFitPathBuilder(gc, &path, 32.0, 1.0, 1.0, 3));
    builder->ReserveInput(2048);
    EXPECT_EQ(AllocatingCalls(*builder, strokes), 0) << "builder kind " << kind;
  }
  // Without the reservation, the fitting builder outgrows its first 128 points in a stroke.
  ZvPath2f path(8192);
  ZvBezierFitPathBuilder fresh(gc, &path, 32.0, 1.0, 1.0, 3);
  EXPECT_GT(AllocatingCalls(fresh, strokes), 0);
}
