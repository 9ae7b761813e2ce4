#include "zoneinfo64/zone_compiler.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace {

// The rules of the European Union and a zone on them, as in the tz data.
constexpr std::string_view kEuRules = R"(
Rule EU 1977 1980 - Apr Sun>=1 1:00u 1:00 S
Rule EU 1977 only - Sep lastSun 1:00u 0 -
Rule EU 1978 only - Oct 1 1:00u 0 -
Rule EU 1979 1995 - Sep lastSun 1:00u 0 -
Rule EU 1981 max - Mar lastSun 1:00u 1:00 S
Rule EU 1996 max - Oct lastSun 1:00u 0 -
)";

compiled_zone compile(const std::string& text, const std::string& zone) {
  const tz_source source = parse_tz_source(text);
  return compile_zone(source, source.zones.at(zone));
}

struct expected_zone {
  const char* what;
  std::string source;
  zone_offset initial;
  std::vector<zone_transition> transitions;
};

TEST(zone_compiler, eras_and_rules_give_zics_transitions_with_raw_and_saving) {
  const expected_zone cases[] = {
      {"fixed offsets change at each line's until, read in the line's own time",
       "Zone X 0:30 - LMT 1900\n 1:00 - A 1970 Jan 1 2:00\n 2:00 - B\n",
       {1800, 0},
       {{-2208990600, {3600, 0}}, {3600, {7200, 0}}}},
      {"a line with a fixed saving keeps it apart from the raw offset",
       "Zone X 1:00 - A 1940\n 1:00 1:00 S 1941\n 1:00 - A\n",
       {3600, 0},
       {{-946774800, {3600, 3600}}, {-915156000, {3600, 0}}}},
      {"a change that keeps raw offset and saving is no transition",
       "Zone X 1:00 - A 1940\n 1:00 - B\n",
       {3600, 0},
       {}},
      {"a line starting in summer starts with the saving of the rule last in "
       "force",
       std::string(kEuRules) +
           "Zone X 0:00 - A 1980 Jun 1\n 1:00 EU CE%sT 1981\n 2:00 -  Y\n",
       {0, 0},
       {{328665600, {3600, 3600}},
        {338950800, {3600, 0}},
        {347151600, {7200, 0}}}},
  };
  for (const auto& c : cases) {
    const compiled_zone zone = compile(c.source, "X");
    EXPECT_EQ(zone.initial, c.initial) << c.what;
    ASSERT_EQ(zone.transitions.size(), c.transitions.size()) << c.what;
    for (size_t i = 0; i < c.transitions.size(); ++i) {
      EXPECT_EQ(zone.transitions[i].at, c.transitions[i].at)
          << c.what << " #" << i;
      EXPECT_EQ(zone.transitions[i].offset, c.transitions[i].offset)
          << c.what << " #" << i;
    }
  }
}

struct final_case {
  const char* what;
  std::string zone_lines;
  int year;
  size_t transitions;
};

TEST(zone_compiler,
     final_rule_starts_after_the_first_year_the_pair_gives_alone) {
  const final_case cases[] = {
      {"rules changing in 1996, zone on them since 1986",
       "Zone X 1:00 EU CE%sT\n", 1997, 40},
      {"zone joining at the start of a year",
       "Zone X 0:00 - A 1996\n 1:00 EU CE%sT\n", 1997, 3},
      {"zone joining after that year's first change",
       "Zone X 0:00 - A 2017 Oct 29 1:00u\n 1:00 EU CE%sT\n", 2019, 3},
  };
  for (const auto& c : cases) {
    const compiled_zone zone =
        compile(std::string(kEuRules) + c.zone_lines, "X");
    ASSERT_TRUE(zone.final) << c.what;
    EXPECT_EQ(zone.final->name, "EU") << c.what;
    EXPECT_EQ(zone.final->raw, 3600) << c.what;
    EXPECT_EQ(zone.final->year, c.year) << c.what;
    const std::array<int, 11> eu = {2,   -31, -1,   3600, 2,   9,
                                    -31, -1,  3600, 2,    3600};
    EXPECT_EQ(zone.final->fields, eu) << c.what;
    EXPECT_EQ(zone.transitions.size(), c.transitions) << c.what;
    EXPECT_LT(zone.transitions.back().at,
              852076800 + (c.year - 1997) * 31536000LL)
        << c.what;
  }
}

TEST(zone_compiler, rules_that_end_give_no_final_rule) {
  const compiled_zone zone = compile(
      "Rule R 2000 2002 - Apr 1 0:00 1:00 S\nRule R 2000 2002 - Oct 1 0:00 0 "
      "-\nZone X 1:00 R %s\n",
      "X");
  EXPECT_FALSE(zone.final);
  EXPECT_EQ(zone.transitions.size(), 6U);
}

TEST(zone_compiler, unknown_rule_set_is_an_error) {
  EXPECT_THROW(compile("Zone X 1:00 Nowhere %s\n", "X"), std::runtime_error);
}

TEST(zone_compiler, negative_saving_is_an_error) {
  // The main form's negative savings are folded away before compiling.
  EXPECT_THROW(compile("Zone X 1:00 -1:00 A\n", "X"), std::runtime_error);
  EXPECT_THROW(compile("Rule N 2000 only - Jan 1 0 -1 -\nZone X 1 N A\n", "X"),
               std::runtime_error);
}

}  // namespace
