#include "zoneinfo64/tz_words.h"

#include <algorithm>
#include <array>
#include <cctype>
#include <charconv>
#include <string>

namespace {

constexpr std::array<std::string_view, 12> kMonths = {
    "January", "February", "March",     "April",   "May",      "June",
    "July",    "August",   "September", "October", "November", "December"};
constexpr std::array<std::string_view, 7> kWeekdays = {
    "Sunday",   "Monday", "Tuesday", "Wednesday",
    "Thursday", "Friday", "Saturday"};

// Years outside this range are refused: the tz data uses none, and a bound
// keeps the year-by-year expansion of rules short on any input.
constexpr int kFirstYear = 1000;
constexpr int kLastYear = 3000;

bool same_letters(std::string_view a, std::string_view b) {
  if (a.size() != b.size()) return false;
  for (size_t i = 0; i < a.size(); ++i) {
    if (std::tolower(static_cast<unsigned char>(a[i])) !=
        std::tolower(static_cast<unsigned char>(b[i]))) {
      return false;
    }
  }
  return true;
}

std::optional<int> parse_number(std::string_view text) {
  int value = 0;
  const auto [end, error] =
      std::from_chars(text.data(), text.data() + text.size(), value);
  if (error != std::errc() || end != text.data() + text.size())
    return std::nullopt;
  return value;
}

// How a fraction of a second (its digits) rounds: +1 above one half, 0
// below, and at exactly one half -1, leaving the choice to the caller (ties
// go to the even second, as zic does).
int fraction_rounding(std::string_view digits) {
  if (digits[0] != '5') return digits[0] > '5' ? 1 : 0;
  return digits.find_first_not_of('0', 1) == std::string_view::npos ? -1 : 1;
}

}  // namespace

std::optional<int> match_word(std::string_view word,
                              std::span<const std::string_view> table) {
  if (word.empty()) return std::nullopt;
  for (size_t i = 0; i < table.size(); ++i) {
    if (same_letters(word, table[i])) return static_cast<int>(i);
  }
  std::optional<int> found;
  for (size_t i = 0; i < table.size(); ++i) {
    if (word.size() < table[i].size() &&
        same_letters(word, table[i].substr(0, word.size()))) {
      if (found) return std::nullopt;
      found = static_cast<int>(i);
    }
  }
  return found;
}

std::optional<int> match_month(std::string_view word) {
  const auto index = match_word(word, kMonths);
  if (!index) return std::nullopt;
  return *index + 1;
}

std::optional<int> parse_hms(std::string_view text) {
  if (text == "-") return 0;
  const bool negative = !text.empty() && text.front() == '-';
  if (negative) text.remove_prefix(1);
  std::string_view fraction;
  if (const size_t dot = text.find('.'); dot != std::string_view::npos) {
    fraction = text.substr(dot + 1);
    text = text.substr(0, dot);
    if (fraction.empty() ||
        fraction.find_first_not_of("0123456789") != std::string_view::npos ||
        std::count(text.begin(), text.end(), ':') != 2) {
      return std::nullopt;
    }
  }
  std::array<int, 3> parts = {0, 0, 0};
  for (size_t count = 0;; ++count) {
    if (count == parts.size()) return std::nullopt;
    const size_t colon = text.find(':');
    const std::string_view piece = text.substr(0, colon);
    if (piece.empty() || piece.size() > 6 ||
        piece.find_first_not_of("0123456789") != std::string_view::npos) {
      return std::nullopt;
    }
    parts.at(count) = *parse_number(piece);
    if (colon == std::string_view::npos) break;
    text.remove_prefix(colon + 1);
  }
  if (parts[0] > 1000 || parts[1] > 59 || parts[2] > 59) return std::nullopt;
  int seconds = parts[0] * 3600 + parts[1] * 60 + parts[2];
  if (!fraction.empty()) {
    const int rounding = fraction_rounding(fraction);
    seconds += rounding == -1 ? seconds % 2 : rounding;
  }
  return negative ? -seconds : seconds;
}

std::optional<tz_day_time> parse_at(std::string_view text, tz_day_time day) {
  if (text.empty()) return std::nullopt;
  day.clock = tz_clock::wall;
  switch (std::tolower(static_cast<unsigned char>(text.back()))) {
    case 'w':
      text.remove_suffix(1);
      break;
    case 's':
      day.clock = tz_clock::standard;
      text.remove_suffix(1);
      break;
    case 'u':
    case 'g':
    case 'z':
      day.clock = tz_clock::universal;
      text.remove_suffix(1);
      break;
    default:
      break;
  }
  const auto seconds = parse_hms(text);
  if (!seconds) return std::nullopt;
  day.seconds = *seconds;
  return day;
}

std::optional<tz_day_time> parse_on(std::string_view text, int month) {
  tz_day_time day;
  day.month = month;
  if (const auto number = parse_number(text)) {
    if (*number < 1 || *number > 31) return std::nullopt;
    day.day = *number;
    return day;
  }
  if (text.size() > 4 && same_letters(text.substr(0, 4), "last")) {
    const auto weekday = match_word(text.substr(4), kWeekdays);
    if (!weekday) return std::nullopt;
    day.rule = tz_day_time::kind::last;
    day.weekday = *weekday;
    return day;
  }
  const size_t op = text.find_first_of("<>");
  if (op == std::string_view::npos || op + 2 >= text.size() ||
      text[op + 1] != '=') {
    return std::nullopt;
  }
  const auto weekday = match_word(text.substr(0, op), kWeekdays);
  const auto number = parse_number(text.substr(op + 2));
  if (!weekday || !number || *number < 1 || *number > 31) return std::nullopt;
  day.rule = text[op] == '>' ? tz_day_time::kind::on_or_after
                             : tz_day_time::kind::on_or_before;
  day.weekday = *weekday;
  day.day = *number;
  return day;
}

std::optional<int> parse_year(std::string_view text) {
  const auto year = parse_number(text);
  if (!year || *year < kFirstYear || *year > kLastYear) return std::nullopt;
  return year;
}
