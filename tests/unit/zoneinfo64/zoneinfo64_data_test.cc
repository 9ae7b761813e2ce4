#include "zoneinfo64/zoneinfo64_data.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <stdexcept>
#include <string>

#include "zoneinfo64/zoneinfo64_writer.h"

namespace {

constexpr std::string_view kSource = R"(
Rule US 2007 max - Mar Sun>=8 2:00 1:00 D
Rule US 2007 max - Nov Sun>=1 2:00 0 S
Zone America/New_York -4:56:02 - LMT 1883 Nov 18 17:00u
 -5:00 US E%sT
Zone Africa/Abidjan -0:16:08 - LMT 1912
 0:00 - GMT
Zone Europe/Paris 1:00 - CET
Zone Asia/Shanghai 8:00 - CST
Zone Asia/Kolkata 5:30 - IST
Link Africa/Abidjan Africa/Accra
Link Africa/Abidjan Iceland #= Atlantic/Reykjavik
Link Africa/Abidjan Atlantic/Reykjavik
Link Africa/Abidjan Africa/Nowhere #= Africa/Accra
)";

constexpr std::string_view kZoneTab =
    "# "
    "comment\nUS\t+404251-0740023\tAmerica/"
    "New_York\tEastern\nCI\t+0519-00402\tAfrica/Abidjan\n"
    "GH\t+0533-00013\tAfrica/Accra\nIS\t+6409-02151\tAtlantic/Reykjavik\n";

size_t index_of(const zoneinfo64_data& data, const std::string& name) {
  const auto found = std::find(data.names.begin(), data.names.end(), name);
  EXPECT_NE(found, data.names.end()) << name;
  return static_cast<size_t>(found - data.names.begin());
}

TEST(zoneinfo64_data, names_sorted_links_indexed_regions_from_zone_tab) {
  const zoneinfo64_data data = build_zoneinfo64(kSource, kZoneTab, "2099z");
  EXPECT_TRUE(std::is_sorted(data.names.begin(), data.names.end()));
  const size_t abidjan = index_of(data, "Africa/Abidjan");
  struct expected {
    std::string name;
    int alias_of;
    std::string region;
  };
  const expected cases[] = {
      {"Africa/Abidjan", -1, "CI"},
      {"Africa/Accra", static_cast<int>(abidjan), "GH"},
      {"Africa/Nowhere", static_cast<int>(abidjan),
       "GH"},  // through its former target
      {"Iceland", static_cast<int>(abidjan), "CI"},  // kept by ICU
      {"America/New_York", -1, "US"},
      {"Europe/Paris", -1, "001"},
      {"ECT", static_cast<int>(index_of(data, "Europe/Paris")),
       "001"},  // Java's old ID
      {"SystemV/EST5EDT", -1, "001"},
      {"Etc/Unknown", -1, "001"},
  };
  for (const auto& c : cases) {
    const size_t i = index_of(data, c.name);
    EXPECT_EQ(data.alias_of[i], c.alias_of) << c.name;
    EXPECT_EQ(data.regions[i], c.region) << c.name;
  }
  EXPECT_EQ(data.rules.size(), 2U);  // US and SystemV
  const auto& york = data.zones[index_of(data, "America/New_York")];
  ASSERT_TRUE(york.final);
  EXPECT_EQ(york.final->year, 2008);
}

TEST(zoneinfo64_data, writer_splits_64_bit_times_and_lists_links) {
  const std::string text =
      write_zoneinfo64(build_zoneinfo64(kSource, kZoneTab, "2099z"));
  EXPECT_NE(text.find(" TZVersion { \"2099z\" }\n"), std::string::npos);
  // 1883-11-18 17:00 UT is -2717650800: high word -1, low word 1577316496.
  EXPECT_NE(text.find("transPre32:intvector { -1, 1577316496 }"),
            std::string::npos);
  EXPECT_NE(
      text.find("typeOffsets:intvector { -17762, 0, -18000, 0, -18000, 3600 }"),
      std::string::npos);
  EXPECT_NE(text.find("finalRule { \"US\" }\n    finalRaw:int { -18000 }\n    "
                      "finalYear:int { 2008 }"),
            std::string::npos);
  EXPECT_NE(
      text.find(
          "US:intvector {\n    2, 8, -1, 7200, 0, 10, 1, -1, 7200, 0, 3600\n"),
      std::string::npos);
}

struct bad_case {
  std::string_view source;
  std::string_view message;
};

TEST(zoneinfo64_data, bad_input_is_refused_with_the_line_or_name) {
  const bad_case cases[] = {
      {"Zone A 1:00 - X\nLink Nowhere B\n", "link to unknown zone Nowhere"},
      {"Link B C\nLink C B\n", "link loop"},
      {"Zone A 1:00 R %s\n", "zone A: no rule set named R"},
      {"Zone A 1:00 - X 1990\n", "the last zone has no line without UNTIL"},
      {"Rule R 1990 only - Foo 1 0 1:00 S\n", "line 1: bad month"},
      {"Zone A 1:00 - X\n\nZone A 2:00 - Y\n", "line 3: zone A defined twice"},
      {"Rule R 20 only - Jan 1 0 1:00 S\n", "line 1: bad FROM year"},
      {"Bogus line\n", "line 1: unknown line"},
      {"Zone \"A*/B\" 1:00 - X\n",
       "zone name \"A*/B\" has characters ICU IDs do not use"},
      {"Rule \"R{\" 2000 max - Mar 1 0 1:00 S\nRule \"R{\" 2000 max - Oct 1 0 "
       "0 -\n"
       "Zone A 1:00 \"R{\" %s\n",
       "rule name \"R{\" has characters"},
  };
  for (const auto& c : cases) {
    try {
      build_zoneinfo64(c.source, "", "1z");
      ADD_FAILURE() << "accepted: " << c.source;
    } catch (const std::runtime_error& error) {
      EXPECT_NE(std::string(error.what()).find(c.message), std::string::npos)
          << error.what() << " for " << c.source;
    }
  }
}

}  // namespace
