#include "raster/aa_table.h"

unsigned char gc_oABTable[131072];

namespace {
struct BuildABTable {
  BuildABTable() {
    for (unsigned int m = 0; m < 65536; ++m) {
      unsigned int bits = 0;
      for (unsigned int v = m; v; v &= v - 1)
        ++bits;
      gc_oABTable[65536 + m] = static_cast<unsigned char>(bits);
      gc_oABTable[m] = static_cast<unsigned char>(bits * 255.0 * 0.0625 + 0.5);
    }
  }
};
const BuildABTable buildABTable;
}  // namespace
