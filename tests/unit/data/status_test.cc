#include "data/status_command.h"

#include <string>

#include "clean_device.h"
#include "device_tree.h"
#include "gtest/gtest.h"
#include "tree.h"

namespace {

using status_test = clean_device;

void staged(const std::string& version, const std::string& schema = "44l") {
  tree::write_file("/var/db/timezone/tz/" + version + "/icutz/icutz" + schema +
                       ".dat",
                   "data");
  tree::make_dir("/var/db/timezone/tz/" + version + "/zoneinfo");
}

TEST_F(status_test, a_device_with_nothing_staged) {
  make_device("2025b");
  EXPECT_EQ(format_status(device_state::read(), false),
            "system partition: 2025b.1.0, ICU schema 44l\n"
            "designated by the links: 2025b.1.0\n"
            "tz_latest: (none)\n"
            "staged sets: 0\n"
            "clean-up marker: absent\n"
            "last version change: (none)\n");
}

TEST_F(status_test, says_which_staged_set_kestrel_would_adopt) {
  make_device("2025b");
  staged("2026a.1.1");
  staged("2026c.1.1", "72l");
  staged("2024a.1.1");
  staged("2026b.1.2");
  tree::write_file("/var/db/timezone/tz/.stage-x1y2z3/leftover", "");
  const struct {
    const char* latest;
    const char* line;
  } kCases[] = {
      {"2026a.1.1", "  2026a.1.1, ICU schema 44l, adopted at next start: yes "
                    "(newer than 2025b.1.0)\n"},
      {"2026a.1.1", "  2026b.1.2, ICU schema 44l, adopted at next start: no "
                    "(tz_latest names another set)\n"},
      {"2026c.1.1", "  2026c.1.1, ICU schema 72l, adopted at next start: no "
                    "(ICU schema is not the system partition's)\n"},
      {"2024a.1.1", "  2024a.1.1, ICU schema 44l, adopted at next start: no "
                    "(not newer than 2025b.1.0)\n"},
  };
  for (const auto& c : kCases) {
    (void)std::remove("/var/db/timezone/tz_latest");
    tree::make_link(std::string("/var/db/timezone/tz/") + c.latest,
                    "/var/db/timezone/tz_latest");
    const std::string text = format_status(device_state::read(), false);
    EXPECT_NE(text.find(c.line), std::string::npos) << text;
    EXPECT_NE(text.find("staged sets: 4\n"), std::string::npos) << text;
  }
}

TEST_F(status_test, reports_the_marker_the_record_and_the_designated_set) {
  make_device("2025b");
  staged("2026a.1.1");
  (void)std::remove("/var/db/timezone/zoneinfo");
  tree::make_link("/var/db/timezone/tz/2026a.1.1/zoneinfo",
                  "/var/db/timezone/zoneinfo");
  tree::make_link("/var/db/timezone/tz/2026a.1.1", "/var/db/timezone/tz_latest");
  tree::write_file("/var/db/timezone/needs_cleanup", "");
  tree::write_file("/var/db/timezone/TZVersionDiffRecord", "2025b.1.0_2026a.1.1");
  EXPECT_EQ(
      format_status(device_state::read(), true),
      "{\"system\":{\"version\":\"2025b.1.0\",\"icu_schema\":\"44l\"},"
      "\"designated\":{\"path\":\"/var/db/timezone/tz/2026a.1.1\","
      "\"version\":\"2026a.1.1\"},"
      "\"tz_latest\":\"/var/db/timezone/tz/2026a.1.1\",\"staged\":[{"
      "\"path\":\"/var/db/timezone/tz/2026a.1.1\",\"version\":\"2026a.1.1\","
      "\"icu_schema\":\"44l\",\"adopted_at_next_start\":false,"
      "\"reason\":\"not newer than 2026a.1.1\"}],\"needs_cleanup\":true,"
      "\"last_version_change\":\"2025b.1.0_2026a.1.1\"}\n");
}

}  // namespace
