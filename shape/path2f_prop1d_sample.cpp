// Polylines of a property path with one property value per point: flattening, even sampling,
// sampling spaced by the property, and the extent filters over both.
#include <zv/gc.h>
#include <zv/path2f_prop1d.h>
#include <zv/polyline.h>
#include <zv/transfo4.h>

#include <cmath>

#include "shape/path2f_measure.h"
#include "shape/path2f_prop1d_impl.h"
#include "shape/path_codes.h"
#include "shape/shape_lock.h"

namespace {

// Flattening with values keeps to the generic Bezier flattener for every degree, so that the
// vertices it merges with the property's breakpoints come from one algorithm.
struct ZvFlattenByTool : ZvFlattenInFloat {
  static unsigned int Segment(ZvBezierTool& tool, const Point* p, unsigned int degree,
                              double tolerance, Array& out) {
    return tool.Flatten(p, 0, degree, tolerance, &out, 1);
  }
};

ZvPoint2<float> Lerp(const ZvPoint2<float>& a, const ZvPoint2<float>& b, double t) {
  return ZvPoint2<float>{static_cast<float>(a.x + (double(b.x) - a.x) * t),
                         static_cast<float>(a.y + (double(b.y) - a.y) * t)};
}

// One flattened subpath in the frame of the context's transform, with its running lengths.
struct FlatSubpath {
  ZvPoint2fArray points{64};
  ZvDoubleArray lengths{64};

  // By the path's own flatteners, as the even sampling does, or by F.
  template <class F = ZvFlattenInFloat>
  void Make(const ZvPath2f& path, unsigned int s, unsigned int e, const ZvGC& gc,
            ZvBezierTool& tool) {
    points.Chop(0);
    lengths.Chop(0);
    if (ZvPath2fMeasure::FlattenSubpath<F>(path, s, e, &gc.transform, gc.flattenTolerance, points,
                                           tool) == 0)
      points.Add(points[0]);
    ZvPoint2fArray_ComputeChordLength(points, 0, points.size - 1, lengths);
  }
  double Length() const { return lengths[lengths.size - 1]; }
  // The point at arc length `pos`, searching forward from edge *edge (kept for the next call).
  // False once `pos` lies beyond the last point.
  bool At(double pos, unsigned int& edge, ZvPoint2<float>& out) const {
    while (edge < lengths.size && lengths[edge] < pos)
      ++edge;
    if (edge >= lengths.size) return false;
    if (edge == 0) {
      out = points[0];
      return true;
    }
    const double span = lengths[edge] - lengths[edge - 1];
    out = span > 0.0 ? Lerp(points[edge - 1], points[edge], (pos - lengths[edge - 1]) / span)
                     : points[edge];
    return true;
  }
};

void AddValues(ZvDoubleArray& values, double value, unsigned int count) {
  for (unsigned int k = 0; k < count; ++k)
    values.Add(value);
}

// The pieces of a tagged polyline: the index range of the piece that starts at `first`.
unsigned int PieceEnd(const ZvPointTagArray& tags, unsigned int first) {
  unsigned int last = first;
  while (last + 1 < tags.size && tags[last + 1] != ZvPointTag_First)
    ++last;
  return last;
}

}  // namespace

