// Even subdivision of a polyline by arc length.
#include <zv/polyline.h>

#include <cmath>

int ZvPoint2fArraySingleComponent_EvenSubdivide(const ZvPoint2fArray& a,
                                                const ZvDoubleArray& chords, unsigned int n,
                                                ZvPoint2fArray& out) {
  if (n == 0 || a.size == 0 || chords.size != a.size || &out == &a) return 0;
  const unsigned int last = a.size - 1;
  const double total = chords[last];
  if (last == 0 || std::fabs(total) <= 1e-9) {
    for (unsigned int k = 0; k <= n; ++k)
      out.Add(a[0]);
    return 1;
  }
  const double step = total / n;
  out.Add(a[0]);
  // The targets grow, so one forward walk over the table finds all their edges.
  unsigned int j = 1;
  for (unsigned int k = 1; k < n; ++k) {
    const double target = k * step;
    while (j < last && chords[j] < target)
      ++j;
    const double span = chords[j] - chords[j - 1];
    const double t = span > 0.0 ? (target - chords[j - 1]) / span : 1.0;
    const ZvPoint2<float>& p = a[j - 1];
    const ZvPoint2<float>& q = a[j];
    out.Add(p.x + (double(q.x) - p.x) * t, p.y + (double(q.y) - p.y) * t);
  }
  out.Add(a[last]);
  return 1;
}
