#ifndef KESTREL_TESTS_UNIT_ZONEINFO64_ICU_VIEW_H_
#define KESTREL_TESTS_UNIT_ZONEINFO64_ICU_VIEW_H_

#include <map>
#include <string>
#include <vector>

// What ICU's own API says about its time zones when it reads the
// resources of one directory through ICU_TIMEZONE_FILES_DIR. Each view is
// taken in a child process, as ICU reads the variable once.
struct icu_zone_view {
  std::string region;
  std::string equivalents;          // the IDs ICU gives as equivalent, in order
  std::vector<double> transitions;  // ms since 1970, 1900-2100
};

struct icu_view {
  std::string version;
  std::map<std::string, icu_zone_view> zones;  // by ID
};

// One instant's answers: total, raw and daylight offsets in ms, and
// inDaylightTime.
struct icu_offsets {
  int total = 0, raw = 0, dst = 0;
  bool in_daylight = false;
  bool operator==(const icu_offsets&) const = default;
};

icu_view view_icu_zones(const std::string& dir);

// The offsets ICU gives for each zone ID at each of the instants (ms).
std::map<std::string, std::vector<icu_offsets>> icu_offsets_at(
    const std::string& dir,
    const std::map<std::string, std::vector<double>>& instants);

#endif  // KESTREL_TESTS_UNIT_ZONEINFO64_ICU_VIEW_H_
