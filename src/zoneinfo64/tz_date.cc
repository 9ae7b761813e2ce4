#include "zoneinfo64/tz_date.h"

namespace {

constexpr int64_t kSecondsPerDay = 86400;

// 0 = Sunday for the day that many days after 1970-01-01, a Thursday.
int weekday_of(int64_t days) {
  constexpr int kThursday = 4;
  constexpr int kWeek = 7;
  return static_cast<int>(((days + kThursday) % kWeek + kWeek) % kWeek);
}

}  // namespace

int64_t days_from_civil(int64_t year, int month, int day) {
  // Counts in eras of 400 years starting on March 1st, so that the leap day
  // is the last day of the counted year.
  year -= month <= 2 ? 1 : 0;
  const int64_t era = (year >= 0 ? year : year - 399) / 400;
  const int64_t year_of_era = year - era * 400;
  const int64_t day_of_year =
      (153 * (month + (month > 2 ? -3 : 9)) + 2) / 5 + day - 1;
  const int64_t day_of_era =
      year_of_era * 365 + year_of_era / 4 - year_of_era / 100 + day_of_year;
  return era * 146097 + day_of_era - 719468;
}

int month_length(int64_t year, int month) {
  static constexpr int kLengths[] = {31, 28, 31, 30, 31, 30,
                                     31, 31, 30, 31, 30, 31};
  const bool leap = (year % 4 == 0 && year % 100 != 0) || year % 400 == 0;
  return kLengths[month - 1] + (month == 2 && leap ? 1 : 0);
}

int64_t local_seconds(int64_t year, const tz_day_time& when) {
  int64_t days = 0;
  switch (when.rule) {
    case tz_day_time::kind::day:
      days = days_from_civil(year, when.month, when.day);
      break;
    case tz_day_time::kind::last: {
      days = days_from_civil(year, when.month, month_length(year, when.month));
      days -= (weekday_of(days) - when.weekday + 7) % 7;
      break;
    }
    case tz_day_time::kind::on_or_after:
      days = days_from_civil(year, when.month, when.day);
      days += (when.weekday - weekday_of(days) + 7) % 7;
      break;
    case tz_day_time::kind::on_or_before:
      days = days_from_civil(year, when.month, when.day);
      days -= (weekday_of(days) - when.weekday + 7) % 7;
      break;
  }
  return days * kSecondsPerDay + when.seconds;
}
