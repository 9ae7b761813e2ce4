#include "driver/current_data.h"

#include <cerrno>
#include <functional>
#include <string>
#include <vector>

#include "captured_stderr.h"
#include "clean_device.h"
#include "gtest/gtest.h"
#include "outcome.h"
#include "tree.h"

namespace {

constexpr char kSystem[] = "/usr/share/zoneinfo.default";
constexpr char kZoneinfo[] = "/var/db/timezone/zoneinfo";
constexpr char kIcutz[] = "/var/db/timezone/icutz";
constexpr char kLatest[] = "/var/db/timezone/tz_latest";
constexpr char kMarker[] = "/var/db/timezone/needs_cleanup";
constexpr char kRecord[] = "/var/db/timezone/TZVersionDiffRecord";
constexpr char kIncompatible[] =
    "kestrel: Symlink points at data incompatible with installed system: any";
constexpr char kUnableToLocate[] =
    "kestrel: Unable to locate data; resetting to system partition: any";
constexpr char kInvalidLinks[] =
    "kestrel: Invalid current symlinks; resetting to system partition: any";

// A staged data set tz/RELEASE.1.0 with ICU data of the schema.
std::string stage(const std::string& release, const std::string& schema) {
  const std::string path = "/var/db/timezone/tz/" + release + ".1.0";
  tree::write_file(path + "/zoneinfo/+VERSION", release + "\n");
  tree::write_file(path + "/zoneinfo/America/Los_Angeles", "TZif");
  tree::write_file(path + "/icutz/icutz" + schema + ".dat", "data");
  return path;
}

// Both links at the staged set.
void designate(const std::string& path) {
  tree::make_link(path + "/zoneinfo", kZoneinfo);
  tree::make_link(path + "/icutz", kIcutz);
}

std::string record() {
  return tree::present(kRecord) ? tree::file_content(kRecord) : "(none)";
}

// A system partition of release 2019c with ICU schema 57l.
class select_current_data_test : public clean_device {
 protected:
  void SetUp() override {
    clean_device::SetUp();
    tree::write_file(std::string(kSystem) + "/+VERSION", "2019c\n");
    tree::write_file(std::string(kSystem) + "/America/Los_Angeles", "TZif");
    tree::write_file("/usr/share/icu/icutzformat.txt", "57l\n");
    tree::make_dir("/var/db/timezone/tz");
  }
};

}  // namespace