unsigned int ZvPath2fProp1d::Flatten(const ZvGC& gc, ZvPoint2fArray& out, ZvPointTagArray& tags,
                                     ZvDoubleArray& values) const {
  ZvShapeLock guard(*this);
  const unsigned int before = out.size;
  const ZvTransfo4 identity;
  ZvBezierTool tool;
  FlatSubpath subpath;
  ZvPoint2dArray pairs(64);
  ZvPointTagArray pairTags(64);
  const double merge = gc.pointMergeDistance;
  zvForEachSubpath(*this, [&](unsigned int s, unsigned int e) {
    const ZvRawFCurve* curve = m_impl->Find(s);
    if (!curve) {
      // Values of a subpath without a curve are 0 here, not the default property.
      const unsigned int start = out.size;
      unsigned int t = ZvPath2fMeasure::FlattenSubpath<ZvFlattenByTool>(
          *this, s, e, &gc.transform, gc.flattenTolerance, out, tool);
      if (t == 0) {
        out.Add(out[start]);
        t = 1;
      }
      zvAppendSubpathTags(tags, t);
      AddValues(values, 0.0, t + 1);
      return;
    }
    pairs.Chop(0);
    pairTags.Chop(0);
    curve->Flatten(identity, gc.propertyTolerance, pairs, pairTags, 1);
    if (pairs.size == 0) pairs.Add(ZvPoint2<double>{0.0, curve->Eval(0.0, 1)});
    subpath.Make<ZvFlattenByTool>(*this, s, e, gc, tool);
    const ZvPoint2fArray& flat = subpath.points;
    const ZvDoubleArray& lengths = subpath.lengths;
    const double length = subpath.Length();
    const unsigned int start = out.size;
    out.Add(flat[0]);
    values.Add(pairs[0].y);
    if (!(length >= merge)) {
      out.Add(flat[flat.size - 1]);
      values.Add(pairs[pairs.size - 1].y);
      zvAppendSubpathTags(tags, 1);
      return;
    }
    // The property's breakpoints stretched onto the subpath: the curve's last key lands on its
    // end whatever the two lengths are, and pairs that would not advance are dropped.
    const double last = pairs[pairs.size - 1].x;
    unsigned int kept = 1;
    if (pairs.size >= 2 && last > 0.0) {
      const double factor = length / last;
      double previous = 0.0;
      for (unsigned int i = 1; i < pairs.size; ++i) {
        double p = pairs[i].x * factor;
        p = p < 0.0 ? 0.0 : p > length ? length : p;
        if (!(p > previous)) continue;
        pairs[kept++] = ZvPoint2<double>{p, pairs[i].y};
        previous = p;
      }
      pairs[0].x = 0.0;
    }
    if (kept < 2) {
      // A curve that covers no arc length holds its value along the whole subpath.
      const double value = pairs[0].y;
      pairs.Chop(0);
      pairs.Add(ZvPoint2<double>{0.0, value});
      pairs.Add(ZvPoint2<double>{length, value});
      kept = 2;
    }
    pairs.Chop(kept);
    pairs[kept - 1].x = length;
    // Merge the flat vertices and the breakpoints by position; a breakpoint gets a vertex of its
    // own unless it falls within the merge distance of the last one.
    double emitted = 0.0;
    unsigned int j = 1, i = 1;
    while (j < flat.size && i < pairs.size) {
      const double p = pairs[i].x, d = lengths[j];
      if (p > d) {
        const ZvPoint2<double>& a = pairs[i - 1];
        out.Add(flat[j]);
        values.Add(a.y + (pairs[i].y - a.y) * (d - a.x) / (p - a.x));
        emitted = d;
        ++j;
      } else if (p == d) {
        out.Add(flat[j]);
        values.Add(pairs[i].y);
        emitted = d;
        ++i;
        ++j;
      } else {
        if (p - emitted > merge) {
          const double span = d - lengths[j - 1];
          out.Add(span > 0.0 ? Lerp(flat[j - 1], flat[j], (p - lengths[j - 1]) / span) : flat[j]);
          values.Add(pairs[i].y);
          emitted = p;
        }
        ++i;
      }
    }
    for (; j < flat.size; ++j) {  // rounding left vertices behind the last breakpoint
      out.Add(flat[j]);
      values.Add(pairs[pairs.size - 1].y);
    }
    zvAppendSubpathTags(tags, out.size - start - 1);
  });
  return out.size - before;
}

unsigned int ZvPath2fProp1d::Sample(const ZvGC& gc, ZvPoint2fArray& out, ZvPointTagArray& tags,
                                    ZvDoubleArray& values) const {
  ZvShapeLock guard(*this);
  return SampleWithValues(gc, out, tags, values, true);
}

