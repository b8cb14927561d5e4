#include <zv/fcurve_userdata.h>

#include "tests/fcurve/uid.h"
#include "tests/support/byte_blocks.h"

#include <gtest/gtest.h>

#include <cstring>
#include <vector>

TEST(UserDataValue, CopiesOwnTheirBytesAndWrappersDoNot) {
  unsigned char bytes[3] = {1, 2, 3};
  CFCUserDataValue wrapper(bytes, 3, 0);
  EXPECT_EQ(wrapper.IsOwned(), 0u);
  EXPECT_EQ(wrapper.GetData(), bytes);

  CFCUserDataValue copy(wrapper);
  EXPECT_EQ(copy.IsOwned(), 1u);
  ASSERT_NE(copy.GetData(), bytes);
  bytes[0] = 9;
  EXPECT_EQ(copy.GetData()[0], 1);
  EXPECT_EQ(copy.GetSize(), 3u);

  CFCUserDataValue owned(bytes, 3, 1);
  EXPECT_EQ(owned.IsOwned(), 1u);
  EXPECT_NE(owned.GetData(), bytes);
  EXPECT_EQ(owned.GetData()[0], 9);

  // Assigning from itself and from its own bytes keeps the bytes.
  owned = *&owned;
  owned.Assign(owned.GetData() + 1, 2);
  ASSERT_EQ(owned.GetSize(), 2u);
  EXPECT_EQ(owned.GetData()[0], 2);
  EXPECT_EQ(owned.GetData()[1], 3);

  CFCUserDataValue empty(nullptr, 5, 1);
  EXPECT_EQ(empty.GetSize(), 0u);
  EXPECT_EQ(empty.GetData(), nullptr);
}

TEST(UserDataSet, SetReplacesInsertKeepsRemoveAndMerge) {
  CFCUserDataSet set;
  set.SetUserData(MakeUID(1), TextBytes("one"), 3);
  set.SetUserData(MakeUID(1), TextBytes("uno"), 3);
  EXPECT_EQ(set.GetCount(), 1u);
  EXPECT_EQ(AsString(set.FindUserData(MakeUID(1))), "uno");

  EXPECT_EQ(set.InsertUserData(MakeUID(1), TextBytes("eins"), 4), 0u);
  EXPECT_EQ(set.InsertUserData(MakeUID(2), TextBytes("two"), 3), 1u);
  EXPECT_EQ(AsString(set.FindUserData(MakeUID(1))), "uno");

  CFCUserDataSet other;
  other.SetUserData(MakeUID(2), TextBytes("deux"), 4);
  other.SetUserData(MakeUID(3), TextBytes("trois"), 5);
  set.MergeUserData(other);
  EXPECT_EQ(set.GetCount(), 3u);
  EXPECT_EQ(AsString(set.FindUserData(MakeUID(2))), "deux");

  EXPECT_EQ(set.RemoveUserData(MakeUID(3)), 1u);
  EXPECT_EQ(set.RemoveUserData(MakeUID(3)), 0u);
  EXPECT_EQ(set.FindUserData(MakeUID(3)), nullptr);

  CFCUserDataSet copy(set);
  set.RemoveAllUserData();
  EXPECT_EQ(set.IsEmpty(), 1u);
  EXPECT_EQ(copy.GetCount(), 2u);
}

TEST(UserDataSet, OrderIsStrictOverAllSixteenBytes) {
  // Identifiers that differ in one field only, in each field.
  _zvUID base = MakeUID(4);
  std::vector<_zvUID> uids(5, base);
  uids[1].Data1 += 1;
  uids[2].Data2 += 1;
  uids[3].Data3 += 1;
  uids[4].Data4[7] += 1;
  CFCUserDataSet set;
  for (unsigned int i = 0; i < uids.size(); ++i)
    set.SetUserData(uids[i], TextBytes("x"), 1);
  EXPECT_EQ(set.GetCount(), 5u);
  for (const _zvUID& a : uids) {
    EXPECT_FALSE(CFCUserDataKey(a) < CFCUserDataKey(a));
    for (const _zvUID& b : uids) {
      if (a == b) continue;
      EXPECT_NE(CFCUserDataKey(a) < CFCUserDataKey(b), CFCUserDataKey(b) < CFCUserDataKey(a));
    }
  }
}

