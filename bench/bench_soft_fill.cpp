// Soft fill of a disc on a 1024^2 float raster against a plain two-pass separable convolution
// of zv's antialiased coverage with the same taps (every pixel times every tap, written here),
// for disc radii 64..400 and filter radii 2, 8 and 32.
//
// Besides the whole soft fill (clipped to the shape, as by default) the summary shows the
// unclipped soft fill and the antialiased fill alone, so that the time splits into the clip step
// and the two blur passes; and the blur's growth with the filter radius, per disc, so that it can
// be compared with the disc's perimeter (which grows linearly) and area (quadratically).
//
// Run with --benchmark_repetitions=5 or more: the summary gives medians.
#include <zv/gc.h>
#include <zv/path2f.h>

#include <benchmark/benchmark.h>

#include "median_reporter.h"

#include <cmath>
#include <cstdio>
#include <string>
#include <vector>

namespace {
constexpr int kSize = 1024;
const int kDiscs[] = {64, 128, 256, 400};
const int kRadii[] = {2, 8, 32};

ZvPath2f Disc(float r) {
  const float c = kSize / 2.0f, k = 0.5523f * r;
  ZvPath2f path;
  path.Moveto({c + r, c});
  path.Curveto({c + r, c + k}, {c + k, c + r}, {c, c + r});
  path.Curveto({c - k, c + r}, {c - r, c + k}, {c - r, c});
  path.Curveto({c - r, c - k}, {c - k, c - r}, {c, c - r});
  path.Curveto({c + k, c - r}, {c + r, c - k}, {c + r, c});
  path.Closeto();
  return path;
}

// A context whose feather gives filter radius R: R = max(ceil(w - 0.5), 1) with w = R + 0.5.
ZvGC Context(int radius, int clip) {
  ZvGC gc;
  gc.featherInner = radius + 0.5;
  gc.clipToShape = clip;
  return gc;
}

// The taps the soft fill samples from the profile, normalised.
std::vector<double> Taps(const ZvGC& gc, int radius) {
  std::vector<double> f(2 * radius + 1);
  double sum = f[radius] = gc.featherProfile.Eval(0.0, 0);
  for (int i = 1; i <= radius; ++i) {
    f[radius + i] = f[radius - i] = gc.featherProfile.Eval(i / (0.5 + radius), 0);
    sum += 2 * f[radius + i];
  }
  for (double& v : f)
    v /= sum;
  return f;
}

// The reference: antialiased coverage, then a horizontal and a vertical pass of every tap.
void PlainConvolution(const ZvPath2f& disc, const ZvGC& gc, int radius, ZvRaster<float>& out,
                      std::vector<double>& a, std::vector<double>& b) {
  const std::vector<double> f = Taps(gc, radius);
  out.MemsetBuffer(0);
  disc.AAFill(gc, out, nullptr, nullptr);
  const float* src = out.GetRaster();
  for (int y = 0; y < kSize; ++y)
    for (int x = 0; x < kSize; ++x) {
      double s = 0;
      for (int j = -radius; j <= radius; ++j) {
        const int sx = x + j;
        if (sx >= 0 && sx < kSize) s += f[j + radius] * src[y * kSize + sx];
      }
      a[static_cast<std::size_t>(y) * kSize + x] = s;
    }
  for (int y = 0; y < kSize; ++y)
    for (int x = 0; x < kSize; ++x) {
      double s = 0;
      for (int k = -radius; k <= radius; ++k) {
        const int sy = y + k;
        if (sy >= 0 && sy < kSize) s += f[k + radius] * a[static_cast<std::size_t>(sy) * kSize + x];
      }
      b[static_cast<std::size_t>(y) * kSize + x] = s;
    }
  float* dst = out.GetRaster();
  for (int i = 0; i < kSize * kSize; ++i)
    dst[i] = static_cast<float>(b[i]);
}

std::string Name(const char* what, int disc, int radius) {
  return std::string(what) + "/disc" + std::to_string(disc) + "/R" + std::to_string(radius);
}

void Register() {
  for (int disc : kDiscs)
    for (int radius : kRadii) {
      benchmark::RegisterBenchmark(Name("soft", disc, radius).c_str(), [=](benchmark::State& s) {
        const ZvPath2f path = Disc(static_cast<float>(disc));
        const ZvGC gc = Context(radius, 1);
        ZvRaster<float> raster(kSize, kSize, 0);
        for (auto _ : s)
          path.SoftFill(gc, raster, nullptr);
      })->Unit(benchmark::kMillisecond);
      benchmark::RegisterBenchmark(Name("unclipped", disc, radius).c_str(),
                                   [=](benchmark::State& s) {
                                     const ZvPath2f path = Disc(static_cast<float>(disc));
                                     const ZvGC gc = Context(radius, 0);
                                     ZvRaster<float> raster(kSize, kSize, 0);
                                     for (auto _ : s)
                                       path.SoftFill(gc, raster, nullptr);
                                   })
          ->Unit(benchmark::kMillisecond);
      benchmark::RegisterBenchmark(Name("plain", disc, radius).c_str(), [=](benchmark::State& s) {
        const ZvPath2f path = Disc(static_cast<float>(disc));
        const ZvGC gc = Context(radius, 1);
        ZvRaster<float> raster(kSize, kSize, 0);
        std::vector<double> a(kSize * kSize), b(kSize * kSize);
        for (auto _ : s)
          PlainConvolution(path, gc, radius, raster, a, b);
      })->Unit(benchmark::kMillisecond);
    }
  for (int disc : kDiscs)
    benchmark::RegisterBenchmark(Name("aafill", disc, 0).c_str(), [=](benchmark::State& s) {
      const ZvPath2f path = Disc(static_cast<float>(disc));
      const ZvGC gc;
      ZvRaster<float> raster(kSize, kSize, 0);
      for (auto _ : s)
        path.AAFill(gc, raster, nullptr, nullptr);
    })->Unit(benchmark::kMillisecond);
}

void PrintSummary(const ZvMedianReporter& r) {
  std::printf("\nmedian ms per fill, 1024^2 float raster\n");
  std::printf("%6s %3s %9s %9s %9s %8s %10s %9s\n", "disc", "R", "soft", "plain", "plain/soft",
              "aafill", "unclipped", "clip step");
  for (int disc : kDiscs)
    for (int radius : kRadii) {
      const double soft = r.MedianSeconds(Name("soft", disc, radius)) * 1e3;
      const double plain = r.MedianSeconds(Name("plain", disc, radius)) * 1e3;
      const double unclipped = r.MedianSeconds(Name("unclipped", disc, radius)) * 1e3;
      const double aa = r.MedianSeconds(Name("aafill", disc, 0)) * 1e3;
      std::printf("%6d %3d %9.3f %9.3f %9.2f%s %8.3f %10.3f %9.3f\n", disc, radius, soft, plain,
                  soft > 0 ? plain / soft : 0.0, radius >= 8 && plain < 5 * soft ? "!" : " ", aa,
                  unclipped, soft - unclipped);
    }
  std::printf("\nblur time growth from R = 2 to R = 32 (unclipped), per disc radius:\n");
  for (int disc : kDiscs) {
    const double grow = (r.MedianSeconds(Name("unclipped", disc, 32)) -
                         r.MedianSeconds(Name("unclipped", disc, 2))) *
                        1e3;
    std::printf("  disc %3d: +%.3f ms, %.4f ms per 100 px of perimeter\n", disc, grow,
                grow / (2 * 3.14159265 * disc / 100));
  }
  std::printf("'!' marks a ratio under the target of 5 at R >= 8.\n");
}
}  // namespace

int main(int argc, char** argv) {
  Register();
  return ZvRunBenchmarks(argc, argv,
                         [&](const ZvMedianReporter& reporter) { PrintSummary(reporter); });
}
