#ifndef KESTREL_DATA_POSIX_TZ_RULE_H_
#define KESTREL_DATA_POSIX_TZ_RULE_H_

#include <cstdint>
#include <string_view>
#include <vector>

#include "zoneinfo64/tz_date.h"  // days_from_civil

// The rule of a TZif footer, a POSIX TZ string with the extensions of RFC
// 9636 (hours from -167 to 167 in rule times), such as
// "CET-1CEST,M3.5.0,M10.5.0/3" or "<+0330>-3:30". Only the instants of its
// changes are worked out here: what holds between them is read from glibc
// and ICU themselves.
class posix_tz_rule {
 public:
  // Raises std::runtime_error for a text that is not such a rule.
  explicit posix_tz_rule(std::string_view text);

  // The instants, in seconds since the epoch, at which the rule switches
  // into or out of daylight time during the given year; none for a rule
  // without daylight time.
  std::vector<std::int64_t> changes_in(std::int64_t year) const;

 private:
  // One end of the daylight period: a day of the year and a local time.
  struct boundary {
    char kind = 'M';  // 'J': Julian day 1-365; 'N': day 0-365; 'M': m.w.d
    int day = 0;
    int month = 0;
    int week = 0;
    std::int64_t time = std::int64_t{2} * 3600;
  };

  std::int64_t day_of(const boundary& at, std::int64_t year) const;
  static boundary parse_boundary(std::string_view& text);

  bool has_dst = false;
  std::int64_t std_west = 0;
  std::int64_t dst_west = 0;
  boundary start;
  boundary end;
};

#endif  // KESTREL_DATA_POSIX_TZ_RULE_H_
