#include "driver/localtime_link.h"

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

constexpr char kLocaltime[] = "/var/db/timezone/localtime";
constexpr char kDefaultLink[] = "/var/db/timezone/zoneinfo/America/Los_Angeles";
constexpr char kInvalid[] =
    "kestrel: localtime link invalid; resetting to America/Los_Angeles: any";
constexpr char kNotALink[] =
    "kestrel: read_symlink: /var/db/timezone/localtime: Invalid argument";

// The system partition's zone files are current, through the data link.
class repair_localtime_link_test : public clean_device {
 protected:
  void SetUp() override {
    clean_device::SetUp();
    for (const char* zone : {"America/Los_Angeles", "Asia/Tokyo"}) {
      tree::write_file(std::string("/usr/share/zoneinfo.default/") + zone,
                       "TZif");
    }
    tree::make_link("/usr/share/zoneinfo.default", "/var/db/timezone/zoneinfo");
  }
};

void link_to(const std::string& target) { tree::make_link(target, kLocaltime); }

}  // namespace

TEST_F(repair_localtime_link_test, keeps_corrects_or_resets_the_link) {
  const struct {
    const char* name;
    std::function<void()> before;
    std::vector<std::string> lines;
    std::string link;
  } cases[] = {
      {"through the data link",
       [] { link_to(kDefaultLink); },
       {},
       kDefaultLink},
      {"through the data link to a missing zone",
       [] { link_to("/var/db/timezone/zoneinfo/Nowhere"); },
       {},
       "/var/db/timezone/zoneinfo/Nowhere"},
      {"the data link's name as a bare prefix",
       [] { link_to("/var/db/timezone/zoneinfoXYZ"); },
       {},
       "/var/db/timezone/zoneinfoXYZ"},
      {"old style",
       [] { link_to("/usr/share/zoneinfo/Asia/Tokyo"); },
       {"kestrel: Correcting localtime link to "
        "/var/db/timezone/zoneinfo/Asia/Tokyo: any"},
       "/var/db/timezone/zoneinfo/Asia/Tokyo"},
      {"old style, climbing with dot-dot",
       [] { link_to("/usr/share/zoneinfo/../zoneinfo.default/Asia/Tokyo"); },
       {"kestrel: Correcting localtime link to "
        "/var/db/timezone/zoneinfo/../zoneinfo.default/Asia/Tokyo: any"},
       "/var/db/timezone/zoneinfo/../zoneinfo.default/Asia/Tokyo"},
      {"old style to a missing zone",
       [] { link_to("/usr/share/zoneinfo/Bogus/Zone"); },
       {"kestrel: Correcting localtime link to "
        "/var/db/timezone/zoneinfo/Bogus/Zone: any",
        kInvalid},
       kDefaultLink},
      {"into the system partition's own directory",
       [] { link_to("/usr/share/zoneinfo.default/Asia/Tokyo"); },
       {"kestrel: Correcting localtime link to "
        "/var/db/timezone/zoneinfo.default/Asia/Tokyo: any",
        kInvalid},
       kDefaultLink},
      {"missing", [] {}, {kInvalid}, kDefaultLink},
      {"foreign target",
       [] { link_to("/etc/zone"); },
       {kInvalid},
       kDefaultLink},
      {"regular file",
       [] { tree::write_file(kLocaltime, "TZif"); },
       {kNotALink, kInvalid},
       kDefaultLink},
      {"empty directory",
       [] { tree::make_dir(kLocaltime); },
       {kNotALink, kInvalid},
       kDefaultLink},
  };
  for (const auto& c : cases) {
    SetUp();
    c.before();
    captured_stderr err;
    repair_localtime_link();
    EXPECT_TRUE(same_lines(err.text(), c.lines)) << c.name;
    EXPECT_EQ(tree::link_target(kLocaltime), c.link) << c.name;
  }
}

// The one failure that leaves the phase, and so main: the process aborts.
TEST_F(repair_localtime_link_test,
       non_empty_directory_raises_out_of_the_default_link) {
  tree::write_file(std::string(kLocaltime) + "/Europe/Paris", "TZif");
  captured_stderr err;
  EXPECT_EQ(raised_by([] { repair_localtime_link(); }), EEXIST);
  EXPECT_TRUE(same_lines(
      err.text(), {kNotALink, kInvalid,
                   "kestrel: create_symlink: from /var/db/timezone/localtime "
                   "to /var/db/timezone/zoneinfo/America/Los_Angeles: File "
                   "exists"}));
  EXPECT_EQ(tree::file_content(std::string(kLocaltime) + "/Europe/Paris"),
            "TZif");
}
