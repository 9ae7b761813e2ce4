#ifndef KESTREL_ZONEINFO64_ICU_COMPAT_H_
#define KESTREL_ZONEINFO64_ICU_COMPAT_H_

#include <map>
#include <string>
#include <string_view>

// Zones and links that ICU's zoneinfo64 keeps beyond the tz release, in
// zic's input format, to be read after the release's own data.
std::string_view icu_compat_source();

// Names that ICU places in a country although zone.tab no longer lists
// them and the zone they link to is in another country.
const std::map<std::string, std::string, std::less<>>& icu_compat_regions();

#endif  // KESTREL_ZONEINFO64_ICU_COMPAT_H_
