// Feeds arbitrary bytes to the bounded property path reader. A refused block must leave the
// object as it was; an accepted one must describe a path whose codes parse and whose records
// name subpath starts, must read the same through the shape factory and the trusted body
// reader, and must write back to a block that reads back to the same bytes. The property
// queries then walk every subpath, and the polylines with values pair points and values.
#include <zv/gc.h>
#include <zv/path2f_prop1d.h>

#include "tests/shape/path_fixtures.h"

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <memory>
#include <vector>

namespace {

std::vector<unsigned char> Block(const ZvShape2f& shape) {
  std::vector<unsigned char> block(shape.GetBufferSize());
  if (shape.WriteToBuffer(block.data()) != block.size()) std::abort();
  return block;
}

void Walk(const ZvPath2fProp1d& path) {
  ZvPath2fIter it(path);
  unsigned int first = 0, last = 0;
  unsigned int curves = 0;
  ZvDoubleArray parameters, values;
  parameters.Add(-1.0);
  parameters.Add(0.5);
  parameters.Add(1e9);
  while (it.GetNextSubPathIndices(first, last)) {
    if (!path.HasPropCurve(last)) continue;
    ++curves;
    if (!path.GetPropCurveInsideCriticalSection(first)) std::abort();
    path.EvalPropCurve(last, path.GetLargestArcLength(first));
    path.EvalPropCurve(first, parameters, values);
    double parameter = 0.0;
    path.GetPropCurveParameter(last, 0.5, parameter);
  }
  if (curves != path.GetNumPropCurves()) std::abort();
}

// The polylines with values, on paths small enough that their point counts stay modest (an
// unclipped flatten costs the size over the tolerance). Points and values must pair up.
void Sample(const ZvPath2fProp1d& path) {
  ZvExtent2<double> box;
  path.GetTightExtent(box);
  if (box.kind != ZvExtent2<double>::Regular ||
      !(box.xmin > -1e3 && box.ymin > -1e3 && box.xmax < 1e3 && box.ymax < 1e3))
    return;
  ZvGC gc;
  ZvPoint2fArray points;
  ZvPointTagArray tags;
  ZvDoubleArray values;
  path.Flatten(gc, points, tags, values);
  if (values.size != points.size || tags.size != points.size) std::abort();
  points.Chop(0);
  tags.Chop(0);
  values.Chop(0);
  path.PropertySample(gc, points, tags, values);
  if (values.size != points.size || tags.size != points.size) std::abort();
  path.Sample(gc, points, tags, values);
  const ZvExtent2<float> window(0, 0, 16, 16);
  ZvDoubleArray kept;
  points.Chop(0);
  tags.Chop(0);
  path.IntersectSamplePointsExtent(gc, window, points, tags, kept, 1);
  path.IntersectPropertySamplePointsExtent(gc, window, points, tags, kept, 1);
  if (kept.size != points.size) std::abort();
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  ZvPath2fProp1d path;
  path.Moveto(P(1, 2));
  path.Lineto(P(3, 4));
  path.SetPropCurve(0, ZvRawFCurve(0.0, 1.0, 2.0, 3.0));
  const std::vector<unsigned char> before = Block(path);
  const unsigned int read = path.ReadFromBuffer(data, size);
  if (read == 0) {
    if (Block(path) != before) std::abort();
    return 0;
  }
  if (read > size || !PathInvariantHolds(path) || Codes(path, 255) != Codes(path, 63)) std::abort();
  unsigned int consumed = 0;
  std::unique_ptr<ZvShape2f> made(ZvShape2f_CreateFromBuffer(data, size, consumed));
  if (!made || consumed != read || !made->QueryShapeKind(ZvShape2f::KindPathProp)) std::abort();
  ZvPath2fProp1d trusted;
  if (trusted.ReadFromBufferBody(data + 4) == 0) std::abort();
  const std::vector<unsigned char> block = Block(path);
  if (Block(*made) != block || Block(trusted) != block) std::abort();
  ZvPath2fProp1d again;
  if (again.ReadFromBuffer(block.data(), block.size()) != block.size() || Block(again) != block)
    std::abort();
  Walk(path);
  Sample(path);
  return 0;
}
