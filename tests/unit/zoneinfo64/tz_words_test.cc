#include "zoneinfo64/tz_words.h"

#include <gtest/gtest.h>

#include <optional>
#include <string_view>

namespace {

struct hms_case {
  std::string_view text;
  std::optional<int> seconds;
};

TEST(tz_words, hms_reads_zics_offsets_and_times) {
  const hms_case cases[] = {
      {"0", 0},
      {"-", 0},
      {"1:00", 3600},
      {"-0:25:21", -1521},
      {"24:00", 86400},
      {"2:45", 9900},
      {"0:57:44", 3464},
      {"12:33:04", 45184},
      {"0:00:00.5", 0},
      {"0:00:01.5", 2},
      {"0:00:00.51", 1},
      {"", std::nullopt},
      {"1:", std::nullopt},
      {"1:60", std::nullopt},
      {"a", std::nullopt},
      {"1:00:00:00", std::nullopt},
  };
  for (const auto& c : cases) EXPECT_EQ(parse_hms(c.text), c.seconds) << c.text;
}

struct month_case {
  std::string_view word;
  std::optional<int> month;
};

TEST(tz_words, months_match_by_unambiguous_prefix) {
  const month_case cases[] = {{"Jan", 1},
                              {"ja", 1},
                              {"F", 2},
                              {"Mar", 3},
                              {"May", 5},
                              {"Jun", 6},
                              {"Jul", 7},
                              {"S", 9},
                              {"Oct", 10},
                              {"D", 12},
                              {"Ju", std::nullopt},
                              {"M", std::nullopt},
                              {"Octobers", std::nullopt}};
  for (const auto& c : cases) EXPECT_EQ(match_month(c.word), c.month) << c.word;
}

struct on_case {
  std::string_view text;
  tz_day_time::kind rule;
  int day;
  int weekday;
};

TEST(tz_words, days_read_numbers_last_and_comparisons) {
  const on_case cases[] = {
      {"5", tz_day_time::kind::day, 5, 0},
      {"lastSun", tz_day_time::kind::last, 1, 0},
      {"lastSu", tz_day_time::kind::last, 1, 0},
      {"lastFri", tz_day_time::kind::last, 1, 5},
      {"Sun>=8", tz_day_time::kind::on_or_after, 8, 0},
      {"Sa<=30", tz_day_time::kind::on_or_before, 30, 6},
  };
  for (const auto& c : cases) {
    const auto day = parse_on(c.text, 3);
    ASSERT_TRUE(day) << c.text;
    EXPECT_EQ(day->rule, c.rule) << c.text;
    EXPECT_EQ(day->day, c.day) << c.text;
    EXPECT_EQ(day->weekday, c.weekday) << c.text;
  }
  for (const std::string_view bad :
       {"0", "32", "lastS", "Sun>8", "Sun>=", "Xyz>=3", "last"}) {
    EXPECT_FALSE(parse_on(bad, 3)) << bad;
  }
}

struct at_case {
  std::string_view text;
  int seconds;
  tz_clock clock;
};

TEST(tz_words, times_carry_their_clock) {
  const at_case cases[] = {{"2:00", 7200, tz_clock::wall},
                           {"2:00w", 7200, tz_clock::wall},
                           {"2:00s", 7200, tz_clock::standard},
                           {"1:00u", 3600, tz_clock::universal},
                           {"1:00g", 3600, tz_clock::universal},
                           {"0z", 0, tz_clock::universal}};
  for (const auto& c : cases) {
    const auto at = parse_at(c.text, tz_day_time{});
    ASSERT_TRUE(at) << c.text;
    EXPECT_EQ(at->seconds, c.seconds) << c.text;
    EXPECT_EQ(at->clock, c.clock) << c.text;
  }
}

}  // namespace
