#include "data/set_zone.h"

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

constexpr char kLocaltime[] = "/var/db/timezone/localtime";
constexpr char kZoneFile[] = "TZif2\0\0\0 a compiled zone";

// A device whose current data is the system partition's, with two zones, a
// link between zone names, and the other kinds of entry a zone directory
// holds; and an /etc of its own, where /etc/localtime leads to the device's
// zone as the package lays it out.
class set_zone_test : public clean_device {
 protected:
  static void SetUpTestSuite() {
    ASSERT_EQ(mount("etc", "/etc", "tmpfs", 0, "mode=0755"), 0);
  }

  void SetUp() override {
    clean_device::SetUp();
    tree::clear("/etc");
    const std::string zone(kZoneFile, sizeof(kZoneFile) - 1);
    tree::write_file("/usr/share/zoneinfo.default/Europe/Paris", zone);
    tree::write_file("/usr/share/zoneinfo.default/Asia/Tokyo", zone);
    tree::make_link("Asia/Tokyo", "/usr/share/zoneinfo.default/Japan");
    tree::write_file("/usr/share/zoneinfo.default/+VERSION", "2025b\n");
    tree::write_file("/usr/share/zoneinfo.default/zone.tab", "# tz zone\n");
    tree::make_link("/usr/share/zoneinfo.default", "/var/db/timezone/zoneinfo");
    tree::make_link("/var/db/timezone/zoneinfo/Asia/Tokyo", kLocaltime);
    tree::make_link(kLocaltime, "/etc/localtime");
  }

  int run(const std::string& zone) { return data::set_zone(zone, out, err); }

  std::ostringstream out;
  std::ostringstream err;
};

TEST_F(set_zone_test, points_localtime_at_the_zone_through_the_data_link) {
  EXPECT_EQ(run("Europe/Paris"), 0);
  EXPECT_EQ(tree::link_target(kLocaltime),
            "/var/db/timezone/zoneinfo/Europe/Paris");
  EXPECT_EQ(out.str(), "The device's zone is Europe/Paris.\n");
  EXPECT_EQ(err.str(), "");
  EXPECT_FALSE(tree::present("/var/db/timezone/.localtime.new"));
}

TEST_F(set_zone_test, takes_a_zone_name_that_is_a_link) {
  EXPECT_EQ(run("Japan"), 0);
  EXPECT_EQ(tree::link_target(kLocaltime), "/var/db/timezone/zoneinfo/Japan");
}

TEST_F(set_zone_test, replaces_a_leftover_of_an_interrupted_run) {
  tree::make_link("/nowhere", "/var/db/timezone/.localtime.new");
  EXPECT_EQ(run("Europe/Paris"), 0);
  EXPECT_EQ(tree::link_target(kLocaltime),
            "/var/db/timezone/zoneinfo/Europe/Paris");
  EXPECT_FALSE(tree::present("/var/db/timezone/.localtime.new"));
}

TEST_F(set_zone_test, replaces_a_localtime_that_is_not_a_link) {
  unlink(kLocaltime);
  tree::write_file(kLocaltime, "not a link");
  EXPECT_EQ(run("Europe/Paris"), 0);
  EXPECT_EQ(tree::link_target(kLocaltime),
            "/var/db/timezone/zoneinfo/Europe/Paris");
}

// The states another program leaves /etc/localtime in: timedatectl's
// relative link, tzdata's absolute one, a copied file, nothing.
TEST_F(set_zone_test, points_etc_localtime_back_when_it_leads_elsewhere) {
  const std::vector<std::function<void()>> states = {
      [] {
        tree::make_link("../usr/share/zoneinfo/Asia/Tokyo", "/etc/localtime");
      },
      [] {
        tree::make_link("/usr/share/zoneinfo/Asia/Tokyo", "/etc/localtime");
      },
      [] { tree::write_file("/etc/localtime", "TZif2 copied"); },
      [] {},
  };
  for (std::size_t i = 0; i < states.size(); ++i) {
    SCOPED_TRACE(i);
    unlink("/etc/localtime");
    states[i]();
    out.str("");
    EXPECT_EQ(run("Europe/Paris"), 0);
    EXPECT_EQ(tree::link_target(kLocaltime),
              "/var/db/timezone/zoneinfo/Europe/Paris");
    EXPECT_EQ(tree::link_target("/etc/localtime"), kLocaltime);
    EXPECT_EQ(out.str(),
              "The device's zone is Europe/Paris.\n"
              "/etc/localtime led elsewhere; it leads to "
              "/var/db/timezone/localtime again.\n");
    EXPECT_FALSE(tree::present("/etc/.localtime.kestrel-new"));
  }
  EXPECT_EQ(err.str(), "");
}

