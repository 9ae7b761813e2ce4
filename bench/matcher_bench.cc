// The hand-written matchers alone, without the files around them: the whole
// version grammar and the ICU data file's name.

#include <benchmark/benchmark.h>

#include <string_view>

#include "dataset/icu_data_file.h"
#include "dataset/version_grammar.h"

namespace {

void match_version_text(benchmark::State& state, const char* text) {
  const std::string_view view(text);
  for (auto _ : state) {
    benchmark::DoNotOptimize(match_version(view));
  }
}

void match_icu_data_file_name(benchmark::State& state, const char* name) {
  const std::string_view view(name);
  for (auto _ : state) {
    benchmark::DoNotOptimize(icu_data_file_schema(view));
  }
}

}  // namespace

BENCHMARK_CAPTURE(match_version_text, full, "2019c.1.0");
BENCHMARK_CAPTURE(match_version_text, not_a_version, "2019C.1.0");
BENCHMARK_CAPTURE(match_icu_data_file_name, data_file, "icutz44l.dat");
BENCHMARK_CAPTURE(match_icu_data_file_name, other_name, "icutz44l.dat.bak");
