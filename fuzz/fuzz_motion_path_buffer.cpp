// Feeds arbitrary bytes to the bounded motion path reader and, when a path comes out, checks
// that it writes back to a block that reads again to the same bytes, then evaluates, renders,
// projects and edits it the way hosts do.
#include <zv/motion_path.h>
#include <zv/path2f.h>

#include <cmath>
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <vector>

namespace {

std::vector<unsigned char> Write(const ZvMotionPath3d& path) {
  std::vector<unsigned char> block(path.GetBufferSize());
  if (path.WriteToBuffer(block.data()) != block.size()) std::abort();
  return block;
}

// Flattening costs grow with the ratio of a curve's size to the tolerance, so the tolerance
// follows the size of the path, as a host's would.
double ToleranceFor(const ZvMotionPath3d& path) {
  double extent = 0.0;
  ZvPoint3<double> p;
  for (unsigned int i = 0; path.GetControlPoint(i, p); ++i)
    extent =
        std::fmax(extent, std::fmax(std::fabs(p.x), std::fmax(std::fabs(p.y), std::fabs(p.z))));
  return extent > 0.0 ? extent * 1e-3 : 1e-3;
}

void Exercise(ZvMotionPath3d& path) {
  const double tolerance = ToleranceFor(path);
  const double first = path.GetFirstTime(), last = path.GetLastTime();
  const double span = last - first;
  ZvPoint3<double> p;
  for (int k = -1; k <= 17; ++k)
    path.Eval(first + span * k / 16.0, tolerance, p);
  if (std::isfinite(span) && span > 0.0) {
    ZvPoint3dArray points;
    path.EvalSequence(first, last, span / 32.0, tolerance, points);
    ZvUByteArray kinds;
    ZvDoubleArray times;
    ZvULongArray segments;
    path.Render(span / 64.0, tolerance, 256, points, kinds, times, segments);
    if (kinds.size != times.size || times.size != segments.size) std::abort();
  }
  ZvPath2f flat;
  path.GetProjectedPath(ZvMotionPath3d::ProjectZY, flat);
  unsigned int index = 0, low = 0, high = 0;
  int existing = 0, lowOk = 0, highOk = 0;
  path.GetBracketingIndices(first + span / 3.0, 0.0, low, lowOk, high, highOk);
  path.GetNodeIndexFromInitialTime(first + span / 3.0, span / 10.0, index);
  path.LockG1ContinuityAtAllNodes();
  path.InsertNode(first + span / 2.0, 0.0, tolerance, index, existing);
  path.SmoothSegment(3);
  path.ReplaceControlPoint(1, {1.0, 2.0, 3.0}, 1);
  if (path.NumPoints() > 3) path.RemoveNodes(3, 3);
  if (path.NumPoints() != 0 && path.NumPoints() % 3 != 1) std::abort();
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  unsigned int consumed = 0;
  ZvMotionPath3d* path =
      ZvMotionPath3d_CreateFromBufferBody(data, static_cast<unsigned int>(size), consumed);
  if (!path) {
    if (consumed != 0) std::abort();
    return 0;
  }
  if (consumed > size) std::abort();
  const std::vector<unsigned char> block = Write(*path);
  unsigned int again = 0;
  ZvMotionPath3d* copy = ZvMotionPath3d_CreateFromBufferBody(
      block.data() + 4, static_cast<unsigned int>(block.size() - 4), again);
  if (!copy || again != block.size() - 4 || Write(*copy) != block) std::abort();
  delete copy;
  Exercise(*path);
  delete path;
  return 0;
}
