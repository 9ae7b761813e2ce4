#include "data/tzif_file.h"

#include <stdexcept>
#include <string>
#include <vector>

#include "data/child_process.h"
#include "gtest/gtest.h"
#include "scratch_dir.h"
#include "tree.h"

namespace {

struct zone_case {
  const char* source;
  std::vector<std::int64_t> transitions;
  const char* footer;
};

// Zones compiled by this machine's zic, as kestrel-data build compiles.
const zone_case kZones[] = {
    {"Zone Test/Fixed 1:00 - +01\n", {}, "<+01>-1"},
    {"Zone Test/Once 0 - +00 2000 Jan 1 0:00u\n 2:00 - +02\n",
     {946684800},
     "<+02>-2"},
    {"Rule R 2030 max - Mar lastSun 1:00u 1:00 S\n"
     "Rule R 2030 max - Oct lastSun 1:00u 0 -\n"
     "Zone Test/Rules 0 - UTC 2030\n 1:00 R CE%sT\n",
     // 2030-01-01 into CET, then 2030-03-31 01:00 UTC into CEST: a slim
     // file keeps the transitions up to where its footer takes over.
     {1893456000, 1901149200},
     "CET-1CEST,M3.5.0,M10.5.0/3"},
};

std::string compiled(const scratch_dir& dir, const zone_case& zone) {
  tree::write_file(dir / "zones", zone.source);
  child_process zic({"zic", "-b", "slim", "-d", dir / "out", dir / "zones"});
  EXPECT_EQ(zic.run(), 0) << zone.source;
  return dir / "out";
}

TEST(tzif_file_test, reads_transitions_and_footer_of_compiled_zones) {
  for (const zone_case& zone : kZones) {
    const scratch_dir dir;
    const std::string source = zone.source;
    const std::size_t at = source.find("Test/");
    const std::string name = source.substr(at, source.find(' ', at) - at);
    const tzif_file file = read_tzif(compiled(dir, zone) + "/" + name);
    EXPECT_EQ(file.transitions, zone.transitions) << name;
    EXPECT_EQ(file.footer, zone.footer) << name;
  }
}

TEST(tzif_file_test, refuses_bytes_that_are_no_complete_tzif) {
  const scratch_dir dir;
  const std::string bytes = tree::file_content(compiled(dir, kZones[1]) + "/Test/Once");
  std::string version_one = bytes;
  version_one[4] = '\0';
  for (const std::string& bad :
       {std::string(), std::string("TZif2"), bytes.substr(0, 44),
        bytes.substr(0, bytes.size() - 3), "XXXX" + bytes.substr(4),
        version_one}) {
    EXPECT_THROW(parse_tzif(bad), std::runtime_error) << bad.size();
  }
  EXPECT_THROW(read_tzif(dir / "missing"), std::runtime_error);
}

}  // namespace
