#ifndef KESTREL_ZONEINFO64_FINAL_RULE_H_
#define KESTREL_ZONEINFO64_FINAL_RULE_H_

#include <cstdint>
#include <optional>
#include <vector>

#include "zoneinfo64/compiled_zone.h"
#include "zoneinfo64/tz_source.h"

// Where the last line of a zone follows, for ever, exactly two rules of its
// rule set, one with a saving and one without: those two as ICU's final
// rule. Its year is one after the first year F in which the two rules alone
// give all transitions: F is at least the first year of each, after the
// last year of every other rule of the set, and no earlier than the line's
// start, nor the year of its start when the line starts after the first
// transition of that year. start_time is the line's start in UT, absent for
// a zone's only line.
std::optional<final_rule> find_final_rule(const tz_era& era,
                                          const std::vector<tz_rule>& rules,
                                          std::optional<int64_t> start_time);

// The year in which the instant (seconds since 1970 UT) falls.
int year_of(int64_t seconds);

#endif  // KESTREL_ZONEINFO64_FINAL_RULE_H_
