// Slots of ZvPath2f whose work belongs to the measuring, editing and rasterising code of paths.
//
// The virtual table is fixed, so every slot needs a body to link. Until that code is in, each of
// these answers its failure value (0, null, or its argument untouched) and changes nothing.
// Each definition here is removed when the real one arrives.
#include <zv/path2f.h>

// ---- Rasterising -------------------------------------------------------------------------------

int ZvPath2f::SoftFill(const ZvGC&, ZvRaster<unsigned char>&, int (*)()) const {
  return 0;
}
int ZvPath2f::SoftFill(const ZvGC&, ZvRaster<float>&, int (*)()) const {
  return 0;
}
int ZvPath2f::SoftFill(const ZvGC&, ZvRaster<short>&, int (*)()) const {
  return 0;
}
