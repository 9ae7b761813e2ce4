#include "data/clean.h"

#include <fcntl.h>
#include <sys/mount.h>
#include <unistd.h>

#include <functional>
#include <map>
#include <sstream>
#include <string>
#include <vector>

#include "clean_device.h"
#include "data/staging_lock.h"
#include "device_tree.h"
#include "gtest/gtest.h"
#include "tree.h"

namespace {

constexpr char kTz[] = "/var/db/timezone/tz/";
constexpr char kMarker[] = "/var/db/timezone/needs_cleanup";

// A staged set as kestrel-data stages it: zone files and ICU data.
void stage(const std::string& name) {
  tree::write_file(kTz + name + "/zoneinfo/+VERSION", name + "\n");
  tree::write_file(kTz + name + "/zoneinfo/Europe/Paris", "TZif2");
  tree::write_file(kTz + name + "/icutz/icutz44l.dat", "icu");
}

void designate(const std::string& name) {
  unlink("/var/db/timezone/zoneinfo");
  tree::make_link(kTz + name + "/zoneinfo", "/var/db/timezone/zoneinfo");
  tree::make_link(kTz + name + "/icutz", "/var/db/timezone/icutz");
}

void latest(const std::string& target) {
  tree::make_link(target, "/var/db/timezone/tz_latest");
}

// A device with the system partition at 2025b, three staged sets and the
// marker kestrel leaves when it abandons one.
class clean_test : public clean_device {
 protected:
  void SetUp() override {
    clean_device::SetUp();
    make_device("2025b");
    for (const char* name : {"2025b.1.1", "2026a.1.1", "2026c.1.1"}) {
      stage(name);
    }
    tree::write_file(kMarker, "");
  }

  int run() { return data::clean(out, err); }

