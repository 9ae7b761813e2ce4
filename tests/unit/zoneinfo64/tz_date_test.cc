#include "zoneinfo64/tz_date.h"

#include <gtest/gtest.h>

#include <string_view>

#include "zoneinfo64/tz_words.h"

namespace {

struct date_case {
  int year;
  std::string_view month;
  std::string_view on;
  std::string_view at;
  int64_t seconds;  // as if UT
};

TEST(tz_date, rule_days_land_on_the_right_date) {
  const date_case cases[] = {
      {1970, "Jan", "1", "0:00", 0},
      {2026, "Mar", "lastSun", "1:00", 1774746000},   // 2026-03-29 01:00
      {2026, "Oct", "lastSun", "1:00", 1792890000},   // 2026-10-25 01:00
      {2007, "Mar", "Sun>=8", "2:00", 1173578400},    // 2007-03-11 02:00
      {2023, "Mar", "Fri>=23", "2:00", 1679623200},   // 2023-03-24 02:00
      {2024, "Oct", "Sat<=30", "2:00", 1729908000},   // 2024-10-26 02:00
      {2023, "Oct", "lastThu", "24:00", 1698364800},  // 2023-10-27 00:00
      {1891, "Mar", "15", "0:01", -2486678340},       // before 1901
      {2087, "Mar", "lastSun", "0:00", 3699820800},   // after 2038
  };
  for (const auto& c : cases) {
    const auto day = parse_on(c.on, *match_month(c.month));
    const auto when = parse_at(c.at, *day);
    EXPECT_EQ(local_seconds(c.year, *when), c.seconds)
        << c.year << " " << c.month << " " << c.on;
  }
}

TEST(tz_date, month_lengths_follow_gregorian_leap_years) {
  EXPECT_EQ(month_length(2024, 2), 29);
  EXPECT_EQ(month_length(2023, 2), 28);
  EXPECT_EQ(month_length(1900, 2), 28);
  EXPECT_EQ(month_length(2000, 2), 29);
  EXPECT_EQ(month_length(2023, 4), 30);
  EXPECT_EQ(month_length(2023, 12), 31);
}

}  // namespace
