// Rows of runs: a raster row encoded as the runs of pixels equal to the traced value.
#include "raster/ob_context.h"

#include <cstring>

namespace {
// Rows are scanned eight pixels at a time: a pixel equal to the value is a zero byte of the
// word xor'ed with eight copies of the value, and bytes come in memory order from the lowest.
const std::uint64_t kOnes = 0x0101010101010101ull;
const std::uint64_t kHighs = 0x8080808080808080ull;

std::uint64_t Load(const unsigned char* p) {
  std::uint64_t w;
  std::memcpy(&w, p, 8);
  return w;
}

// First pixel equal to the value at or after p, or end.
const unsigned char* FindEqual(const unsigned char* p, const unsigned char* end,
                               std::uint64_t pattern, unsigned char value) {
  for (; end - p >= 8; p += 8) {
    const std::uint64_t x = Load(p) ^ pattern;
    // The lowest flagged byte is exactly the first zero byte; flags above it may be false.
    const std::uint64_t zero = (x - kOnes) & ~x & kHighs;
    if (zero) return p + __builtin_ctzll(zero) / 8;
  }
  while (p < end && *p != value)
    ++p;
  return p;
}

// First pixel different from the value at or after p, or end.
const unsigned char* FindDifferent(const unsigned char* p, const unsigned char* end,
                                   std::uint64_t pattern, unsigned char value) {
  for (; end - p >= 8; p += 8) {
    const std::uint64_t x = Load(p) ^ pattern;
    if (x) return p + __builtin_ctzll(x) / 8;
  }
  while (p < end && *p == value)
    ++p;
  return p;
}
}  // namespace

void ObEncodeRow(const unsigned char* pixels, int width, unsigned char value, std::uint16_t* row) {
  const std::uint64_t pattern = kOnes * value;
  const unsigned char* end = pixels + width;
  unsigned int n = 0;
  for (const unsigned char* p = FindEqual(pixels, end, pattern, value); p < end;
       p = FindEqual(p, end, pattern, value)) {
    const unsigned char* s = p;
    p = FindDifferent(p + 1, end, pattern, value);
    row[n++] = static_cast<std::uint16_t>(s - pixels + 2);
    row[n++] = static_cast<std::uint16_t>(p - pixels + 1);
  }
  row[n] = 0;
  row[n + 1] = 0;
}
