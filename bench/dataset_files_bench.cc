// Reading a staged data set's two small inputs, as every start does for the
// designated data set and the latest update: the first word of the zoneinfo
// "+VERSION" file, and the walk of the ICU directory that matches the data
// file's name. They run on a scratch data set, not on the fixed paths.

#include <benchmark/benchmark.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <string>

#include "dataset/kal_icu.h"
#include "dataset/kal_zoneinfo.h"

namespace {

// A staged data set in a fresh temporary directory, removed at exit. The ICU
// directory holds a few names that come close to a data file's but do not
// qualify, so that the name match sees more than the winning name.
class scratch_dataset {
 public:
  scratch_dataset() {
    std::string pattern =
        (std::filesystem::temp_directory_path() / "kestrel-bench.XXXXXX")
            .string();
    root = mkdtemp(pattern.data());
    path = root + "/2025b.1.1";
    std::filesystem::create_directories(path + "/zoneinfo");
    std::filesystem::create_directories(path + "/icutz");
    std::ofstream(path + "/zoneinfo/+VERSION") << "2025b\n";
    for (const char* name : {"icutz44L.dat", "icutz44.dat", "icutz44l.dat.bak",
                             "old-icutz44l.dat", "icutz44l.dat"}) {
      std::ofstream(path + "/icutz/" + name) << "data";
    }
  }
  ~scratch_dataset() { std::filesystem::remove_all(root); }

  std::string root;
  std::string path;
};

const std::string& dataset_path() {
  static const scratch_dataset dataset;
  return dataset.path;
}

void icu_data_file_schema(benchmark::State& state) {
  const std::string& path = dataset_path();
  for (auto _ : state) {
    kal_icu icu(path);
    benchmark::DoNotOptimize(&icu);
  }
}

void zoneinfo_first_word(benchmark::State& state) {
  const std::string& path = dataset_path();
  for (auto _ : state) {
    kal_zoneinfo zoneinfo(path);
    benchmark::DoNotOptimize(zoneinfo.version());
  }
}

}  // namespace

BENCHMARK(icu_data_file_schema);
BENCHMARK(zoneinfo_first_word);
