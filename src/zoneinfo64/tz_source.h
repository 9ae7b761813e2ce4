#ifndef KESTREL_ZONEINFO64_TZ_SOURCE_H_
#define KESTREL_ZONEINFO64_TZ_SOURCE_H_

#include <map>
#include <string>
#include <string_view>
#include <vector>

#include "zoneinfo64/tz_date.h"

// One Rule line of zic's input: from year FROM to year TO (inclusive), on the
// day DAY of MONTH at time AT, daylight saving becomes SAVE.
struct tz_rule {
  int from = 0, to = 0;
  bool to_max = false;  // TO is "max": the rule goes on for ever
  tz_day_time at;
  int save = 0;
  size_t line = 0;  // its line in the text, counting from 1
};

// One line of a Zone: standard offset STDOFF, either a fixed saving or the
// name of a rule set, in force until UNTIL (absent on the last line).
struct tz_era {
  int stdoff = 0;
  std::string rules;  // empty for a fixed saving
  int save = 0;
  bool has_until = false;
  int until_year = 0;
  tz_day_time until;
  size_t line = 0;  // its line in the text, counting from 1
};

// The Zone, Rule and Link lines of a tz release, in zic's input format
// (main, rearguard or vanguard form, keywords abbreviated as zic allows).
struct tz_source {
  std::map<std::string, std::vector<tz_rule>> rules;
  std::map<std::string, std::vector<tz_era>> zones;
  std::map<std::string, std::string> links;  // link name -> target
  // The target a link had before the data stopped linking to links, from
  // its "#= TARGET" comment (backward: Asmera was Asmara's link).
  std::map<std::string, std::string> former_links;
};

// The fields of a line of zic input: words separated by white space, "#"
// to the end of the line a comment, and double quotes keeping white space
// inside a field.
std::vector<std::string_view> split_fields(std::string_view line);

// Reads zic input text; a line it cannot read throws std::runtime_error
// naming the line.
tz_source parse_tz_source(std::string_view text);

#endif  // KESTREL_ZONEINFO64_TZ_SOURCE_H_
