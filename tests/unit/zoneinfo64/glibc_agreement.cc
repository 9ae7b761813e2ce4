// zoneinfo64_glibc_agreement ICU_DIR ZONEINFO_DIR
//
// Checks ICU time-zone resources against the zoneinfo compiled by zic from
// the same release: for every zone and link of the release (ZONEINFO_DIR's
// tzdata.zi), ICU reading ICU_DIR through ICU_TIMEZONE_FILES_DIR must know
// the ID and give the total UTC offset that glibc gives through TZDIR, at
// every transition from 1900 to 2100 of either, the second before it and
// half-way to the next, and say alike whether daylight time is in effect
// (both read the main form with its negative savings folded the same way).
// Prints the counts; exits 0 only when nothing disagrees.
#include <time.h>

#include <array>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <set>
#include <sstream>

#include "icu_view.h"

namespace {

constexpr int64_t kFrom = -2208988800;  // 1900-01-01 UT
constexpr int64_t kTo = 4102444800;     // 2100-01-01 UT

// The zone and link names of a zic input file, in main or compact form.
std::vector<std::string> release_names(const std::string& path) {
  std::ifstream in(path);
  std::vector<std::string> names;
  for (std::string line; std::getline(in, line);) {
    std::istringstream words(line);
    std::string kind, first, second;
    words >> kind >> first >> second;
    if (kind == "Z" || kind == "Zone") names.push_back(first);
    if (kind == "L" || kind == "Link") names.push_back(second);
  }
  return names;
}

uint32_t big_endian(const std::string& data, size_t at) {
  uint32_t value = 0;
  for (size_t i = 0; i < 4; ++i)
    value = value << 8 | static_cast<unsigned char>(data.at(at + i));
  return value;
}

// The 64-bit transition times of a TZif file (version 2 or later).
std::vector<int64_t> tzif_transitions(const std::string& path) {
  std::ifstream in(path, std::ios::binary);
  std::stringstream buffer;
  buffer << in.rdbuf();
  const std::string data = buffer.str();
  if (data.size() < 44 || data.compare(0, 4, "TZif") != 0) return {};
  auto counts = [&](size_t header) {
    std::array<uint32_t, 6> values{};
    for (size_t i = 0; i < values.size(); ++i)
      values.at(i) = big_endian(data, header + 20 + 4 * i);
    return values;
  };
  const auto v1 = counts(0);  // isut, isstd, leap, time, type, char
  const size_t v2 =
      44 + v1[3] * 5 + v1[4] * 6 + v1[5] + v1[2] * 8 + v1[1] + v1[0];
  const auto c2 = counts(v2);
  std::vector<int64_t> times;
  for (uint32_t i = 0; i < c2[3]; ++i) {
    const size_t at = v2 + 44 + i * 8;
    times.push_back(static_cast<int64_t>(uint64_t{big_endian(data, at)} << 32 |
                                         big_endian(data, at + 4)));
  }
  return times;
}

}  // namespace

int main(int argc, char** argv) {
  if (argc != 3) {
    std::fputs("usage: zoneinfo64_glibc_agreement ICU_DIR ZONEINFO_DIR\n",
               stderr);
    return 2;
  }
  const std::string zoneinfo = argv[2];
  const icu_view icu = view_icu_zones(argv[1]);
  std::map<std::string, std::vector<double>> instants;
  int unknown = 0;
  for (const std::string& name : release_names(zoneinfo + "/tzdata.zi")) {
    const auto zone = icu.zones.find(name);
    if (zone == icu.zones.end()) {
      ++unknown;
      std::printf("%s: unknown to ICU\n", name.c_str());
      continue;
    }
    std::set<int64_t> changes;
    for (const double at : zone->second.transitions)
      changes.insert(static_cast<int64_t>(at / 1000));
    for (const int64_t at : tzif_transitions(zoneinfo + "/" + name)) {
      if (at >= kFrom && at < kTo) changes.insert(at);
    }
    std::set<int64_t> times = {kFrom, kTo - 1};
    for (auto it = changes.begin(); it != changes.end(); ++it) {
      const auto next = std::next(it);
      times.insert(
          {*it - 1, *it,
           next == changes.end() ? *it + 86400 : *it + (*next - *it) / 2});
    }
    for (const int64_t at : times)
      instants[name].push_back(static_cast<double>(at) * 1000);
  }
  const auto offsets = icu_offsets_at(argv[1], instants);
  setenv("TZDIR", zoneinfo.c_str(), 1);
  size_t compared = 0;
  int offset_disagreements = 0, daylight_disagreements = 0;
  std::set<std::string> daylight_zones;
  for (const auto& [name, times] : instants) {
    setenv("TZ", name.c_str(), 1);
    tzset();
    const auto& answers = offsets.at(name);
    bool reported = false;
    for (size_t i = 0; i < times.size() && i < answers.size();
         ++i, ++compared) {
      const time_t at = static_cast<time_t>(times[i] / 1000);
      struct tm local {};
      localtime_r(&at, &local);
      if (local.tm_gmtoff * 1000 != answers[i].total) {
        ++offset_disagreements;
        if (!reported) {
          std::printf("%s at %lld: glibc %ld, ICU %d\n", name.c_str(),
                      static_cast<long long>(at), local.tm_gmtoff,
                      answers[i].total / 1000);
        }
        reported = true;
      }
      if ((local.tm_isdst > 0) != answers[i].in_daylight) {
        ++daylight_disagreements;
        daylight_zones.insert(name);
      }
    }
  }
  std::printf("ICU tz version %s; zones compared: %zu, instants: %zu\n",
              icu.version.c_str(), instants.size(), compared);
  std::printf("names unknown to ICU: %d; total offset disagreements: %d\n",
              unknown, offset_disagreements);
  std::printf("daylight-time disagreements: %d, in", daylight_disagreements);
  for (const std::string& name : daylight_zones)
    std::printf(" %s", name.c_str());
  std::printf("\n");
  return unknown == 0 && offset_disagreements == 0 &&
                 daylight_disagreements == 0
             ? 0
             : 1;
}
