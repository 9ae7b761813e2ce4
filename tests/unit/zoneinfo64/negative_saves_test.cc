#include "zoneinfo64/negative_saves.h"

#include <gtest/gtest.h>

#include <stdexcept>
#include <string>
#include <vector>

#include "zoneinfo64/zone_compiler.h"

namespace {

struct fold_case {
  const char* what;
  std::string input;
  std::string folded;
};

TEST(negative_saves, fold_rewrites_only_negative_savings) {
  const std::vector<fold_case> cases = {
      {"text without negative savings comes back unchanged",
       "# version 2026f\nR E 1981 ma - Mar lastSu 1u 1 S\n"
       "Z X 1 E CE%sT\nL X Y\n",
       "# version 2026f\nR E 1981 ma - Mar lastSu 1u 1 S\n"
       "Z X 1 E CE%sT\nL X Y\n"},
      {"a fixed negative saving goes into the standard offset; an UNTIL on "
       "standard time moves with it",
       "Zone X 1:00 - CET 1946 Dec 1 3:00\n"
       " 1:00 -1:00 GMT 1947 Feb 23 2:00s\n"
       " 1:00 - CET\n",
       "Zone X 1:00 - CET 1946 Dec 1 3:00\n"
       "\t\t\t0\t-\tGMT\t1947 Feb 23 1s\n"
       " 1:00 - CET\n"},
      {"rules with negative savings that end: the line is cut at the first "
       "and after the last, and follows a raised copy between",
       "Rule N 1994 only - Mar 21 0:00 -1:00 WAT\n"
       "Rule N 1994 2017 - Sep Sun>=1 2:00 0 CAT\n"
       "Rule N 1995 2017 - Apr Sun>=1 2:00 -1:00 WAT\n"
       "Zone X 2:00 - SAST 1990 Mar 21\n"
       " 2:00 N %s\n",
       "Rule N 1994 only - Mar 21 0:00 -1:00 WAT\n"
       "Rule N 1994 2017 - Sep Sun>=1 2:00 0 CAT\n"
       "Rule N 1995 2017 - Apr Sun>=1 2:00 -1:00 WAT\n"
       "Zone X 2:00 - SAST 1990 Mar 21\n"
       "\t\t\t2:00\t-\tCAT\t1994 Mar 21 0:00\n"
       "\t\t\t1\tN_3600\t%s\t2017 Sep Sun>=1 2:00\n"
       "\t\t\t2:00\tN\t%s\n"
       "Rule\tN_3600\t1994\tonly\t-\tMar\t21\t0:00\t0\tWAT\n"
       "Rule\tN_3600\t1994\t2017\t-\tSep\tSun>=1\t2:00\t1\tCAT\n"
       "Rule\tN_3600\t1995\t2017\t-\tApr\tSun>=1\t2:00\t0\tWAT\n"},
      {"rules whose negative saving goes on for ever, on standard time: the "
       "copy's times move with the offset and STD/DST is swapped",
       "Rule E 1971 only - Oct 31 2:00s -1:00 -\n"
       "Rule E 1981 max - Mar lastSun 1:00u 0 -\n"
       "Rule E 1996 max - Oct lastSun 1:00u -1:00 -\n"
       "Z X 1 E IST/GMT\n",
       "Rule E 1971 only - Oct 31 2:00s -1:00 -\n"
       "Rule E 1981 max - Mar lastSun 1:00u 0 -\n"
       "Rule E 1996 max - Oct lastSun 1:00u -1:00 -\n"
       "Zone\tX\t1\t-\tIST\t1971 Oct 31 2:00s\n"
       "\t\t\t0\tE_3600\tGMT/IST\n"
       "Rule\tE_3600\t1971\tonly\t-\tOct\t31\t1s\t0\t-\n"
       "Rule\tE_3600\t1981\tmax\t-\tMar\tlastSun\t1:00u\t1\t-\n"
       "Rule\tE_3600\t1996\tmax\t-\tOct\tlastSun\t1:00u\t0\t-\n"},
      {"a line that starts under a negative saving is lowered from its start",
       "Rule M 2019 only - May 5 3:00 -1:00 -\n"
       "Rule M 2019 only - Jun 9 2:00 0 -\n"
       "Zone X 0:00 - A 2019 May 20\n 1:00 M %z\n",
       "Rule M 2019 only - May 5 3:00 -1:00 -\n"
       "Rule M 2019 only - Jun 9 2:00 0 -\n"
       "Zone X 0:00 - A 2019 May 20\n"
       "\t\t\t0\tM_3600\t%z\t2019 Jun 9 2:00\n"
       "\t\t\t1:00\tM\t%z\n"
       "Rule\tM_3600\t2019\tonly\t-\tMay\t5\t3:00\t0\t-\n"
       "Rule\tM_3600\t2019\tonly\t-\tJun\t9\t2:00\t1\t-\n"},
  };
  for (const auto& c : cases) {
    EXPECT_EQ(fold_negative_saves(c.input), c.folded) << c.what;
  }
}

TEST(negative_saves, refuses_what_it_cannot_fold) {
  // STD/DST names two savings; folding would need a third name.
  EXPECT_THROW(fold_negative_saves("Rule N 2000 only - Jan 1 0 -1 -\n"
                                   "Rule N 2000 only - Jun 1 0 1 -\n"
                                   "Rule N 2000 only - Sep 1 0 -1 -\n"
                                   "Rule N 2000 only - Dec 1 0 0 -\n"
                                   "Zone X 1 N A/B\n"),
               std::runtime_error);
  EXPECT_THROW(fold_negative_saves("Zone X 1 -1\n"), std::runtime_error);
}

TEST(negative_saves, folded_zone_compiles_to_icu_offsets) {
  // Namibia 2016-2017, its rules running since 1994: the summer (CAT) is
  // daylight time above a raw offset of one hour, the winter (WAT) standard
  // time, and from September 2017 standard time two hours ahead.
  const std::string folded = fold_negative_saves(
      "Rule N 1994 2017 - Sep Sun>=1 2:00 0 CAT\n"
      "Rule N 1995 2017 - Apr Sun>=1 2:00 -1:00 WAT\n"
      "Zone X 2:00 - A 2016\n 2:00 N %s\n");
  const tz_source source = parse_tz_source(folded);
  const compiled_zone zone = compile_zone(source, source.zones.at("X"));
  const std::vector<zone_transition> expected = {{1451599200, {3600, 3600}},
                                                 {1459641600, {3600, 0}},
                                                 {1472950800, {3600, 3600}},
                                                 {1491091200, {3600, 0}},
                                                 {1504400400, {7200, 0}}};
  EXPECT_EQ(zone.initial, (zone_offset{7200, 0}));
  ASSERT_EQ(zone.transitions.size(), expected.size());
  for (size_t i = 0; i < expected.size(); ++i) {
    EXPECT_EQ(zone.transitions[i].at, expected[i].at) << i;
    EXPECT_EQ(zone.transitions[i].offset, expected[i].offset) << i;
  }
}

}  // namespace
