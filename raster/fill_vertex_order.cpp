// Sorting the vertices of a fill by y: distribution into as many buckets as there are vertices
// over the range of y, then each bucket sorted on its own. Bucket keys rise with y, so the result
// is the full order; a polygon's vertices spread over its height, so a bucket holds one or two
// and the whole costs a few linear passes rather than n log n comparisons through the vertex
// table.
#include "raster/fill_vertex_order.h"

#include "raster/fill_scratch.h"
#include "raster/insertion_sort.h"

#include <algorithm>
#include <cmath>

namespace {
bool Before(const CFillSortedVertex& a, const CFillSortedVertex& b) {
  return CompareIndices(&b, &a) > 0;  // a.y < b.y
}

// Below this count, and within a bucket above it, a comparison sort is cheaper.
constexpr int kFewVertices = 64;
constexpr int kInsertionLimit = 16;

void SortBucket(CFillSortedVertex* r, int count) {
  if (count > kInsertionLimit) {
    std::sort(r, r + count, Before);
  } else {
    zvInsertionSort(r, count, [](const CFillSortedVertex& a, const CFillSortedVertex& b) {
      return Before(b, a);
    });
  }
}
void YRange(const CFillVertex* vertices, int n, double& lo, double& hi) {
  lo = hi = vertices[0].y;
  for (int i = 1; i < n; ++i) {
    lo = std::min(lo, vertices[i].y);
    hi = std::max(hi, vertices[i].y);
  }
}

// A stable counting sort of the records into `count` groups by key(y), key rising with y;
// starts[g] ends as the end of group g.
template <class Key>
void Distribute(const CFillSortedVertex* records, CFillSortedVertex* sorted, int n,
                const CFillVertex* vertices, int count, int* starts, Key key) {
  std::fill(starts, starts + count + 1, 0);
  for (int i = 0; i < n; ++i)
    ++starts[key(vertices[i].y) + 1];
  for (int g = 0; g < count; ++g)
    starts[g + 1] += starts[g];
  for (int i = 0; i < n; ++i)
    sorted[starts[key(vertices[i].y)]++] = records[i];
}
}  // namespace

void ZvOrderByRisingY(const CFillSortedVertex* records, CFillSortedVertex* sorted, int n,
                      const CFillVertex* vertices) {
  if (n < kFewVertices) {
    std::copy(records, records + n, sorted);
    std::sort(sorted, sorted + n, Before);
    return;
  }
  double lo, hi;
  YRange(vertices, n, lo, hi);
  // Keys are floor((y - lo) * k): subtracting, scaling by a positive factor and flooring never
  // reverse an order. A range too thin for the factor puts everything into one bucket.
  const int buckets = n;
  double k = (buckets - 1) / (hi - lo);
  if (!(k < 1e300)) k = 0.0;
  auto key = [&](double y) {
    const int b = static_cast<int>((y - lo) * k);
    return b < buckets ? b : buckets - 1;
  };
  ZvScratchArray<int> starts(ZvScratch_SortCounts, static_cast<std::size_t>(buckets) + 1);
  Distribute(records, sorted, n, vertices, buckets, starts.get(), key);
  int begin = 0;
  for (int b = 0; b < buckets; ++b) {
    const int end = starts[b];
    if (end - begin > 1) SortBucket(sorted + begin, end - begin);
    begin = end;
  }
}

void ZvOrderBySampleLine(const CFillSortedVertex* records, CFillSortedVertex* sorted, int n,
                         const CFillVertex* vertices) {
  if (n < kFewVertices) {
    ZvOrderByRisingY(records, sorted, n, vertices);
    return;
  }
  double lo, hi;
  YRange(vertices, n, lo, hi);
  // y - 0.5 is exact below 2^52; rows beyond a few per vertex would make the counts the cost.
  const double first = std::ceil(lo - 0.5), rows = std::ceil(hi - 0.5) - first + 1.0;
  if (!(std::fabs(lo) < 0x1p50 && std::fabs(hi) < 0x1p50 && rows <= 4.0 * n + 4096.0)) {
    ZvOrderByRisingY(records, sorted, n, vertices);
    return;
  }
  const int count = static_cast<int>(rows);
  auto row = [&](double y) { return static_cast<int>(std::ceil(y - 0.5) - first); };
  ZvScratchArray<int> starts(ZvScratch_SortCounts, static_cast<std::size_t>(count) + 1);
  Distribute(records, sorted, n, vertices, count, starts.get(), row);
}
