#include "icuprobe/probe_check.h"

#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <iostream>
#include <vector>

#include "data/zone_names.h"
#include "icuprobe/icu_zone.h"
#include "icuprobe/zone_comparison.h"

namespace {

std::vector<std::string> unresolved_ids() {
  std::vector<std::string> missing;
  std::string id;
  while (std::getline(std::cin, id)) {
    if (!id.empty() && !icu_zone(id).known()) {
      missing.push_back(id);
    }
  }
  return missing;
}

}  // namespace

bool run_probe_check(const std::string& release, const std::string& zoneinfo) {
  (void)setenv("TZDIR", zoneinfo.c_str(), 1);
  const std::string version = icu_zone::data_version();
  const std::vector<std::string> names =
      zone_and_link_names(zoneinfo + "/tzdata.zi");
  std::int64_t instants = 0;
  std::int64_t disagreements = 0;
  std::vector<std::string> disagreeing;
  for (const std::string& name : names) {
    const zone_comparison compared(name, zoneinfo);
    instants += compared.instants;
    disagreements += compared.disagreements;
    if (compared.disagreements != 0) {
      disagreeing.push_back(name);
      std::printf("disagreement: %s: %lld, first %s\n", name.c_str(),
                  static_cast<long long>(compared.disagreements),
                  compared.first.c_str());
    }
  }
  const std::vector<std::string> missing = unresolved_ids();
  for (const std::string& id : missing) {
    std::printf("unresolved: %s\n", id.c_str());
  }
  std::printf("ICU tz version: %s (release %s)\n", version.c_str(),
              release.c_str());
  std::printf("zones: %zu\ninstants: %lld\ndisagreements: %lld\n",
              names.size(), static_cast<long long>(instants),
              static_cast<long long>(disagreements));
  std::printf("disagreeing zones: %zu", disagreeing.size());
  for (const std::string& name : disagreeing) {
    std::printf(" %s", name.c_str());
  }
  std::printf("\nunresolved system IDs: %zu\n", missing.size());
  return version == release && disagreements == 0 && missing.empty();
}
