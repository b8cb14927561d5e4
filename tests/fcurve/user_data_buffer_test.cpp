#include "tests/fcurve/test_fcurve.h"
#include "tests/fcurve/uid.h"

#include <gtest/gtest.h>

#include <cstring>
#include <limits>
#include <vector>

namespace {

std::vector<unsigned char> Write(const ZvBaseFCurve& curve) {
  std::vector<unsigned char> buffer(curve.GetUserDataBufferSize(), 0xEE);
  EXPECT_EQ(curve.WriteUserDataToBuffer(buffer.data()), buffer.size());
  return buffer;
}

unsigned int U32(const std::vector<unsigned char>& b, size_t at) {
  return b[at] | b[at + 1] << 8 | b[at + 2] << 16 | static_cast<unsigned int>(b[at + 3]) << 24;
}

}  // namespace

TEST(UserDataBuffer, BlocksWithoutAndWithAnEmptyStore) {
  TestFCurve curve({1.0});
  std::vector<unsigned char> none = Write(curve);
  ASSERT_EQ(none.size(), 9u);
  EXPECT_EQ(U32(none, 0), 5u);
  EXPECT_EQ(U32(none, 4), 256u);
  EXPECT_EQ(none[8], 0);

  curve.SetFCurveUserData(MakeUID(1), TextBytes("a"), 1);
  curve.RemoveFCurveUserData(MakeUID(1));
  std::vector<unsigned char> empty = Write(curve);
  ASSERT_EQ(empty.size(), 11u);
  EXPECT_EQ(U32(empty, 0), 7u);
  EXPECT_EQ(empty[8] | empty[9] | empty[10], 0);

  // A block that holds nothing reads as 5 body bytes and makes no store.
  TestFCurve reader;
  EXPECT_EQ(reader.ReadUserDataFromBufferBody(empty.data() + 4), 5u);
  EXPECT_EQ(reader.HasUserData(), 0u);
}

TEST(UserDataBuffer, RoundTripOfCurveAndKeyItems) {
  TestFCurve curve({-1.5, 2.0});
  curve.SetFCurveUserData(MakeUID(1), TextBytes("curve"), 5);
  double t = -1.5;
  curve.SetKeyUserData(t, MakeUID(2), TextBytes("left"), 4, 0.0);
  t = 2.0;
  curve.SetKeyUserData(t, MakeUID(3), TextBytes("right"), 5, 0.0);
  curve.SetKeyUserData(t, MakeUID(4), nullptr, 0, 0.0);

  std::vector<unsigned char> buffer = Write(curve);
  // 9 + flag + set(12 + 25) + flag + count + 2 * 8 + sets(12 + 24, 12 + 25 + 20)
  EXPECT_EQ(buffer.size(), 9u + 1 + 37 + 1 + 4 + 16 + 36 + 57);
  EXPECT_EQ(U32(buffer, 0), buffer.size() - 4);
  EXPECT_EQ(buffer[8], 1);
  EXPECT_EQ(buffer[9], 1);
  EXPECT_EQ(buffer[10 + 37], 1);
  EXPECT_EQ(U32(buffer, 10 + 37 + 1), 2u);
  double first;
  std::memcpy(&first, &buffer[10 + 37 + 5], 8);
  EXPECT_EQ(first, -1.5);

  TestFCurve copy({-1.5, 2.0});
  EXPECT_EQ(copy.ReadUserDataFromBufferBody(buffer.data() + 4), buffer.size() - 4);
  EXPECT_EQ(Write(copy), buffer);
  const unsigned char* data = nullptr;
  unsigned int size = 0;
  t = 2.0;
  ASSERT_EQ(copy.GetKeyUserData(t, MakeUID(3), data, size, 0.0), 1u);
  EXPECT_EQ(AsString(data, size), "right");

  // A curve that has a store already only steps over the block.
  TestFCurve holder({2.0});
  holder.SetFCurveUserData(MakeUID(9), TextBytes("mine"), 4);
  EXPECT_EQ(holder.ReadUserDataFromBufferBody(buffer.data() + 4), buffer.size() - 4);
  EXPECT_EQ(holder.GetUserDataSet(2.0), nullptr);
  EXPECT_EQ(holder.GetFCurveUserData(MakeUID(1), data, size), 0u);
}

TEST(UserDataBuffer, NonFiniteParametersAndRefusedBlocks) {
  TestFCurve curve({1.0});
  CFCUserDataSet set;
  set.SetUserData(MakeUID(1), TextBytes("x"), 1);
  curve.SetUserDataSet(set, std::numeric_limits<double>::infinity());
  std::vector<unsigned char> buffer = Write(curve);
  double written;
  std::memcpy(&written, &buffer[9 + 1 + 1 + 4], 8);
  EXPECT_EQ(written, 0.0);

  TestFCurve reader({0.0});
  EXPECT_EQ(reader.ReadUserDataFromBufferBody(buffer.data() + 4), buffer.size() - 4);
  EXPECT_EQ(reader.HasUserData(0.0), 1u);

  // A refused outer or inner version changes nothing.
  std::vector<unsigned char> outer(buffer);
  outer[5] = 0;  // version 0
  TestFCurve refused({0.0});
  EXPECT_EQ(refused.ReadUserDataFromBufferBody(outer.data() + 4), 0u);
  std::vector<unsigned char> inner(buffer);
  // The key set's version word becomes the all-ones word.
  const size_t version = 9 + 1 + 1 + 4 + 8 + 4;
  for (size_t i = 0; i < 4; ++i)
    inner[version + i] = 0xFF;
  EXPECT_EQ(refused.ReadUserDataFromBufferBody(inner.data() + 4), 0u);
  EXPECT_EQ(refused.HasUserData(), 0u);
}