TEST(UserDataSet, BufferBlockLayoutAndRoundTrip) {
  CFCUserDataSet set;
  _zvUID uid = {0x04030201u, 0x0605, 0x0807, {9, 10, 11, 12, 13, 14, 15, 16}};
  set.SetUserData(uid, TextBytes("abc"), 3);
  set.SetUserData(MakeUID(7), nullptr, 0);
  ASSERT_EQ(set.GetBufferSize(), 12u + 23u + 20u);

  std::vector<unsigned char> buffer(set.GetBufferSize(), 0xEE);
  ASSERT_EQ(set.WriteToBuffer(buffer.data()), buffer.size());
  const unsigned char head[] = {51, 0, 0, 0, 0, 1, 0, 0, 2, 0, 0, 0};
  EXPECT_EQ(std::memcmp(buffer.data(), head, sizeof head), 0);
  // The item of the smaller identifier comes first.
  const unsigned char item[] = {1,  2,  3,  4,  5, 6, 7, 8, 9,   10,  11, 12,
                                13, 14, 15, 16, 3, 0, 0, 0, 'a', 'b', 'c'};
  EXPECT_EQ(std::memcmp(buffer.data() + 12, item, sizeof item), 0);

  CFCUserDataSet read;
  EXPECT_EQ(read.ReadFromBufferBody(buffer.data() + 4), buffer.size() - 4);
  ASSERT_EQ(read.GetCount(), 2u);
  EXPECT_EQ(AsString(read.FindUserData(uid)), "abc");
  EXPECT_EQ(read.FindUserData(MakeUID(7))->GetSize(), 0u);

  // A set that holds items steps over the block and keeps its own.
  CFCUserDataSet holder;
  holder.SetUserData(uid, TextBytes("keep"), 4);
  EXPECT_EQ(holder.ReadFromBufferBody(buffer.data() + 4), buffer.size() - 4);
  EXPECT_EQ(holder.GetCount(), 1u);
  EXPECT_EQ(AsString(holder.FindUserData(uid)), "keep");

  // Refused versions.
  for (unsigned int version : {255u, 0xFFFFFFFFu}) {
    std::vector<unsigned char> bad(buffer);
    for (int i = 0; i < 4; ++i)
      bad[4 + i] = static_cast<unsigned char>(version >> (8 * i));
    CFCUserDataSet refused;
    EXPECT_EQ(refused.ReadFromBufferBody(bad.data() + 4), 0u);
    EXPECT_EQ(refused.IsEmpty(), 1u);
  }
  CFCUserDataSet empty;
  std::vector<unsigned char> emptyBlock(12);
  ASSERT_EQ(empty.WriteToBuffer(emptyBlock.data()), 12u);
  EXPECT_EQ(empty.ReadFromBufferBody(emptyBlock.data() + 4), 8u);
}

namespace {
std::vector<unsigned char> Written(const CFCUserDataSet& set) {
  std::vector<unsigned char> block(set.GetBufferSize());
  EXPECT_EQ(set.WriteToBuffer(block.data()), block.size());
  return block;
}
}  // namespace

TEST(UserDataSet, BoundedReadsRefuseCutBlocksAndChangeNothing) {
  CFCUserDataSet set;
  set.SetUserData(MakeUID(1), TextBytes("abc"), 3);
  set.SetUserData(MakeUID(2), nullptr, 0);
  set.SetUserData(MakeUID(3), TextBytes("longer item"), 11);
  const std::vector<unsigned char> block = Written(set);
  const unsigned int body = static_cast<unsigned int>(block.size() - 4);

  CFCUserDataSet holder;
  holder.SetUserData(MakeUID(9), TextBytes("old"), 3);
  for (unsigned int size = 0; size < body; ++size) {
    CFCUserDataSet empty;
    EXPECT_EQ(empty.ReadFromBufferBody(block.data() + 4, size), 0u) << size;
    EXPECT_EQ(empty.IsEmpty(), 1u) << size;  // no item of the part that was read
  }
  CFCUserDataSet read;
  EXPECT_EQ(read.ReadFromBufferBody(block.data() + 4, body), body);
  EXPECT_EQ(Written(read), block);
  // A set that holds items only walks the block, as the unbounded reader does.
  EXPECT_EQ(holder.ReadFromBufferBody(block.data() + 4, body), body);
  EXPECT_EQ(holder.GetCount(), 1u);

  // An item size that reaches past the block.
  std::vector<unsigned char> bad(block);
  bad[12 + 16] = 0xFF;
  CFCUserDataSet refused;
  EXPECT_EQ(refused.ReadFromBufferBody(bad.data() + 4, body), 0u);
  EXPECT_EQ(refused.IsEmpty(), 1u);

  ExpectFuzzSeed("fuzz_fcurve_userdata", "three_items",
                 std::vector<unsigned char>(block.begin() + 4, block.end()));
  const std::vector<unsigned char> none = Written(CFCUserDataSet());
  ExpectFuzzSeed("fuzz_fcurve_userdata", "empty",
                 std::vector<unsigned char>(none.begin() + 4, none.end()));
}
