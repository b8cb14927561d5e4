// Flattening a 10,000-key curve of cubic segments for display at a tolerance of 0.25 pixels:
// Flatten of the whole curve, and FlattenFromTo of a view box that shows 100 keys. With cairo
// at configure time, cairo flattens the same Bezier path (cairo_copy_path_flat at the same
// tolerance) in the same run. Reports medians and the ratio.
#include <benchmark/benchmark.h>

#include "median_reporter.h"

#include <zv/std_fcurve.h>
#include <zv/transfo4.h>

#if ZV_HAVE_CAIRO
#include <cairo.h>
#endif

#include <cmath>
#include <cstdio>
#include <map>
#include <random>
#include <string>
#include <vector>

namespace {

constexpr int kKeys = 10000;
constexpr double kTolerance = 0.25;

// 40 pixels per parameter unit, 30 per value unit, Y growing downward as on a screen.
ZvTransfo4 View() {
  ZvTransfo4 view;
  view.Translate(0.0, 400.0, 0.0).Scale(40.0, -30.0, 1.0);
  return view;
}

ZvStdFCurve& TheCurve() {
  static ZvStdFCurve* curve = [] {
    ZvStdFCurve* c = new ZvStdFCurve(0.0, ZvBaseFCurve::CubicSegment);
    std::mt19937 rng(5);
    std::uniform_real_distribution<double> gap(0.5, 1.5);
    double p = 0.0;
    for (int i = 0; i < kKeys; ++i) {
      c->CreateKey(p, std::sin(i * 0.37) * 3.0 + std::cos(i * 0.11));
      p += gap(rng);
    }
    return c;
  }();
  return *curve;
}

void BM_ZvFlatten(benchmark::State& state) {
  const ZvStdFCurve& curve = TheCurve();
  const ZvTransfo4 view = View();
  ZvPoint2dArray points(1024);
  ZvPointTagArray tags(1024);
  for (auto _ : state) {
    points.Chop(0);
    tags.Chop(0);
    curve.Flatten(view, kTolerance, points, tags, 0);
    benchmark::DoNotOptimize(points.data);
  }
  state.counters["points"] = points.size;
}

// The box of keys 5000 to 5100 in view space, a little taller than the values.
void BM_ZvFlattenFromTo100Keys(benchmark::State& state) {
  const ZvStdFCurve& curve = TheCurve();
  const ZvTransfo4 view = View();
  double a = 0.0, b = 0.0;
  curve.GetKeyParameter(5000, a);
  curve.GetKeyParameter(5100, b);
  const ZvExtent2<double> box(a * 40.0, 400.0 - 5.0 * 30.0, b * 40.0, 400.0 + 5.0 * 30.0);
  ZvPoint2dArray points(1024);
  ZvPointTagArray tags(1024);
  ZvBoolArray flags(1024);
  for (auto _ : state) {
    points.Chop(0);
    tags.Chop(0);
    flags.Chop(0);
    curve.FlattenFromTo(box, view, kTolerance, points, tags, flags, 0);
    benchmark::DoNotOptimize(points.data);
  }
  state.counters["points"] = points.size;
}

#if ZV_HAVE_CAIRO
// The same segments as a cairo path in view space, flattened by cairo.
void BM_CairoCopyPathFlat(benchmark::State& state) {
  const ZvStdFCurve& curve = TheCurve();
  const ZvTransfo4 view = View();
  cairo_surface_t* surface = cairo_image_surface_create(CAIRO_FORMAT_A8, 1, 1);
  cairo_t* cr = cairo_create(surface);
  cairo_set_tolerance(cr, kTolerance);
  std::vector<ZvPoint2<double>> key(kKeys), left(kKeys), right(kKeys);
  for (int i = 0; i < kKeys; ++i) {
    ZvBaseFCurve::KeyInfo info{};
    info.mask = 511;
    curve.GetKeyInfoFromIndex(i, &info);
    key[i] = view.Map(ZvPoint2<double>{info.parameter, info.rightValue});
    left[i] = view.Map(
        ZvPoint2<double>{info.parameter + info.leftTangentX, info.leftValue + info.leftTangentY});
    right[i] = view.Map(ZvPoint2<double>{info.parameter + info.rightTangentX,
                                         info.rightValue + info.rightTangentY});
  }
  long count = 0;
  for (auto _ : state) {
    cairo_new_path(cr);
    cairo_move_to(cr, key[0].x, key[0].y);
    for (int i = 1; i < kKeys; ++i) {
      cairo_curve_to(cr, right[i - 1].x, right[i - 1].y, left[i].x, left[i].y, key[i].x, key[i].y);
    }
    cairo_path_t* flat = cairo_copy_path_flat(cr);
    count = flat->num_data;
    cairo_path_destroy(flat);
  }
  state.counters["path data"] = count;
  cairo_destroy(cr);
  cairo_surface_destroy(surface);
}
#endif

}  // namespace

BENCHMARK(BM_ZvFlatten)->Unit(benchmark::kMillisecond)->Repetitions(5)->ReportAggregatesOnly(true);
BENCHMARK(BM_ZvFlattenFromTo100Keys)
    ->Unit(benchmark::kMicrosecond)
    ->Repetitions(5)
    ->ReportAggregatesOnly(true);
#if ZV_HAVE_CAIRO
BENCHMARK(BM_CairoCopyPathFlat)
    ->Unit(benchmark::kMillisecond)
    ->Repetitions(5)
    ->ReportAggregatesOnly(true);
#endif

int main(int argc, char** argv) {
  TheCurve();  // built outside the timings
  return ZvRunBenchmarks(argc, argv, [&](const ZvMedianReporter& reporter) {
    auto median = [&](const char* name) { return reporter.FunctionMedianSeconds(name); };
    const double whole = median("BM_ZvFlatten") * 1e3,
                 box = median("BM_ZvFlattenFromTo100Keys") * 1e6;
    std::printf("\nmedians, %d keys, tolerance %.2f\n", kKeys, kTolerance);
    std::printf("  zv Flatten whole curve      %8.3f ms (target well under 10 ms)\n", whole);
    std::printf("  zv FlattenFromTo, 100 keys  %8.1f us\n", box);
#if ZV_HAVE_CAIRO
    const double cairo = median("BM_CairoCopyPathFlat") * 1e3;
    std::printf("  cairo copy_path_flat        %8.3f ms   ratio zv / cairo %.2f\n", cairo,
                cairo > 0.0 ? whole / cairo : 0.0);
#else
    std::printf("  cairo not found at configure time: no comparison\n");
#endif
  });
}
