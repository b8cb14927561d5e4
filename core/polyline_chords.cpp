// Cumulative chord-length tables and polyline lengths.
#include <zv/polyline.h>

#include "core/polyline_edge.h"

namespace {

// Appends the running total after each edge of vertices first..last, counting on from total.
template <class P>
double AppendRunningLengths(const P* p, unsigned int first, unsigned int last, double total,
                            ZvDoubleArray& out) {
  for (unsigned int i = first; i < last; ++i) {
    total += zvEdgeLength(p[i], p[i + 1]);
    out.Add(total);
  }
  return total;
}

template <class Array>
int ComputeChordLength(const Array& a, unsigned int first, unsigned int last, ZvDoubleArray& out) {
  if (first > last || last >= a.size) return 0;
  out.Add(0.0);
  AppendRunningLengths(a.data, first, last, 0.0, out);
  return 1;
}

template <class Array>
double SingleComponentChordLength(const Array& a, ZvDoubleArray& out) {
  if (a.size == 0) return 0.0;
  out.Add(0.0);
  return AppendRunningLengths(a.data, 0, a.size - 1, 0.0, out);
}

}  // namespace

int ZvPoint2fArray_ComputeChordLength(const ZvPoint2fArray& a, unsigned int first,
                                      unsigned int last, ZvDoubleArray& out) {
  return ComputeChordLength(a, first, last, out);
}

int ZvPoint2dArray_ComputeChordLength(const ZvPoint2dArray& a, unsigned int first,
                                      unsigned int last, ZvDoubleArray& out) {
  return ComputeChordLength(a, first, last, out);
}

int ZvPoint2fArray_ComputeIncrementalChordLength(const ZvPoint2fArray& a, unsigned int first,
                                                 unsigned int last, ZvDoubleArray& out) {
  if (first > last || last >= a.size) return 0;
  if (first == 0 && out.size == 0) {
    out.Add(0.0);
  } else if (out.size <= first) {
    return 0;
  } else {
    // Entries past first belong to vertices that may have moved since they were measured.
    out.Chop(first + 1);
  }
  AppendRunningLengths(a.data, first, last, out[first], out);
  return 1;
}

int ZvPoint2fArray_ComputeChordLength(const ZvPoint2fArray& a, const ZvPointTagArray& tags,
                                      ZvDoubleArray& out) {
  if (tags.size < a.size) return 0;
  double total = 0.0;
  for (unsigned int i = 0; i < a.size; ++i) {
    // The jump from one piece to the next is not part of the length.
    const bool startsPiece =
        i == 0 || tags[i] == ZvPointTag_First || tags[i - 1] == ZvPointTag_Last;
    if (!startsPiece) total += zvEdgeLength(a[i - 1], a[i]);
    out.Add(total);
  }
  return 1;
}

double ZvPoint2fArraySingleComponent_ComputeChordLength(const ZvPoint2fArray& a,
                                                        ZvDoubleArray& out) {
  return SingleComponentChordLength(a, out);
}

double ZvPoint3dArraySingleComponent_ComputeChordLength(const ZvPoint3dArray& a,
                                                        ZvDoubleArray& out) {
  return SingleComponentChordLength(a, out);
}

double ZvPoint2fArraySingleComponent_ComputeLength(const ZvPoint2fArray& a) {
  double total = 0.0;
  for (unsigned int i = 1; i < a.size; ++i)
    total += zvEdgeLength(a[i - 1], a[i]);
  return total;
}
