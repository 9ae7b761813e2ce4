#include "icuprobe/local_offset.h"

#include "gtest/gtest.h"

namespace {

TEST(local_offset_test, describes_offsets_as_hours_and_minutes) {
  const struct {
    local_offset offset;
    const char* text;
  } kCases[] = {
      {{0, false}, "+00:00"},
      {{-6 * 3600, false}, "-06:00"},
      {{-5 * 3600, true}, "-05:00 daylight"},
      {{5 * 3600 + 1800, false}, "+05:30"},
      {{-(3 * 3600 + 1800), true}, "-03:30 daylight"},
      {{-1000, false}, "-00:16"},
  };
  for (const auto& c : kCases) {
    EXPECT_EQ(describe_offset(c.offset), c.text) << c.offset.seconds;
  }
}

}  // namespace
