#include "icuprobe/zone_comparison.h"

#include <cstdlib>
#include <string>

#include "data/child_process.h"
#include "gtest/gtest.h"
#include "icuprobe/glibc_zone.h"
#include "scratch_dir.h"
#include "tree.h"

namespace {

// Zone files compiled by zic into a scratch TZDIR, read by the C library
// and compared with the system ICU's own data.
class zone_comparison_test : public testing::Test {
 protected:
  void SetUp() override {
    (void)unsetenv("ICU_TIMEZONE_FILES_DIR");
    tree::write_file(dir / "zones",
                     "Zone Etc/GMT-3 3 - +03\n"
                     "Zone Test/Wrong 2 - +02\n"
                     "Link Test/Wrong Etc/GMT-4\n"
                     "Zone Test/Nowhere 0 - -00\n");
    ASSERT_EQ(
        child_process({"zic", "-d", dir / "zoneinfo", dir / "zones"}).run(), 0);
    (void)setenv("TZDIR", (dir / "zoneinfo").c_str(), 1);
  }
  void TearDown() override { (void)unsetenv("TZDIR"); }

  scratch_dir dir;
};

TEST_F(zone_comparison_test, glibc_reads_the_zone_under_tzdir) {
  EXPECT_EQ(glibc_zone("Etc/GMT-3").at(0), (local_offset{3 * 3600, false}));
  EXPECT_EQ(glibc_zone("Etc/GMT-4").at(0), (local_offset{2 * 3600, false}));
}

TEST_F(zone_comparison_test, counts_instants_and_disagreements) {
  const struct {
    const char* name;
    std::int64_t instants;
    std::int64_t disagreements;
    const char* first;
  } kCases[] = {
      {"Etc/GMT-3", 3, 0, ""},
      {"Etc/GMT-4", 3, 3, "at 1900-01-01T00:00:00Z ICU +04:00, glibc +02:00"},
      {"Test/Nowhere", 0, 1, "unknown to ICU"},
      {"Europe/Paris", 0, 1, "cannot read"},
  };
  for (const auto& c : kCases) {
    const zone_comparison compared(c.name, dir / "zoneinfo");
    EXPECT_EQ(compared.instants, c.instants) << c.name;
    EXPECT_EQ(compared.disagreements, c.disagreements) << c.name;
    EXPECT_EQ(compared.first.substr(0, std::string(c.first).size()), c.first)
        << c.name << ": " << compared.first;
  }
}

}  // namespace
