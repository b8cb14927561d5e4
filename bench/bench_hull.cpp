// Convex hull of large random point sets: ZvGetConvexHull2D against the peer's hull on the same
// points. Run with --benchmark_repetitions=N to read medians.
#include <zv/polyline.h>

#include <benchmark/benchmark.h>

#include <cmath>
#include <random>
#include <vector>

// The peer's headers need Boost's; without them its cases are left out.
#if ZV_HAVE_2GEOM && __has_include(<boost/operators.hpp>)
#define ZV_BENCH_2GEOM 1
#include <2geom/convex-hull.h>
#else
#define ZV_BENCH_2GEOM 0
#endif

namespace {

enum Cloud { Square = 0, Disc = 1, Circle = 2 };

// Uniform in a square (few corners), in a disc (many more corners, about n^(1/3)) or on a circle
// (rounded to float: nearly every point is a corner, and many triples are nearly collinear).
std::vector<ZvPoint2<float>> MakeCloud(int n, int cloud) {
  std::mt19937 rng(4242);
  std::uniform_real_distribution<float> u(-1.0f, 1.0f);
  std::vector<ZvPoint2<float>> points;
  points.reserve(n);
  while (int(points.size()) < n) {
    if (cloud == Circle) {
      const double a = 3.141592653589793 * u(rng);
      points.push_back({float(1000 * std::cos(a)), float(1000 * std::sin(a))});
      continue;
    }
    const ZvPoint2<float> p{u(rng), u(rng)};
    if (cloud == Square || p.x * p.x + p.y * p.y <= 1.0f)
      points.push_back({p.x * 1000, p.y * 1000});
  }
  return points;
}

void BM_ZvGetConvexHull2D(benchmark::State& state) {
  std::vector<ZvPoint2<float>> points = MakeCloud(int(state.range(0)), int(state.range(1)));
  unsigned int corners = 0;
  for (auto _ : state) {
    ZvPoint2fArray hull(64);
    benchmark::DoNotOptimize(ZvGetConvexHull2D(int(points.size()), points.data(), &hull));
    corners = hull.size;
  }
  state.counters["corners"] = corners;
  state.SetItemsProcessed(state.iterations() * state.range(0));
}

#if ZV_BENCH_2GEOM
void BM_2geom_ConvexHull(benchmark::State& state) {
  const std::vector<ZvPoint2<float>> cloud = MakeCloud(int(state.range(0)), int(state.range(1)));
  std::vector<Geom::Point> points;
  points.reserve(cloud.size());
  for (const auto& p : cloud)
    points.emplace_back(p.x, p.y);
  size_t corners = 0;
  for (auto _ : state) {
    Geom::ConvexHull hull(points);
    corners = hull.size();
    benchmark::DoNotOptimize(corners);
  }
  state.counters["corners"] = double(corners);
  state.SetItemsProcessed(state.iterations() * state.range(0));
}
BENCHMARK(BM_2geom_ConvexHull)
    ->ArgsProduct({{100000, 1000000}, {Square, Disc, Circle}})
    ->Unit(benchmark::kMillisecond);
#endif

}  // namespace

BENCHMARK(BM_ZvGetConvexHull2D)
    ->ArgsProduct({{100000, 1000000}, {Square, Disc, Circle}})
    ->Unit(benchmark::kMillisecond);

BENCHMARK_MAIN();