TEST_F(select_current_data_test, keeps_resets_or_adopts) {
  const std::string set_2020a = "/var/db/timezone/tz/2020a.1.0";
  const std::string set_2020b = "/var/db/timezone/tz/2020b.1.0";
  const struct {
    const char* name;
    std::function<void()> before;
    std::vector<std::string> lines;
    std::string zoneinfo;
    std::string icutz;
    bool marker;
    std::string record;
  } cases[] = {
      {"system partition, nothing staged",
       [] { tree::make_link(kSystem, kZoneinfo); },
       {},
       kSystem,
       "(none)",
       false,
       "(none)"},
      {"first update",
       [] {
         tree::make_link(kSystem, kZoneinfo);
         tree::make_link(stage("2020a", "57l"), kLatest);
       },
       {},
       set_2020a + "/zoneinfo",
       set_2020a + "/icutz",
       false,
       "2019c.1.0_2020a.1.0"},
      {"newer update over a staged set",
       [] {
         designate(stage("2020a", "57l"));
         tree::make_link(stage("2020b", "57l"), kLatest);
       },
       {},
       set_2020b + "/zoneinfo",
       set_2020b + "/icutz",
       true,
       "2020a.1.0_2020b.1.0"},
      {"staged set without tz_latest",
       [] { designate(stage("2020a", "57l")); },
       {},
       set_2020a + "/zoneinfo",
       set_2020a + "/icutz",
       false,
       "(none)"},
      {"tz_latest naming the current set",
       [] {
         const std::string path = stage("2020a", "57l");
         designate(path);
         tree::make_link(path, kLatest);
       },
       {"kestrel: New update not compatible or older version: 2020a.1.0 vs. "
        "2020a.1.0: any"},
       set_2020a + "/zoneinfo",
       set_2020a + "/icutz",
       false,
       "(none)"},
      {"designated set of another ICU schema",
       [] { designate(stage("2020a", "58l")); },
       {kIncompatible},
       kSystem,
       "(none)",
       true,
       "(none)"},
      {"designated set older than the system's",
       [] { designate(stage("2019a", "57l")); },
       {kIncompatible},
       kSystem,
       "(none)",
       true,
       "(none)"},
      {"update weighed against the abandoned set",
       [] {
         designate(stage("2019a", "57l"));
         tree::make_link(stage("2019b", "57l"), kLatest);
       },
       {kIncompatible},
       "/var/db/timezone/tz/2019b.1.0/zoneinfo",
       "/var/db/timezone/tz/2019b.1.0/icutz",
       true,
       "2019c.1.0_2019b.1.0"},
      {"older update",
       [] {
         tree::make_link(kSystem, kZoneinfo);
         tree::make_link(stage("2019a", "57l"), kLatest);
       },
       {"kestrel: New update not compatible or older version: 2019a.1.0 vs. "
        "2019c.1.0: any"},
       kSystem,
       "(none)",
       false,
       "(none)"},
      {"update of another ICU schema",
       [] {
         tree::make_link(kSystem, kZoneinfo);
         tree::make_link(stage("2020a", "58l"), kLatest);
       },
       {"kestrel: New update not compatible or older version: 2020a.1.0 vs. "
        "2019c.1.0: any"},
       kSystem,
       "(none)",
       false,
       "(none)"},
      {"missing zoneinfo link",
       [] {},
       {"kestrel: Bad zoneinfo link : any", kInvalidLinks},
       kSystem,
       "(none)",
       false,
       "(none)"},
      {"zoneinfo link to a data set directory itself",
       [] {
         stage("2020a", "57l");
         tree::make_link("/var/db/timezone/tz/2020a.1.0", kZoneinfo);
       },
       {"kestrel: Bad zoneinfo link /var/db/timezone/tz/2020a.1.0: any",
        kInvalidLinks},
       kSystem,
       "(none)",
       false,
       "(none)"},
      {"tz_latest a regular file",
       [] {
         designate(stage("2020a", "57l"));
         tree::write_file(kLatest, "/var/db/timezone/tz/2020a.1.0");
       },
       {"kestrel: read_symlink: /var/db/timezone/tz_latest: Invalid argument",
        kUnableToLocate},
       kSystem,
       "(none)",
       false,
       "(none)"},
      {"tz_latest outside the staged directory",
       [] {
         designate(stage("2020a", "57l"));
         tree::make_link("/var/db/timezone/2020b.1.0", kLatest);
       },
       {"kestrel: kal_dataset::create_components: bad path "
        "/var/db/timezone/2020b.1.0: any",
        kUnableToLocate},
       kSystem,
       "(none)",
       false,
       "(none)"},
  };
  for (const auto& c : cases) {
    SetUp();
    c.before();
    captured_stderr err;
    select_current_data();
    EXPECT_TRUE(same_lines(err.text(), c.lines)) << c.name;
    EXPECT_EQ(tree::link_target(kZoneinfo), c.zoneinfo) << c.name;
    EXPECT_EQ(tree::link_target(kIcutz), c.icutz) << c.name;
    EXPECT_EQ(tree::present(kMarker), c.marker) << c.name;
    EXPECT_EQ(record(), c.record) << c.name;
  }
}

// The one failure that leaves the phase, and so main: the outer guard's own
// reset cannot replace a directory with the zoneinfo link, and the process
// aborts.
TEST_F(select_current_data_test, failed_reset_in_the_outer_guard_raises) {
  tree::write_file(std::string(kZoneinfo) + "/America/Los_Angeles", "TZif");
  const std::vector<std::string> failed_reset = {
      "kestrel: remove: could not remove /var/db/timezone/zoneinfo: Is a "
      "directory",
      "kestrel: Unlink of zoneinfo softlink failed: any",
      "kestrel: create_symlink: from /var/db/timezone/zoneinfo to "
      "/usr/share/zoneinfo.default: File exists"};
  std::vector<std::string> lines = {
      "kestrel: read_symlink: /var/db/timezone/zoneinfo: Invalid argument",
      kInvalidLinks};
  lines.insert(lines.end(), failed_reset.begin(), failed_reset.end());
  lines.push_back(kUnableToLocate);
  lines.insert(lines.end(), failed_reset.begin(), failed_reset.end());
  captured_stderr err;
  EXPECT_EQ(raised_by([] { select_current_data(); }), EEXIST);
  EXPECT_TRUE(same_lines(err.text(), lines));
  EXPECT_EQ(tree::file_content(std::string(kZoneinfo) + "/America/Los_Angeles"),
            "TZif");
}
