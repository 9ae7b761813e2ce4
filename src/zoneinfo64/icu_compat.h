#ifndef KESTREL_ZONEINFO64_ICU_COMPAT_H_
#define KESTREL_ZONEINFO64_ICU_COMPAT_H_

#include <cstdint>
#include <map>
#include <string>
#include <string_view>
#include <vector>

// Zones and links that ICU's zoneinfo64 keeps beyond the tz release, in
// zic's input format, to be read after the release's own data.
std::string_view icu_compat_source();

// Names that ICU places in a country although zone.tab no longer lists
// them and the zone they link to is in another country.
const std::map<std::string, std::string, std::less<>>& icu_compat_regions();

// A transition that ICU's published data has at another instant than the
// tz data gives, by zone.
struct icu_moved_transition {
  std::string zone;
  int64_t tz_time;
  int64_t icu_time;
};
const std::vector<icu_moved_transition>& icu_moved_transitions();

#endif  // KESTREL_ZONEINFO64_ICU_COMPAT_H_
