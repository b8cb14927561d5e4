// Random sequences of public path calls with extreme arguments (huge, tiny, infinite and NaN
// coordinates, tolerances and transforms, any index). After every call the path must parse,
// and its written block must read back through the bounded reader to the same bytes. An
// allocation failure (which includes a flatten past its cap) is an allowed outcome; the path
// must still parse after it. CI runs this with -timeout=1 and -rss_limit_mb=512; an input holds
// at most 8 calls, so that a second for the input bounds every call well within it.
#include <zv/gc.h>
#include <zv/path2f.h>

#include <cmath>
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <limits>
#include <new>
#include <vector>

#include "tests/shape/path_fixtures.h"

namespace {

class Input {
 public:
  Input(const std::uint8_t* data, std::size_t size) : data(data), size(size) {}
  bool More() const { return at < size; }
  unsigned int Byte() { return at < size ? data[at++] : 0; }
  unsigned int Index(unsigned int n) { return n ? (Byte() | Byte() << 8) % (n + 2) : Byte() % 3; }
  // Mostly ordinary values, with the extremes a host might pass by mistake.
  double Number() {
    static const double kExtremes[] = {0.0,
                                       -0.0,
                                       1e-300,
                                       1e-45,
                                       3e38,
                                       -3e38,
                                       1e300,
                                       std::numeric_limits<double>::infinity(),
                                       -std::numeric_limits<double>::infinity(),
                                       std::numeric_limits<double>::quiet_NaN(),
                                       std::numeric_limits<double>::max(),
                                       1e7};
    const unsigned int kind = Byte();
    if (kind < 24) return kExtremes[kind % 12];
    return (static_cast<int>(Byte() | Byte() << 8) - 32768) / 256.0;
  }
  ZvPoint2<float> Point() { return {static_cast<float>(Number()), static_cast<float>(Number())}; }

