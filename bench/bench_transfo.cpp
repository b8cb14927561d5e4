// Mapping a million single-precision plane points in place, the hot path of shape
// transformation, against a memcpy of the same bytes and against the peers' point transforms.
// Every case reports its median over repetitions; the closing lines give the ratios to memcpy.
#include <zv/transfo4.h>

#include <benchmark/benchmark.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstring>
#include <map>
#include <string>
#include <vector>

#if ZV_HAVE_AGG
#include <agg_trans_affine.h>
#endif
#if ZV_HAVE_CAIRO
#include <cairo.h>
#endif
// 2geom's headers need Boost, which its package does not always bring along.
#if ZV_HAVE_2GEOM && __has_include(<boost/operators.hpp>)
#define ZV_BENCH_2GEOM 1
#include <2geom/affine.h>
#include <2geom/point.h>
#endif

namespace {

const unsigned int kCount = 1000000;

std::vector<ZvPoint2<float>> MakePoints() {
  std::vector<ZvPoint2<float>> points(kCount);
  for (unsigned int i = 0; i < kCount; ++i) {
    points[i] = {static_cast<float>(i % 1000) * 0.5f, static_cast<float>(i / 1000) * 0.25f};
  }
  return points;
}

// A rotation about a centre: every one of the six elements is non-trivial, and mapping the same
// array again and again keeps the coordinates bounded (no overflow, no denormals).
ZvTransfo4 Rotation() {
  ZvTransfo4 t;
  t.RotateXY(30, ZvPoint2<double>{250, 125});
  return t;
}

void Finish(benchmark::State& state) {
  state.SetBytesProcessed(static_cast<int64_t>(state.iterations()) * kCount *
                          sizeof(ZvPoint2<float>));
}

void BM_Memcpy(benchmark::State& state) {
  const std::vector<ZvPoint2<float>> src = MakePoints();
  std::vector<ZvPoint2<float>> dst(kCount);
  for (auto _ : state) {
    std::memcpy(dst.data(), src.data(), kCount * sizeof(ZvPoint2<float>));
    benchmark::DoNotOptimize(dst.data());
    benchmark::ClobberMemory();
  }
  Finish(state);
}

void BM_ZvMapInPlace(benchmark::State& state) {
  std::vector<ZvPoint2<float>> points = MakePoints();
  const ZvTransfo4 t = Rotation();
  for (auto _ : state) {
    t.MapInPlace(points.data(), kCount);
    benchmark::ClobberMemory();
  }
  Finish(state);
}

// The identity takes the same loop: there is no shortcut to measure here, only its absence.
void BM_ZvMapInPlaceIdentity(benchmark::State& state) {
  std::vector<ZvPoint2<float>> points = MakePoints();
  const ZvTransfo4 t;
  for (auto _ : state) {
    t.MapInPlace(points.data(), kCount);
    benchmark::ClobberMemory();
  }
  Finish(state);
}

void BM_ZvMapInto(benchmark::State& state) {
  const std::vector<ZvPoint2<float>> src = MakePoints();
  std::vector<ZvPoint2<float>> dst(kCount);
  const ZvTransfo4 t = Rotation();
  for (auto _ : state) {
    t.Map(src.data(), kCount, dst.data());
    benchmark::ClobberMemory();
  }
  Finish(state);
}

// The peers work on double coordinates; each is fed the same float array in place.
#if ZV_HAVE_AGG
void BM_AggTransAffine(benchmark::State& state) {
  std::vector<ZvPoint2<float>> points = MakePoints();
  const ZvTransfo4 t = Rotation();
  const double* m = t.GetMatrixPtr();
  const agg::trans_affine a(m[0], m[1], m[4], m[5], m[12], m[13]);
  for (auto _ : state) {
    for (ZvPoint2<float>& p : points) {
      double x = p.x, y = p.y;
      a.transform(&x, &y);
      p = {static_cast<float>(x), static_cast<float>(y)};
    }
    benchmark::ClobberMemory();
  }
  Finish(state);
}
BENCHMARK(BM_AggTransAffine);
#endif

#if ZV_HAVE_CAIRO
void BM_CairoMatrix(benchmark::State& state) {
  std::vector<ZvPoint2<float>> points = MakePoints();
  const ZvTransfo4 t = Rotation();
  const double* m = t.GetMatrixPtr();
  cairo_matrix_t c;
  cairo_matrix_init(&c, m[0], m[1], m[4], m[5], m[12], m[13]);
  for (auto _ : state) {
    for (ZvPoint2<float>& p : points) {
      double x = p.x, y = p.y;
      cairo_matrix_transform_point(&c, &x, &y);
      p = {static_cast<float>(x), static_cast<float>(y)};
    }
    benchmark::ClobberMemory();
  }
  Finish(state);
}
BENCHMARK(BM_CairoMatrix);
#endif

#if ZV_BENCH_2GEOM
void BM_2GeomAffine(benchmark::State& state) {
  std::vector<ZvPoint2<float>> points = MakePoints();
  const ZvTransfo4 t = Rotation();
  const double* m = t.GetMatrixPtr();
  const Geom::Affine a(m[0], m[1], m[4], m[5], m[12], m[13]);
  for (auto _ : state) {
    for (ZvPoint2<float>& p : points) {
      const Geom::Point q = Geom::Point(p.x, p.y) * a;
      p = {static_cast<float>(q[Geom::X]), static_cast<float>(q[Geom::Y])};
    }
    benchmark::ClobberMemory();
  }
  Finish(state);
}
BENCHMARK(BM_2GeomAffine);
#endif

BENCHMARK(BM_Memcpy);
BENCHMARK(BM_ZvMapInPlace);
BENCHMARK(BM_ZvMapInPlaceIdentity);
BENCHMARK(BM_ZvMapInto);

// Keeps the median of every case so the ratios can be printed after the run.
class MedianReporter : public benchmark::ConsoleReporter {
 public:
  void ReportRuns(const std::vector<Run>& runs) override {
    for (const Run& run : runs) {
      if (run.aggregate_name == "median") {
        medians[run.run_name.function_name] = {run.GetAdjustedRealTime(), run.GetAdjustedCPUTime()};
      }
    }
    ConsoleReporter::ReportRuns(runs);
  }
  struct Median {
    double real, cpu;  // in the runs' unit, nanoseconds
  };
  std::map<std::string, Median> medians;
};

// On a shared machine the load changes between cases run seconds apart. Alternating the two
// operations round by round exposes both to the same conditions; the median of the per-round
// ratios is the robust figure.
void PairedRounds() {
  std::vector<ZvPoint2<float>> points = MakePoints(), copy(kCount);
  const ZvTransfo4 t = Rotation();
  const int rounds = 301;
  std::vector<double> map(rounds), mem(rounds), ratio(rounds);
  for (int i = 0; i < rounds; ++i) {
    const auto t0 = std::chrono::steady_clock::now();
    t.MapInPlace(points.data(), kCount);
    benchmark::ClobberMemory();
    const auto t1 = std::chrono::steady_clock::now();
    std::memcpy(copy.data(), points.data(), kCount * sizeof(ZvPoint2<float>));
    benchmark::DoNotOptimize(copy.data());
    benchmark::ClobberMemory();
    const auto t2 = std::chrono::steady_clock::now();
    map[i] = std::chrono::duration<double, std::milli>(t1 - t0).count();
    mem[i] = std::chrono::duration<double, std::milli>(t2 - t1).count();
    ratio[i] = map[i] / mem[i];
  }
  for (std::vector<double>* v : {&map, &mem, &ratio})
    std::sort(v->begin(), v->end());
  std::printf(
      "\nPaired rounds (%d): MapInPlace median %.3f ms, memcpy median %.3f ms, "
      "median ratio x%.2f\n",
      rounds, map[rounds / 2], mem[rounds / 2], ratio[rounds / 2]);
}

}  // namespace

