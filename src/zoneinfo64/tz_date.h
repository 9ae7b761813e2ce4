#ifndef KESTREL_ZONEINFO64_TZ_DATE_H_
#define KESTREL_ZONEINFO64_TZ_DATE_H_

#include <cstdint>

// How a time of day is read: local wall clock, local standard time, or UT.
enum class tz_clock { wall, standard, universal };

// A day of a month as zic's input writes it: a day number ("5"), the last
// given weekday ("lastSun"), or the first weekday on or after a day
// ("Sun>=8") or the last on or before one ("Sun<=25"), and a time of day.
struct tz_day_time {
  enum class kind { day, last, on_or_after, on_or_before };
  int month = 1;  // 1-12
  kind rule = kind::day;
  int day = 1;
  int weekday = 0;  // 0 = Sunday
  int seconds = 0;  // may be negative or pass 24:00
  tz_clock clock = tz_clock::wall;
};

// Days from 1970-01-01 to the given proleptic Gregorian date.
int64_t days_from_civil(int64_t year, int month, int day);

// Days in the month (1-12) of year.
int month_length(int64_t year, int month);

// Seconds from 1970-01-01 00:00 to the day and time in the year, counting
// the time as if it were UT (the caller subtracts the offsets its clock
// needs).
int64_t local_seconds(int64_t year, const tz_day_time& when);

#endif  // KESTREL_ZONEINFO64_TZ_DATE_H_
