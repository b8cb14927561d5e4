// Editing a long path in place: replacing and removing points, segments and sections at random
// places, at four path sizes, against the bare data movement of the same edits.
//
// The path is made of open subpaths of 100 cubics each; sizes are counted in segments (25,000 to
// 200,000, about three points a segment). Every structural edit removes or inserts points at a
// random place, so it moves the tail of both arrays behind that place: the cost must grow
// linearly with the path, and the table shows time per edit over the path size next to the
// same figure for the smallest path. The reference ("vector erase+insert") does only that data
// movement: a std::vector of points and one of code bytes, one point erased and one inserted at
// the same random place. Moving a point with no structural change (ReplacePoint) should not
// grow with the path at all. Each benchmark restores what it changed within the iteration, so
// the path keeps its size and shape from one iteration to the next.
#include <benchmark/benchmark.h>

#include <zv/path2f.h>
#include "median_reporter.h"

#include <cstdio>
#include <functional>
#include <map>
#include <memory>
#include <random>
#include <string>
#include <vector>

namespace {

using P2 = ZvPoint2<float>;

constexpr unsigned int kPerSubpath = 100;  // cubics per subpath
const unsigned int kSizes[] = {25000, 50000, 100000, 200000};

void AppendSubpath(ZvPath2f& path, std::mt19937& g) {
  std::uniform_real_distribution<float> d(-10.0f, 10.0f);
  P2 at{d(g) * 100, d(g) * 100};
  path.Moveto(at);
  for (unsigned int k = 0; k < kPerSubpath; ++k) {
    const P2 c1{at.x + d(g), at.y + d(g)}, c2{at.x + d(g), at.y + d(g)};
    at = P2{at.x + d(g), at.y + d(g)};
    path.Curveto(c1, c2, at);
  }
}

ZvPath2f MakePath(unsigned int segments) {
  std::mt19937 g(segments);
  ZvPath2f path(3 * segments + segments / kPerSubpath);
  for (unsigned int s = 0; s < segments / kPerSubpath; ++s)
    AppendSubpath(path, g);
  return path;
}

// Random cubic segments: the index of the start node of segment k of subpath s.
class Places {
 public:
  explicit Places(unsigned int segments) : g_(7), subpaths_(segments / kPerSubpath) {}
  unsigned int NextSegmentStart() {
    const unsigned int s = g_() % subpaths_, k = g_() % kPerSubpath;
    return s * (3 * kPerSubpath + 1) + 3 * k;
  }
  unsigned int NextSubpathStart() { return (g_() % subpaths_) * (3 * kPerSubpath + 1); }
  unsigned int Below(unsigned int n) { return g_() % n; }

