#include "zoneinfo64/release_reader.h"

#include <gtest/gtest.h>

#include <fstream>
#include <stdexcept>
#include <string>

#include "scratch_dir.h"

namespace {

void write(const std::string& path, const std::string& text) {
  std::ofstream(path) << text;
}

// A stand-in for a release's ziguard.awk that marks what it read, so that
// the test sees the script run over the data files in the Makefile's order.
constexpr const char* kZiguard =
    "FNR == 1 { print \"# \" FILENAME } { print } END { print \"# form \" "
    "DATAFORM }\n";

TEST(release_reader, iana_release_gives_its_rearguard_form_through_ziguard) {
  const scratch_dir release;
  for (const char* file :
       {"africa", "antarctica", "asia", "australasia", "europe", "northamerica",
        "southamerica", "etcetera", "factory", "backward"}) {
    write(release / file, std::string("Zone ") + file + " 0 - X\n");
  }
  write(release / "ziguard.awk", kZiguard);
  write(release / "zone.tab", "XX\t+00+000\tafrica\n");
  write(release / "version", "2099z\n");
  const release_text text = read_release(release.path());
  EXPECT_EQ(text.version, "2099z");
  EXPECT_EQ(text.zone_tab, "XX\t+00+000\tafrica\n");
  EXPECT_NE(
      text.zic_text.find("Zone africa 0 - X\n# " + (release / "antarctica")),
      std::string::npos);
  EXPECT_NE(
      text.zic_text.find("Zone factory 0 - X\n# " + (release / "backward")),
      std::string::npos);
  EXPECT_TRUE(text.zic_text.ends_with("# form rearguard\n"));
}

TEST(release_reader, single_tzdata_zi_is_read_with_its_version_line) {
  const scratch_dir release;
  write(release / "tzdata.zi", "# version 2026f\nZ A 0 - X\n");
  write(release / "zone.tab", "");
  const release_text text = read_release(release.path());
  EXPECT_EQ(text.version, "2026f");
  EXPECT_EQ(text.zic_text, "# version 2026f\nZ A 0 - X\n");
}

struct broken_case {
  const char* what;
  const char* file;
  const char* text;
  const char* message;
};

TEST(release_reader, incomplete_release_is_refused_with_what_is_missing) {
  const broken_case cases[] = {
      {"no zone.tab", "tzdata.zi", "Z A 0 - X\n", "zone.tab"},
      {"no data", "zone.tab", "",
       "holds neither ziguard.awk with the data files nor tzdata.zi"},
      {"no version", "tzdata.zi", "Z A 0 - X\n", "no release version"},
      {"ziguard without data files", "ziguard.awk", "{ print }\n",
       "ziguard.awk failed"},
  };
  for (const auto& c : cases) {
    const scratch_dir release;
    write(release / c.file, c.text);
    if (std::string(c.what) != "no zone.tab") write(release / "zone.tab", "");
    try {
      read_release(release.path());
      ADD_FAILURE() << c.what;
    } catch (const std::runtime_error& error) {
      EXPECT_NE(std::string(error.what()).find(c.message), std::string::npos)
          << c.what << ": " << error.what();
    }
  }
}

}  // namespace
