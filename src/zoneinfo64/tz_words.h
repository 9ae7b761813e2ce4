#ifndef KESTREL_ZONEINFO64_TZ_WORDS_H_
#define KESTREL_ZONEINFO64_TZ_WORDS_H_

#include <optional>
#include <span>
#include <string_view>

#include "zoneinfo64/tz_date.h"

// The words of zic's input as zic reads them: case-insensitive, and any
// unambiguous prefix of a word stands for it ("Ja" for January, "o" for
// only, "Z" for Zone), an exact match winning over prefixes. Each returns
// nothing for a word it cannot read.

// The index of word in table.
std::optional<int> match_word(std::string_view word,
                              std::span<const std::string_view> table);

// A month name, 1-12.
std::optional<int> match_month(std::string_view word);

// An offset or time of day [-]h[:mm[:ss]] in seconds; "-" is zero.
// Fractions of a second are rounded to the nearest even second as zic does.
std::optional<int> parse_hms(std::string_view text);

// A time of day with zic's optional suffix: w (wall), s (standard),
// u, g or z (UT).
std::optional<tz_day_time> parse_at(std::string_view text, tz_day_time day);

// A day of the month: "5", "lastSun", "Sun>=8" or "Sun<=25".
std::optional<tz_day_time> parse_on(std::string_view text, int month);

// A year as a number within the range the converter computes.
std::optional<int> parse_year(std::string_view text);

#endif  // KESTREL_ZONEINFO64_TZ_WORDS_H_
