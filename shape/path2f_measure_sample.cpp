// Sampling of ZvPath2f: even spacing along each subpath, or given relative arc positions.
#include <zv/gc.h>
#include <zv/path2f.h>
#include <zv/polyline.h>

#include <cmath>

#include "shape/path2f_measure.h"
#include "shape/path_codes.h"
#include "shape/shape_lock.h"

namespace {

ZvPoint2<float> Lerp(const ZvPoint2<float>& a, const ZvPoint2<float>& b, double t) {
  const double x = a.x + (double(b.x) - a.x) * t, y = a.y + (double(b.y) - a.y) * t;
  return ZvPoint2<float>{static_cast<float>(x), static_cast<float>(y)};
}

}  // namespace

unsigned int ZvPath2f::Sample(const ZvGC& gc, ZvPoint2fArray& out, ZvPointTagArray& tags) const {
  ZvShapeLock guard(*this);
  if (points.size == 0) return 0;
  const unsigned int before = out.size, tagsBefore = tags.size;
  const double spacing = gc.sampleSpacing;
  // A spacing that is not positive, or a length that is not finite, would ask for samples
  // without end; so would any request past the cap.
  bool tooMany = !(spacing > 0.0);
  ZvBezierTool tool;
  ZvPoint2fArray flat(64);
  ZvDoubleArray chords(64);
  zvForEachSubpath(*this, [&](unsigned int s, unsigned int e) {
    flat.Chop(0);
    chords.Chop(0);
    if (ZvPath2fMeasure::FlattenSubpath<ZvFlattenInFloat>(*this, s, e, &gc.transform,
                                                          gc.flattenTolerance, flat, tool) == 0)
      flat.Add(flat[0]);
    const unsigned int start = out.size;
    out.Add(flat[0]);
    tags.Add(ZvPointTag_First);
    ZvPoint2fArray_ComputeChordLength(flat, 0, flat.size - 1, chords);
    const double length = chords[chords.size - 1];
    double n = std::floor(length / spacing);
    if (std::fmod(length, spacing) > 0.5 * spacing) n += 1.0;
    if (tooMany || !(n + (out.size - before) <= kMaxSamples)) {
      tooMany = true;
      return;
    }
    if (!(length > spacing) || !(n > 1.0)) {
      out.Add(flat[flat.size - 1]);
      tags.Add(ZvPointTag_Last);
      return;
    }
    // n - 1 samples at even steps; the true end is left to the caller (it may be a node the
    // caller keeps, or the start again on a closed subpath).
    const double step = length / n;
    double target = 0.0;
    unsigned int j = 0;
    for (double k = 1.0; k < n; k += 1.0) {
      target += step;
      while (j < flat.size && chords[j] < target)
        ++j;
      if (j >= flat.size) break;
      const double t = j > 0 ? (target - chords[j - 1]) / (chords[j] - chords[j - 1]) : 0.0;
      out.Add(j > 0 ? Lerp(flat[j - 1], flat[j], t) : flat[0]);
      tags.Add(ZvPointTag_Continue);
    }
    if (out.size == start + 1) {  // no step landed: the end stands in
      out.Add(flat[flat.size - 1]);
      tags.Add(ZvPointTag_Continue);
    }
    tags[tags.size - 1] = ZvPointTag_Last;
    // A closed subpath must not end on a sample that repeats its start.
    if (ZvPath2fMeasure::IsClosed(*this, e) && out.size - start >= 3 &&
        zv_path::Coincide(out[out.size - 1], flat[flat.size - 1])) {
      out.Chop(out.size - 1);
      tags.Chop(tags.size - 1);
      tags[tags.size - 1] = ZvPointTag_Last;
    }
  });
  if (tooMany) {
    out.Chop(before);
    tags.Chop(tagsBefore);
    return 0;
  }
  return out.size - before;
}

unsigned int ZvPath2f::Sample(const ZvGC& gc, const ZvFloatArray& positions, ZvPoint2fArray& out,
                              ZvPointTagArray& tags) const {
  ZvShapeLock guard(*this);
  if (points.size == 0) return 0;
  const unsigned int before = out.size;
  ZvPoint2fArray flat(64);
  ZvPointTagArray flatTags(64);
  ZvDoubleArray chords(64);
  Flatten(gc, flat, flatTags);
  ZvPoint2fArray_ComputeChordLength(flat, flatTags, chords);
  const double length = chords[chords.size - 1];
  unsigned int next = 0;  // the next position to place
  for (unsigned int a = 0; a < flat.size && next < positions.size;) {
    unsigned int b = a;
    while (b + 1 < flat.size && flatTags[b] != ZvPointTag_Last)
      ++b;
    const unsigned int start = out.size;
    unsigned int j = a;
    for (; next < positions.size; ++next) {
      const double target = positions[next] * length;
      if (!(target <= chords[b])) break;  // beyond this subpath (or not a number)
      if (j > a && target < chords[j - 1]) j = a;
      while (chords[j] < target)
        ++j;
      if (j == a || !(chords[j] - chords[j - 1] > 0.0)) {
        out.Add(flat[j == a ? a : j - 1]);
      } else {
        out.Add(Lerp(flat[j - 1], flat[j], (target - chords[j - 1]) / (chords[j] - chords[j - 1])));
      }
      tags.Add(ZvPointTag_Continue);
    }
    if (out.size > start) {
      tags[start] = ZvPointTag_First;
      tags[tags.size - 1] = ZvPointTag_Last;
    }
    a = b + 1;
  }
  return out.size - before;
}