 private:
  const std::uint8_t* data;
  std::size_t size;
  std::size_t at = 0;
};

void Check(const ZvPath2f& path) {
  if (!PathInvariantHolds(path)) std::abort();
  std::vector<unsigned char> block(path.GetBufferSize());
  path.WriteToBuffer(block.data());
  unsigned int consumed = 0;
  ZvShape2f* copy = ZvShape2f_CreateFromBuffer(block.data(), block.size(), consumed);
  if (!copy || consumed != block.size()) std::abort();
  std::vector<unsigned char> again(copy->GetBufferSize());
  copy->WriteToBuffer(again.data());
  if (again != block) std::abort();
  delete copy;
}

// A flatten's cost grows with the path's size over the tolerance, up to the flatteners' cap of
// 2^24 points, and sampling's with the size over the spacing, up to 2^24 samples (both caps are
// tested on their own): steps finer than 1e-3 of the size of the path's finite points (a path's
// length can be many times its size; a point at infinity makes the whole extent infinite, yet
// the cubics between finite points are still flattened at the tolerance asked) would only
// measure that cost here. Non-positive and non-finite steps still get through.
double Tolerance(const ZvPath2f& path, double asked) {
  ZvExtent2<double> box;
  for (unsigned int i = 0; i < path.NumPoints(); ++i) {
    const ZvPoint2<float> q = path.GetPoint(i);
    if (std::isfinite(q.x) && std::isfinite(q.y)) box.AddPoint(ZvPoint2<double>{q.x, q.y});
  }
  if (box.kind == ZvExtent2<double>::Empty) return asked;
  return std::fmax(asked, std::fmax(box.xmax - box.xmin, box.ymax - box.ymin) * 1e-3);
}

void Step(ZvPath2f& path, Input& in) {
  const unsigned int n = path.NumPoints();
  ZvGC gc;
  gc.flattenTolerance = Tolerance(path, gc.flattenTolerance);
  ZvPoint2fArray points;
  ZvPointTagArray tags;
  switch (in.Byte() % 24) {
    case 0:
      path.Moveto(in.Point());
      break;
    case 1:
      path.Lineto(in.Point());
      break;
    case 2:
      path.Curveto(in.Point(), in.Point());
      break;
    case 3:
      path.Curveto(in.Point(), in.Point(), in.Point());
      break;
    case 4: {
      ZvPoint2<float> p[9];
      for (ZvPoint2<float>& q : p)
        q = in.Point();
      path.AltCurveto(p, in.Byte() % 10);
      break;
    }
    case 5:
      path.Closeto();
      break;
    case 6:
      path.CloseSubpath(in.Index(n));
      break;
    case 7:
      path.OpenSubpath(in.Index(n));
      break;
    case 8:
      path.LockG1(in.Index(n));
      break;
    case 9:
      path.UnlockG1(in.Index(n));
      break;
    case 10: {
      const unsigned int first = in.Index(n), last = in.Index(n);
      path = ZvPath2f(path, first, last);
      break;
    }
    case 11:
      path.Translate(in.Point());
      break;
    case 12:
      path.Rotate(in.Number(), in.Point());
      break;
    case 13:
      path.Scale(in.Number(), in.Number(), in.Point());
      break;
    case 14:
      path.ShearX(in.Number(), in.Number());
      break;
    case 15:
      gc.flattenTolerance = Tolerance(path, in.Number());
      path.Flatten(gc, points, tags);
      break;
    case 16:
      gc.sampleSpacing = Tolerance(path, in.Number());
      gc.flattenTolerance = Tolerance(path, in.Number());
      path.Sample(gc, points, tags);
      break;
    case 17: {
      ZvExtent2<double> box;
      path.GetTightExtent(box);
      unsigned int index = 0;
      path.GetClosePointIndex(in.Point(), in.Number(), &index);
      path.IsIntersectingExtent(gc, ZvExtent2<float>(0, 0, 16, 16), 1);
      break;
    }
    case 18:
    case 19: {
      gc.transform.Scale(in.Number(), in.Number(), 1.0);
      gc.samplingRate = in.Byte() & 1 ? 8 : 4;
      gc.featherRadius = static_cast<int>(in.Byte() % 10);
      gc.opacity = in.Number();
      gc.fillRule = static_cast<int>(in.Byte() & 1);
      ZvRaster<unsigned char> raster(16, 16, 0);
      if (in.Byte() & 1)
        path.AAFill(gc, raster, nullptr, nullptr);
      else
        path.Fill(gc, raster, nullptr, nullptr);
      break;
    }
    case 20: {
      // A stroke flattens the whole path and each round join and cap whole, at a cost that grows
      // with the square root of the size (a million points a cubic near the float range): the
      // header asks hosts to keep paths and widths within what they draw.
      ZvExtent2<float> box;
      path.GetExtent(box);
      if (!(box.xmin > -1e6f && box.ymin > -1e6f && box.xmax < 1e6f && box.ymax < 1e6f)) break;
      gc.lineWidth = std::fmod(in.Number(), 1e6);
      gc.joinStyle = static_cast<int>(in.Byte() % 3);
      gc.capStyle = static_cast<int>(in.Byte() % 3);
      gc.miterLimit = in.Number();
      gc.taper = static_cast<int>(in.Byte() & 1);
      ZvRaster<unsigned char> raster(16, 16, 0);
      path.Stroke(gc, raster);
      break;
    }
    case 21:
      path.GetNodeNormalizedArcLength(in.Index(n), Tolerance(path, in.Number()));
      break;
    case 22: {
      gc.featherInner = in.Number();
      gc.clipToShape = static_cast<int>(in.Byte() & 1);
      ZvRaster<float> raster(16, 16, 0);
      path.SoftFill(gc, raster, nullptr);
      break;
    }
    default:
      path.Clear();
      break;
  }
}

}  // namespace

// The memory limit is meant for what the library holds. AddressSanitizer keeps freed blocks in
// quarantine to catch late uses, 256 MB of them by default, which after a few large flattens or
// curves is most of the process; a smaller quarantine still catches a use soon after a free.
// Over a long run its allocator's cached free blocks and the stacks it records for every
// allocation grow the process too: freed pages go back to the system every second, and
// allocation stacks keep their 10 innermost frames.
extern "C" const char* __asan_default_options() {
  return "quarantine_size_mb=32:allocator_release_to_os_interval_ms=1000:malloc_context_size=10";
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  Input in(data, size);
  ZvPath2f path;
  for (int calls = 0; in.More() && calls < 8; ++calls) {
    try {
      Step(path, in);
    } catch (const std::bad_alloc&) {
      // Refused as an allocation failure would be; the path keeps its rules all the same.
    }
    Check(path);
  }
  return 0;
}