 private:
  std::mt19937 g_;
  unsigned int subpaths_;
};

struct Case {
  std::string name;
  int editsPerIteration;
  // Runs one iteration on `path` (of `segments` segments) at places from `places`.
  std::function<void(ZvPath2f&, Places&)> run;
};

std::vector<Case> Cases() {
  std::vector<Case> c;
  // A cubic becomes a quadratic (one point out) and then the cubic again (one point in).
  c.push_back({"ReplaceSegment", 2, [](ZvPath2f& path, Places& places) {
                 const unsigned int a = places.NextSegmentStart();
                 P2 cubic[4];
                 path.GetPoints(a, a + 3, cubic);
                 const P2 quad[3] = {cubic[0], cubic[1], cubic[3]};
                 path.ReplaceSegment(a + 1, quad, 2);
                 path.ReplaceSegment(a + 1, cubic, 3);
               }});
  // The cubic's two handles removed (a line), then put back (the cubic).
  c.push_back({"ReplaceSubpathSection", 2, [](ZvPath2f& path, Places& places) {
                 const unsigned int a = places.NextSegmentStart();
                 P2 cubic[4];
                 path.GetPoints(a, a + 3, cubic);
                 path.ReplaceSubpathSection(a, a + 3);
                 path.ReplaceSubpathSection(a, a + 1, cubic[1], cubic[2]);
               }});
  // A whole subpath of 301 points removed; a new one appended at the end keeps the size.
  c.push_back({"RemoveSubpath", 1, [](ZvPath2f& path, Places& places) {
                 static std::mt19937 g(3);
                 path.RemoveSubpath(places.NextSubpathStart());
                 AppendSubpath(path, g);
               }});
  // A handle moved and moved back: no structural change.
  c.push_back({"ReplacePoint", 2, [](ZvPath2f& path, Places& places) {
                 const unsigned int i = places.NextSegmentStart() + 1;
                 const P2 p = path.GetPoint(i);
                 path.ReplacePoint(i, P2{p.x + 1, p.y}, 1);
                 path.ReplacePoint(i, p, 1);
               }});
  return c;
}

void BM_Edit(benchmark::State& state, const Case& c, unsigned int segments) {
  ZvPath2f path = MakePath(segments);
  Places places(segments);
  for (auto _ : state)
    c.run(path, places);
  state.counters["points"] = path.NumPoints();
  state.SetItemsProcessed(state.iterations() * c.editsPerIteration);
}

void BM_VectorEraseInsert(benchmark::State& state, unsigned int segments) {
  const ZvPath2f path = MakePath(segments);
  const unsigned int n = path.NumPoints();
  std::vector<P2> points(n);
  path.GetPoints(0, n - 1, points.data());
  std::vector<unsigned char> codes(n, 8);
  Places places(segments);
  for (auto _ : state) {
    const unsigned int i = places.NextSegmentStart() + 1;
    const P2 p = points[i];
    const unsigned char code = codes[i];
    points.erase(points.begin() + i);
    codes.erase(codes.begin() + i);
    points.insert(points.begin() + i, p);
    codes.insert(codes.begin() + i, code);
    benchmark::DoNotOptimize(points.data());
  }
  state.SetItemsProcessed(state.iterations() * 2);
}

std::string Name(const std::string& c, unsigned int segments) {
  return c + "/" + std::to_string(segments);
}

}  // namespace

int main(int argc, char** argv) {
  const std::vector<Case> cases = Cases();
  for (unsigned int n : kSizes) {
    benchmark::RegisterBenchmark(Name("vector erase+insert", n).c_str(), BM_VectorEraseInsert, n)
        ->Unit(benchmark::kMicrosecond);
    for (const Case& c : cases)
      benchmark::RegisterBenchmark(Name(c.name, n).c_str(), BM_Edit, c, n)
          ->Unit(benchmark::kMicrosecond);
  }
  return ZvRunBenchmarks(argc, argv, [&](const ZvMedianReporter& reporter) {
    std::printf(
        "\nMedian CPU time per edit (us), and per edit per 100,000 segments (us): linear growth\n"
        "keeps the second figure flat across sizes. 'x ref' is the time per edit over that of the\n"
        "bare vector erase+insert at the same size.\n\n");
    std::vector<std::string> names = {"vector erase+insert"};
    std::vector<int> perIteration = {2};
    for (const Case& c : cases) {
      names.push_back(c.name);
      perIteration.push_back(c.editsPerIteration);
    }
    std::printf("%-24s %8s %10s %12s %8s\n", "edit", "segments", "us/edit", "us/edit/100k",
                "x ref");
    for (size_t k = 0; k < names.size(); ++k) {
      for (unsigned int n : kSizes) {
        const double us = reporter.MedianSeconds(Name(names[k], n)) * 1e6 / perIteration[k];
        const double ref = reporter.MedianSeconds(Name(names[0], n)) * 1e6 / perIteration[0];
        if (us == 0.0) continue;
        std::printf("%-24s %8u %10.3f %12.3f %7.2fx\n", names[k].c_str(), n, us, us * 100000.0 / n,
                    ref > 0.0 ? us / ref : 0.0);
      }
    }
  });
}
