// The named cell setters of CFillContext: the newest coverage row is the last of the three.
#include "raster/aa_cells.h"

void CFillContext::SetAbuffer8(int row, int x0, int x1, int& minCell, int& maxCell) {
  ZvSetCells<ZvCells8x8>(abuffer8[abuffer8[2] ? 2 : 0], row, x0, x1, minCell, maxCell);
}

void CFillContext::SetAbuffer(int row, int x0, int x1, int& minCell, int& maxCell) {
  ZvSetCells<ZvCells4x4>(abuffer[abuffer[2] ? 2 : 0], row, x0, x1, minCell, maxCell);
}
