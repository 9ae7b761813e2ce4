// The zone files kestrel-data compiles from a release's main form (negative
// savings folded by the project's own code) against those zic compiles from
// the release's rearguard form (made by the release's own ziguard.awk):
// glibc must give the same total offset and abbreviation for every zone and
// link, at every instant check_instants picks from either file, 1900-2100.

#include <time.h>

#include <cstdio>
#include <cstdlib>
#include <set>
#include <string>
#include <vector>

#include "data/check_instants.h"
#include "data/child_process.h"
#include "data/release_source.h"
#include "data/tzif_file.h"
#include "data/zone_names.h"
#include "gtest/gtest.h"
#include "scratch_dir.h"
#include "tree.h"

namespace {

const std::string kReleases = KESTREL_TEST_RELEASES;

// The data files of a release in the order of its Makefile.
constexpr const char* kDataFiles[] = {
    "africa",       "antarctica",   "asia",     "australasia", "europe",
    "northamerica", "southamerica", "etcetera", "factory",     "backward"};

struct local_time {
  long offset;
  std::string abbreviation;
  int dst;
};

// What glibc says of the zone file at path at each instant.
std::vector<local_time> glibc_view(const std::string& path,
                                   const std::vector<std::int64_t>& instants) {
  setenv("TZ", (":" + path).c_str(), 1);
  tzset();
  std::vector<local_time> view;
  for (const std::int64_t instant : instants) {
    const time_t t = instant;
    struct tm local {};
    localtime_r(&t, &local);
    view.push_back({local.tm_gmtoff, local.tm_zone, local.tm_isdst});
  }
  return view;
}

void zic(const std::string& text, const std::string& dir) {
  tree::write_file(dir + ".zi", text);
  ASSERT_EQ((child_process{{"zic", "-d", dir, dir + ".zi"}}.run()), 0);
}

TEST(main_form_test, folded_main_form_gives_glibc_the_rearguard_offsets) {
  const struct {
    const char* release;
    int zones;  // zones and links
  } kReleaseCases[] = {
      {"2024a", 597}, {"2025b", 598}, {"2026a", 598}, {"2026c", 598}};
  for (const auto& [release, zone_count] : kReleaseCases) {
    SCOPED_TRACE(release);
    const scratch_dir dir;
    const release_source rearguard(kReleases + "/tzdata" + release + ".tar.gz");
    // The main form, as a distribution's tzdata.zi holds it.
    std::vector<std::string> awk = {"awk", "-v", "DATAFORM=main", "-f",
                                    rearguard.file("ziguard.awk")};
    for (const char* file : kDataFiles) awk.push_back(rearguard.file(file));
    child_process main_form(awk);
    main_form.capture = true;
    ASSERT_EQ(main_form.run(), 0);
    tree::write_file(
        dir / "main/tzdata.zi",
        std::string("# version ") + release + "\n" + main_form.output);
    tree::write_file(dir / "main/zone.tab", "");
    const release_source folded(dir / "main");
    zic(folded.text().zic_text, dir / "new");
    zic(rearguard.text().zic_text, dir / "old");
    int zones = 0;
    int instants = 0;
    int disagreements = 0;
    int dst_differences = 0;
    std::set<std::string> dst_zones;
    for (const std::string& name : zone_and_link_names(dir / "new.zi")) {
      const std::string old_file = dir / ("old/" + name);
      const std::string new_file = dir / ("new/" + name);
      std::vector<std::int64_t> at = check_instants(read_tzif(old_file));
      const auto more = check_instants(read_tzif(new_file));
      at.insert(at.end(), more.begin(), more.end());
      const auto before = glibc_view(old_file, at);
      const auto after = glibc_view(new_file, at);
      ++zones;
      for (std::size_t i = 0; i < at.size(); ++i) {
        ++instants;
        if (before[i].offset != after[i].offset ||
            before[i].abbreviation != after[i].abbreviation) {
          ++disagreements;
          ADD_FAILURE() << name << " at " << at[i] << ": "
                        << before[i].abbreviation << " " << before[i].offset
                        << " against " << after[i].abbreviation << " "
                        << after[i].offset;
        }
        if (before[i].dst != after[i].dst) {
          ++dst_differences;
          dst_zones.insert(name);
        }
      }
    }
    unsetenv("TZ");
    std::printf(
        "%s: zones %d, instants %d, disagreements %d, daylight flag "
        "differing %d, in",
        release, zones, instants, disagreements, dst_differences);
    for (const std::string& name : dst_zones) std::printf(" %s", name.c_str());
    std::printf("\n");
    EXPECT_EQ(zones, zone_count);
    EXPECT_EQ(disagreements, 0);
  }
}

}  // namespace
