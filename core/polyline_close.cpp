// Closeness of two polylines compared at equal arc lengths.
#include <zv/polyline.h>

namespace {

template <class Array>
int PolylinesAreClose(const Array& a, const ZvDoubleArray& chordsA, unsigned int aFirst,
                      unsigned int aLast, const Array& b, const ZvDoubleArray& chordsB,
                      unsigned int bFirst, unsigned int bLast, double tolerance,
                      unsigned int& index) {
  if (aFirst > aLast || aLast >= a.size || aLast >= chordsA.size) return 0;
  if (bFirst > bLast || bLast >= b.size || bLast >= chordsB.size) return 0;
  const double tolerance2 = tolerance * tolerance;
  const double startA = chordsA[aFirst], startB = chordsB[bFirst];
  unsigned int j = aFirst;
  // The end vertices of b are where a fit was pinned: only the inner ones can stray.
  for (unsigned int k = bFirst + 1; k < bLast; ++k) {
    const double s = chordsB[k] - startB;
    while (j < aLast && chordsA[j + 1] - startA < s)
      ++j;
    double x = a[j].x, y = a[j].y;
    if (j < aLast) {
      const double span = chordsA[j + 1] - chordsA[j];
      const double u = span > 0.0 ? (s - (chordsA[j] - startA)) / span : 0.0;
      if (u > 0.0) {
        x += (double(a[j + 1].x) - x) * u;
        y += (double(a[j + 1].y) - y) * u;
      }
    }
    const double dx = x - b[k].x, dy = y - b[k].y;
    if (dx * dx + dy * dy > tolerance2) {
      index = k;
      return 0;
    }
  }
  return 1;
}

}  // namespace

int ZvPoint2fArray_PolylinesAreClose(const ZvPoint2fArray& a, const ZvDoubleArray& chordsA,
                                     unsigned int aFirst, unsigned int aLast,
                                     const ZvPoint2fArray& b, const ZvDoubleArray& chordsB,
                                     unsigned int bFirst, unsigned int bLast, double tolerance,
                                     unsigned int& index) {
  return PolylinesAreClose(a, chordsA, aFirst, aLast, b, chordsB, bFirst, bLast, tolerance, index);
}

int ZvPoint2dArray_PolylinesAreClose(const ZvPoint2dArray& a, const ZvDoubleArray& chordsA,
                                     unsigned int aFirst, unsigned int aLast,
                                     const ZvPoint2dArray& b, const ZvDoubleArray& chordsB,
                                     unsigned int bFirst, unsigned int bLast, double tolerance,
                                     unsigned int& index) {
  return PolylinesAreClose(a, chordsA, aFirst, aLast, b, chordsB, bFirst, bLast, tolerance, index);
}
