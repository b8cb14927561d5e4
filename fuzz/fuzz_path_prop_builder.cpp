// Feeds arbitrary pen streams with pressure to the two property path builders: whatever the
// points, the pressures and the order of calls, every builder must come back, keep what it
// committed, return as many values as samples, values within the range of the pressures given
// (give or take the property tolerance by which the curve is thinned), and leave a path whose
// structure reads back and whose finished subpaths carry a curve.
//
// Layout: byte 0 picks the builder (bit 0) and its fit degree (bits 1..3); bytes 1..3 set the
// densify spacing, the long chord distance and the fit error. Then records of 6 bytes: two
// little-endian 16-bit coordinates in eighths of a pixel, a pressure byte (sixty-fourths; 255 is
// NaN and 254 infinity, after which a subpath's values are only counted) and
// an action byte: bits 0..1 choose AddInputPoint, AddInputPoint forced, GetTrailingSamples
// after it, or the end of the subpath (bit 2: closed; bit 3: EndSubpath now and
// GetTrailingSamples at the next record, instead of both at once); bits 4..5 both set: Reset
// first.
#include <zv/gc.h>
#include <zv/path2f_prop1d.h>
#include <zv/path_prop_builder.h>

#include <algorithm>
#include <cmath>
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <memory>
#include <vector>

#include "fuzz/pen_stream.h"

namespace {
struct Range {
  double low = HUGE_VAL, high = -HUGE_VAL;
  bool wild = false;  // a pressure that is no number or infinite: any value may follow
  void Take(double v) {
    if (!std::isfinite(v)) wild = true;
    low = std::min(low, v);
    high = std::max(high, v);
  }
};

// A batch must pair each sample with a value the pressures could give.
void CheckBatch(const ZvPoint2fArray& samples, const ZvDoubleArray& values, const Range& range,
                double tolerance) {
  if (samples.size != values.size) std::abort();
  for (unsigned int k = 0; k < values.size; ++k)
    if (!range.wild && !(values[k] >= range.low - tolerance && values[k] <= range.high + tolerance))
      std::abort();
}
}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  if (size < 4) return 0;
  ZvGC gc;
  gc.sampleSpacing = 2.0;
  // Thinning moves a value at most the tolerance off the line it extends.
  const double slack = gc.propertyTolerance * 1.001 + 1e-9;
  ZvPath2fProp1d path(0);
  std::unique_ptr<ZvBasePathPropBuilder> builder;
  if (data[0] & 1)
    builder.reset(new ZvBezierFitPathPropBuilder(gc, &path, 1.0 + data[2] / 4.0,
                                                 0.25 + data[1] / 16.0, 0.05 + data[3] / 32.0,
                                                 (data[0] >> 1) & 7));
  else
    builder.reset(new ZvLinearPathPropBuilder(gc, &path));
  ZvDoubleArray values;
  Range range;
  bool pendingEnd = false;
  std::vector<unsigned int> finished;  // a point of every subpath the builder finished
  for (size_t at = 4; at + 6 <= size; at += 6) {
    const ZvPoint2<float> p{PenCoordinate(data + at), PenCoordinate(data + at + 2)};
    const double pressure = data[at + 4] == 255   ? std::nan("")
                            : data[at + 4] == 254 ? HUGE_VAL
                                                  : data[at + 4] / 64.0;
    const uint8_t action = data[at + 5];
    const ZvPath2f before(path);
    if (pendingEnd) {
      CheckBatch(builder->GetTrailingSamples(values), values, range, slack);
      finished.push_back(path.NumPoints() - 1);
      range = Range();
      pendingEnd = false;
    }
    if ((action & 0x30) == 0x30) {
      builder->Reset();
      range = Range();
    }
    range.Take(pressure);
    switch (action & 3) {
      case 0:
        builder->AddInputPoint(p, pressure, 0);
        break;
      case 1:
        builder->AddInputPoint(p, pressure, 1);
        break;
      case 2:
        builder->AddInputPoint(p, pressure, 0);
        CheckBatch(builder->GetTrailingSamples(values), values, range, slack);
        break;
      default:
        if (action & 8) {
          builder->EndSubpath(p, pressure, (action >> 2) & 1);
          pendingEnd = true;
        } else {
          CheckBatch(
              builder->EndSubpathAndGetTrailingSamples(p, pressure, values, (action >> 2) & 1),
              values, range, slack);
          finished.push_back(path.NumPoints() - 1);
          range = Range();
        }
    }
    if (!KeepsPrefix(path, before)) std::abort();
  }
  // The structure reads back: every index lies in a subpath and a segment.
  for (unsigned int i = 0; i < path.NumPoints(); ++i) {
    unsigned int a, b;
    if (!path.GetSubpathIndices(i, a, b) || !path.GetSegmentIndices(i, a, b)) std::abort();
  }
  for (unsigned int i : finished)
    if (!path.HasPropCurve(i)) std::abort();
  return 0;
}
