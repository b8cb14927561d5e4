// The scanline sweep shared by the aliased and antialiased fills.
//
// Row y samples the line y + 0.5. Before each row, the vertices that the line has reached are
// taken in y order and their two edges started or retired; an edge holds for the sample lines
// from its upper end inclusive to its lower end exclusive. The active edges stay ordered by x
// through a cheap sortedness test, since the order rarely changes from row to row. Spans are
// then handed to a sink, which writes pixels (aliased fill) or coverage bits (antialiased
// fill), and every edge taken advances by one addition.
#ifndef ZV_RASTER_FILL_SWEEP_H
#define ZV_RASTER_FILL_SWEEP_H

#include "raster/fill_context.h"
#include "raster/fill_scratch.h"
#include "raster/insertion_sort.h"

#include <algorithm>
#include <cmath>

class CFillSweep {
 public:
  CFillSweep(CFillContext& ctx, int numVertices)
      : ctx(ctx),
        numVertices(numVertices),
        retiring(ZvScratch_RetiringEdges, Count(numVertices)),
        incoming(ZvScratch_IncomingEdges, Count(numVertices)),
        spare(ZvScratch_SpareEdges, Count(numVertices)),
        slots(ZvScratch_EdgeSlots, Count(numVertices)),
        edges(ctx.activeEdges),
        other(spare.get()) {
    std::fill(slots.get(), slots.get() + Count(numVertices), -1);
  }

  // Brings the active edges to the sample line y + 0.5, ordered by x.
  void Advance(int y) {
    const double yc = y + 0.5;
    if (cursor < numVertices && ctx.vertices[ctx.sortedVertices[cursor].index].y <= yc)
      TakeVertices(y);
    else if (crossed)
      OrderEdges();
  }

  // Calls span(left, right) for each run of sample columns inside under the rule, clipped to
  // [leftLimit, rightExclusive), and advances the edges taken. A column whose sample point lies
  // on an edge is inside; a span of zero width is never written.
  template <bool NonZero, class Span>
  void Spans(int leftLimit, int rightExclusive, Span&& span) {
    CFillActiveEdge* e = edges;
    const Limits limits(leftLimit, rightExclusive);
    // A local, not the member: the member was read and written in memory at every edge.
    bool cross = false;
    if (!NonZero) {
      for (int i = 0; i + 1 < numActive; i += 2) {
        const double xl = e[i].x;
        const double xr = e[i + 1].x;
        if (xr > xl) Emit(xl, xr, limits, span);
        Step(e, i, cross);
        Step(e, i + 1, cross);
      }
      if (numActive & 1) Step(e, numActive - 1, cross);
      crossed = cross;
      return;
    }
    int i = 0;
    while (i < numActive) {
      const double xl = e[i].x;
      int winding = e[i].direction;
      Step(e, i, cross);
      ++i;
      double xr = xl;
      double end = HUGE_VAL;  // edges run out: the span reaches the right limit
      while (i < numActive) {
        xr = e[i].x;
        winding += e[i].direction;
        Step(e, i, cross);
        ++i;
        if (winding == 0) {
          end = xr;
          break;
        }
      }
      if (xr > xl) Emit(xl, end, limits, span);
    }
    crossed = cross;
  }

 private:
  // Advances edge i by one row and notes whether it went past the edge before it (advanced
  // already): the next row's ordering pass is skipped when no edge did, which is the usual case.
  static void Step(CFillActiveEdge* e, int i, bool& cross) {
    e[i].x += e[i].dxdy;
    cross |= i > 0 && After(e[i - 1], e[i]);
  }

  static std::size_t Count(int n) { return n > 0 ? static_cast<std::size_t>(n) : 0; }

  // The rows that reach vertices, out of line: in most shapes most rows take none.
  //
  // A vertex inside a chain ends one edge and starts the next: the new edge takes the slot of
  // the old one, found through the slot table, and the order is mended by the insertion sort.
  // The edges that end elsewhere are known by the vertices that end them, and the edges that
  // begin, ordered among themselves, are merged in: only the part of the table from the first
  // change on is rewritten, since shapes side by side give rows where a few edges change among
  // many that go on.
  void TakeVertices(int y);
  bool Replace(int endId, const CFillVertex& at, const CFillVertex& other, int id, int direction,
               double yc);
  void Treat(const CFillVertex& at, const CFillVertex& other, int id, int direction, double yc,
             double yAbove, int& numIncoming, int& numRetiring);
  void Merge(int numIncoming, int numRetiring);
  void Start(CFillActiveEdge& e, const CFillVertex& at, const CFillVertex& other, int id,
             int direction, double yc) {
    e.dxdy = (other.x - at.x) / (other.y - at.y);
    e.x = (yc - at.y) * e.dxdy + at.x - 0.5;
    e.id = id;
    e.direction = direction;
  }

  // Edges rarely swap between rows, so the insertion sort is linear on the usual nearly
  // ordered table.
  static bool After(const CFillActiveEdge& a, const CFillActiveEdge& b) {
    return CompareActiveEdges(&a, &b) > 0;
  }
  // The active table's order, keeping the slot table up to date.
  void OrderEdges() {
    CFillActiveEdge* e = edges;
    zvInsertionSort(e, numActive, After, [&](int at) { slots[e[at].id] = at; });
  }

  // The clip limits of a row's spans, also in double so that no crossing is compared by
  // converting the limit anew.
  struct Limits {
    Limits(int leftLimit, int rightExclusive)
        : left(leftLimit), last(rightExclusive - 1), leftD(left), lastD(last) {}
    int left, last;
    double leftD, lastD;
  };

  // Writes the columns from ceil(xl) to floor(xr), clipped to the limits. An xr of +infinity
  // reaches the right limit. Clipping happens in double precision so that no far-off crossing
  // is converted to int, and the roundings of the crossings left inside are done on the
  // integers: a crossing between the limits fits in an int. The two ends are rounded
  // independently, so their conversions overlap.
  template <class Span>
  static void Emit(double xl, double xr, const Limits& limits, Span& span) {
    if (!(xl <= limits.lastD)) return;  // ceil(xl) past the last column, or NaN
    if (!(xr >= limits.leftD)) return;  // floor(xr) before the first column, or NaN
    int left = limits.left;
    if (xl > limits.leftD) {
      left = static_cast<int>(xl);  // towards zero, then up to the ceiling
      left += left < xl;
    }
    int right = limits.last;
    if (xr < limits.lastD) {
      right = static_cast<int>(xr);
      right -= right > xr;
    }
    if (left <= right) span(left, right);
  }

  CFillContext& ctx;
  int numVertices;
  ZvScratchArray<int> retiring;              // the edges that end on the current line
  ZvScratchArray<CFillActiveEdge> incoming;  // the edges that begin on the current line
  ZvScratchArray<CFillActiveEdge> spare;
  ZvScratchArray<int> slots;  // position of each active edge by edge id, -1 for the others
  CFillActiveEdge* edges;     // the active edges, the context's table
  CFillActiveEdge* other;     // where the changed part of the table is merged
  int cursor = 0;
  int numActive = 0;
  bool crossed = true;  // the table may be out of order: edges moved since it was last ordered
};

#endif
