#include "icuprobe/icu_zone.h"

#include <cstdlib>
#include <string>
#include <vector>

#include "gtest/gtest.h"

namespace {

// The system ICU's own data: facts that no tz release since has changed.
class icu_zone_test : public testing::Test {
 protected:
  void SetUp() override { (void)unsetenv("ICU_TIMEZONE_FILES_DIR"); }
};

TEST_F(icu_zone_test, reads_offset_and_daylight_time) {
  const struct {
    const char* name;
    std::int64_t instant;
    local_offset expected;
  } kCases[] = {
      {"America/New_York", 1593561600, {-4 * 3600, true}},   // 2020-07-01
      {"America/New_York", 1579046400, {-5 * 3600, false}},  // 2020-01-15
      {"Europe/Paris", 1579046400, {3600, false}},
      {"Asia/Kolkata", 1579046400, {5 * 3600 + 1800, false}},
      {"Etc/GMT+5", 0, {-5 * 3600, false}},
  };
  for (const auto& c : kCases) {
    const icu_zone zone(c.name);
    EXPECT_TRUE(zone.known()) << c.name;
    EXPECT_EQ(zone.at(c.instant), c.expected) << c.name << " " << c.instant;
  }
}

TEST_F(icu_zone_test, an_unknown_name_is_not_known) {
  EXPECT_FALSE(icu_zone("Nowhere/Atlantis").known());
  EXPECT_TRUE(icu_zone("UTC").known());
}

TEST_F(icu_zone_test, lists_transitions_within_the_span) {
  // 2020-03-29 and 2020-10-25 at 01:00 UTC.
  EXPECT_EQ(icu_zone("Europe/Paris").transitions(1577836800, 1609459200),
            (std::vector<std::int64_t>{1585443600, 1603587600}));
  EXPECT_EQ(icu_zone("Europe/Paris").transitions(1585443600, 1585443601),
            (std::vector<std::int64_t>{1585443600}));
  EXPECT_TRUE(icu_zone("Etc/GMT+5").transitions(0, 1609459200).empty());
}

TEST_F(icu_zone_test, lists_every_zone_id_and_a_data_version) {
  const std::string ids = icu_zone::all_ids();
  EXPECT_NE(ids.find("\nEurope/Paris\n"), std::string::npos);
  EXPECT_NE(ids.find("\nAmerica/New_York\n"), std::string::npos);
  EXPECT_EQ(icu_zone::data_version().size(), 5U) << icu_zone::data_version();
}

}  // namespace
