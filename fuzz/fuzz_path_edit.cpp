// Edits driven by arbitrary bytes on paths read from arbitrary blocks. The input is a path block
// (through the bounded reader) followed by an edit script; when no path can be read, the script
// runs on a built-in path of lines, quadratics and locked cubics. A foreign block may carry any
// codes and lock bits, so no edit may leave the arrays whatever they say, and the two arrays
// must stay of one length (the writer reads both in full). Each script step is one byte for
// the operation and a few more for its indices and coordinates.
#include <zv/path2f.h>

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <memory>
#include <vector>

namespace {

class Script {
 public:
  Script(const std::uint8_t* data, std::size_t size) : p_(data), end_(data + size) {}
  bool More() const { return p_ < end_; }
  unsigned int Byte() { return p_ < end_ ? *p_++ : 0; }
  unsigned int Index(unsigned int n) { return n ? (Byte() | Byte() << 8) % (n + 1) : 0; }
  ZvPoint2<float> Point() {
    const int x = static_cast<std::int8_t>(Byte()), y = static_cast<std::int8_t>(Byte());
    return ZvPoint2<float>{x * 0.5f, y * 0.5f};
  }

 private:
  const std::uint8_t* p_;
  const std::uint8_t* end_;
};

std::unique_ptr<ZvPath2f> BuiltIn() {
  std::unique_ptr<ZvPath2f> path(new ZvPath2f);
  path->Moveto(ZvPoint2<float>{0, 0});
  path->Lineto(ZvPoint2<float>{10, 0});
  path->Curveto(ZvPoint2<float>{15, 5}, ZvPoint2<float>{10, 10});
  path->Moveto(ZvPoint2<float>{20, 0});
  path->Curveto(ZvPoint2<float>{25, -5}, ZvPoint2<float>{30, -5}, ZvPoint2<float>{35, 0});
  path->Curveto(ZvPoint2<float>{40, 5}, ZvPoint2<float>{15, 5}, ZvPoint2<float>{20, 0});
  path->Closeto();
  path->LockG1(3);
  path->LockG1(6);
  return path;
}

void Step(ZvPath2f& path, Script& s) {
  const unsigned int n = path.NumPoints();
  const unsigned int op = s.Byte() % 9;
  // Indices reach one past the end, to try the refusals.
  const unsigned int i = s.Index(n), j = s.Index(n);
  switch (op) {
    case 0:
      path.ReplacePoint(i, s.Point(), static_cast<int>(s.Byte() & 1));
      break;
    case 1:
      path.ReplaceTangentVectorDirections(i, s.Point());
      break;
    case 2: {
      const unsigned int degree = s.Byte() % 11;
      std::vector<ZvPoint2<float>> pts(degree + 1);
      for (ZvPoint2<float>& p : pts)
        p = s.Point();
      unsigned int a = 0, b = 0;
      // Mostly with ends that fit, so that the replacement itself runs.
      if (path.GetSegmentIndices(i, a, b) && (s.Byte() & 3)) {
        pts[0] = path.GetPoint(a);
        pts[degree] = path.GetPoint(b);
      }
      path.ReplaceSegment(i, pts.data(), degree);
      break;
    }
    case 3:
      path.ReplaceSubpathSection(i, j);
      break;
    case 4:
      path.ReplaceSubpathSection(i, j, s.Point(), s.Point());
      break;
    case 5: {
      const unsigned int first = s.Index(n), last = s.Index(n);
      path.ReplaceSubpathSection(i, j, path, first, last);
      if (i < n && j < n) {
        ZvPath2f source(path, i, j);
        path.ReplaceSubpathSection(i, j, source, 0, j - i);
      }
      break;
    }
    case 6:
      path.RemoveSubpathSection(i, j);
      break;
    case 7:
      path.RemoveSubpath(i);
      break;
    default: {
      ZvPath2f out(path);
      path.GetSimilarPath(s.Point().x, static_cast<int>(s.Byte() & 1), out);
      path.GetInwardOutwardPaths(1.0f, 2.0f, out, out);
      path.LockG1(i);
      break;
    }
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  unsigned int consumed = 0;
  std::unique_ptr<ZvShape2f> shape(ZvShape2f_CreateFromBuffer(data, size, consumed));
  std::unique_ptr<ZvPath2f> path;
  if (shape && shape->QueryShapeKind(ZvShape2f::KindPath)) {
    path.reset(static_cast<ZvPath2f*>(shape.release()));
  } else {
    path = BuiltIn();
    consumed = 0;
  }
  Script script(data + consumed, size - consumed);
  for (int steps = 0; script.More() && steps < 64; ++steps) {
    Step(*path, script);
    std::vector<unsigned char> block(path->GetBufferSize());
    if (path->WriteToBuffer(block.data()) != block.size()) std::abort();
  }
  return 0;
}
