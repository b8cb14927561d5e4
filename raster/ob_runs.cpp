// Rows of runs: encoding a raster row, and finding each run's overlaps in a neighbour row.
#include "raster/ob_context.h"

#include <cstring>

void ObEncodeRow(const unsigned char* pixels, int width, unsigned char value, std::uint16_t* row) {
  unsigned int n = 0;
  const unsigned char* p = pixels;
  const unsigned char* end = pixels + width;
  while (p < end) {
    // Rows of a traced raster are mostly one long run or one long gap: skip the gap in one go.
    const void* hit = std::memchr(p, value, static_cast<std::size_t>(end - p));
    if (!hit) break;
    const unsigned char* s = static_cast<const unsigned char*>(hit);
    p = s + 1;
    while (p < end && *p == value)
      ++p;
    row[n++] = static_cast<std::uint16_t>(s - pixels + 2);
    row[n++] = static_cast<std::uint16_t>(p - pixels + 1);
  }
  row[n] = 0;
  row[n + 1] = 0;
}
