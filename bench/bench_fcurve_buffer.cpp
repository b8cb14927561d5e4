// Writing and reading back the block of a 10,000-key standard curve, against memcpy of the same
// bytes in the same run. Reports the median throughput of each in MB/s and the ratio of memcpy's
// to each of them.
#include <benchmark/benchmark.h>

#include "median_reporter.h"

#include <zv/std_fcurve.h>

#include <cmath>
#include <cstdio>
#include <cstring>
#include <vector>

namespace {

constexpr int kKeys = 10000;

// Keys of every segment kind, with flags, so that every field of a record carries data.
const ZvStdFCurve& TheCurve() {
  static const ZvStdFCurve* curve = [] {
    ZvStdFCurve* c = new ZvStdFCurve(0.0, ZvBaseFCurve::CubicSegment);
    for (int i = 0; i < kKeys; ++i)
      c->CreateKey(i * 0.1, std::sin(i * 0.37) * 3.0);
    for (unsigned int i = 0; i < kKeys; i += 3)
      c->SetSegmentKindAtIndex(i, ZvBaseFCurve::LinearSegment);
    for (unsigned int i = 0; i < kKeys; i += 7)
      c->SetConstraintAtIndex(i, ZvBaseFCurve::ValueLock, 1);
    return c;
  }();
  return *curve;
}

const std::vector<unsigned char>& TheBlock() {
  static const std::vector<unsigned char> block = [] {
    std::vector<unsigned char> b(TheCurve().GetBufferSize());
    TheCurve().WriteToBuffer(b.data());
    return b;
  }();
  return block;
}

void SetBytes(benchmark::State& state) {
  state.SetBytesProcessed(static_cast<int64_t>(state.iterations()) *
                          static_cast<int64_t>(TheBlock().size()));
}

void BM_Write(benchmark::State& state) {
  const ZvStdFCurve& curve = TheCurve();
  std::vector<unsigned char> block(TheBlock().size());
  for (auto _ : state) {
    benchmark::DoNotOptimize(curve.WriteToBuffer(block.data()));
    benchmark::ClobberMemory();
  }
  SetBytes(state);
}

void BM_Read(benchmark::State& state) {
  const std::vector<unsigned char>& block = TheBlock();
  ZvStdFCurve curve;
  for (auto _ : state)
    benchmark::DoNotOptimize(curve.ReadFromBufferBody(block.data() + 4));
  SetBytes(state);
}

void BM_ReadBounded(benchmark::State& state) {
  const std::vector<unsigned char>& block = TheBlock();
  ZvStdFCurve curve;
  for (auto _ : state)
    benchmark::DoNotOptimize(curve.ReadFromBuffer(block.data(), block.size()));
  SetBytes(state);
}

void BM_Memcpy(benchmark::State& state) {
  const std::vector<unsigned char>& block = TheBlock();
  std::vector<unsigned char> copy(block.size());
  for (auto _ : state) {
    std::memcpy(copy.data(), block.data(), block.size());
    benchmark::ClobberMemory();
  }
  SetBytes(state);
}

}  // namespace

BENCHMARK(BM_Write)->Repetitions(5)->ReportAggregatesOnly(true);
BENCHMARK(BM_Read)->Repetitions(5)->ReportAggregatesOnly(true);
BENCHMARK(BM_ReadBounded)->Repetitions(5)->ReportAggregatesOnly(true);
BENCHMARK(BM_Memcpy)->Repetitions(5)->ReportAggregatesOnly(true);

int main(int argc, char** argv) {
  TheBlock();  // built outside the timings
  return ZvRunBenchmarks(argc, argv, [&](const ZvMedianReporter& reporter) {
    const double megabytes = static_cast<double>(TheBlock().size()) / 1e6;
    const double copy = reporter.FunctionMedianSeconds("BM_Memcpy");
    std::printf("\nmedian MB/s, a block of %d keys (%zu bytes)\n", kKeys, TheBlock().size());
    std::printf("  memcpy          %10.1f\n", copy > 0.0 ? megabytes / copy : 0.0);
    for (const char* name : {"BM_Write", "BM_Read", "BM_ReadBounded"}) {
      const double seconds = reporter.FunctionMedianSeconds(name);
      if (seconds <= 0.0 || copy <= 0.0) continue;
      std::printf("  %-15s %10.1f   memcpy is %.1f times faster (target: at most 5)\n", name + 3,
                  megabytes / seconds, seconds / copy);
    }
  });
}
