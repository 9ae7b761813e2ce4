// Data sets whose zoneinfo64.res the project's converter makes from the
// release itself, with the CLDR resources of ICU's published files or of
// the system's ICU: each verifies with no disagreement, every zone name
// from 1900 to 2100, and its icutz/origin.txt says where each part came
// from. Debian's tzdata.zi (main form, negative savings) is one of them.

#include <cstdio>
#include <string>

#include "data/child_process.h"
#include "gtest/gtest.h"
#include "scratch_dir.h"
#include "tree.h"

namespace {

const std::string kReleases = KESTREL_TEST_RELEASES;

struct converted_case {
  const char* release;
  const char* source;  // under tests/data/tz-releases
  const char* cldr;  // ICU's resources of this release, or "" for the system's
  const char* cldr_origin;
};

constexpr converted_case kCases[] = {
    {"2026c", "tzdata2026c.tar.gz", "", "the system ICU's own data (icudt"},
    {"2026a", "tzdata2026a.tar.gz", "2026a", "ICU resources copied from "},
    {"2026f", "../tzdata-debian", "2026a", "ICU resources copied from "},
};

// The probe's report lines, shown with the test's output.
std::string counts(const std::string& output) {
  const std::size_t start = output.find("ICU tz version");
  return output.substr(start, output.find("built") - start);
}

TEST(converted_release_test, a_set_with_converted_icu_data_verifies) {
  for (const converted_case& c : kCases) {
    SCOPED_TRACE(c.release);
    const scratch_dir dir;
    std::vector<std::string> argv = {KESTREL_DATA_BINARY, "build"};
    if (*c.cldr != '\0') {
      argv.insert(argv.end(), {"--cldr", kReleases + "/icu/" + c.cldr + "/le"});
    }
    argv.insert(argv.end(), {kReleases + "/" + c.source, dir / "set"});
    child_process data(argv);
    data.capture = true;
    ASSERT_EQ(data.run(), 0) << data.output;
    std::printf("%s:\n%s", c.release, counts(data.output).c_str());
    EXPECT_NE(data.output.find(std::string("ICU tz version: ") + c.release +
                               " (release " + c.release + ")"),
              std::string::npos);
    EXPECT_NE(data.output.find("zones: 598\n"), std::string::npos);
    EXPECT_NE(data.output.find("disagreements: 0\n"), std::string::npos);
    EXPECT_NE(data.output.find("unresolved system IDs: 0\n"),
              std::string::npos);
    const std::string origin = tree::file_content(dir / "set/icutz/origin.txt");
    EXPECT_NE(origin.find(std::string("zoneinfo64.res: converted from tz "
                                      "release ") +
                          c.release),
              std::string::npos)
        << origin;
    EXPECT_NE(origin.find(c.cldr_origin), std::string::npos) << origin;
    EXPECT_TRUE(tree::present(dir / "set/icutz/icutz44l.dat"));
    EXPECT_TRUE(tree::present(dir / "set/icutz/windowsZones.res"));
  }
}

}  // namespace
