// Rows of runs: a raster row encoded as the runs of pixels equal to the traced value.
//
// A row is read 64 pixels at a time into a mask, bit i set where pixel i equals the value. The
// run boundaries are then the bits where the mask differs from itself moved by one pixel, found
// with a count of trailing zeros each; a stretch of 64 pixels wholly inside or wholly outside a
// run, which is most of a drawing, has no such bit and costs a compare.
#include "raster/ob_context.h"

#if defined(__SSE2__)
#include <emmintrin.h>
#endif
#include <cstring>

namespace {
const int kChunk = 64;

// The mask of the `count` pixels at p, one byte at a time, but for whole words of eight equal or
// eight different pixels; for machines without vector compares, and for the end of a row.
std::uint64_t ScalarMask(const unsigned char* p, int count, unsigned char value) {
  const std::uint64_t ones = 0x0101010101010101ull, highs = 0x8080808080808080ull;
  std::uint64_t mask = 0;
  int i = 0;
  for (; i + 8 <= count; i += 8) {
    std::uint64_t word;
    std::memcpy(&word, p + i, 8);
    const std::uint64_t x = word ^ (ones * value);
    if (x == 0) {
      mask |= std::uint64_t{0xff} << i;
      continue;
    }
    // No zero byte in x: no pixel of the eight equals the value. The test answers exactly
    // whether there is one, but may flag bytes above it too, so such a word is read byte by
    // byte.
    if (!((x - ones) & ~x & highs)) continue;
    for (int k = 0; k < 8; ++k)
      mask |= std::uint64_t{p[i + k] == value} << (i + k);
  }
  for (; i < count; ++i)
    mask |= std::uint64_t{p[i] == value} << i;
  return mask;
}

#if defined(__SSE2__)
std::uint64_t ChunkMask(const unsigned char* p, __m128i pattern) {
  std::uint64_t mask = 0;
  for (int i = 0; i < kChunk; i += 16) {
    const __m128i v = _mm_loadu_si128(reinterpret_cast<const __m128i*>(p + i));
    mask |= static_cast<std::uint64_t>(
                static_cast<unsigned int>(_mm_movemask_epi8(_mm_cmpeq_epi8(v, pattern))))
            << i;
  }
  return mask;
}
#endif

// Stores the boundaries marked in `changes`, bit i for column x + i. Boundaries alternate: a
// start, stored as its column plus 2, then the column after an end, whose last column plus 2 is
// one less; `n`, the entries written so far, tells which by its parity.
inline unsigned int PutBoundaries(std::uint64_t changes, int x, std::uint16_t* row,
                                  unsigned int n) {
  while (changes) {
    const int at = x + __builtin_ctzll(changes);
    row[n] = static_cast<std::uint16_t>(at + 2 - static_cast<int>(n & 1));
    ++n;
    changes &= changes - 1;
  }
  return n;
}
}  // namespace

void ObEncodeRow(const unsigned char* pixels, int width, unsigned char value, std::uint16_t* row) {
  unsigned int n = 0;
  std::uint64_t inside = 0;  // 1 when the pixel left of the chunk is in a run
  int x = 0;
#if defined(__SSE2__)
  const __m128i pattern = _mm_set1_epi8(static_cast<char>(value));
  for (; x + kChunk <= width; x += kChunk) {
    const std::uint64_t mask = ChunkMask(pixels + x, pattern);
    n = PutBoundaries(mask ^ (mask << 1 | inside), x, row, n);
    inside = mask >> 63;
  }
#endif
  for (; x < width; x += kChunk) {
    const int count = width - x < kChunk ? width - x : kChunk;
    const std::uint64_t mask = ScalarMask(pixels + x, count, value);
    const std::uint64_t live =
        count == kChunk ? ~std::uint64_t{0} : (std::uint64_t{1} << count) - 1;
    n = PutBoundaries((mask ^ (mask << 1 | inside)) & live, x, row, n);
    inside = mask >> (count - 1) & 1;
  }
  // A run reaching the right edge ends on the last column.
  if (inside) row[n++] = static_cast<std::uint16_t>(width + 1);
  row[n] = 0;
  row[n + 1] = 0;
}
