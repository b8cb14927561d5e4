#include "tests/fcurve/test_fcurve.h"

#include <gtest/gtest.h>

TEST(BaseFCurve, NewCurveHasNoStoreAndNoLock) {
  TestFCurve curve;
  EXPECT_EQ(curve.HasUserData(), 0u);
  EXPECT_EQ(curve.GetLockCount(), 0u);
}
