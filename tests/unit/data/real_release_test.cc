// Real tz releases and ICU's published resources, from tests/data: each
// release ICU published verifies against its own resources with no
// disagreement, and a newer release with older resources is refused,
// naming the zones that differ.

#include <string>

#include "data/child_process.h"
#include "gtest/gtest.h"
#include "scratch_dir.h"
#include "tree.h"

namespace {

const std::string kReleases = KESTREL_TEST_RELEASES;

child_process build(const std::string& release, const std::string& icu,
                    const std::string& out) {
  child_process data({KESTREL_DATA_BINARY, "build", "--icu",
                      kReleases + "/icu/" + icu + "/le",
                      kReleases + "/tzdata" + release + ".tar.gz", out});
  data.capture = true;
  return data;
}

TEST(real_release_test, each_published_release_verifies_with_its_own_resources) {
  for (const char* release : {"2024a", "2025b", "2026a"}) {
    SCOPED_TRACE(release);
    const scratch_dir dir;
    child_process data = build(release, release, dir / "set");
    EXPECT_EQ(data.run(), 0) << data.output;
    EXPECT_NE(data.output.find("disagreements: 0\n"), std::string::npos)
        << data.output;
    EXPECT_NE(data.output.find(std::string("ICU tz version: ") + release),
              std::string::npos);
    EXPECT_EQ(tree::file_content(dir / "set/zoneinfo/+VERSION"),
              std::string(release) + "\n");
    EXPECT_TRUE(tree::present(dir / "set/icutz/icutz44l.dat"));
  }
}

TEST(real_release_test, a_release_with_older_resources_is_refused_naming_zones) {
  const scratch_dir dir;
  child_process data = build("2026c", "2026a", dir / "set");
  EXPECT_NE(data.run(), 0);
  for (const char* zone : {"Africa/Casablanca", "America/Edmonton",
                           "America/Vancouver"}) {
    EXPECT_NE(data.output.find(std::string("disagreement: ") + zone),
              std::string::npos)
        << data.output;
  }
  EXPECT_NE(data.output.find("ICU tz version: 2026a (release 2026c)"),
            std::string::npos);
  // Nothing is left: neither the set nor its temporary beside it.
  EXPECT_FALSE(tree::present(dir / "set"));
}

}  // namespace
