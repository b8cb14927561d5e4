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

#include <cmath>

class CFillSweep {
 public:
  CFillSweep(CFillContext& ctx, int numVertices)
      : ctx(ctx),
        numVertices(numVertices),
        edgeEnds(ZvScratch_EdgeEnds, numVertices),
        incoming(ZvScratch_IncomingEdges, numVertices) {}

  // Brings the active edges to the sample line y + 0.5, ordered by x.
  //
  // The edges that end on this line go in one pass rather than one search each: an edge is
  // retired at the first line that reaches its lower end, which is the line that takes that
  // end's vertex. The edges that begin are ordered among themselves and merged in, after the
  // ones already active, which keep their order: the table is the one that appending and a
  // stable sort by x would give.
  void Advance(int y) {
    const double yc = y + 0.5;
    const double yAbove = y - 0.5;
    const CFillVertex* v = ctx.vertices;
    int numIncoming = 0;
    bool ending = false;
    while (cursor < numVertices && v[ctx.sortedVertices[cursor].index].y <= yc) {
      const CFillSortedVertex& s = ctx.sortedVertices[cursor++];
      const CFillVertex& at = v[s.index];
      // The edge arriving from prev goes upwards in path order when it starts here, the edge
      // leaving towards next downwards.
      Treat(at, v[s.prev], s.prev, -1, yc, yAbove, numIncoming, ending);
      Treat(at, v[s.next], s.index, +1, yc, yAbove, numIncoming, ending);
    }
    if (ending) Retire(yc);
    // Edges rarely swap between rows: a stable insertion sort is linear on the usual nearly
    // ordered table.
    InsertionSort(ctx.activeEdges, numActive);
    if (numIncoming > 0) {
      InsertionSort(incoming.get(), numIncoming);
      Merge(numIncoming);
    }
  }

  // Calls span(left, right) for each run of sample columns inside under the rule, clipped to
  // [leftLimit, rightExclusive), and advances the edges taken. A column whose sample point lies
  // on an edge is inside; a span of zero width is never written.
  template <bool NonZero, class Span>
  void Spans(int leftLimit, int rightExclusive, Span&& span) {
    CFillActiveEdge* e = ctx.activeEdges;
    if (!NonZero) {
      for (int i = 0; i + 1 < numActive; i += 2) {
        const double xl = e[i].x;
        const double xr = e[i + 1].x;
        if (xr > xl) Emit(xl, std::floor(xr), leftLimit, rightExclusive, span);
        e[i].x += e[i].dxdy;
        e[i + 1].x += e[i + 1].dxdy;
      }
      if (numActive & 1) e[numActive - 1].x += e[numActive - 1].dxdy;
      return;
    }
    int i = 0;
    while (i < numActive) {
      const double xl = e[i].x;
      int winding = e[i].direction;
      e[i].x += e[i].dxdy;
      ++i;
      double xr = xl;
      double right = rightExclusive - 1;
      while (i < numActive) {
        xr = e[i].x;
        winding += e[i].direction;
        e[i].x += e[i].dxdy;
        ++i;
        if (winding == 0) {
          right = std::floor(xr);
          break;
        }
      }
      if (xr > xl) Emit(xl, right, leftLimit, rightExclusive, span);
    }
  }

 private:
  void Treat(const CFillVertex& at, const CFillVertex& other, int id, int direction, double yc,
             double yAbove, int& numIncoming, bool& ending) {
    if (other.y <= yAbove) {
      ending = true;
    } else if (other.y > yc) {
      CFillActiveEdge& e = incoming[numIncoming++];
      e.dxdy = (other.x - at.x) / (other.y - at.y);
      e.x = (yc - at.y) * e.dxdy + at.x - 0.5;
      e.id = id;
      e.direction = direction;
      edgeEnds[id] = other.y;
    }
  }

  // Drops the edges whose lower end the line yc has reached, keeping the order of the others.
  void Retire(double yc) {
    CFillActiveEdge* e = ctx.activeEdges;
    int kept = 0;
    for (int i = 0; i < numActive; ++i) {
      if (edgeEnds[e[i].id] <= yc) continue;
      if (kept != i) e[kept] = e[i];
      ++kept;
    }
    numActive = kept;
  }

  static void InsertionSort(CFillActiveEdge* e, int count) {
    for (int i = 1; i < count; ++i) {
      if (CompareActiveEdges(&e[i - 1], &e[i]) < 0) continue;
      const CFillActiveEdge moving = e[i];
      int j = i;
      for (; j > 0 && CompareActiveEdges(&e[j - 1], &moving) > 0; --j)
        e[j] = e[j - 1];
      e[j] = moving;
    }
  }

  // Merges the ordered incoming edges into the ordered active ones from the back, in place; on
  // equal x the active edge stays first.
  void Merge(int numIncoming) {
    CFillActiveEdge* e = ctx.activeEdges;
    int i = numActive - 1;
    int j = numIncoming - 1;
    int to = numActive + numIncoming - 1;
    while (j >= 0) {
      if (i >= 0 && CompareActiveEdges(&e[i], &incoming[j]) > 0)
        e[to--] = e[i--];
      else
        e[to--] = incoming[j--];
    }
    numActive += numIncoming;
  }

  // Clipping happens in double precision so that no far-off crossing is converted to int.
  template <class Span>
  static void Emit(double xl, double right, int leftLimit, int rightExclusive, Span& span) {
    double left = std::ceil(xl);
    if (left < leftLimit) left = leftLimit;
    if (right > rightExclusive - 1) right = rightExclusive - 1;
    if (!(left <= right) || left >= rightExclusive) return;
    span(static_cast<int>(left), static_cast<int>(right));
  }

  CFillContext& ctx;
  int numVertices;
  ZvScratchArray<double> edgeEnds;            // lower end y of each started edge, by edge id
  ZvScratchArray<CFillActiveEdge> incoming;  // the edges that begin on the current line
  int cursor = 0;
  int numActive = 0;
};

#endif
