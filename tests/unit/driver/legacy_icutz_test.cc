#include "driver/legacy_icutz.h"

#include <functional>
#include <string>
#include <vector>

#include "captured_stderr.h"
#include "clean_device.h"
#include "gtest/gtest.h"
#include "outcome.h"
#include "tree.h"

namespace {

constexpr char kOld[] = "/var/db/icutz";
constexpr char kPresent[] = "/var/db/timezone/icutz";
constexpr char kStagedIcu[] = "/var/db/timezone/tz/2019c.1.0/icutz";
constexpr char kMissingIcu[] = "/var/db/timezone/tz/2017a.1.0/icutz";
constexpr char kNotMigrated[] =
    "kestrel: Could not migrate /var/db/icutz to /var/db/timezone/icutz: any";

// The system's and a staged set's ICU data exist; 2017a.1.0 does not.
class migrate_legacy_icutz_test : public clean_device {
 protected:
  void SetUp() override {
    clean_device::SetUp();
    tree::write_file("/usr/share/icu/icutzformat.txt", "57l\n");
    tree::write_file(std::string(kStagedIcu) + "/icutz57l.dat", "data");
  }
};

}  // namespace

TEST_F(migrate_legacy_icutz_test, moves_removes_or_leaves_the_old_link) {
  const struct {
    const char* name;
    std::function<void()> before;
    std::vector<std::string> lines;
    std::string present_link;
    std::string old_link;
  } cases[] = {
      {"no old link", [] {}, {}, "(none)", "(none)"},
      {"old link alone",
       [] { tree::make_link("/usr/share/icu", kOld); },
       {},
       "/usr/share/icu",
       "(none)"},
      {"old link beside a working present one",
       [] {
         tree::make_link("/usr/share/icu", kOld);
         tree::make_link(kStagedIcu, kPresent);
       },
       {},
       kStagedIcu,
       "(none)"},
      {"dangling old link",
       [] { tree::make_link(kMissingIcu, kOld); },
       {},
       "(none)",
       kMissingIcu},
      {"old link over a dangling present one",
       [] {
         tree::make_link("/usr/share/icu", kOld);
         tree::make_link(kMissingIcu, kPresent);
       },
       {"kestrel: create_symlink: from /var/db/timezone/icutz to "
        "/usr/share/icu: File exists",
        kNotMigrated},
       kMissingIcu,
       "(none)"},
  };
  for (const auto& c : cases) {
    SetUp();
    c.before();
    captured_stderr err;
    migrate_legacy_icutz();
    EXPECT_TRUE(same_lines(err.text(), c.lines)) << c.name;
    EXPECT_EQ(tree::link_target(kPresent), c.present_link) << c.name;
    EXPECT_EQ(tree::link_target(kOld), c.old_link) << c.name;
  }
}

TEST_F(migrate_legacy_icutz_test,
       real_directory_can_be_neither_moved_nor_removed) {
  tree::write_file(std::string(kOld) + "/icutz57l.dat", "data");
  captured_stderr err;
  migrate_legacy_icutz();
  EXPECT_TRUE(same_lines(
      err.text(),
      {"kestrel: read_symlink: /var/db/icutz: Invalid argument", kNotMigrated,
       "kestrel: remove: could not remove /var/db/icutz: Is a directory",
       "kestrel: Could not remove /var/db/icutz: any"}));
  EXPECT_FALSE(tree::present(kPresent));
  EXPECT_EQ(tree::file_content(std::string(kOld) + "/icutz57l.dat"), "data");
}
