// The vertex rows of the scanline sweep: edges started, retired and merged into the order.
#include "raster/fill_sweep.h"

#include <algorithm>
#include <cmath>

namespace {
constexpr int kLookAhead = 8;
}

void CFillSweep::TakeVertices(int y) {
  const double yc = y + 0.5;
  const double yAbove = y - 0.5;
  const CFillVertex* v = ctx.vertices;
  int numIncoming = 0;
  int numRetiring = 0;
  while (cursor < numVertices && v[ctx.sortedVertices[cursor].index].y <= yc) {
    const CFillSortedVertex& s = ctx.sortedVertices[cursor++];
    // The vertices in y order lie all over the table: their neighbours, a few records ahead,
    // are fetched while this one is worked on.
    if (cursor + kLookAhead < numVertices) {
      const CFillSortedVertex& ahead = ctx.sortedVertices[cursor + kLookAhead];
      __builtin_prefetch(v + ahead.index);
      __builtin_prefetch(v + ahead.prev);
      __builtin_prefetch(v + ahead.next);
    }
    const CFillVertex& at = v[s.index];
    const CFillVertex& before = v[s.prev];
    const CFillVertex& after = v[s.next];
    // The edge arriving from prev goes upwards in path order when it starts here, the edge
    // leaving towards next downwards.
    if (before.y <= yAbove && after.y > yc && Replace(s.prev, at, after, s.index, +1, yc)) continue;
    if (after.y <= yAbove && before.y > yc && Replace(s.index, at, before, s.prev, -1, yc))
      continue;
    Treat(at, before, s.prev, -1, yc, yAbove, numIncoming, numRetiring);
    Treat(at, after, s.index, +1, yc, yAbove, numIncoming, numRetiring);
  }
  // Edges that crossed or were replaced since the last row are put right first: the merge
  // needs the table in order.
  OrderEdges();
  if (numRetiring > 0 || numIncoming > 0) Merge(numIncoming, numRetiring);
}

void CFillSweep::Merge(int numIncoming, int numRetiring) {
  zvInsertionSort(incoming.get(), numIncoming, After);
  // The retiring edges by position, ascending, and out of the slot table.
  int* gone = retiring.get();
  for (int k = 0; k < numRetiring; ++k) {
    const int id = gone[k];
    gone[k] = slots[id];
    slots[id] = -1;
  }
  zvInsertionSort(gone, numRetiring, [](int a, int b) { return a > b; });
  int first = numRetiring > 0 ? gone[0] : numActive;
  if (numIncoming > 0) {
    // An incoming edge goes in front of the first edge right of it.
    const double x = incoming[0].x;
    first = static_cast<int>(
        std::upper_bound(edges, edges + first, x,
                         [](double value, const CFillActiveEdge& e) { return value < e.x; }) -
        edges);
  }
  // The rest of the table, merged into the spare one and copied back.
  int n = first;
  int j = 0;
  int g = 0;
  for (int i = first; i < numActive; ++i) {
    if (g < numRetiring && gone[g] == i) {
      ++g;
      continue;
    }
    const CFillActiveEdge& e = edges[i];
    while (j < numIncoming && incoming[j].x < e.x)
      other[n++] = incoming[j++];
    other[n++] = e;
  }
  while (j < numIncoming)
    other[n++] = incoming[j++];
  std::copy(other + first, other + n, edges + first);
  for (int i = first; i < n; ++i)
    slots[edges[i].id] = i;
  numActive = n;
}

bool CFillSweep::Replace(int endId, const CFillVertex& at, const CFillVertex& other, int id,
                         int direction, double yc) {
  const int slot = slots[endId];
  if (slot < 0) return false;  // never started: both its ends came on the same line
  Start(edges[slot], at, other, id, direction, yc);
  slots[endId] = -1;
  slots[id] = slot;
  return true;
}

void CFillSweep::Treat(const CFillVertex& at, const CFillVertex& other, int id, int direction,
                       double yc, double yAbove, int& numIncoming, int& numRetiring) {
  if (other.y <= yAbove) {
    // The edge from the vertex above ends here, if it was ever started: an edge whose two ends
    // came on one line never was.
    if (slots[id] >= 0) retiring[numRetiring++] = id;
  } else if (other.y > yc) {
    Start(incoming[numIncoming++], at, other, id, direction, yc);
  }
}
