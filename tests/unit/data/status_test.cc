#include "data/status_command.h"

#include <cstdio>
#include <functional>
#include <string>

#include "captured_stderr.h"
#include "clean_device.h"
#include "device_tree.h"
#include "gtest/gtest.h"
#include "tree.h"

namespace {

using status_test = clean_device;

void staged(const std::string& version, const std::string& schema = "44l") {
  tree::write_file(
      "/var/db/timezone/tz/" + version + "/icutz/icutz" + schema + ".dat",
      "data");
  tree::write_file("/var/db/timezone/tz/" + version + "/zoneinfo/+VERSION",
                   version.substr(0, version.find('.')) + "\n");
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
      {"2026a.1.1",
       "  2026a.1.1, ICU schema 44l, adopted at next start: yes "
       "(newer than 2025b.1.0)\n"},
      {"2026a.1.1",
       "  2026b.1.2, ICU schema 44l, adopted at next start: no "
       "(tz_latest names another set)\n"},
      {"2026c.1.1",
       "  2026c.1.1, ICU schema 72l, adopted at next start: no "
       "(ICU schema is not the system partition's)\n"},
      {"2024a.1.1",
       "  2024a.1.1, ICU schema 44l, adopted at next start: no "
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
  tree::make_link("/var/db/timezone/tz/2026a.1.1",
                  "/var/db/timezone/tz_latest");
  tree::write_file("/var/db/timezone/needs_cleanup", "");
  tree::write_file("/var/db/timezone/TZVersionDiffRecord",
                   "2025b.1.0_2026a.1.1");
  EXPECT_EQ(
      format_status(device_state::read(), true),
      "{\"system\":{\"version\":\"2025b.1.0\",\"icu_schema\":\"44l\"},"
      "\"designated\":{\"path\":\"/var/db/timezone/tz/2026a.1.1\","
      "\"version\":\"2026a.1.1\"},"
      "\"tz_latest\":\"/var/db/timezone/tz/2026a.1.1\",\"staged\":[{"
      "\"path\":\"/var/db/timezone/tz/2026a.1.1\",\"version\":\"2026a.1.1\","
      "\"icu_schema\":\"44l\",\"fault\":\"\",\"adopted_at_next_start\":false,"
      "\"reason\":\"not newer than 2026a.1.1\"}],\"needs_cleanup\":true,"
      "\"last_version_change\":\"2025b.1.0_2026a.1.1\"}\n");
}

// Each broken set is reported in status's own words, in text and in JSON,
// and kestrel's warnings about it never reach standard error.
TEST_F(status_test, reports_broken_sets_without_kestrel_warnings) {
  const struct {
    const char* name;
    const char* latest;
    std::function<void()> make;
    const char* line;
    const char* json;
  } kCases[] = {
      {"name not a version", "junk", [] { staged("junk"); },
       "  junk, ICU schema 44l, adopted at next start: no (not adoptable: "
       "its name is not a version)\n",
       "\"fault\":\"its name is not a version\",\"adopted_at_next_start\":"
       "false,\"reason\":\"not adoptable: its name is not a version\""},
      {"no ICU data file", "2026a.1.1",
       [] {
         staged("2026a.1.1");
         (void)std::remove("/var/db/timezone/tz/2026a.1.1/icutz/icutz44l.dat");
       },
       "  2026a.1.1, ICU schema (none), adopted at next start: no (not "
       "adoptable: no ICU data file icutzNNx.dat in icutz/)\n",
       "\"fault\":\"no ICU data file icutzNNx.dat in icutz/\""},
      {"icutz not a directory", "2026a.1.1",
       [] {
         tree::write_file("/var/db/timezone/tz/2026a.1.1/zoneinfo/+VERSION",
                          "2026a\n");
         tree::write_file("/var/db/timezone/tz/2026a.1.1/icutz", "");
       },
       "  2026a.1.1, ICU schema (none), adopted at next start: no (not "
       "adoptable: icutz/ cannot be read: Not a directory)\n",
       "\"reason\":\"not adoptable: icutz/ cannot be read: Not a "
       "directory\""},
      {"no +VERSION, named by tz_latest", "2026a.1.1",
       [] {
         staged("2026a.1.1");
         (void)std::remove("/var/db/timezone/tz/2026a.1.1/zoneinfo/+VERSION");
       },
       "  2026a.1.1, ICU schema 44l, adopted at next start: yes (newer than "
       "2025b.1.0; broken: no zoneinfo/+VERSION)\n",
       "\"fault\":\"no zoneinfo/+VERSION\",\"adopted_at_next_start\":true"},
      {"no +VERSION, not named by tz_latest", "2026b.1.1",
       [] {
         staged("2026b.1.1");
         tree::make_dir("/var/db/timezone/tz/2026a.1.1/zoneinfo");
         tree::write_file("/var/db/timezone/tz/2026a.1.1/icutz/icutz44l.dat",
                          "data");
       },
       "  2026a.1.1, ICU schema 44l, adopted at next start: no (not "
       "adoptable: no zoneinfo/+VERSION)\n",
       "\"reason\":\"not adoptable: no zoneinfo/+VERSION\""},
      {"bad links and tz_latest not a link", nullptr,
       [] {
         staged("2026a.1.1");
         (void)std::remove("/var/db/timezone/zoneinfo");
         tree::make_link("/elsewhere", "/var/db/timezone/zoneinfo");
         tree::write_file("/var/db/timezone/tz_latest", "");
       },
       "designated by the links: unreadable links (kestrel resets them)\n"
       "tz_latest: (unreadable)\n",
       "\"tz_latest\":\"(unreadable)\""},
  };
  for (const auto& c : kCases) {
    SCOPED_TRACE(c.name);
    clean_device::SetUp();
    make_device("2025b");
    c.make();
    if (c.latest != nullptr) {
      tree::make_link(std::string("/var/db/timezone/tz/") + c.latest,
                      "/var/db/timezone/tz_latest");
    }
    const captured_stderr err;
    const std::string text = format_status(device_state::read(), false);
    const std::string json = format_status(device_state::read(), true);
    EXPECT_NE(text.find(c.line), std::string::npos) << text;
    EXPECT_NE(json.find(c.json), std::string::npos) << json;
    EXPECT_EQ(err.text(), "");
  }
}

}  // namespace
