// The y order of a fill's vertices.
#ifndef ZV_RASTER_FILL_VERTEX_ORDER_H
#define ZV_RASTER_FILL_VERTEX_ORDER_H

#include "raster/fill_context.h"

// Writes records[0..n) into sorted[0..n) by rising y of their vertices (the order of
// CompareIndices; vertices of equal y in no particular order). The records must be in vertex
// order, records[i].index == i.
void ZvOrderByRisingY(const CFillSortedVertex* records, CFillSortedVertex* sorted, int n,
                      const CFillVertex* vertices);

// Writes records[0..n) into sorted[0..n) by the sample line that takes them: a vertex of y is
// taken at the first line y' + 0.5 with y <= y' + 0.5, that is at row ceil(y - 0.5). Within a row
// the records keep vertex order. A sweep whose spans only ever set coverage sees the same result
// from any order within a row: the edges it starts come out of them ordered by x, and edges of
// equal x give spans whose union is the same. Vertices spread over far more rows than there are
// vertices are sorted by y instead.
void ZvOrderBySampleLine(const CFillSortedVertex* records, CFillSortedVertex* sorted, int n,
                         const CFillVertex* vertices);

#endif
