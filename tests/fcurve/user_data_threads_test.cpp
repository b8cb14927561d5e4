#include "tests/fcurve/test_fcurve.h"
#include "tests/fcurve/uid.h"

#include <gtest/gtest.h>

#include <atomic>
#include <memory>
#include <string>
#include <thread>
#include <vector>

// Four threads share one curve: they write, read, move and copy its user data
// and hold its lock across several calls. Every item must stay on a key and
// every read must see whole items.
TEST(UserDataThreads, OneCurveSharedByFourThreads) {
  const int kThreads = 4;
  const int kIterations = 2000;
  const std::vector<double> keys = {0, 1, 2, 3, 4, 5, 6, 7};
  TestFCurve curve(keys);
  std::atomic<int> failures(0);

  auto work = [&](unsigned int id) {
    const std::string mine = "thread-" + std::to_string(id);
    for (int i = 0; i < kIterations; ++i) {
      curve.SetFCurveUserData(MakeUID(id), TextBytes(mine), Size(mine));
      double t = (i + id) % keys.size() + 0.2;
      curve.SetKeyUserData(t, MakeUID(id), TextBytes(mine), Size(mine), 0.5);

      // Held across several calls: what we read is what we wrote.
      curve.Lock();
      const unsigned char* data = nullptr;
      unsigned int size = 0;
      if (curve.GetLockCount() == 0 || !curve.GetFCurveUserData(MakeUID(id), data, size) ||
          AsString(data, size) != mine)
        ++failures;
      t = (i + id) % keys.size();
      if (!curve.GetKeyUserData(t, MakeUID(id), data, size, 0.0) || AsString(data, size) != mine)
        ++failures;
      curve.Unlock();

      switch (i % 4) {
        case 0:
          // Keys and their data go away and come back together.
          curve.Lock();
          curve.ShiftParameters(0.5);
          curve.ShiftParameters(-0.5);
          curve.Unlock();
          break;
        case 1: {
          std::unique_ptr<ZvBaseFCurve> clone(curve.Clone());
          if (clone->HasUserData() != 1) ++failures;
          break;
        }
        case 2: {
          std::vector<unsigned char> buffer;
          curve.Lock();
          buffer.resize(curve.GetUserDataBufferSize());
          curve.WriteUserDataToBuffer(buffer.data());
          curve.Unlock();
          break;
        }
        default: {
          ZvDoubleArray same;
          same.Add(5.0);
          same.Add(6.0);
          curve.MoveKeyUserDataTail(same, same);
          t = (i + id) % keys.size();
          curve.RemoveKeyUserData(t, MakeUID(id), 0.0);
          break;
        }
      }
    }
    for (double key : keys) {
      double t = key;
      curve.SetKeyUserData(t, MakeUID(id), TextBytes(mine), Size(mine), 0.0);
    }
  };

  std::vector<std::thread> threads;
  for (int id = 0; id < kThreads; ++id)
    threads.emplace_back(work, static_cast<unsigned int>(id));
  for (std::thread& thread : threads)
    thread.join();

  EXPECT_EQ(failures.load(), 0);
  EXPECT_EQ(curve.GetLockCount(), 0u);
  EXPECT_EQ(curve.Keys(), keys);
  for (double key : keys) {
    const CFCUserDataSet* set = curve.GetUserDataSet(key);
    ASSERT_NE(set, nullptr) << key;
    EXPECT_EQ(set->GetCount(), static_cast<unsigned int>(kThreads)) << key;
  }
  // Nothing strayed off the keys: the block counts exactly one set per key.
  std::vector<unsigned char> buffer(curve.GetUserDataBufferSize());
  curve.WriteUserDataToBuffer(buffer.data());
  ASSERT_EQ(buffer[9], 1);
  const size_t keyFlag = 10 + 4 + (buffer[10] | buffer[11] << 8 | buffer[12] << 16);
  ASSERT_EQ(buffer[keyFlag], 1);
  EXPECT_EQ(buffer[keyFlag + 1] | buffer[keyFlag + 2] << 8, static_cast<int>(keys.size()));
}
