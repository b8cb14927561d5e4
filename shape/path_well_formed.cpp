#include "shape/path_well_formed.h"

#include "shape/path_codes.h"

namespace zv_path {

bool IsWellFormedBlock(const unsigned char* codes, unsigned int count) {
  unsigned int i = 0;
  while (i < count) {
    if (codes[i] != kStart) return false;
    ++i;
    bool closed = false;
    while (i < count && codes[i] != kStart) {
      // A closed end is the subpath's last point.
      if (closed || codes[i] > kCodeMask) return false;
      const unsigned int d = Decode(codes[i]).degree;
      if (d == 0 || count - i < d) return false;
      const unsigned int base = Base(d);
      for (unsigned int k = 0; k + 1 < d; ++k)
        if (codes[i + k] != base + k) return false;
      const unsigned int end = codes[i + d - 1];
      if (end != base + d - 1 && end != base + d) return false;
      closed = end == base + d;
      i += d;
    }
  }
  return true;
}

}  // namespace zv_path
