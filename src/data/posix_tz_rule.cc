#include "data/posix_tz_rule.h"

#include <cctype>
#include <stdexcept>
#include <string>

namespace {

constexpr std::int64_t kDay = 86400;

[[noreturn]] void bad(std::string_view text) {
  throw std::runtime_error("bad TZ rule text near \"" + std::string(text) +
                           "\"");
}

bool is_leap(std::int64_t year) {
  return (year % 4 == 0 && year % 100 != 0) || year % 400 == 0;
}

// A zone abbreviation: letters, or anything but '>' between '<' and '>'.
void skip_name(std::string_view& text) {
  std::size_t n = 0;
  if (!text.empty() && text[0] == '<') {
    n = text.find('>');
    if (n == std::string_view::npos) {
      bad(text);
    }
    ++n;
  } else {
    while (n < text.size() &&
           std::isalpha(static_cast<unsigned char>(text[n]))) {
      ++n;
    }
  }
  if (n < 3) {
    bad(text);
  }
  text.remove_prefix(n);
}

std::int64_t number(std::string_view& text) {
  std::size_t n = 0;
  std::int64_t value = 0;
  while (n < text.size() && std::isdigit(static_cast<unsigned char>(text[n]))) {
    value = value * 10 + (text[n] - '0');
    ++n;
  }
  if (n == 0 || n > 3) {
    bad(text);
  }
  text.remove_prefix(n);
  return value;
}

// [+-]hh[:mm[:ss]] in seconds.
std::int64_t clock_time(std::string_view& text) {
  std::int64_t sign = 1;
  if (!text.empty() && (text[0] == '+' || text[0] == '-')) {
    sign = text[0] == '-' ? -1 : 1;
    text.remove_prefix(1);
  }
  std::int64_t seconds = number(text) * 3600;
  for (std::int64_t unit : {60, 1}) {
    if (text.empty() || text[0] != ':') {
      break;
    }
    text.remove_prefix(1);
    seconds += number(text) * unit;
  }
  return sign * seconds;
}

}  // namespace

posix_tz_rule::posix_tz_rule(std::string_view text) {
  skip_name(text);
  std_west = clock_time(text);
  if (text.empty()) {
    return;
  }
  has_dst = true;
  skip_name(text);
  dst_west = std_west - 3600;
  if (!text.empty() && text[0] != ',') {
    dst_west = clock_time(text);
  }
  if (text.empty() || text[0] != ',') {
    bad(text);  // zic always writes the rule out
  }
  text.remove_prefix(1);
  start = parse_boundary(text);
  if (text.empty() || text[0] != ',') {
    bad(text);
  }
  text.remove_prefix(1);
  end = parse_boundary(text);
  if (!text.empty()) {
    bad(text);
  }
}

posix_tz_rule::boundary posix_tz_rule::parse_boundary(std::string_view& text) {
  boundary at;
  if (!text.empty() && text[0] == 'M') {
    text.remove_prefix(1);
    at.month = static_cast<int>(number(text));
    for (int* field : {&at.week, &at.day}) {
      if (text.empty() || text[0] != '.') {
        bad(text);
      }
      text.remove_prefix(1);
      *field = static_cast<int>(number(text));
    }
  } else {
    at.kind = 'N';
    if (!text.empty() && text[0] == 'J') {
      at.kind = 'J';
      text.remove_prefix(1);
    }
    at.day = static_cast<int>(number(text));
  }
  if (!text.empty() && text[0] == '/') {
    text.remove_prefix(1);
    at.time = clock_time(text);
  }
  return at;
}

std::int64_t posix_tz_rule::day_of(const boundary& at,
                                   std::int64_t year) const {
  const std::int64_t jan1 = days_from_civil(year, 1, 1);
  if (at.kind == 'N') {
    return jan1 + at.day;
  }
  if (at.kind == 'J') {
    return jan1 + at.day - 1 + (is_leap(year) && at.day >= 60 ? 1 : 0);
  }
  // Day 0 of the epoch was a Thursday (weekday 4).
  const std::int64_t first = days_from_civil(year, at.month, 1);
  const std::int64_t first_weekday = ((first % 7) + 7 + 4) % 7;
  std::int64_t day = first + (at.day - first_weekday + 7) % 7 +
                     7 * static_cast<std::int64_t>(at.week - 1);
  const int next_month = at.month % 12 + 1;
  const std::int64_t month_end =
      days_from_civil(year + (at.month == 12 ? 1 : 0), next_month, 1);
  while (day >= month_end) {
    day -= 7;
  }
  return day;
}

std::vector<std::int64_t> posix_tz_rule::changes_in(std::int64_t year) const {
  if (!has_dst) {
    return {};
  }
  // The switch into daylight time happens on standard time's clock, the
  // switch out of it on daylight time's.
  return {day_of(start, year) * kDay + start.time + std_west,
          day_of(end, year) * kDay + end.time + dst_west};
}
