// CFillContext: the vertex and edge tables that every path rasteriser sweeps.
//
// A polygon (flattened closed subpaths, double precision) becomes three tables: the vertices,
// one sorted-vertex record per vertex ordered by rising y with its ring neighbours, and the
// active edges (capacity one per vertex). The antialiased fill adds three rows of coverage
// cells; the soft fill its filter and row buffers. Everything is released by the destructor, on
// every way out of a fill: the tables and coverage rows go back to the thread's scratch pool
// (fill_scratch.h) for its next fill.
#ifndef ZV_RASTER_FILL_CONTEXT_H
#define ZV_RASTER_FILL_CONTEXT_H

#include <zv/arrays.h>

#include <cstdint>

class ZvGC;

struct CFillVertex {
  double x;
  double y;
};

struct CFillSortedVertex {
  std::int32_t index;  // position in the vertex table
  std::int32_t prev;   // ring neighbours around the closed subpath
  std::int32_t next;
  const CFillVertex* vertices;  // the comparator takes no context
};

struct CFillActiveEdge {
  double x;                // crossing of the current sample line, less 0.5
  double dxdy;             // change of x per row
  std::int32_t id;         // the edge from vertex a to its next vertex is a
  std::int32_t direction;  // +1 downwards in path order, -1 upwards (winding rule only)
};

// The two orderings of the sweep, in the form of qsort comparators that never answer 0: 1 when
// the first record goes after the second (its key is greater), -1 otherwise. The order among
// equal keys is left to the sort; it never changes which pixels are inside.
inline int CompareIndices(const void* a, const void* b) {
  const CFillSortedVertex& first = *static_cast<const CFillSortedVertex*>(a);
  const CFillSortedVertex& second = *static_cast<const CFillSortedVertex*>(b);
  return second.vertices[second.index].y >= first.vertices[first.index].y ? -1 : 1;
}
inline int CompareActiveEdges(const void* a, const void* b) {
  const CFillActiveEdge& first = *static_cast<const CFillActiveEdge*>(a);
  const CFillActiveEdge& second = *static_cast<const CFillActiveEdge*>(b);
  return second.x >= first.x ? -1 : 1;
}

class CFillContext {
 public:
  CFillContext() = default;
  CFillContext(const CFillContext&) = delete;
  CFillContext& operator=(const CFillContext&) = delete;
  ~CFillContext();

  // Fills the three tables from flattened closed subpaths (tag 2 closes a subpath and is itself
  // dropped), every coordinate multiplied by `scale`. Answers the number of vertices, 0 when a
  // coordinate is not finite. The tables get one slot per input point; bad_alloc propagates.
  int BuildTables(const ZvPoint2dArray& points, const ZvPointTagArray& tags, double scale);

  // Set before BuildTables by fills whose spans set coverage and never add it up: the sorted
  // records then only need to be grouped by the sample line that takes them (a counting sort by
  // row), rather than ordered by y.
  bool takenByLine = false;

  // Zeroed coverage rows of cells indexed first..end-1 (row pointers pre-offset by `first`): one
  // row, or three when `three`, and the row of runs.
  void AllocateCoverageRows4x4(int first, int end, bool three);
  void AllocateCoverageRows8x8(int first, int end, bool three);

  // The soft fill's filter of `taps` = 2 radius + 1 weights sampled from the context's feather
  // profile and normalised to sum 1, and its cumulative table (one zero entry past the end).
  void BuildFeatheringFilters(int radius, int taps, const ZvGC& gc);

  // Sets the samples x0..x1 (inclusive) of sub-sample row `row` in the newest coverage row,
  // widening [minCell, maxCell] to the cells touched.
  void SetAbuffer8(int row, int x0, int x1, int& minCell, int& maxCell);
  void SetAbuffer(int row, int x0, int x1, int& minCell, int& maxCell);

  CFillVertex* vertices = nullptr;
  CFillSortedVertex* sortedVertices = nullptr;
  CFillActiveEdge* activeEdges = nullptr;
  std::uint32_t* abuffer[3] = {nullptr, nullptr, nullptr};   // 4x4 cells, low 16 bits
  std::uint64_t* abuffer8[3] = {nullptr, nullptr, nullptr};  // 8x8 cells
  // Whole-cell runs of the newest coverage row, in the cells' layout: a run of sub-sample row r
  // flips row r's bits at its first cell and one past its last, so a running exclusive or over
  // the row gives each cell the sub-sample rows that cover it whole.
  std::uint32_t* aruns = nullptr;
  std::uint64_t* aruns8 = nullptr;
  std::int32_t firstCell = 0;
  std::int32_t endCell = 0;
  double* featherFilter = nullptr;            // soft fill
  double* cumulativeFeatherFilter = nullptr;  // soft fill
  void* rowBuffer0 = nullptr;                 // soft fill
  void* rowBuffer1 = nullptr;                 // soft fill
};

#endif
