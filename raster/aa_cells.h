// Coverage cells of the antialiased fill: one bit per sub-sample, one word per pixel.
//
//   8x8: a 64-bit word; sub-sample row r is byte r (from the least significant), column c is
//        bit c of that byte, so sample (c, r) is bit 8r + c.
//   4x4: a 32-bit word of which the low 16 bits are used; sample (c, r) is bit 4r + c.
//
// The two layouts are one policy each; the span setter, the bit count and the feather masks
// are told once over them.
#ifndef ZV_RASTER_AA_CELLS_H
#define ZV_RASTER_AA_CELLS_H

#include "raster/aa_table.h"
#include "raster/fill_context.h"

#include <cstdint>

#if defined(__SSE2__)
#include <emmintrin.h>
#endif

struct ZvCells4x4 {
  using Word = std::uint32_t;
  static constexpr int N = 4;
  static constexpr int Shift = 2;
  static constexpr Word RowBits = 0xF;
  static constexpr Word AllBits = 0xFFFF;
  static Word* (&Rows(CFillContext& ctx))[3] { return ctx.abuffer; }
  static Word* Runs(CFillContext& ctx) { return ctx.aruns; }
  static void Allocate(CFillContext& ctx, int first, int end, bool three) {
    ctx.AllocateCoverageRows4x4(first, end, three);
  }
  static unsigned int Count(Word w) { return ZvCountBits16(w); }
};

struct ZvCells8x8 {
  using Word = std::uint64_t;
  static constexpr int N = 8;
  static constexpr int Shift = 3;
  static constexpr Word RowBits = 0xFF;
  static constexpr Word AllBits = ~Word(0);
  static Word* (&Rows(CFillContext& ctx))[3] { return ctx.abuffer8; }
  static Word* Runs(CFillContext& ctx) { return ctx.aruns8; }
  static void Allocate(CFillContext& ctx, int first, int end, bool three) {
    ctx.AllocateCoverageRows8x8(first, end, three);
  }
  static unsigned int Count(Word w) {
    return ZvCountBits16(static_cast<std::uint32_t>(w)) +
           ZvCountBits16(static_cast<std::uint32_t>(w >> 16)) +
           ZvCountBits16(static_cast<std::uint32_t>(w >> 32)) +
           ZvCountBits16(static_cast<std::uint32_t>(w >> 48));
  }
};

// Bits k..N-1 and 0..k of one sub-sample row (the L and R masks), shifted to row `row`.
template <class C>
inline typename C::Word ZvCellLeftMask(int row, int k) {
  return ((C::RowBits << k) & C::RowBits) << (row * C::N);
}
template <class C>
inline typename C::Word ZvCellRightMask(int row, int k) {
  return (C::RowBits >> (C::N - 1 - k)) << (row * C::N);
}

// Sets samples x0..x1 (inclusive, x0 <= x1) of sub-sample row `row` in `cells`, indexed by
// cell. Inner cells of the span get their whole row at once.
template <class C>
inline void ZvSetCells(typename C::Word* cells, int row, int x0, int x1, int& minCell,
                       int& maxCell) {
  using Word = typename C::Word;
  const int a = x0 >> C::Shift;
  const int b = x1 >> C::Shift;
  if (a < minCell) minCell = a;
  if (b > maxCell) maxCell = b;
  const Word left = ZvCellLeftMask<C>(row, x0 & (C::N - 1));
  const Word right = ZvCellRightMask<C>(row, x1 & (C::N - 1));
  if (a == b) {
    cells[a] |= left & right;
    return;
  }
  cells[a] |= left;
  const Word whole = C::RowBits << (row * C::N);
  for (int c = a + 1; c < b; ++c)
    cells[c] |= whole;
  cells[b] |= right;
}

// The sweep's form of ZvSetCells: the end cells of the span are set, and its inner cells become
// a run of `runs` (see CFillContext::aruns), two flips whatever the span's length. Inner cells of
// one sub-sample row never hold an end of another span of that row (the row's spans are
// disjoint), so a cell covered whole by runs in every sub-sample row has no bit set in `cells`.
template <class C>
inline void ZvMarkCells(typename C::Word* cells, typename C::Word* runs, int row, int x0, int x1,
                        int& minCell, int& maxCell) {
  using Word = typename C::Word;
  const int a = x0 >> C::Shift;
  const int b = x1 >> C::Shift;
  if (a < minCell) minCell = a;
  if (b > maxCell) maxCell = b;
  const Word left = ZvCellLeftMask<C>(row, x0 & (C::N - 1));
  const Word right = ZvCellRightMask<C>(row, x1 & (C::N - 1));
  if (a == b) {
    cells[a] |= left & right;
    return;
  }
  cells[a] |= left;
  cells[b] |= right;
  const Word whole = C::RowBits << (row * C::N);
  runs[a + 1] ^= whole;  // b = a + 1 flips twice: no inner cell
  runs[b] ^= whole;
}

// The first cell at or after `x` where `cells` or `runs` is non-zero, given that there is one.
// Inside and outside a large shape most cells are blank, so the scan goes a vector of cells at
// a time where the machine has one (reading up to 16 bytes past the found cell: the rows are
// padded for it), and finishes cell by cell.
template <class Word>
inline int ZvNextMarkedCell(const Word* cells, const Word* runs, int x) {
#if defined(__SSE2__)
  constexpr int perVector = 16 / sizeof(Word);
  const __m128i zero = _mm_setzero_si128();
  for (;; x += perVector) {
    const __m128i v = _mm_or_si128(_mm_loadu_si128(reinterpret_cast<const __m128i*>(cells + x)),
                                   _mm_loadu_si128(reinterpret_cast<const __m128i*>(runs + x)));
    if (_mm_movemask_epi8(_mm_cmpeq_epi8(v, zero)) != 0xFFFF) break;
  }
#endif
  while (!(cells[x] | runs[x]))
    ++x;
  return x;
}

// The masks of the nine cells around a pixel whose counts make its feathered value: the square
// of the pixel's own cell widened by `radius` sub-samples (1..N) on each side. Index [dy][dx]
// with dy, dx in 0..2 for the cell above/left, own, below/right.
template <class C>
struct ZvFeatherMasks {
  typename C::Word m[3][3];
  explicit ZvFeatherMasks(int radius) {
    using Word = typename C::Word;
    Word lowCols = 0, highCols = 0, topRows = 0, bottomRows = 0;
    const Word lowRow = (C::RowBits >> (C::N - radius));  // columns 0..radius-1
    const Word highRow = (lowRow << (C::N - radius));     // columns N-radius..N-1
    for (int r = 0; r < C::N; ++r) {
      lowCols |= lowRow << (r * C::N);
      highCols |= highRow << (r * C::N);
      if (r < radius) topRows |= C::RowBits << (r * C::N);
      if (r >= C::N - radius) bottomRows |= C::RowBits << (r * C::N);
    }
    const Word all = lowCols | ~lowCols;
    const Word full = C::N == 4 ? Word(0xFFFF) : all;
    // Above: the cell's last rows; below: its first rows; left: its last columns; right: its
    // first columns.
    const Word rowMask[3] = {bottomRows, full, topRows};
    const Word colMask[3] = {highCols, full, lowCols};
    for (int dy = 0; dy < 3; ++dy)
      for (int dx = 0; dx < 3; ++dx)
        m[dy][dx] = rowMask[dy] & colMask[dx];
  }
};

#endif
