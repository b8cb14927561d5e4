// The y order of a fill's vertices.
#ifndef ZV_RASTER_FILL_VERTEX_ORDER_H
#define ZV_RASTER_FILL_VERTEX_ORDER_H

#include "raster/fill_context.h"

// Writes records[0..n) into sorted[0..n) by rising y of their vertices (the order of
// CompareIndices; vertices of equal y in no particular order). The records must be in vertex
// order, records[i].index == i.
void ZvOrderByRisingY(const CFillSortedVertex* records, CFillSortedVertex* sorted, int n,
                      const CFillVertex* vertices);

#endif
