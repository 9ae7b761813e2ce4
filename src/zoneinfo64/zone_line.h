#ifndef KESTREL_ZONEINFO64_ZONE_LINE_H_
#define KESTREL_ZONEINFO64_ZONE_LINE_H_

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "zoneinfo64/tz_source.h"

// A zone line of zic input being rewritten, where it starts and ends (UT,
// taken on its standard time), and the lines written in its place.
struct zone_line {
  const tz_era& era;
  std::vector<std::string_view> fields;
  size_t first;      // the index of STDOFF among the fields
  std::string lead;  // "Zone NAME" on a zone's first line
  int64_t start;
  int64_t end;

  // One line in its place, "Zone NAME" on the first written.
  std::string text(const std::string& stdoff, const std::string& rules,
                   const std::string& format, const std::string& until);
  std::string stdoff() const { return std::string(fields[first]); }
  std::string rules() const { return std::string(fields[first + 1]); }
  std::string format() const { return std::string(fields[first + 2]); }
  // Its UNTIL, a time on standard time moved by delta seconds.
  std::string until(int delta) const;
};

// Seconds as zic's [-]h[:mm[:ss]].
std::string zic_hms(int seconds);

// A time-of-day field, moved by delta seconds when it is read on standard
// time, which moves with the standard offset; wall clock and UT times stay.
std::string moved_time(std::string_view field, const tz_day_time& when,
                       int delta);

// "STD/DST" as "DST/STD"; any other format as it is.
std::string swapped_format(std::string_view format);

// The abbreviation a format gives with no saving and the rule letters.
std::string standard_format(const std::string& format,
                            const std::string& letters);

#endif  // KESTREL_ZONEINFO64_ZONE_LINE_H_
