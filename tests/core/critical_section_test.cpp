#include <zv/critical_section.h>

#include <gtest/gtest.h>

#include <atomic>
#include <thread>

namespace {

TEST(CriticalSection, IsRecursiveAndExcludesOtherThreads) {
  ZvCriticalSection cs;
  cs.Lock();
  cs.Lock();  // a holder may take it again
  std::atomic<bool> entered{false};
  std::thread other([&] {
    cs.Lock();
    entered = true;
    cs.Unlock();
  });
  cs.Unlock();
  // Still held once: the other thread cannot be inside yet.
  std::this_thread::sleep_for(std::chrono::milliseconds(20));
  EXPECT_FALSE(entered.load());
  cs.Unlock();
  other.join();
  EXPECT_TRUE(entered.load());
}

TEST(CriticalSection, SerialisesConcurrentUpdates) {
  ZvCriticalSection cs;
  long counter = 0;
  auto work = [&] {
    for (int i = 0; i < 20000; ++i) {
      cs.Lock();
      cs.Lock();
      ++counter;
      cs.Unlock();
      cs.Unlock();
    }
  };
  std::thread a(work), b(work), c(work), d(work);
  a.join();
  b.join();
  c.join();
  d.join();
  EXPECT_EQ(counter, 80000);
}

}  // namespace
