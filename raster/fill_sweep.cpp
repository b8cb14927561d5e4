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
    // The edge arriving from prev goes upwards in path order when it starts here, the edge
    // leaving towards next downwards.
    Treat(at, v[s.prev], s.prev, -1, yc, yAbove, numIncoming, ending);
    Treat(at, v[s.next], s.index, +1, yc, yAbove, numIncoming, ending);
  }
  InsertionSort(incoming.get(), numIncoming);
  if (!ending && numIncoming == 0) {
    InsertionSort(edges, numActive);
    return;
  }
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
      other[n++] = incoming[j++];
    other[n] = e;
    n += edgeEnds[e.id] > yc;
  }
  while (j < numIncoming)
    other[n++] = incoming[j++];
  std::swap(edges, other);
  numActive = n;
  // Edges that crossed since the last row: the merge took them as ordered, the sort puts them
  // right.
  if (!ordered) InsertionSort(edges, numActive);
}

void CFillSweep::Treat(const CFillVertex& at, const CFillVertex& other, int id, int direction,
                       double yc, double yAbove, int& numIncoming, bool& ending) {
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
