// Motion path evaluation at 10,000 sequential times on paths of 200 and 2,000 cubic segments,
// against one ZvBezierTool_FlattenCubic3d of one of their segments at the same tolerance (the
// work an evaluation would repeat if it flattened afresh each time), in the same run. Also
// EvalSequence over the same times, per sample. Reports medians and ratios.
#include <benchmark/benchmark.h>

#include "median_reporter.h"

#include <zv/bezier_tool.h>
#include <zv/motion_path.h>

#include <cmath>
#include <cstdio>
#include <map>
#include <memory>
#include <string>
#include <vector>

namespace {

constexpr int kSamples = 10000;
constexpr double kTolerance = 0.01;

// A helix-like chain of cubics, one time unit per segment, segments about 30 units long.
std::unique_ptr<ZvMotionPath3d> MakePath(int nodes) {
  auto path = std::make_unique<ZvMotionPath3d>();
  const auto at = [](double k) {
    return ZvPoint3<double>{20.0 * std::cos(k * 0.9), 20.0 * std::sin(k * 0.9), 5.0 * k};
  };
  path->Moveto(at(0), 0.0);
  for (int k = 1; k < nodes; ++k) {
    const ZvPoint3<double> a = at(k - 1), b = at(k);
    const ZvPoint3<double> c1{a.x - 8.0 * std::sin((k - 1) * 0.9),
                              a.y + 8.0 * std::cos((k - 1) * 0.9), a.z + 1.5};
    const ZvPoint3<double> c2{b.x + 8.0 * std::sin(k * 0.9), b.y - 8.0 * std::cos(k * 0.9),
                              b.z - 1.5};
    path->Curveto(c1, c2, b, k);
  }
  return path;
}

const ZvMotionPath3d& ThePath(int nodes) {
  static std::map<int, std::unique_ptr<ZvMotionPath3d>> paths;
  auto& slot = paths[nodes];
  if (!slot) slot = MakePath(nodes);
  return *slot;
}

std::vector<double> Times(int nodes) {
  std::vector<double> t;
  for (int i = 0; i < kSamples; ++i)
    t.push_back((nodes - 1) * (i + 0.5) / kSamples);
  return t;
}

void BM_Eval(benchmark::State& state) {
  const int nodes = static_cast<int>(state.range(0));
  const ZvMotionPath3d& path = ThePath(nodes);
  const std::vector<double> times = Times(nodes);
  ZvPoint3<double> p;
  // The first sweep flattens every segment once; the timing is of the sweeps after it.
  for (double t : times)
    path.Eval(t, kTolerance, p);
  size_t i = 0;
  for (auto _ : state) {
    path.Eval(times[i], kTolerance, p);
    benchmark::DoNotOptimize(p);
    if (++i == times.size()) i = 0;
  }
}

void BM_EvalSequence(benchmark::State& state) {
  const int nodes = static_cast<int>(state.range(0));
  const ZvMotionPath3d& path = ThePath(nodes);
  const std::vector<double> times = Times(nodes);
  const double step = times[1] - times[0];
  ZvPoint3dArray out(kSamples + 2);
  for (auto _ : state) {
    out.Chop(0);
    path.EvalSequence(times.front(), times.back(), step, kTolerance, out);
    benchmark::DoNotOptimize(out.data);
  }
  state.counters["samples"] = out.size;
}

// One segment from the middle of the path, flattened into a reused array.
void BM_FlattenOneSegment(benchmark::State& state) {
  const ZvMotionPath3d& path = ThePath(200);
  ZvPoint3<double> cubic[4];
  path.GetControlPoints(300, 303, cubic, nullptr);
  ZvPoint3dArray out(32);
  for (auto _ : state) {
    out.Chop(0);
    ZvBezierTool_FlattenCubic3d(cubic, kTolerance, &out, 0);
    benchmark::DoNotOptimize(out.data);
  }
  state.counters["points"] = out.size;
}

}  // namespace

BENCHMARK(BM_FlattenOneSegment)->Repetitions(5)->ReportAggregatesOnly(true);
BENCHMARK(BM_Eval)->Arg(200)->Arg(2000)->Repetitions(5)->ReportAggregatesOnly(true);
BENCHMARK(BM_EvalSequence)->Arg(200)->Arg(2000)->Repetitions(5)->ReportAggregatesOnly(true);

int main(int argc, char** argv) {
  ThePath(200);
  ThePath(2000);
  return ZvRunBenchmarks(argc, argv, [&](const ZvMedianReporter& reporter) {
    const auto median = [&](const std::string& name) {
      return reporter.MedianSeconds(name + "/repeats:5") * 1e9;
    };
    const double flatten = reporter.FunctionMedianSeconds("BM_FlattenOneSegment") * 1e9;
    std::printf("\nmedian ns, tolerance %g, %d sequential times\n", kTolerance, kSamples);
    std::printf("  FlattenCubic3d of one segment %10.1f\n", flatten);
    for (int nodes : {200, 2000}) {
      const std::string arg = "/" + std::to_string(nodes);
      const double eval = median("BM_Eval" + arg);
      const double sequence = median("BM_EvalSequence" + arg) / kSamples;
      std::printf(
          "  %4d nodes: Eval %8.1f per call (%.3f of a flatten, target <= 0.2),"
          " EvalSequence %8.1f per sample\n",
          nodes, eval, flatten > 0.0 ? eval / flatten : 0.0, sequence);
    }
  });
}