  std::ostringstream out;
  std::ostringstream err;
};

std::map<std::string, std::string> under(
    const std::map<std::string, std::string>& all, const std::string& dir) {
  std::map<std::string, std::string> part;
  for (const auto& [path, entry] : all) {
    if (path.starts_with(dir)) {
      part.emplace(path, entry);
    }
  }
  return part;
}

struct removal_case {
  std::string name;
  std::function<void()> setup;
  std::vector<std::string> left;
  std::string output;
};

void PrintTo(const removal_case& param, std::ostream* os) { *os << param.name; }

const std::vector<removal_case> removal_cases = {
    {"system_designated_no_latest",
     [] {},
     {},
     "removed /var/db/timezone/tz/2025b.1.1\n"
     "removed /var/db/timezone/tz/2026a.1.1\n"
     "removed /var/db/timezone/tz/2026c.1.1\n"},
    {"system_designated_latest_kept",
     [] { latest("/var/db/timezone/tz/2026c.1.1"); },
     {"2026c.1.1"},
     "removed /var/db/timezone/tz/2025b.1.1\n"
     "removed /var/db/timezone/tz/2026a.1.1\n"},
    {"staged_designated_and_latest_kept",
     [] {
       designate("2026a.1.1");
       latest("/var/db/timezone/tz/2026c.1.1");
     },
     {"2026a.1.1", "2026c.1.1"},
     "removed /var/db/timezone/tz/2025b.1.1\n"},
    {"latest_is_the_designated_set",
     [] {
       designate("2026c.1.1");
       latest("/var/db/timezone/tz/2026c.1.1");
     },
     {"2026c.1.1"},
     "removed /var/db/timezone/tz/2025b.1.1\n"
     "removed /var/db/timezone/tz/2026a.1.1\n"},
    {"leftovers_of_staging_and_removal",
     [] {
       designate("2026a.1.1");
       latest("/var/db/timezone/tz/2026a.1.1");
       tree::write_file(std::string(kTz) + ".stage-Ab12Cd/zoneinfo/+VERSION",
                        "2026c\n");
       tree::write_file(std::string(kTz) + ".remove-2024a.1.1/icutz/x", "");
       tree::write_file(std::string(kTz) + ".remove-file", "");
       tree::write_file(std::string(kTz) + ".keep-unknown", "");
     },
     {".keep-unknown", "2026a.1.1"},
     "removed leftover /var/db/timezone/tz/.remove-2024a.1.1\n"
     "removed leftover /var/db/timezone/tz/.remove-file\n"
     "removed leftover /var/db/timezone/tz/.stage-Ab12Cd\n"
     "removed /var/db/timezone/tz/2025b.1.1\n"
     "removed /var/db/timezone/tz/2026c.1.1\n"},
};

class clean_removal_test : public clean_test,
                           public testing::WithParamInterface<removal_case> {};

// The names left directly in tz/, in order.
std::vector<std::string> left_in_tz() {
  std::vector<std::string> names;
  const std::string tz = kTz;
  for (const auto& [path, entry] : snapshot(kTz)) {
    const std::string name = path.substr(tz.size());
    if (!name.empty() && name.find('/') == std::string::npos) {
      names.push_back(name);
    }
  }
  return names;
}

TEST_P(clean_removal_test, removes_what_no_link_designates_and_the_marker) {
  GetParam().setup();
  const auto before = snapshot("/var/db/timezone");
  EXPECT_EQ(run(), 0);
  EXPECT_EQ(err.str(), "");
  EXPECT_EQ(out.str(), GetParam().output);
  EXPECT_EQ(left_in_tz(), GetParam().left);
  EXPECT_FALSE(tree::present(kMarker));
  // Every kept set is whole, and the links are as they were.
  const auto after = snapshot("/var/db/timezone");
  for (const std::string& name : GetParam().left) {
    EXPECT_EQ(under(after, kTz + name), under(before, kTz + name)) << name;
  }
  for (const char* link : {"zoneinfo", "icutz", "tz_latest", "localtime"}) {
    const std::string path = std::string("/var/db/timezone/") + link;
    EXPECT_EQ(under(after, path), under(before, path)) << link;
  }
}

INSTANTIATE_TEST_SUITE_P(clean, clean_removal_test,
                         testing::ValuesIn(removal_cases),
                         [](const testing::TestParamInfo<removal_case>& info) {
                           return info.param.name;
                         });

struct refusal_case {
  std::string name;
  std::function<void()> setup;
  std::string message;
};

void PrintTo(const refusal_case& param, std::ostream* os) { *os << param.name; }

const std::vector<refusal_case> refusal_cases = {
    {"no_zoneinfo_link", [] { unlink("/var/db/timezone/zoneinfo"); },
     "cannot read /var/db/timezone/zoneinfo: No such file or directory"},
    {"zoneinfo_is_a_directory",
     [] {
       unlink("/var/db/timezone/zoneinfo");
       tree::make_dir("/var/db/timezone/zoneinfo");
     },
     "cannot read /var/db/timezone/zoneinfo: Invalid argument"},
    {"zoneinfo_link_elsewhere",
     [] {
       unlink("/var/db/timezone/zoneinfo");
       tree::make_link("/usr/share/zoneinfo", "/var/db/timezone/zoneinfo");
     },
     "/var/db/timezone/zoneinfo -> /usr/share/zoneinfo designates no data set "
     "in /var/db/timezone/tz/"},
    {"zoneinfo_link_to_a_missing_set",
     [] {
       unlink("/var/db/timezone/zoneinfo");
       tree::make_link("/var/db/timezone/tz/2027a.1.1/zoneinfo",
                       "/var/db/timezone/zoneinfo");
     },
     "/var/db/timezone/zoneinfo -> /var/db/timezone/tz/2027a.1.1/zoneinfo "
     "designates no data set in /var/db/timezone/tz/"},
    {"zoneinfo_link_to_a_set_itself",
     [] {
       unlink("/var/db/timezone/zoneinfo");
       tree::make_link("/var/db/timezone/tz/2026a.1.1",
                       "/var/db/timezone/zoneinfo");
     },
     "/var/db/timezone/zoneinfo -> /var/db/timezone/tz/2026a.1.1 designates "
     "no data set in /var/db/timezone/tz/"},
    {"zoneinfo_link_climbing_out",
     [] {
       unlink("/var/db/timezone/zoneinfo");
       tree::make_link("/var/db/timezone/tz/../zoneinfo",
                       "/var/db/timezone/zoneinfo");
     },
     "/var/db/timezone/zoneinfo -> /var/db/timezone/tz/../zoneinfo designates "
     "no data set in /var/db/timezone/tz/"},
    {"icutz_of_another_set",
     [] {
       designate("2026a.1.1");
       unlink("/var/db/timezone/icutz");
       tree::make_link("/var/db/timezone/tz/2025b.1.1/icutz",
                       "/var/db/timezone/icutz");
     },
     "/var/db/timezone/icutz -> /var/db/timezone/tz/2025b.1.1/icutz disagrees "
     "with /var/db/timezone/zoneinfo"},
    {"icutz_missing_for_a_staged_set",
     [] {
       designate("2026a.1.1");
       unlink("/var/db/timezone/icutz");
     },
     "/var/db/timezone/icutz unreadable disagrees with "
     "/var/db/timezone/zoneinfo"},
    {"icutz_beside_the_system_partition",
     [] {
       tree::make_link("/var/db/timezone/tz/2026a.1.1/icutz",
                       "/var/db/timezone/icutz");
     },
     "/var/db/timezone/icutz -> /var/db/timezone/tz/2026a.1.1/icutz disagrees "
     "with /var/db/timezone/zoneinfo"},
    {"tz_latest_to_a_missing_set",
     [] { latest("/var/db/timezone/tz/2027a.1.1"); },
     "/var/db/timezone/tz_latest -> /var/db/timezone/tz/2027a.1.1 names no "
     "data set in /var/db/timezone/tz/"},
    {"tz_latest_with_trailing_slash",
     [] { latest("/var/db/timezone/tz/2026a.1.1/"); },
     "/var/db/timezone/tz_latest -> /var/db/timezone/tz/2026a.1.1/ names no "
     "data set in /var/db/timezone/tz/"},
    {"tz_latest_outside",
     [] { latest("/var/db/timezone/elsewhere/2026a.1.1"); },
     "/var/db/timezone/tz_latest -> /var/db/timezone/elsewhere/2026a.1.1 names "
     "no data set in /var/db/timezone/tz/"},
    {"tz_latest_is_a_file",
     [] { tree::write_file("/var/db/timezone/tz_latest", ""); },
     "cannot read /var/db/timezone/tz_latest: Invalid argument"},
    {"tz_latest_to_a_leftover",
     [] {
       tree::make_dir("/var/db/timezone/tz/.stage-Ab12Cd");
       latest("/var/db/timezone/tz/.stage-Ab12Cd");
     },
     "/var/db/timezone/tz_latest -> /var/db/timezone/tz/.stage-Ab12Cd names "
     "no data set in /var/db/timezone/tz/"},
};

class clean_refusal_test : public clean_test,
                           public testing::WithParamInterface<refusal_case> {};

TEST_P(clean_refusal_test, removes_nothing_but_the_marker) {
  GetParam().setup();
  tree::write_file(std::string(kTz) + ".stage-Zz99Yy/zoneinfo/+VERSION", "x");
  auto before = snapshot("/var/db/timezone");
  EXPECT_EQ(run(), 1);
  EXPECT_EQ(err.str(), "kestrel-data clean: " + GetParam().message +
                           "; nothing removed\n");
  EXPECT_EQ(out.str(), "");
  before.erase(kMarker);
  auto after = snapshot("/var/db/timezone");
  after.erase("/var/db/timezone/.kestrel-data.lock");
  EXPECT_EQ(after, before);
}

INSTANTIATE_TEST_SUITE_P(clean, clean_refusal_test,
                         testing::ValuesIn(refusal_cases),
                         [](const testing::TestParamInfo<refusal_case>& info) {
                           return info.param.name;
                         });

TEST_F(clean_test, removes_nothing_while_another_command_holds_the_lock) {
  const staging_lock other;
  auto before = snapshot("/var/db/timezone");
  EXPECT_EQ(run(), 1);
  EXPECT_EQ(err.str(),
            "kestrel-data clean: another kestrel-data command is changing the "
            "device; nothing removed\n");
  before.erase(kMarker);
  EXPECT_EQ(snapshot("/var/db/timezone"), before);
}

TEST_F(clean_test, never_follows_a_link_out_of_a_removed_set) {
  tree::write_file("/var/db/elsewhere/kept", "kept");
  tree::make_link("/var/db/elsewhere", std::string(kTz) + "2025b.1.1/out");
  tree::make_link("/var/db/elsewhere/kept",
                  std::string(kTz) + "2025b.1.1/zoneinfo/kept");
  latest("/var/db/timezone/tz/2026c.1.1");
  designate("2026a.1.1");
  EXPECT_EQ(run(), 0);
  EXPECT_FALSE(tree::present(std::string(kTz) + "2025b.1.1"));
  EXPECT_EQ(tree::file_content("/var/db/elsewhere/kept"), "kept");
}

TEST_F(clean_test, a_device_without_a_marker_is_cleaned_all_the_same) {
  unlink(kMarker);
  designate("2026a.1.1");
  latest("/var/db/timezone/tz/2026a.1.1");
  EXPECT_EQ(run(), 0);
  EXPECT_EQ(left_in_tz(), std::vector<std::string>{"2026a.1.1"});
}

TEST_F(clean_test, says_why_a_set_cannot_be_removed_and_goes_on) {
  designate("2026a.1.1");
  latest("/var/db/timezone/tz/2026a.1.1");
  // A file system mounted inside a set: its directory cannot be removed.
  const std::string mount_point = std::string(kTz) + "2025b.1.1/zoneinfo/held";
  tree::make_dir(mount_point);
  ASSERT_EQ(mount("held", mount_point.c_str(), "tmpfs", 0, nullptr), 0);
  EXPECT_EQ(run(), 1);
  EXPECT_EQ(err.str(),
            "kestrel-data clean: cannot remove "
            "/var/db/timezone/tz/.remove-2025b.1.1: Device or resource busy\n");
  EXPECT_EQ(out.str(), "removed /var/db/timezone/tz/2026c.1.1\n");
  EXPECT_FALSE(tree::present(kMarker));
  ASSERT_EQ(
      umount((std::string(kTz) + ".remove-2025b.1.1/zoneinfo/held").c_str()),
      0);
  // The next run removes the leftover.
  EXPECT_EQ(run(), 0);
  EXPECT_EQ(left_in_tz(), std::vector<std::string>{"2026a.1.1"});
}

}  // namespace
