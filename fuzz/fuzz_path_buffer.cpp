// Feeds arbitrary bytes to the bounded shape reader and, when a shape comes out, checks what
// the reader promises and walks it the way hosts and the other operations do. A path must have
// codes that parse, without lock bits; its queries may not leave the arrays. A rectangle or an
// oval may hold any floats (infinities, NaNs, huge values): its fills run on a small raster,
// where no conversion may write outside. A written block must read back to the same bytes.
#include <zv/gc.h>
#include <zv/oval2f.h>
#include <zv/path2f.h>
#include <zv/rect2f.h>

#include "tests/shape/path_fixtures.h"

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <sstream>
#include <vector>

namespace {

void Walk(ZvPath2f& path) {
  const unsigned int n = path.NumPoints();
  path.NumSegments();
  path.NumSubpaths();
  path.NumNodes();
  path.NumNodesExceptLastNodeOfClosedSubpaths();
  path.LargestDegree();
  path.IsPolyline();
  path.GetCurrentPoint();
  ZvExtent2<double> extent;
  path.GetExtent(extent);
  std::ostringstream dump;
  dump << path;
  unsigned int first = 0, last = 0;
  int closed = 0;
  for (unsigned int i = 0; i < n; ++i) {
    path.GetSegmentIndices(i, first, last);
    if (first >= n || last >= n) std::abort();
    path.GetSubpathIndices(i, first, last);
    if (first > i || last < i || last >= n) std::abort();
    path.GetDegree(i);
    path.IsEndOfSubpath(i, closed);
    path.IsSubpathClosed(i);
    path.IsG1Continuous(i);
  }
  ZvPath2fIter it(path);
  unsigned int subpaths = 0;
  while (it.GetNextSubPathIndices(first, last))
    ++subpaths;
  if (subpaths != path.NumSubpaths()) std::abort();
  if (n) {
    ZvPath2f part(path, n / 3, n - 1);
    part.NumSegments();
  }
  for (unsigned int i = 0; i < n && i < 64; ++i) {
    path.LockG1(i);
    path.UnlockG1(i);
    path.OpenSubpath(i);
  }
  path.Closeto();
}

// The direct fills and the handle queries of a three-corner shape, in both orientations.
void Frame(const ZvShape2f& shape) {
  ZvGC gc;
  ZvRaster<unsigned char> raster(24, 17, 0);
  ZvRaster<float> soft(9, 31, 0.0f);
  for (int flag = 0; flag < 2; ++flag) {
    raster.SetOrientationFlag(flag);
    shape.Fill(gc, raster, nullptr, nullptr);
    shape.Fill(gc, soft, nullptr, nullptr);
  }
  if (const ZvOval2f* oval =
          static_cast<const ZvOval2f*>(shape.QueryShapeKind(ZvShape2f::KindOval)))
    oval->RadialFill(gc, raster);
  if (const ZvRect2f* rect =
          static_cast<const ZvRect2f*>(shape.QueryShapeKind(ZvShape2f::KindRect)))
    rect->RadialFill(gc, raster);
  ZvPoint2<float> p;
  for (unsigned int i = 0; i < 10; ++i)
    shape.GetPoint(i, p);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  unsigned int consumed = 0;
  ZvShape2f* shape = ZvShape2f_CreateFromBuffer(data, size, consumed);
  if (!shape) {
    if (consumed != 0) std::abort();
    return 0;
  }
  if (consumed > size) std::abort();
  // What is read is written back identically, bar the bytes a writer leaves at 0.
  std::vector<unsigned char> block(shape->GetBufferSize());
  shape->WriteToBuffer(block.data());
  unsigned int again = 0;
  ZvShape2f* copy = ZvShape2f_CreateFromBuffer(block.data(), block.size(), again);
  if (!copy || again != block.size()) std::abort();
  std::vector<unsigned char> second(block.size());
  copy->WriteToBuffer(second.data());
  if (second != block) std::abort();
  delete copy;
  if (ZvPath2f* path = static_cast<ZvPath2f*>(shape->QueryShapeKind(ZvShape2f::KindPath))) {
    // A foreign block is handed over only when its codes parse, without lock bits.
    if (!PathInvariantHolds(*path) || Codes(*path, 255) != Codes(*path, 63)) std::abort();
    Walk(*path);
  } else {
    Frame(*shape);
  }
  delete shape;
  return 0;
}
