// Console reporter that also keeps each benchmark's CPU time, so that a benchmark binary can
// print its own summary (medians and ratios to its peers) after the run, and the main that
// every such binary shares.
#ifndef ZV_BENCH_MEDIAN_REPORTER_H
#define ZV_BENCH_MEDIAN_REPORTER_H

#include <benchmark/benchmark.h>

#include <algorithm>
#include <map>
#include <string>
#include <vector>

class ZvMedianReporter : public benchmark::ConsoleReporter {
 public:
  void ReportRuns(const std::vector<Run>& reported) override {
    for (const Run& r : reported) {
      if (r.error_occurred) continue;
      const std::string name = r.run_name.str();
      const double seconds = r.GetAdjustedCPUTime() / benchmark::GetTimeUnitMultiplier(r.time_unit);
      const bool typical = r.run_type == Run::RT_Iteration || r.aggregate_name == "median";
      if (typical) {
        for (const auto& counter : r.counters)
          counters_[name][counter.first] = counter.second;
      }
      if (r.run_type == Run::RT_Iteration) runs_[name].push_back(seconds);
      if (r.run_type == Run::RT_Aggregate && r.aggregate_name == "median") {
        medians_[name] = seconds;
        functionMedians_[r.run_name.function_name] = seconds;
      }
    }
    ConsoleReporter::ReportRuns(reported);
  }

  // Median CPU seconds per iteration: the reported median when aggregates were reported, else
  // the median of the repetitions; 0 when the benchmark did not run.
  double MedianSeconds(const std::string& name) const {
    const auto m = medians_.find(name);
    if (m != medians_.end()) return m->second;
    const auto it = runs_.find(name);
    if (it == runs_.end() || it->second.empty()) return 0.0;
    std::vector<double> v = it->second;
    std::sort(v.begin(), v.end());
    const size_t n = v.size();
    return n % 2 ? v[n / 2] : 0.5 * (v[n / 2 - 1] + v[n / 2]);
  }

  // Median CPU seconds of a benchmark registered with its own repetitions, by function name.
  double FunctionMedianSeconds(const std::string& function) const {
    const auto m = functionMedians_.find(function);
    return m == functionMedians_.end() ? 0.0 : m->second;
  }

  // A counter of the benchmark's typical run, 0 when it has none.
  double Counter(const std::string& name, const std::string& counter) const {
    const auto it = counters_.find(name);
    if (it == counters_.end()) return 0.0;
    const auto c = it->second.find(counter);
    return c == it->second.end() ? 0.0 : static_cast<double>(c->second);
  }

 private:
  std::map<std::string, std::vector<double>> runs_;
  std::map<std::string, double> medians_;
  std::map<std::string, double> functionMedians_;
  std::map<std::string, std::map<std::string, benchmark::Counter>> counters_;
};

// Runs the benchmarks registered so far, as the command line selects them, through a
// ZvMedianReporter, then hands the reporter to `summary` to print the medians and ratios.
// Answers main's exit status: 1 for an argument the benchmark library does not know.
template <class Summary>
int ZvRunBenchmarks(int argc, char** argv, Summary&& summary) {
  benchmark::Initialize(&argc, argv);
  if (benchmark::ReportUnrecognizedArguments(argc, argv)) return 1;
  ZvMedianReporter reporter;
  benchmark::RunSpecifiedBenchmarks(&reporter);
  benchmark::Shutdown();
  summary(static_cast<const ZvMedianReporter&>(reporter));
  return 0;
}

#endif
