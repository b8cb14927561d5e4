// The vertex rows of the scanline sweep: edges started, retired and merged into the order.
#include "raster/fill_sweep.h"

#include <cmath>
#include <utility>

void CFillSweep::TakeVertices(int y) {
  const double yc = y + 0.5;
  const double yAbove = y - 0.5;
  const CFillVertex* v = ctx.vertices;
  int numIncoming = 0;
  bool ending = false;
  while (cursor < numVertices && v[ctx.sortedVertices[cursor].index].y <= yc) {
    const CFillSortedVertex& s = ctx.sortedVertices[cursor++];
    const CFillVertex& at = v[s.index];
    const CFillVertex& before = v[s.prev];
    const CFillVertex& after = v[s.next];
    // The edge arriving from prev goes upwards in path order when it starts here, the edge
    // leaving towards next downwards.
    if (before.y <= yAbove && after.y > yc && Replace(s.prev, at, after, s.index, +1, yc)) continue;
    if (after.y <= yAbove && before.y > yc && Replace(s.index, at, before, s.prev, -1, yc))
      continue;
    Treat(at, before, s.prev, -1, yc, yAbove, numIncoming, ending);
    Treat(at, after, s.index, +1, yc, yAbove, numIncoming, ending);
  }
  if (!ending && numIncoming == 0) {
    OrderEdges();
    return;
  }
  zvInsertionSort(incoming.get(), numIncoming, After);
  // Written without a branch on the retirement, which follows no pattern: every edge is copied
  // and only a kept one counts. Incoming edges left of a retired one are also left of every
  // later kept one.
  int n = 0;
  int j = 0;
  bool ordered = true;
  double previous = -HUGE_VAL;
  for (int i = 0; i < numActive; ++i) {
    const CFillActiveEdge& e = edges[i];
    ordered &= !(e.x < previous);
    previous = e.x;
    while (j < numIncoming && incoming[j].x < e.x)
      Place(incoming[j++], n++);
    other[n] = e;
    const bool kept = edgeEnds[e.id] > yc;
    slots[e.id] = kept ? n : -1;
    n += kept;
  }
  while (j < numIncoming)
    Place(incoming[j++], n++);
  std::swap(edges, other);
  numActive = n;
  // Edges that crossed or were replaced since the last row: the merge took them as ordered, the
  // sort puts them right.
  if (!ordered) OrderEdges();
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
                       double yc, double yAbove, int& numIncoming, bool& ending) {
  if (other.y <= yAbove) {
    ending = true;
  } else if (other.y > yc) {
    Start(incoming[numIncoming++], at, other, id, direction, yc);
  }
}
