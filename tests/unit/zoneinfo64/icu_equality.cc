// zoneinfo64_icu_equality MINE.txt ICU.txt MINE_DIR ICU_DIR
//
// Compares the converter's zoneinfo64 with ICU's own for the same release:
// the two resource texts part by part, then ICU's answers through its API
// with each directory as ICU_TIMEZONE_FILES_DIR: the same IDs, regions and
// equivalent IDs, and for every ID the same total, raw and daylight offsets
// and inDaylightTime at every transition from 1900 to 2100 of either, just
// before it and half-way to the next. Prints the counts; exits 0 only when
// nothing differs.
#include <algorithm>
#include <cstdio>
#include <fstream>
#include <set>
#include <sstream>

#include "icu_view.h"
#include "resource_compare.h"

namespace {

std::string read_file(const char* path) {
  std::ifstream in(path);
  std::stringstream text;
  text << in.rdbuf();
  return text.str();
}

// The instants at which to ask: both views' transitions, the millisecond
// before each, half-way to the next, and the ends of the range.
std::vector<double> instants_for(const icu_zone_view& a,
                                 const icu_zone_view& b) {
  std::set<double> changes(a.transitions.begin(), a.transitions.end());
  changes.insert(b.transitions.begin(), b.transitions.end());
  std::set<double> times = {-2208988800000.0, 4102444799000.0};
  for (auto it = changes.begin(); it != changes.end(); ++it) {
    times.insert(*it - 1);
    times.insert(*it);
    const auto next = std::next(it);
    times.insert(next == changes.end() ? *it + 86400000.0
                                       : *it + (*next - *it) / 2);
  }
  return {times.begin(), times.end()};
}

}  // namespace

int main(int argc, char** argv) {
  if (argc != 5) {
    std::fputs(
        "usage: zoneinfo64_icu_equality MINE.txt ICU.txt MINE_DIR ICU_DIR\n",
        stderr);
    return 2;
  }
  std::map<std::string, int> counts =
      compare_zoneinfo64(parse_resource_text(read_file(argv[1])),
                         parse_resource_text(read_file(argv[2])), stdout);
  const icu_view mine = view_icu_zones(argv[3]);
  const icu_view theirs = view_icu_zones(argv[4]);
  counts["TZVersion"] = mine.version == theirs.version ? 0 : 1;
  for (const char* kind :
       {"IDs unknown to mine", "IDs unknown to ICU's", "regions",
        "equivalent IDs", "total offset", "raw offset", "daylight saving",
        "inDaylightTime", "unanswered IDs"}) {
    counts[kind] = 0;
  }
  std::map<std::string, std::vector<double>> instants;
  for (const auto& [id, zone] : theirs.zones) {
    const auto my_zone = mine.zones.find(id);
    if (my_zone == mine.zones.end()) {
      ++counts["IDs unknown to mine"];
      std::printf("%s: unknown with mine\n", id.c_str());
      continue;
    }
    if (my_zone->second.region != zone.region) ++counts["regions"];
    if (my_zone->second.equivalents != zone.equivalents) {
      ++counts["equivalent IDs"];
      std::printf("%s: equivalents %s vs %s\n", id.c_str(),
                  my_zone->second.equivalents.c_str(),
                  zone.equivalents.c_str());
    }
    instants[id] = instants_for(my_zone->second, zone);
  }
  for (const auto& entry : mine.zones) {
    if (!theirs.zones.contains(entry.first)) ++counts["IDs unknown to ICU's"];
  }
  const auto my_offsets = icu_offsets_at(argv[3], instants);
  const auto their_offsets = icu_offsets_at(argv[4], instants);
  size_t compared = 0;
  for (const auto& [id, times] : instants) {
    const auto& a = my_offsets.at(id);
    const auto& b = their_offsets.at(id);
    bool reported = false;
    for (size_t i = 0; i < times.size() && i < a.size() && i < b.size();
         ++i, ++compared) {
      counts["total offset"] += a[i].total != b[i].total ? 1 : 0;
      counts["raw offset"] += a[i].raw != b[i].raw ? 1 : 0;
      counts["daylight saving"] += a[i].dst != b[i].dst ? 1 : 0;
      counts["inDaylightTime"] += a[i].in_daylight != b[i].in_daylight ? 1 : 0;
      if (!(a[i] == b[i]) && !reported) {
        reported = true;
        std::printf("%s at %.0f ms: mine %d+%d, ICU's %d+%d\n", id.c_str(),
                    times[i], a[i].raw, a[i].dst, b[i].raw, b[i].dst);
      }
    }
    if (a.size() != times.size() || b.size() != times.size())
      ++counts["unanswered IDs"];
  }
  std::printf("ICU tz version: mine %s, ICU's %s\n", mine.version.c_str(),
              theirs.version.c_str());
  std::printf("zones compared: %zu, instants: %zu\n", instants.size(),
              compared);
  int total = 0;
  for (const auto& [kind, count] : counts) {
    std::printf("differences in %s: %d\n", kind.c_str(), count);
    total += count;
  }
  std::printf("differences: %d\n", total);
  return total == 0 ? 0 : 1;
}
