#ifndef KESTREL_ZONEINFO64_ZONEINFO64_DATA_H_
#define KESTREL_ZONEINFO64_ZONEINFO64_DATA_H_

#include <array>
#include <map>
#include <string>
#include <string_view>
#include <vector>

#include "zoneinfo64/compiled_zone.h"

// What ICU's zoneinfo64 resource holds: every zone name in byte order, each
// either a zone of its own or an alias of another name's zone, its country
// ("001" for none), and the final rules the zones name.
struct zoneinfo64_data {
  std::string version;
  std::vector<std::string> names;
  std::vector<int>
      alias_of;  // index of the zone a name resolves to, -1 for a zone
  std::vector<compiled_zone> zones;  // by name; empty for an alias
  std::vector<std::string> regions;
  std::map<std::string, std::array<int, 11>> rules;
};

// Builds the resource's content from a release's zic input (rearguard or
// main form), its zone.tab and its version, with ICU's compatibility names
// added. Throws std::runtime_error for data it cannot convert.
zoneinfo64_data build_zoneinfo64(std::string_view zic_text,
                                 std::string_view zone_tab,
                                 const std::string& version);

#endif  // KESTREL_ZONEINFO64_ZONEINFO64_DATA_H_