TEST_F(set_zone_test,
       sets_the_zone_but_fails_when_etc_localtime_is_a_directory) {
  unlink("/etc/localtime");
  tree::write_file("/etc/localtime/kept", "");
  EXPECT_EQ(run("Europe/Paris"), 1);
  EXPECT_EQ(tree::link_target(kLocaltime),
            "/var/db/timezone/zoneinfo/Europe/Paris");
  EXPECT_EQ(err.str(),
            "kestrel-data set-zone: cannot point /etc/localtime at "
            "/var/db/timezone/localtime: Is a directory; programs do not see "
            "the device's zone until it leads there\n");
  EXPECT_FALSE(tree::present("/etc/.localtime.kestrel-new"));
}

struct refusal {
  std::string name;
  std::string zone;
  std::function<void()> setup;
  std::string message;
};

std::string no_zone(const std::string& zone) {
  return "kestrel-data set-zone: no zone " + zone +
         " in the current data (/var/db/timezone/zoneinfo)\n";
}

std::string not_a_name(const std::string& zone) {
  return "kestrel-data set-zone: \"" + zone + "\" is not a zone name\n";
}

const std::vector<refusal> refusals = {
    {"empty_name", "", [] {}, not_a_name("")},
    {"absolute_name", "/usr/share/zoneinfo/Europe/Paris", [] {},
     not_a_name("/usr/share/zoneinfo/Europe/Paris")},
    {"name_climbing_out", "../zoneinfo.default/Europe/Paris", [] {},
     not_a_name("../zoneinfo.default/Europe/Paris")},
    {"name_climbing_inside", "Asia/../Europe/Paris", [] {},
     not_a_name("Asia/../Europe/Paris")},
    {"name_with_dot_component", "Europe/./Paris", [] {},
     not_a_name("Europe/./Paris")},
    {"name_with_empty_component", "Europe//Paris", [] {},
     not_a_name("Europe//Paris")},
    {"name_with_trailing_slash", "Europe/Paris/", [] {},
     not_a_name("Europe/Paris/")},
    {"name_with_a_space", "Europe/Paris ", [] {}, not_a_name("Europe/Paris ")},
    {"name_with_a_newline", "Europe/Paris\n", [] {},
     not_a_name("Europe/Paris\n")},
    {"zone_missing_from_the_data", "Mars/Olympus", [] {},
     no_zone("Mars/Olympus")},
    {"directory_of_zones", "Europe", [] {}, no_zone("Europe")},
    {"file_that_is_not_a_zone", "zone.tab", [] {}, no_zone("zone.tab")},
    {"version_file", "+VERSION", [] {}, no_zone("+VERSION")},
    {"no_data_link", "Europe/Paris",
     [] { unlink("/var/db/timezone/zoneinfo"); }, no_zone("Europe/Paris")},
    {"data_link_to_missing_data", "Europe/Paris",
     [] {
       unlink("/var/db/timezone/zoneinfo");
       tree::make_link("/var/db/timezone/tz/2026a.1.1/zoneinfo",
                       "/var/db/timezone/zoneinfo");
     },
     no_zone("Europe/Paris")},
    {"device_not_laid_out", "Europe/Paris", [] { tree::clear("/var/db"); },
     "kestrel-data set-zone: cannot open "
     "/var/db/timezone/.kestrel-data.lock: No such file or directory\n"},
    {"localtime_is_a_directory", "Europe/Paris",
     [] {
       unlink(kLocaltime);
       tree::write_file(std::string(kLocaltime) + "/kept", "");
     },
     "kestrel-data set-zone: cannot point /var/db/timezone/localtime at "
     "/var/db/timezone/zoneinfo/Europe/Paris: Is a directory\n"},
};

// Names the case in GoogleTest's output instead of dumping its bytes.
void PrintTo(const refusal& param, std::ostream* os) { *os << param.name; }

class set_zone_refusal_test : public set_zone_test,
                              public testing::WithParamInterface<refusal> {};

// The whole device as it stands, but kestrel-data's lock file, which its
// commands create and leave.
std::map<std::string, std::string> device_listing() {
  std::map<std::string, std::string> listing;
  for (const char* dir : {"/var", "/usr/share", "/etc"}) {
    listing.merge(snapshot(dir));
  }
  listing.erase("/var/db/timezone/.kestrel-data.lock");
  return listing;
}

TEST_P(set_zone_refusal_test, says_why_and_changes_nothing) {
  GetParam().setup();
  const auto before = device_listing();
  EXPECT_EQ(run(GetParam().zone), 1);
  EXPECT_EQ(err.str(), GetParam().message);
  EXPECT_EQ(out.str(), "");
  EXPECT_EQ(device_listing(), before);
}

INSTANTIATE_TEST_SUITE_P(set_zone, set_zone_refusal_test,
                         testing::ValuesIn(refusals),
                         [](const testing::TestParamInfo<refusal>& info) {
                           return info.param.name;
                         });

TEST_F(set_zone_test, refuses_while_another_command_holds_the_lock) {
  const staging_lock other;
  EXPECT_EQ(run("Europe/Paris"), 1);
  EXPECT_EQ(err.str(),
            "kestrel-data set-zone: another kestrel-data command is changing "
            "the device; try again when it is done\n");
  EXPECT_EQ(tree::link_target(kLocaltime),
            "/var/db/timezone/zoneinfo/Asia/Tokyo");
}

}  // namespace
