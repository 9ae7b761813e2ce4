#include "zoneinfo64/final_rule.h"

#include <algorithm>
#include <climits>

namespace {

// ICU's SimpleTimeZone reads a day as: (N, 0) the N-th; (N, -W) weekday W
// on or after the N-th; (-N, -W) weekday W on or before the N-th. Weekdays
// count from Sunday = 1. The last weekday of a month is the one on or
// before its last day (of a common year: no final rule falls in February).
std::pair<int, int> icu_day(const tz_day_time& day) {
  const int weekday = -(day.weekday + 1);
  switch (day.rule) {
    case tz_day_time::kind::day:
      return {day.day, 0};
    case tz_day_time::kind::last:
      return {-month_length(1, day.month), weekday};
    case tz_day_time::kind::on_or_after:
      return {day.day, weekday};
    case tz_day_time::kind::on_or_before:
      return {-day.day, weekday};
  }
  return {day.day, 0};
}

// SimpleTimeZone's time modes: wall 0, standard 1, UTC 2.
int icu_time_mode(tz_clock clock) {
  switch (clock) {
    case tz_clock::wall:
      return 0;
    case tz_clock::standard:
      return 1;
    case tz_clock::universal:
      return 2;
  }
  return 0;
}

}  // namespace

int year_of(int64_t seconds) {
  int year = 1970 + static_cast<int>(seconds / 31556952);
  while (local_seconds(year, tz_day_time{}) > seconds) --year;
  while (local_seconds(year + 1, tz_day_time{}) <= seconds) ++year;
  return year;
}

std::optional<final_rule> find_final_rule(const tz_era& era,
                                          const std::vector<tz_rule>& rules,
                                          std::optional<int64_t> start_time) {
  std::vector<const tz_rule*> forever;
  int first_year = INT_MIN;
  for (const tz_rule& rule : rules) {
    if (rule.to_max) forever.push_back(&rule);
    first_year = std::max(first_year, rule.to_max ? rule.from : rule.to + 1);
  }
  if (forever.size() != 2) return std::nullopt;
  const tz_rule* on =
      forever[0]->save > forever[1]->save ? forever[0] : forever[1];
  const tz_rule* off = on == forever[0] ? forever[1] : forever[0];
  // A pair whose lower saving is negative (main form's winter time) keeps
  // that saving in the raw offset; one that never leaves daylight saving is
  // no rule ICU can give.
  if (on->save == off->save || off->save > 0) return std::nullopt;
  if (start_time) {
    first_year = std::max(first_year, year_of(*start_time));
    const int64_t first_change = std::min(local_seconds(first_year, on->at),
                                          local_seconds(first_year, off->at)) -
                                 era.stdoff;
    if (*start_time > first_change) ++first_year;
  }
  final_rule rule;
  rule.name = era.rules;
  rule.raw = era.stdoff + off->save;
  rule.year = first_year + 1;
  const auto [start_day, start_weekday] = icu_day(on->at);
  const auto [end_day, end_weekday] = icu_day(off->at);
  rule.fields = {on->at.month - 1,
                 start_day,
                 start_weekday,
                 on->at.seconds,
                 icu_time_mode(on->at.clock),
                 off->at.month - 1,
                 end_day,
                 end_weekday,
                 off->at.seconds,
                 icu_time_mode(off->at.clock),
                 on->save - off->save};
  return rule;
}
