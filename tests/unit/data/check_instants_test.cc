#include "data/check_instants.h"

#include <algorithm>
#include <vector>

#include "gtest/gtest.h"

namespace {

bool has(const std::vector<std::int64_t>& all, std::int64_t t) {
  return std::binary_search(all.begin(), all.end(), t);
}

TEST(check_instants_test, a_fixed_zone_is_checked_at_the_span_ends_and_middle) {
  const std::vector<std::int64_t> expected{
      kCheckFrom, kCheckFrom + (kCheckTo - kCheckFrom) / 2, kCheckTo - 1};
  EXPECT_EQ(check_instants({{}, "UTC0"}), expected);
  EXPECT_EQ(check_instants({{}, ""}), expected);
}

TEST(check_instants_test, each_transition_brings_itself_the_second_before_and_a_midpoint) {
  const std::int64_t t = 946684800;
  const std::vector<std::int64_t> expected{
      kCheckFrom,         kCheckFrom + (t - kCheckFrom) / 2,
      t - 1,              t,
      t + (kCheckTo - t) / 2, kCheckTo - 1};
  // Transitions outside the span bring nothing.
  EXPECT_EQ(check_instants({{kCheckFrom - 5000, t, kCheckTo + 1}, "<+02>-2"}),
            expected);
}

TEST(check_instants_test, the_footer_rule_goes_on_to_2100) {
  const std::int64_t last = 1900890000;
  const std::vector<std::int64_t> all =
      check_instants({{last}, "CET-1CEST,M3.5.0,M10.5.0/3"});
  // 2030-03-31 and 2099-10-25 01:00 UTC, and none after the span.
  EXPECT_TRUE(has(all, 1901149200));
  EXPECT_TRUE(has(all, 1901149199));
  EXPECT_TRUE(has(all, 4096573200));
  EXPECT_EQ(all.back(), kCheckTo - 1);
  // Two changes a year from 2030 to 2099, three instants each, plus the
  // file's own transition, the span's ends and the last midpoint.
  EXPECT_EQ(all.size(), 70U * 2 * 3 + 3 + 3);
  EXPECT_TRUE(std::is_sorted(all.begin(), all.end()));
}

TEST(check_instants_test, a_bad_footer_raises) {
  EXPECT_THROW(check_instants({{}, "CET-1CEST"}), std::runtime_error);
}

}  // namespace
