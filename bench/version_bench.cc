// Parsing the version strings that every start parses: the system's, the
// designated data set's and the latest update's.

#include <benchmark/benchmark.h>

#include <string>

#include "dataset/kal_version.h"

namespace {

void version_parse(benchmark::State& state, const char* text) {
  const std::string version_string(text);
  for (auto _ : state) {
    kal_version version(version_string);
    benchmark::DoNotOptimize(version);
  }
}

void version_compare(benchmark::State& state) {
  const kal_version older("2019c.1.0");
  const kal_version newer("2019c.1.1");
  for (auto _ : state) {
    benchmark::DoNotOptimize(newer > older);
  }
}

}  // namespace

BENCHMARK_CAPTURE(version_parse, full, "2019c.1.0");
BENCHMARK_CAPTURE(version_parse, release_only, "2025b");
BENCHMARK(version_compare);
