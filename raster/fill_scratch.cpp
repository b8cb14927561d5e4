// The per-thread pool of fill scratch blocks.
#include "raster/fill_scratch.h"

#include <new>
#include <utility>

namespace {

// Each block carries its capacity in a header, kept a multiple of the strictest alignment.
constexpr std::size_t kHeader = alignof(std::max_align_t) > sizeof(std::size_t)
                                    ? alignof(std::max_align_t)
                                    : sizeof(std::size_t);

std::size_t Capacity(void* block) {
  return *reinterpret_cast<std::size_t*>(static_cast<char*>(block) - kHeader);
}

void Release(void* block) {
  if (block) ::operator delete(static_cast<char*>(block) - kHeader);
}

template <class Array>
void SwapArrays(Array& a, Array& b) {
  std::swap(a.size, b.size);
  std::swap(a.capacity, b.capacity);
  std::swap(a.data, b.data);
}

// 0 before the thread's pool exists, 1 while it lives, 2 once the thread has destroyed it: a
// fill run by another thread-local object's destructor after that uses fresh blocks. Trivially
// destructible, so it stays readable through the whole thread exit.
thread_local int tPoolState = 0;

struct Pool {
  void* blocks[ZvScratch_SlotCount] = {};
  ZvPoint2dArray points;
  ZvPointTagArray tags;
  ~Pool() {
    for (void*& block : blocks) {
      Release(block);
      block = nullptr;
    }
    tPoolState = 2;
  }
};

Pool* ThreadPool() {
  if (tPoolState == 2) return nullptr;
  static thread_local Pool pool;
  tPoolState = 1;
  return &pool;
}

}  // namespace

void* ZvScratchTake(ZvScratchSlot slot, std::size_t bytes) {
  if (Pool* pool = ThreadPool()) {
    void* block = pool->blocks[slot];
    if (block && Capacity(block) >= bytes) {
      pool->blocks[slot] = nullptr;
      return block;
    }
  }
  if (bytes > static_cast<std::size_t>(-1) - kHeader) throw std::bad_alloc();
  char* raw = static_cast<char*>(::operator new(bytes + kHeader));
  *reinterpret_cast<std::size_t*>(raw) = bytes;
  return raw + kHeader;
}

void ZvScratchGive(ZvScratchSlot slot, void* block) {
  if (!block) return;
  Pool* pool = ThreadPool();
  if (!pool || Capacity(block) > kZvScratchKeepBytes) {
    Release(block);
    return;
  }
  // The slot keeps the larger of its block and this one.
  void*& kept = pool->blocks[slot];
  if (kept && Capacity(kept) >= Capacity(block)) {
    Release(block);
    return;
  }
  Release(kept);
  kept = block;
}

ZvScratchPolygon::ZvScratchPolygon() {
  if (Pool* pool = ThreadPool()) {
    SwapArrays(points, pool->points);
    SwapArrays(tags, pool->tags);
  }
  points.Chop(0);
  tags.Chop(0);
}

ZvScratchPolygon::~ZvScratchPolygon() {
  Pool* pool = ThreadPool();
  if (!pool) return;
  const std::size_t bytes =
      points.capacity * sizeof(points.data[0]) + tags.capacity * sizeof(tags.data[0]);
  if (bytes > kZvScratchKeepBytes) return;
  // The pool keeps the larger pair; whichever is left here is freed by the arrays' destructors.
  if (points.capacity > pool->points.capacity) SwapArrays(points, pool->points);
  if (tags.capacity > pool->tags.capacity) SwapArrays(tags, pool->tags);
}
