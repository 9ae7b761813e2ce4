#include "driver/protection.h"

#include <fcntl.h>

#include <cerrno>

#include "captured_stderr.h"
#include "clean_device.h"
#include "gtest/gtest.h"
#include "tree.h"

namespace {

class protect_data_directories_test : public clean_device {};

}  // namespace

TEST_F(protect_data_directories_test,
       missing_directories_stay_missing_silently) {
  tree::clear("/var/db");
  captured_stderr err;
  protect_data_directories();
  EXPECT_EQ(err.text(), "");
  EXPECT_FALSE(tree::present("/var/db/timezone"));
}

TEST_F(protect_data_directories_test, missing_staged_directory_stays_missing) {
  captured_stderr err;
  protect_data_directories();
  EXPECT_EQ(err.text(), "");
  EXPECT_FALSE(tree::present("/var/db/timezone/tz"));
}

TEST_F(protect_data_directories_test,
       existing_directories_are_left_as_they_are) {
  tree::make_dir("/var/db/timezone/tz", 0700);
  tree::write_file("/var/db/timezone/tz/kept", "data");
  captured_stderr err;
  protect_data_directories();
  EXPECT_EQ(err.text(), "");
  EXPECT_EQ(tree::file_content("/var/db/timezone/tz/kept"), "data");
}

#ifndef F_SETPROTECTIONCLASS
// Without protection classes the step makes no call: a missing directory
// leaves no error behind for a later warning to report.
TEST_F(protect_data_directories_test,
       makes_no_call_without_protection_classes) {
  tree::clear("/var/db");
  errno = EINTR;
  protect_data_directories();
  EXPECT_EQ(errno, EINTR);
}
#endif
