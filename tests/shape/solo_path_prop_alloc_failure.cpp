// Property paths under allocation failure: the k-th allocation after arming throws, for every k
// until an operation completes without it. Readers and SetToLerpAB build aside and swap in, so a
// failure leaves the object exactly as it was; assignment keeps the geometry and drops the
// curves; Clone answers null. Under AddressSanitizer leak detection checks every failure path.
#include <gtest/gtest.h>
#include <zv/path2f_prop1d.h>

#include <functional>
#include <memory>
#include <random>
#include <vector>

#include "path_fixtures.h"
#include "path_prop_fixtures.h"
#include "tests/support/byte_blocks.h"
#include "tests/support/failing_allocator.h"

using zv_test::ForEachFailure;

namespace {}  // namespace

TEST(PathPropAllocFailure, ReadersLeaveTheObjectAsItWas) {
  std::mt19937 rng(2);
  ZvPath2fProp1d source = RandomPropPath(rng);
  while (source.GetNumPropCurves() < 2)
    source = RandomPropPath(rng);
  const std::vector<unsigned char> block = Block(source);
  ZvPath2fProp1d target = TwoLinesWithCurves();
  const std::vector<unsigned char> before = Block(target);
  unsigned int result = 0;
  const int trusted = ForEachFailure([&] { result = target.ReadFromBufferBody(block.data() + 4); },
                                     [&](bool threw) {
                                       EXPECT_TRUE(threw || result == 0);
                                       EXPECT_EQ(before, Block(target));
                                       EXPECT_EQ(0u, target.GetLockCount());
                                     });
  EXPECT_GT(trusted, 3);
  EXPECT_EQ(block, Block(target));

  // The bounded reader and the factory swallow the failure.
  ZvPath2fProp1d bounded = TwoLinesWithCurves();
  ForEachFailure([&] { result = bounded.ReadFromBuffer(block.data(), block.size()); },
                 [&](bool threw) {
                   EXPECT_FALSE(threw);
                   EXPECT_EQ(0u, result);
                   EXPECT_EQ(before, Block(bounded));
                 });
  ZvShape2f* made = nullptr;
  unsigned int consumed = 0;
  ForEachFailure([&] { made = ZvShape2f_CreateFromBuffer(block.data(), block.size(), consumed); },
                 [&](bool threw) {
                   EXPECT_FALSE(threw);
                   EXPECT_EQ(nullptr, made);
                 });
  ASSERT_NE(nullptr, made);
  EXPECT_EQ(block, Block(*made));
  delete made;
}

TEST(PathPropAllocFailure, CopiesAndBlendsFailWhole) {
  const ZvPath2fProp1d source = TwoLinesWithCurves();
  ZvPath2fProp1d target;
  ForEachFailure([&] { target = source; },
                 [&](bool threw) {
                   EXPECT_FALSE(threw);
                   EXPECT_TRUE(PropRecordsHold(target));
                 });
  EXPECT_EQ(Block(source), Block(target));
  std::unique_ptr<ZvShape2f> clone;
  ForEachFailure([&] { clone.reset(source.Clone()); },
                 [&](bool threw) {
                   EXPECT_FALSE(threw);
                   EXPECT_EQ(nullptr, clone);
                 });

  ZvPath2fProp1d b = source;
  b.Translate(P(3, 4));
  ZvPath2fProp1d blend = TwoLines();
  const std::vector<unsigned char> before = Block(blend);
  int result = 0;
  ForEachFailure([&] { result = blend.SetToLerpAB(source, b, 0.5, 1.0, 1e-3); },
                 [&](bool threw) {
                   EXPECT_TRUE(threw);
                   EXPECT_EQ(before, Block(blend));
                   EXPECT_EQ(0u, blend.GetLockCount());
                 });
  EXPECT_EQ(1, result);
}
