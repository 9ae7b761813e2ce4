#ifndef KESTREL_ZONEINFO64_COMPILED_ZONE_H_
#define KESTREL_ZONEINFO64_COMPILED_ZONE_H_

#include <array>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

// An offset from UT split as ICU keeps it: raw (standard) offset and
// daylight saving, in seconds.
struct zone_offset {
  int raw = 0;
  int dst = 0;
  bool operator==(const zone_offset&) const = default;
  bool operator<(const zone_offset& other) const {
    return raw != other.raw ? raw < other.raw : dst < other.dst;
  }
};

struct zone_transition {
  int64_t at = 0;  // seconds since 1970-01-01 00:00 UT
  zone_offset offset;
};

// The rule a zone follows for ever after its explicit transitions, in ICU's
// eleven integers (SimpleTimeZone's start month, day, day of week, time,
// time mode, the same for the end, and the saving).
struct final_rule {
  std::string name;
  int raw = 0;
  int year = 0;  // the first year the rule alone gives
  std::array<int, 11> fields{};
};

// A zone's history: its offset before any transition, its transitions, and
// the rule that continues them where there is one.
struct compiled_zone {
  zone_offset initial;
  std::vector<zone_transition> transitions;
  std::optional<final_rule> final;
};

#endif  // KESTREL_ZONEINFO64_COMPILED_ZONE_H_
