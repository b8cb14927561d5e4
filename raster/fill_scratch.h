// Scratch memory of the fills, lent from one fill to the next on the same thread.
//
// A fill needs tables in proportion to its shape: the flattened polygon, the vertex and edge
// tables, the coverage rows. Blocks of that size fresh from the system arrive page by page and
// zero-filled by the kernel, which costs more than the whole sweep of a small shape; so each
// thread keeps the blocks of its last fill for the next. A block leaves its thread's pool for
// the length of a fill: a fill started from another fill's callback on the same thread finds the
// slot empty and allocates its own, and no block is ever seen by two threads at once. Blocks
// beyond the budget kZvScratchKeepBytes go back to the system rather than stay with an idle
// thread.
#ifndef ZV_RASTER_FILL_SCRATCH_H
#define ZV_RASTER_FILL_SCRATCH_H

#include <zv/arrays.h>

#include <cstddef>
#include <new>

// What one thread keeps in all: enough for the tables of a path of a few hundred thousand
// vertices (a page of text in one fill), where fresh memory costs as much as the sweep.
constexpr std::size_t kZvScratchKeepBytes = std::size_t(32) << 20;

enum ZvScratchSlot {
  ZvScratch_Vertices,
  ZvScratch_SortedVertices,
  ZvScratch_ActiveEdges,
  ZvScratch_RetiringEdges,
  ZvScratch_IncomingEdges,
  ZvScratch_SpareEdges,
  ZvScratch_EdgeSlots,
  ZvScratch_SortCounts,
  ZvScratch_SortRecords,
  ZvScratch_Cells0,
  ZvScratch_Cells1,
  ZvScratch_Cells2,
  ZvScratch_CellRuns,
  ZvScratch_SlotCount
};

// A block of at least `bytes` bytes, uninitialised, aligned for any scalar. Throws bad_alloc.
void* ZvScratchTake(ZvScratchSlot slot, std::size_t bytes);
// count * size, or bad_alloc when that overflows (as array new would refuse it).
inline std::size_t ZvScratchBytes(std::size_t count, std::size_t size) {
  if (count > static_cast<std::size_t>(-1) / size) throw std::bad_alloc();
  return count * size;
}
// Returns a block from ZvScratchTake of the same slot (null is ignored).
void ZvScratchGive(ZvScratchSlot slot, void* block);

// A block of `count` elements of a plain type from the pool, for the lifetime of the object.
template <class T>
class ZvScratchArray {
 public:
  ZvScratchArray(ZvScratchSlot slot, std::size_t count)
      : slot(slot),
        data(static_cast<T*>(ZvScratchTake(slot, ZvScratchBytes(count ? count : 1, sizeof(T))))) {}
  ~ZvScratchArray() { ZvScratchGive(slot, data); }
  ZvScratchArray(const ZvScratchArray&) = delete;
  ZvScratchArray& operator=(const ZvScratchArray&) = delete;

  T& operator[](int i) const { return data[i]; }
  T* get() const { return data; }

 private:
  ZvScratchSlot slot;
  T* data;
};

// The flattened polygon of a fill: the thread's point and tag arrays for the lifetime of the
// lease, emptied but with their capacity (fresh ones when the thread's are already lent).
class ZvScratchPolygon {
 public:
  ZvScratchPolygon();
  ~ZvScratchPolygon();
  ZvScratchPolygon(const ZvScratchPolygon&) = delete;
  ZvScratchPolygon& operator=(const ZvScratchPolygon&) = delete;

  ZvPoint2dArray points;
  ZvPointTagArray tags;
};

#endif
