#include "data/zone_names.h"

#include <sstream>
#include <stdexcept>
#include <string>
#include <vector>

#include "gtest/gtest.h"

namespace {

struct names_case {
  const char* zi;
  std::vector<std::string> names;
};

const names_case kCases[] = {
    {"", {}},
    {"# version 2026a\nR d 1916 o - Jun 14 23s 1 S\n", {}},
    {"Z Africa/Abidjan -0:16:8 - LMT 1912\n0 - GMT\n", {"Africa/Abidjan"}},
    {"Z A/B 0 - X\nL A/B C/D\nL A/B E\n", {"A/B", "C/D", "E"}},
    // zic's full keywords and any unambiguous abbreviation of them.
    {"Zone A 0 - X\nLink A B\nZo C 0 - X\nLi A D\n", {"A", "B", "C", "D"}},
    // Continuation lines and rules never name a zone.
    {"R Zion 1940 o - May 31 24u 1 D\n\t2 Zion I%sT\n", {}},
};

TEST(zone_names_test, lists_zones_and_links_in_file_order) {
  for (const names_case& c : kCases) {
    std::istringstream zi(c.zi);
    EXPECT_EQ(zone_and_link_names(zi), c.names) << c.zi;
  }
}

TEST(zone_names_test, an_unreadable_file_raises) {
  EXPECT_THROW(zone_and_link_names(std::string("/nonexistent/tzdata.zi")),
               std::runtime_error);
}

}  // namespace
