// Curve blocks under allocation failure. A test-only global operator new throws on the k-th
// allocation after it is armed; each read runs for k = 0, 1, 2, ... until it completes without
// the failure firing. The body reader lets the failure through and leaves its curve as it was;
// the factories catch it and answer null. Under AddressSanitizer, leak detection catches anything
// a failure leaves behind.
#include <zv/std_fcurve.h>

#include <gtest/gtest.h>

#include <functional>
#include <memory>

#include "tests/fcurve/curve_blocks.h"
#include "tests/support/failing_allocator.h"

using zv_test::ForEachFailure;

TEST(FCurveBufferAllocFailure, BodyReaderThrowsAndChangesNothing) {
  for (const auto& seed : SeedBlocks()) {
    SCOPED_TRACE(seed.first);
    const unsigned char* body = seed.second.data() + 4;
    // A curve of the block's kind, holding what the block holds, reads the block again.
    std::unique_ptr<ZvBaseFCurve> target;
    const auto fresh = [&] {
      ZvBaseFCurve* made = nullptr;
      ASSERT_EQ(ZvBaseFCurve_CreateFromBufferBody(body, &made), 1u);
      target.reset(made);
      // Unlike the block, so that a half-done read would show.
      target->SetFCurveUserData(MakeUID(99), TextBytes("other"), 5);
    };
    fresh();
    const Bytes before = Block(*target);
    unsigned int read = 0;
    const int failures = ForEachFailure([&] { read = target->ReadFromBufferBody(body); },
                                        [&](bool threw) {
                                          // An item's bytes lost while copying are dropped in
                                          // silence; anything else throws.
                                          if (threw) {
                                            EXPECT_EQ(Block(*target), before);
                                          }
                                          EXPECT_EQ(target->GetLockCount(), 0u);
                                          fresh();
                                        });
    EXPECT_GT(failures, 0);
    EXPECT_NE(read, 0u);
  }
}

TEST(FCurveBufferAllocFailure, FactoriesAnswerNull) {
  for (const auto& seed : SeedBlocks()) {
    SCOPED_TRACE(seed.first);
    const Bytes& block = seed.second;
    ZvBaseFCurve* out = nullptr;
    unsigned int result = 0;
    int failures =
        ForEachFailure([&] { result = ZvBaseFCurve_CreateFromBufferBody(block.data() + 4, &out); },
                       [&](bool threw) {
                         EXPECT_FALSE(threw);
                         if (result == 0) {
                           EXPECT_EQ(out, nullptr);
                         }
                         delete out;
                         out = nullptr;
                       });
    EXPECT_GT(failures, 0);
    ASSERT_EQ(result, 1u);
    const std::unique_ptr<ZvBaseFCurve> reference(out);

    ZvBaseFCurve* curve = nullptr;
    unsigned int consumed = 0;
    failures = ForEachFailure(
        [&] { curve = ZvBaseFCurve_CreateFromBuffer(block.data(), block.size(), consumed); },
        [&](bool threw) {
          EXPECT_FALSE(threw);
          EXPECT_EQ(consumed, curve ? block.size() : 0u);
          delete curve;
          curve = nullptr;
        });
    EXPECT_GT(failures, 0);
    ASSERT_NE(curve, nullptr);
    EXPECT_EQ(Block(*curve), Block(*reference));
    delete curve;
  }
}