int main(int argc, char** argv) {
  // Medians need repetitions; the command line may still ask for more.
  std::vector<char*> args(argv, argv + argc);
  char repetitions[] = "--benchmark_repetitions=15";
  char aggregates[] = "--benchmark_report_aggregates_only=true";
  args.insert(args.begin() + 1, {repetitions, aggregates});
  int count = static_cast<int>(args.size());
  benchmark::Initialize(&count, args.data());
  MedianReporter reporter;
  benchmark::RunSpecifiedBenchmarks(&reporter);
  const auto base = reporter.medians.find("BM_Memcpy");
  if (base != reporter.medians.end()) {
    const MedianReporter::Median& b = base->second;
    std::printf("\nMedians against a memcpy of the same %zu bytes (real %.3f ms, cpu %.3f ms):\n",
                kCount * sizeof(ZvPoint2<float>), b.real / 1e6, b.cpu / 1e6);
    for (const auto& entry : reporter.medians) {
      const MedianReporter::Median& m = entry.second;
      std::printf("  %-26s real %7.3f ms x%5.2f   cpu %7.3f ms x%5.2f\n", entry.first.c_str(),
                  m.real / 1e6, m.real / b.real, m.cpu / 1e6, m.cpu / b.cpu);
    }
  }
  PairedRounds();
  benchmark::Shutdown();
  return 0;
}
