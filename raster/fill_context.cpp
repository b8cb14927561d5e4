// Edge tables of a fill, built from flattened closed subpaths.
#include "raster/fill_context.h"

#include "raster/fill_scratch.h"
#include "raster/fill_vertex_order.h"

#include <algorithm>
#include <cmath>
#include <cstring>
#include <new>

namespace {
const ZvScratchSlot kCellSlots[3] = {ZvScratch_Cells0, ZvScratch_Cells1, ZvScratch_Cells2};

template <class Word>
void FreeRows(Word* (&rows)[3], Word*& runs, std::int32_t first) {
  const std::int32_t origin = first < 0 ? first : 0;
  for (int i = 0; i < 3; ++i) {
    if (rows[i]) ZvScratchGive(kCellSlots[i], rows[i] + origin);
    rows[i] = nullptr;
  }
  if (runs) ZvScratchGive(ZvScratch_CellRuns, runs + origin);
  runs = nullptr;
}

// Rows are indexed by cell. A block that starts at cell min(first, 0) keeps row pointers inside
// their blocks (a pointer before a block's start is undefined); the cells left of a box that
// begins right of 0 are never touched, so only first..end-1 are cleared.
//
// Each row has 16 zero bytes past cell end - 1: the scan for the next marked cell reads a whole
// vector at a time, and the last one may reach past the last cell.
template <class Word>
Word* AllocateRow(ZvScratchSlot slot, int first, int end) {
  const int origin = first < 0 ? first : 0;
  const std::size_t pad = 16 / sizeof(Word);
  Word* row =
      static_cast<Word*>(ZvScratchTake(
          slot, ZvScratchBytes(static_cast<std::size_t>(end - origin) + pad, sizeof(Word)))) -
      origin;
  std::memset(static_cast<void*>(row + first), 0,
              sizeof(Word) * (static_cast<std::size_t>(end - first) + pad));
  return row;
}

template <class Word>
void AllocateRows(Word* (&rows)[3], Word*& runs, int first, int end, bool three) {
  for (int i = 0; i < (three ? 3 : 1); ++i)
    rows[i] = AllocateRow<Word>(kCellSlots[i], first, end);
  runs = AllocateRow<Word>(ZvScratch_CellRuns, first, end);
}

template <class T>
T* Take(ZvScratchSlot slot, unsigned int count) {
  return static_cast<T*>(ZvScratchTake(slot, ZvScratchBytes(count, sizeof(T))));
}
}  // namespace

CFillContext::~CFillContext() {
  ZvScratchGive(ZvScratch_Vertices, vertices);
  ZvScratchGive(ZvScratch_SortedVertices, sortedVertices);
  ZvScratchGive(ZvScratch_ActiveEdges, activeEdges);
  vertices = nullptr;
  sortedVertices = nullptr;
  activeEdges = nullptr;
  FreeRows(abuffer, aruns, firstCell);
  FreeRows(abuffer8, aruns8, firstCell);
  delete[] featherFilter;
  delete[] cumulativeFeatherFilter;
  delete[] static_cast<unsigned char*>(rowBuffer0);
  delete[] static_cast<unsigned char*>(rowBuffer1);
  featherFilter = nullptr;
  cumulativeFeatherFilter = nullptr;
  rowBuffer0 = nullptr;
  rowBuffer1 = nullptr;
}

int CFillContext::BuildTables(const ZvPoint2dArray& points, const ZvPointTagArray& tags,
                              double scale) {
  const unsigned int count = points.size < tags.size ? points.size : tags.size;
  if (count == 0) return 0;
  vertices = Take<CFillVertex>(ZvScratch_Vertices, count);
  sortedVertices = Take<CFillSortedVertex>(ZvScratch_SortedVertices, count);
  activeEdges = Take<CFillActiveEdge>(ZvScratch_ActiveEdges, count);
  // The records in vertex order, then sorted into the table.
  ZvScratchArray<CFillSortedVertex> rings(ZvScratch_SortRecords, count);
  int n = 0;
  int subpathStart = 0;
  for (unsigned int i = 0; i < count; ++i) {
    if (tags[i] == ZvPointTag_Last) {
      // The closing point repeats the first one: it only ties the ring.
      if (n > subpathStart) {
        rings[subpathStart].prev = n - 1;
        rings[n - 1].next = subpathStart;
      }
      subpathStart = n;
      continue;
    }
    vertices[n].x = points[i].x * scale;
    vertices[n].y = points[i].y * scale;
    // A non-finite coordinate has no place in the y order: such a polygon is not filled.
    if (!std::isfinite(vertices[n].x) || !std::isfinite(vertices[n].y)) return 0;
    rings[n] = CFillSortedVertex{n, n - 1, n + 1, vertices};
    ++n;
  }
  // An unterminated last subpath is closed the same way, so no ring points past the table.
  if (n > subpathStart) {
    rings[subpathStart].prev = n - 1;
    rings[n - 1].next = subpathStart;
  }
  if (takenByLine) {
    ZvOrderBySampleLine(rings.get(), sortedVertices, n, vertices);
  } else {
    ZvOrderByRisingY(rings.get(), sortedVertices, n, vertices);
  }
  return n;
}

void CFillContext::AllocateCoverageRows4x4(int first, int end, bool three) {
  firstCell = first;
  endCell = end;
  AllocateRows(abuffer, aruns, first, end, three);
}

void CFillContext::AllocateCoverageRows8x8(int first, int end, bool three) {
  firstCell = first;
  endCell = end;
  AllocateRows(abuffer8, aruns8, first, end, three);
}
