#include "data/posix_tz_rule.h"

#include <stdexcept>
#include <string>
#include <vector>

#include "gtest/gtest.h"

namespace {

struct rule_case {
  const char* text;
  std::int64_t year;
  std::vector<std::int64_t> changes;
};

const rule_case kRules[] = {
    // Second Sunday of March at 02:00 EST, first of November at 02:00 EDT.
    {"EST5EDT,M3.2.0,M11.1.0", 2026, {1772953200, 1793512800}},
    // Last Sundays, the end at 03:00 CEST.
    {"CET-1CEST,M3.5.0,M10.5.0/3", 2026, {1774746000, 1792890000}},
    // No daylight time at all.
    {"<+0330>-3:30", 2026, {}},
    // Julian day 60 is 1 March even in a leap year; zero-based day 59 is
    // then 29 February. Daylight time defaults to one hour ahead.
    {"AAA0BBB,J60,59", 2024, {1709258400, 1709168400}},
    // A rule time beyond 24 hours: the fourth Thursday at 26:00.
    {"IST-2IDT,M3.4.4/26,M10.5.0", 2026, {1774569600, 1792882800}},
    // Negative daylight saving, as Europe/Dublin's main form has it.
    {"IST-1GMT0,M10.5.0,M3.5.0/1", 2026, {1792890000, 1774746000}},
};

TEST(posix_tz_rule_test, works_out_the_changes_of_a_year) {
  for (const rule_case& c : kRules) {
    EXPECT_EQ(posix_tz_rule(c.text).changes_in(c.year), c.changes) << c.text;
  }
}

TEST(posix_tz_rule_test, refuses_what_is_not_a_rule) {
  for (const char* text : {"", "E", "EST", "EST5EDT", "EST5EDT,M3.2.0",
                           "EST5EDT,M3.2,M11.1.0", "<+03-3", "EST5EDT,M3.2.0,M11.1.0x"}) {
    EXPECT_THROW(posix_tz_rule{text}, std::runtime_error) << text;
  }
}

TEST(posix_tz_rule_test, days_from_civil_counts_from_the_epoch) {
  const struct {
    std::int64_t year;
    int month, day;
    std::int64_t days;
  } kDates[] = {{1970, 1, 1, 0}, {2000, 3, 1, 11017}, {1900, 1, 1, -25567},
                {2100, 1, 1, 47482}, {1969, 12, 31, -1}};
  for (const auto& d : kDates) {
    EXPECT_EQ(days_from_civil(d.year, d.month, d.day), d.days) << d.year;
  }
}

}  // namespace
