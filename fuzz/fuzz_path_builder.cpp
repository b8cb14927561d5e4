// Feeds arbitrary pen streams to the three path builders: whatever the points (repeated,
// doubling back, jumping, turning sharply) and whatever the order of calls, every builder must
// come back, keep what it committed, and leave a path whose structure reads back.
//
// Layout: byte 0 picks the builder (low 2 bits) and its fit degree (next 3 bits); bytes 1..3 set
// the densify spacing, the long chord distance and the fit error. Then records of 5 bytes: two
// little-endian 16-bit coordinates in eighths of a pixel (a pen's range) and an action byte:
// bits 0..1 choose AddInputPoint, AddInputPoint forced, GetTrailingSamples after it, or
// EndSubpath (bit 2: closed) followed by StartSubpath at the next point.
#include <zv/gc.h>
#include <zv/path2f.h>
#include <zv/path_builder.h>

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <memory>

#include "fuzz/pen_stream.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  if (size < 4) return 0;
  ZvGC gc;
  gc.sampleSpacing = 2.0;
  ZvPath2f path;
  std::unique_ptr<ZvBasePathBuilder> builder;
  switch (data[0] & 3) {
    case 0:
      builder.reset(new ZvLinearPathBuilder(gc, &path));
      break;
    case 1:
      builder.reset(new ZvCubicPathBuilder(gc, &path));
      break;
    default:
      builder.reset(new ZvBezierFitPathBuilder(gc, &path, 1.0 + data[2] / 4.0,
                                               0.25 + data[1] / 16.0, 0.05 + data[3] / 32.0,
                                               (data[0] >> 2) & 7));
  }
  bool started = false;
  for (size_t at = 4; at + 5 <= size; at += 5) {
    const ZvPoint2<float> p{PenCoordinate(data + at), PenCoordinate(data + at + 2)};
    const uint8_t action = data[at + 4];
    if (!started) {
      builder->StartSubpath(p);
      started = true;
      continue;
    }
    const ZvPath2f before(path);
    switch (action & 3) {
      case 0:
        builder->AddInputPoint(p, 0);
        break;
      case 1:
        builder->AddInputPoint(p, 1);
        break;
      case 2:
        builder->AddInputPoint(p, 0);
        builder->GetTrailingSamples();
        break;
      default:
        builder->EndSubpath(p, (action >> 2) & 1);
        started = false;
    }
    if (!KeepsPrefix(path, before)) std::abort();
  }
  if (started) builder->EndSubpath(builder->GetPath()->GetCurrentPoint(), 0);
  // The structure reads back: every index lies in a subpath and a segment.
  for (unsigned int i = 0; i < path.NumPoints(); ++i) {
    unsigned int a, b;
    if (!path.GetSubpathIndices(i, a, b) || !path.GetSegmentIndices(i, a, b)) std::abort();
  }
  return 0;
}