unsigned int ZvPath2fProp1d::SampleWithValues(const ZvGC& gc, ZvPoint2fArray& out,
                                              ZvPointTagArray& tags, ZvDoubleArray& values,
                                              bool keepChoppedValue) const {
  const unsigned int before = out.size, base = values.size;
  ZvPath2f::Sample(gc, out, tags);
  if (out.size == before) return 0;
  ZvBezierTool tool;
  FlatSubpath flat;
  unsigned int first = before;
  zvForEachSubpath(*this, [&](unsigned int s, unsigned int e) {
    if (first >= out.size) return;
    const unsigned int last = PieceEnd(tags, first);
    unsigned int k = last - first + 1;
    first = last + 1;
    const ZvRawFCurve* curve = m_impl->Find(s);
    if (!curve) {
      while (values.size < base + (first - before))
        values.Add(gc.defaultProperty);
      return;
    }
    flat.Make(*this, s, e, gc, tool);
    // The even sampling drops a last sample that repeats a closed subpath's start; its value is
    // still made, the curve's value beyond its end, for callers that stamp to the very end.
    const double spacing = gc.sampleSpacing, length = flat.Length();
    double n = std::floor(length / spacing);
    if (std::fmod(length, spacing) > 0.5 * spacing) n += 1.0;
    const bool chopped = keepChoppedValue && ZvPath2fMeasure::IsClosed(*this, e) &&
                         length > spacing && n > 1.0 && k + 1 == n;
    if (chopped) ++k;
    double largest = 0.0;
    curve->GetLargestKeyParameter(largest);
    const double step = k > 1 ? largest / (k - 1) : 0.0;
    double at = 0.0;
    for (unsigned int i = 0; i < k; ++i, at += step)
      values.Add(curve->Eval(at, 1));
    const ZvPoint2<float>& end = flat.points[flat.points.size - 1];
    if (chopped || zv_path::Coincide(out[last], end))
      values[values.size - 1] = curve->GetPlusInfinityVal();
  });
  while (values.size < base + (out.size - before))
    values.Add(gc.defaultProperty);
  return out.size - before;
}

unsigned int ZvPath2fProp1d::PropertySample(const ZvGC& gc, ZvPoint2fArray& out,
                                            ZvPointTagArray& tags, ZvDoubleArray& values) const {
  ZvShapeLock guard(*this);
  const unsigned int before = out.size, tagsBefore = tags.size, valuesBefore = values.size;
  // Subpaths without a curve take the even sampling; it runs once, and is cut into subpaths.
  ZvPoint2fArray even(64);
  ZvPointTagArray evenTags(64);
  if (m_impl->records.size() < NumSubpaths() && ZvPath2f::Sample(gc, even, evenTags) == 0) return 0;
  const double spacing = gc.sampleSpacing, merge = gc.pointMergeDistance;
  // The distance to the next sample after one of value v.
  auto step = [&](double v) {
    double d = v * spacing;
    if (d < merge) d = merge;
    if (d > spacing) d = spacing;
    return d;
  };
  ZvBezierTool tool;
  FlatSubpath flat;
  bool tooMany = false;
  unsigned int evenFirst = 0;
  zvForEachSubpath(*this, [&](unsigned int s, unsigned int e) {
    const ZvRawFCurve* curve = m_impl->Find(s);
    if (!curve) {
      if (evenFirst >= even.size) return;
      const unsigned int evenLast = PieceEnd(evenTags, evenFirst);
      out.Add(even.data + evenFirst, evenLast - evenFirst + 1);
      tags.Add(evenTags.data + evenFirst, evenLast - evenFirst + 1);
      AddValues(values, gc.defaultProperty, evenLast - evenFirst + 1);
      evenFirst = evenLast + 1;
      return;
    }
    evenFirst = evenFirst < even.size ? PieceEnd(evenTags, evenFirst) + 1 : evenFirst;
    if (tooMany) return;
    flat.Make(*this, s, e, gc, tool);
    const double length = flat.Length();
    double largest = length;
    if (curve->GetNumKeys() > 0) curve->GetLargestKeyParameter(largest);
    const unsigned int start = out.size;
    out.Add(flat.points[0]);
    tags.Add(ZvPointTag_First);
    const double firstValue = curve->Eval(0.0, 1);
    values.Add(firstValue);
    if (!(length > 0.0)) {
      out.Add(flat.points[flat.points.size - 1]);
      tags.Add(ZvPointTag_Last);
      values.Add(firstValue);
      return;
    }
    const double scale = largest / length;
    unsigned int edge = 0;
    ZvPoint2<float> p;
    // A step is never below the merge distance, so the walk ends; a merge distance that is not
    // above 0 could stall it, and is stopped by the same cap as the even sampling.
    for (double pos = step(firstValue); pos < length && flat.At(pos, edge, p);) {
      if (out.size - before >= kMaxSamples || !(pos > 0.0)) {
        tooMany = true;
        return;
      }
      const double v = curve->Eval(scale * pos, 1);
      out.Add(p);
      tags.Add(ZvPointTag_Continue);
      values.Add(v);
      const double next = pos + step(v);
      if (!(next > pos)) {
        tooMany = true;
        return;
      }
      pos = next;
    }
    if (out.size == start + 1) {
      // Shorter than one step: the subpath still ends on its last point.
      out.Add(flat.points[flat.points.size - 1]);
      tags.Add(ZvPointTag_Last);
      values.Add(curve->Eval(largest, 1));
      return;
    }
    tags[tags.size - 1] = ZvPointTag_Last;
    if (ZvPath2fMeasure::IsClosed(*this, e) && out.size - start >= 3 &&
        zv_path::Coincide(out[out.size - 1], flat.points[flat.points.size - 1])) {
      out.Chop(out.size - 1);
      tags.Chop(tags.size - 1);
      values.Chop(values.size - 1);
      tags[tags.size - 1] = ZvPointTag_Last;
    }
  });
  if (tooMany) {
    out.Chop(before);
    tags.Chop(tagsBefore);
    values.Chop(valuesBefore);
    return 0;
  }
  return out.size - before;
}

