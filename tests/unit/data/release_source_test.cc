#include "data/release_source.h"

#include <stdexcept>
#include <string>

#include "data/zone_names.h"
#include "gtest/gtest.h"
#include "scratch_dir.h"
#include "tree.h"

namespace {

const std::string kReleases = KESTREL_TEST_RELEASES;

TEST(release_source_test, release_names) {
  const struct {
    const char* text;
    bool release;
  } kNames[] = {{"2026a", true},  {"1996zz", true}, {"2026", false},
                {"2026A", false}, {"202a", false},  {"2026a.1.0", false},
                {"", false},      {"x2026a", false}};
  for (const auto& n : kNames) {
    EXPECT_EQ(is_release_name(n.text), n.release) << n.text;
  }
}

TEST(release_source_test, a_tarball_gives_its_version_and_tzdata_zi) {
  const scratch_dir dir;
  const release_source source(kReleases + "/tzdata2026a.tar.gz");
  EXPECT_EQ(source.version(), "2026a");
  const std::string text = source.text().zic_text;
  EXPECT_EQ(text.substr(0, 16), "# version 2026a\n");
  tree::write_file(dir / "tzdata.zi", text);
  EXPECT_EQ(zone_and_link_names(dir / "tzdata.zi").size(), 598U);
  // Rearguard form: Europe/Dublin without negative daylight saving.
  EXPECT_NE(text.find("0:00\tGB-Eire\tGMT/IST\t1996"), std::string::npos);
  EXPECT_EQ(text.find("\n\t\t\t 1:00\tEire\tIST/GMT"), std::string::npos);
}

TEST(release_source_test, a_distributions_tzdata_zi_gives_its_version) {
  const release_source source(kReleases + "/../tzdata-debian");
  EXPECT_EQ(source.version(), "2026f");
  const std::string text = source.text().zic_text;
  EXPECT_EQ(text.substr(0, 16), "# version 2026f\n");
  // Main form, its negative savings folded: Namibia's rules (NA) have a
  // copy with every saving an hour higher.
  EXPECT_NE(text.find("Rule\tNA_3600\t1994\to\t-\tMar\t21\t0\t0\tWAT"),
            std::string::npos);
}

TEST(release_source_test, a_directory_is_copied_not_written_to) {
  const scratch_dir dir;
  tree::write_file(dir / "release/version", "2031q\n");
  tree::write_file(dir / "release/tzdata.zi", "Z X 0 - X\n");
  tree::write_file(dir / "release/zone.tab", "");
  const release_source source(dir / "release");
  EXPECT_EQ(source.version(), "2031q");
  tree::write_file(source.file("version"), "changed\n");
  EXPECT_EQ(tree::file_content(dir / "release/version"), "2031q\n");
}

TEST(release_source_test, refuses_what_is_no_release) {
  const scratch_dir dir;
  tree::write_file(dir / "bad/version", "unknown\n");
  EXPECT_THROW(release_source(dir / "bad").version(), std::runtime_error);
  tree::make_dir(dir / "empty");
  EXPECT_THROW(release_source(dir / "empty").version(), std::runtime_error);
  EXPECT_THROW(release_source(dir / "empty").text(), std::runtime_error);
  EXPECT_THROW(release_source{dir / "missing"}, std::runtime_error);
  tree::write_file(dir / "not.tar.gz", "not a tarball");
  EXPECT_THROW(release_source{dir / "not.tar.gz"}, std::runtime_error);
}

}  // namespace
