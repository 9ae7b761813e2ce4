#include "data/verify_command.h"

#include <functional>
#include <string>

#include "data/child_process.h"
#include "gtest/gtest.h"
#include "scratch_dir.h"
#include "tree.h"

namespace {

const std::string kSet = KESTREL_TEST_SET_2026A;

// kestrel-data verify over a copy of the 2026a set, changed as each case
// says: the gate passes the set as built and nothing else.
TEST(verify_command_test, passes_the_built_set_and_refuses_every_change) {
  const struct {
    const char* name;
    std::function<void(const std::string&)> change;
    int status;
    const char* says;
  } kCases[] = {
      {"as built", [](const std::string&) {}, 0, "disagreements: 0\n"},
      {"corrupt zoneinfo64.res",
       [](const std::string& set) {
         const std::string path = set + "/icutz/zoneinfo64.res";
         tree::write_file(path,
                          std::string(tree::file_content(path).size(), 'x'));
       },
       1, "unknown to ICU"},
      {"zoneinfo64.res missing: ICU's own 2022e data",
       [](const std::string& set) {
         ASSERT_EQ(std::remove((set + "/icutz/zoneinfo64.res").c_str()), 0);
       },
       1, "ICU tz version: 2022e (release 2026a)"},
      {"a zone file of another zone",
       [](const std::string& set) {
         tree::write_file(
             set + "/zoneinfo/Europe/Paris",
             tree::file_content(set + "/zoneinfo/America/New_York"));
       },
       1, "disagreement: Europe/Paris: "},
      {"another release named",
       [](const std::string& set) {
         tree::write_file(set + "/zoneinfo/+VERSION", "2026b\n");
       },
       1, "ICU tz version: 2026a (release 2026b)"},
  };
  for (const auto& c : kCases) {
    SCOPED_TRACE(c.name);
    const scratch_dir dir;
    ASSERT_EQ(child_process({"cp", "-R", kSet, dir / "set"}).run(), 0);
    c.change(dir / "set");
    child_process verify({KESTREL_DATA_BINARY, "verify", dir / "set"});
    verify.capture = true;
    EXPECT_EQ(verify.run(), c.status);
    EXPECT_NE(verify.output.find(c.says), std::string::npos) << verify.output;
    EXPECT_NE(verify.output.find("zones: 598\n"), std::string::npos);
  }
}

}  // namespace