namespace {

// Keeps the samples inside the extent (bounds included) with their tags and values.
unsigned int KeepInside(const ZvExtent2<float>& extent, const ZvPoint2fArray& samples,
                        const ZvPointTagArray& sampleTags, const ZvDoubleArray& sampleValues,
                        ZvPoint2fArray& out, ZvPointTagArray& tags, ZvDoubleArray& values) {
  const bool infinite = extent.kind == ZvExtent2<float>::Infinite;
  const unsigned int before = out.size;
  for (unsigned int i = 0; i < samples.size; ++i) {
    const ZvPoint2<float>& q = samples[i];
    if (infinite ||
        (q.x >= extent.xmin && q.x <= extent.xmax && q.y >= extent.ymin && q.y <= extent.ymax)) {
      out.Add(q);
      tags.Add(sampleTags[i]);
      values.Add(sampleValues[i]);
    }
  }
  return out.size - before;
}

}  // namespace

unsigned int ZvPath2fProp1d::IntersectSamplePointsExtent(const ZvGC& gc,
                                                         const ZvExtent2<float>& extent,
                                                         ZvPoint2fArray& out, ZvPointTagArray& tags,
                                                         ZvDoubleArray& values,
                                                         int noQuickReject) const {
  ZvShapeLock guard(*this);
  if (!noQuickReject && !IsRasterExtentIntersecting(gc, extent)) return 0;
  if (extent.kind == ZvExtent2<float>::Empty) return 0;
  ZvPoint2fArray samples(64);
  ZvPointTagArray sampleTags(64);
  ZvDoubleArray sampleValues(64);
  // One value per kept point: a chopped closing sample keeps no value here.
  SampleWithValues(gc, samples, sampleTags, sampleValues, false);
  return KeepInside(extent, samples, sampleTags, sampleValues, out, tags, values);
}

unsigned int ZvPath2fProp1d::IntersectPropertySamplePointsExtent(
    const ZvGC& gc, const ZvExtent2<float>& extent, ZvPoint2fArray& out, ZvPointTagArray& tags,
    ZvDoubleArray& values, int noQuickReject) const {
  ZvShapeLock guard(*this);
  if (!noQuickReject && !IsRasterExtentIntersecting(gc, extent)) return 0;
  if (extent.kind == ZvExtent2<float>::Empty) return 0;
  ZvPoint2fArray samples(64);
  ZvPointTagArray sampleTags(64);
  ZvDoubleArray sampleValues(64);
  PropertySample(gc, samples, sampleTags, sampleValues);
  return KeepInside(extent, samples, sampleTags, sampleValues, out, tags, values);
}

unsigned int ZvPath2fProp1d::AddFittedSamplesFromPath(const ZvGC& gc,
                                                      const ZvPath2fProp1d& source) {
  ZvShapeLock guard(*this);
  ZvShapeLock guardSource(source);
  if (&source == this) {
    // The fit appends to this path while reading the source: read from a snapshot.
    const ZvPath2fProp1d copy(source);  // NOLINT(performance-unnecessary-copy-initialization)
    return AddFittedSamplesFromPath(gc, copy);
  }
  const unsigned int before = points.size;
  ZvPath2fIter subpaths(source);
  unsigned int first = 0, last = 0;
  while (subpaths.GetNextSubPathIndices(first, last)) {
    // One subpath at a time, so that the subpath the fit appended is known for its curve.
    const unsigned int grown = points.size;
    ZvPath2f::AddFittedSamplesFromPath(gc, ZvPath2f(source, first, last));
    const ZvRawFCurve* curve = source.m_impl->Find(first);
    unsigned int s = 0, e = 0;
    if (curve && points.size > grown && GetSubpathIndices(points.size - 1, s, e))
      m_impl->Set(s, *curve);
  }
  return points.size - before;
}
