#include "data/child_process.h"

#include <cstdlib>
#include <stdexcept>
#include <string>

#include "gtest/gtest.h"
#include "scratch_dir.h"

namespace {

TEST(child_process_test, runs_a_program_and_gives_its_exit_status) {
  const struct {
    std::vector<std::string> argv;
    int status;
  } kCases[] = {{{"true"}, 0}, {{"false"}, 1}, {{"sh", "-c", "exit 7"}, 7}};
  for (const auto& c : kCases) {
    EXPECT_EQ(child_process(c.argv).run(), c.status) << c.argv.back();
  }
}

TEST(child_process_test, feeds_input_captures_output_and_sets_the_scene) {
  const scratch_dir dir;
  (void)setenv("KESTREL_TEST_UNSET_ME", "here", 1);
  child_process child({"sh", "-c",
                       "cat; echo \"[$KESTREL_TEST_SET_ME]"
                       "[${KESTREL_TEST_UNSET_ME-unset}]\"; pwd"});
  child.input = "from stdin\n";
  child.capture = true;
  child.environment = {{"KESTREL_TEST_SET_ME", "set"},
                       {"KESTREL_TEST_UNSET_ME", ""}};
  child.directory = dir.path();
  EXPECT_EQ(child.run(), 0);
  EXPECT_EQ(child.output, "from stdin\n[set][unset]\n" + dir.path() + "\n");
  // The environment is changed in the child only.
  EXPECT_STREQ(std::getenv("KESTREL_TEST_UNSET_ME"), "here");
}

TEST(child_process_test, a_program_that_cannot_run_or_dies_raises) {
  EXPECT_THROW(child_process({"/nonexistent/program"}).run(),
               std::runtime_error);
  EXPECT_THROW(child_process({"sh", "-c", "kill -KILL $$"}).run(),
               std::runtime_error);
}

}  // namespace
