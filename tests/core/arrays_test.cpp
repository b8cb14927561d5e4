#include <zv/arrays.h>

#include <gtest/gtest.h>

namespace {

// Capacities a Resize(n) on a full array of capacity c must reach, by the halving/doubling rule.
unsigned int ExpectedCapacity(unsigned int cap, unsigned int n) {
  if ((cap >> 1) < n && n <= cap) return cap;
  while (cap > n)
    cap >>= 1;
  while (cap < n)
    cap = cap ? cap << 1 : 1;
  return cap ? cap : 1;
}

TEST(ArrayConstruction, CapacityArgumentsFollowTheRules) {
  ZvDoubleArray a(0);
  EXPECT_TRUE(a.size == 0 && a.capacity == 1);
  ZvPoint2fArray b(ZvPoint2<float>{1.5f, 2.5f}, 0);
  EXPECT_TRUE(b.size == 1 && b.capacity == 1 && b[0].x == 1.5f);
  ZvPoint2fArray c(ZvPoint2<float>{1, 2}, 7);  // a capacity, not a repeat count
  EXPECT_TRUE(c.size == 1 && c.capacity == 7);
  const double values[3] = {1, 2, 3};
  ZvDoubleArray d(values, 3);
  EXPECT_TRUE(d.size == 3 && d.capacity == 3 && d[2] == 3.0);
  ZvDoubleArray e(values, 0);
  EXPECT_TRUE(e.size == 0 && e.capacity == 0);
  // Point arrays are zeroed on allocation.
  ZvPoint3dArray z(4);
  z.Resize(4);
  for (unsigned int i = 0; i < 4; ++i)
    EXPECT_TRUE(z[i].x == 0.0 && z[i].y == 0.0 && z[i].z == 0.0) << i;
}

TEST(ArrayConstruction, CopyAndAssignmentTakeSizeAndCapacity) {
  ZvULongArray a(8);
  for (unsigned int i = 0; i < 5; ++i)
    a.Add(i * 10);
  ZvULongArray b(a);
  EXPECT_TRUE(b.size == 5 && b.capacity == 8 && b[4] == 40 && b.data != a.data);
  ZvULongArray c(1);
  c = a;
  EXPECT_TRUE(c.size == 5 && c.capacity == 8 && c[3] == 30);
  const unsigned int* before = c.data;
  ZvULongArray& alias = c;
  c = alias;
  EXPECT_EQ(c.data, before);
}

// The sweep below checks every capacity; this one checks that a kept block is not moved and a
// fresh one keeps the contents.
TEST(ArrayCapacity, ResizeHalvesAndDoublesByTheRule) {
  ZvDoubleArray a(8);
  for (int i = 0; i < 5; ++i)
    a.Add(i);
  double* block = a.data;
  a.Resize(5);
  EXPECT_EQ(a.capacity, 8u);
  EXPECT_EQ(a.data, block);
  a.Resize(4);  // at most half full: a fresh, smaller block
  EXPECT_EQ(a.capacity, 4u);
  EXPECT_EQ(a[3], 3.0);
}

TEST(ArrayCapacity, ResizeMatchesTheRuleOverManySizes) {
  for (unsigned int cap = 1; cap < 40; ++cap) {
    for (unsigned int n = 0; n < 90; ++n) {
      ZvFloatArray a(cap);
      a.Resize(n);
      EXPECT_EQ(a.capacity, ExpectedCapacity(cap, n)) << "cap " << cap << " n " << n;
      EXPECT_EQ(a.size, n);
    }
  }
}

TEST(ArrayCapacity, ChopKeepsStorage) {
  ZvUByteArray a(16);
  for (int i = 0; i < 10; ++i)
    a.Add(static_cast<unsigned char>(i));
  a.Chop(2);
  EXPECT_TRUE(a.size == 2 && a.capacity == 16);
  a.ChopAndResize(5);  // not below size: nothing
  EXPECT_TRUE(a.size == 2 && a.capacity == 16);
  a.Add(a.data, 2);
  a.ChopAndResize(1);
  EXPECT_TRUE(a.size == 1 && a.capacity == 1);
}

TEST(ArrayEditing, AddOfOwnElementSurvivesTheMove) {
  ZvPoint2dArray a(2);
  a.Add(1.0, 2.0);
  a.Add(3.0, 4.0);
  a.Add(a[0]);  // full: the block moves while the argument points into it
  ASSERT_TRUE(a.size == 3 && a.capacity == 4);
  EXPECT_TRUE(a[2].x == 1.0 && a[2].y == 2.0);

  ZvDoubleArray d(1);
  d.Add(5.0);
  d.Add(d.data, 1);  // bulk append of its own run
  EXPECT_EQ(d[1], 5.0);
}

TEST(ArrayEditing, InsertAndRemoveKeepOrder) {
  ZvULongArray a(1);
  for (unsigned int v : {1u, 2u, 4u})
    a.Add(v);
  a.InsertBefore(2, 3u);
  a.InsertBefore(0, 0u);
  const unsigned int block[2] = {8, 9};
  a.InsertBefore(5, block, 2);
  ASSERT_EQ(a.size, 7u);
  for (unsigned int i = 0; i < 5; ++i)
    EXPECT_EQ(a[i], i);
  EXPECT_EQ(a[6], 9u);

  ZvULongArray other(1);
  other.Add(100);
  other.Add(101);
  a.InsertBefore(1, other);
  EXPECT_TRUE(a[1] == 100 && a[2] == 101 && a[3] == 1);

  a.Remove(1);
  EXPECT_EQ(a[1], 101u);
  EXPECT_EQ(a.size, 8u);
}

TEST(ArrayEditing, RemoveShrinksToTheSmallestChainValue) {
  ZvDoubleArray a(16);
  for (int i = 0; i < 9; ++i)
    a.Add(i);
  a.Remove(0);  // 8 left: not below half of 16
  EXPECT_EQ(a.capacity, 16u);
  a.Remove(0);  // 7 left: 16 -> 8
  EXPECT_EQ(a.capacity, 8u);
  EXPECT_TRUE(a[0] == 2.0 && a[6] == 8.0);
  a.RemoveClosedRange(1, 4);  // 3 left: 8 -> 4
  EXPECT_TRUE(a.size == 3 && a.capacity == 4 && a[1] == 7.0);
}

// A splice gets its block first, from the removals' rule when it shrinks and the doubling rule
// when it grows, and then moves the elements around the gap without allocating.
TEST(ArrayEditing, SpliceAllocatesBeforeItMoves) {
  ZvULongArray a(16);
  for (unsigned int i = 0; i < 16; ++i)
    a.Add(i);
  EXPECT_EQ(a.SpliceBlock(8), nullptr);  // half full stays
  unsigned int* block = a.SpliceBlock(20);
  ASSERT_NE(block, nullptr);
  EXPECT_EQ(a.size, 16u);
  a.Splice(3, 2, 6, block);  // 3 4 out, a gap of 6: 20 elements in a block of 32
  ASSERT_TRUE(a.size == 20 && a.capacity == 32 && a.data == block);
  EXPECT_TRUE(a[2] == 2 && a[9] == 5 && a[19] == 15);
  a.Splice(0, 13, 0, a.SpliceBlock(7));  // 7 left of 32: halved down to 8
  ASSERT_TRUE(a.size == 7 && a.capacity == 8);
  EXPECT_TRUE(a[0] == 9 && a[6] == 15);
  a.Splice(6, 1, 1, a.SpliceBlock(7));  // in place
  EXPECT_TRUE(a.size == 7 && a.capacity == 8 && a[5] == 14);

  ZvAltDynArray<double> r(8);
  for (int i = 0; i < 6; ++i)
    r.Add(1.0 + i);
  r.Splice(1, 2, 1, r.SpliceBlock(5));
  EXPECT_TRUE(r.size == 5 && r[1] == 0.0 && r[2] == 4.0 && r.data[5] == 0.0);
}

TEST(ArrayEditing, RemoveOnCapacityOneOnlyDropsTheCount) {
  ZvDoubleArray a(1);
  a.Add(42.0);
  a.Remove(0);
  EXPECT_EQ(a.size, 0u);
  EXPECT_EQ(a.data[0], 42.0);
}

TEST(ArrayEditing, PointRangeAppendCopiesAClosedRange) {
  ZvPoint2fArray src(1);
  for (int i = 0; i < 6; ++i)
    src.Add(i, -i);
  ZvPoint2fArray dst(1);
  dst.Add(src, 2, 4);
  ASSERT_EQ(dst.size, 3u);
  EXPECT_TRUE(dst[0].x == 2.0f && dst[2].y == -4.0f);
  dst.Add(src, 3, 2);  // first past last: a zero count, nothing copied
  EXPECT_EQ(dst.size, 3u);
}

struct Record {
  int key;
  double value;
};

TEST(RecordArray, OpenedAndFreedSlotsAreZero) {
  ZvAltDynArray<Record> a(4);
  a.Add(Record{1, 1.5});
  a.Add(Record{3, 3.5});
  a.InsertBefore(1, Record{2, 2.5});
  EXPECT_TRUE(a[1].key == 2 && a[2].value == 3.5);
  a.RemoveClosedRange(0, 0);
  ASSERT_EQ(a.size, 2u);
  ASSERT_EQ(a.capacity, 4u);  // two of four is not below half: the block stays
  EXPECT_TRUE(a[0].key == 2 && a.data[2].key == 0 && a.data[2].value == 0.0);
}

TEST(ObjectArray, ElementsOwningBlocksCopyDeeply) {
  ZvDynArray<ZvDoubleArray> a(1);
  ZvDoubleArray first(1);
  first.Add(1.0);
  a.Add(first);
  a.Add(a[0]);  // aliasing add of a class element
  a[1].Add(2.0);
  ASSERT_EQ(a.size, 2u);
  EXPECT_TRUE(a[0].size == 1 && a[1].size == 2 && a[0].data != a[1].data);

  for (int i = 0; i < 20; ++i)
    a.InsertBefore(0, first);
  a.Remove(0);
  EXPECT_TRUE(a.size == 21 && a[20].size == 2);
}

}  // namespace
