// Vertex tests, filtering of tagged polylines and end tangents.
#include <zv/polyline.h>

#include <cmath>

namespace {

// The comparison runs in the array's own precision, so each form has its own tolerance.
template <class T>
int ConsecutivePointsDiffer(const ZvPoint2<T>* p, unsigned int n, T tolerance) {
  for (unsigned int i = 1; i < n; ++i)
    if (std::fabs(p[i].x - p[i - 1].x) <= tolerance && std::fabs(p[i].y - p[i - 1].y) <= tolerance)
      return 0;
  return 1;
}

bool Coincide(const ZvPoint2<double>& a, const ZvPoint2<double>& b) {
  return std::fabs(a.x - b.x) <= 1e-9 && std::fabs(a.y - b.y) <= 1e-9;
}

// A null edge has no direction to normalise; it is handed back as it is, so that callers see a
// tiny vector rather than a division by zero.
ZvPoint2<double> EdgeDirection(const ZvPoint2<double>& from, const ZvPoint2<double>& to) {
  const ZvPoint2<double> d = to - from;
  if (std::fabs(d.x) <= 1e-9 && std::fabs(d.y) <= 1e-9) return d;
  return d / std::sqrt(ZvDot(d, d));
}

}  // namespace

int ZvPoint2fArray_ConsecutivePointsDiffer(const ZvPoint2fArray& a) {
  return ConsecutivePointsDiffer(a.data, a.size, 1e-7f);
}

int ZvPoint2dArray_ConsecutivePointsDiffer(const ZvPoint2dArray& a) {
  return ConsecutivePointsDiffer(a.data, a.size, 1e-9);
}

int ZvPoint2dArray_IsStrictlyIncreasingX(const ZvPoint2dArray& a) {
  for (unsigned int i = 1; i < a.size; ++i)
    if (Coincide(a[i - 1], a[i]) || !(a[i].x > a[i - 1].x)) return 0;
  return 1;
}

int ZvPoint2dArray_Filter(const ZvPoint2dArray& in, const ZvPointTagArray& tags,
                          ZvPoint2dArray& out, ZvPointTagArray& outTags) {
  // out growing as in would never end.
  if (tags.size < in.size || &out == &in || &outTags == &tags) return 0;
  for (unsigned int i = 0; i < in.size; ++i) {
    const ZvPoint2<double> p = in[i];
    const bool repeated = out.size > 0 && Coincide(p, out[out.size - 1]);
    if (tags[i] == ZvPointTag_First) {
      out.Add(p);
      outTags.Add(ZvPointTag_First);
    } else if (tags[i] == ZvPointTag_Continue) {
      if (repeated) continue;
      out.Add(p);
      outTags.Add(ZvPointTag_Continue);
    } else if (repeated && outTags.size > 0 && outTags[outTags.size - 1] != ZvPointTag_First) {
      // The piece already ends here: its last kept vertex takes over the end mark.
      outTags[outTags.size - 1] = ZvPointTag_Last;
    } else {
      // A first vertex is never turned into an end, so a one-point piece keeps two entries.
      out.Add(p);
      outTags.Add(ZvPointTag_Last);
    }
  }
  return 1;
}

ZvPoint2<double> ZvPoint2dArray_FirstTangent(const ZvPoint2dArray& a) {
  if (a.size < 2) return {0.0, 0.0};
  return EdgeDirection(a[0], a[1]);
}

ZvPoint2<double> ZvPoint2dArray_LastTangent(const ZvPoint2dArray& a) {
  if (a.size < 2) return {0.0, 0.0};
  return EdgeDirection(a[a.size - 2], a[a.size - 1]);
}
