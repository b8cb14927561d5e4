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

template <class Array>
std::size_t Bytes(const Array& a) {
  return std::size_t(a.capacity) * sizeof(a.data[0]);
}

struct Pool {
  void* blocks[ZvScratch_SlotCount] = {};
  std::size_t blockBytes = 0;  // capacity of the blocks above
  ZvPoint2dArray points;
  ZvPointTagArray tags;
  std::size_t PolygonBytes() const { return Bytes(points) + Bytes(tags); }
  // Whether the pool stays within its budget when blocks of `held` bytes give way to `offered`.
  bool Affords(std::size_t held, std::size_t offered) const {
    return blockBytes + PolygonBytes() - held + offered <= kZvScratchKeepBytes;
  }
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
      pool->blockBytes -= Capacity(block);
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
  if (!pool) {
    Release(block);
    return;
  }
  void*& kept = pool->blocks[slot];
  const std::size_t held = kept ? Capacity(kept) : 0, offered = Capacity(block);
  // The slot keeps the larger of its block and this one, as long as the pool stays in budget.
  if (offered <= held || !pool->Affords(held, offered)) {
    Release(block);
    return;
  }
  Release(kept);
  kept = block;
  pool->blockBytes += offered - held;
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
  // The pool keeps the larger pair; whichever is left here is freed by the arrays' destructors.
  const std::size_t held = pool->PolygonBytes(), offered = Bytes(points) + Bytes(tags);
  if (offered <= held || !pool->Affords(held, offered)) return;
  SwapArrays(points, pool->points);
  SwapArrays(tags, pool->tags);
}
