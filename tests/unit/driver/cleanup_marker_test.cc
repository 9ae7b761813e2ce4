#include "driver/cleanup_marker.h"

#include <fcntl.h>
#include <sys/stat.h>

#include <cerrno>
#include <string>

#include "captured_stderr.h"
#include "clean_device.h"
#include "gtest/gtest.h"
#include "outcome.h"
#include "tree.h"

namespace {

constexpr char kMarker[] = "/var/db/timezone/needs_cleanup";

class touch_needs_cleanup_test : public clean_device {
 protected:
  void SetUp() override {
    clean_device::SetUp();
    umask(022);
  }
};

struct stat status_of(const char* path) {
  struct stat status {};
  EXPECT_EQ(lstat(path, &status), 0) << path;
  return status;
}

}  // namespace

TEST_F(touch_needs_cleanup_test,
       creates_an_empty_marker_with_mode_0666_less_umask) {
  captured_stderr err;
  touch_needs_cleanup();
  EXPECT_EQ(err.text(), "");
  const struct stat status = status_of(kMarker);
  EXPECT_TRUE(S_ISREG(status.st_mode));
  EXPECT_EQ(status.st_mode & 07777, 0644u);
  EXPECT_EQ(status.st_size, 0);
}

TEST_F(touch_needs_cleanup_test,
       keeps_content_and_times_of_an_existing_marker) {
  tree::write_file(kMarker, "kept\n", 0600);
  const struct timespec old_times[2] = {{1000000000, 0}, {1000000000, 0}};
  ASSERT_EQ(utimensat(AT_FDCWD, kMarker, old_times, 0), 0);
  captured_stderr err;
  touch_needs_cleanup();
  EXPECT_EQ(err.text(), "");
  const struct stat status = status_of(kMarker);
  EXPECT_EQ(status.st_mtim.tv_sec, 1000000000);
  EXPECT_EQ(status.st_atim.tv_sec, 1000000000);
  EXPECT_EQ(status.st_mode & 07777, 0600u);
  EXPECT_EQ(tree::file_content(kMarker), "kept\n");
}

TEST_F(touch_needs_cleanup_test,
       missing_timezone_directory_warns_and_creates_nothing) {
  tree::clear("/var/db");
  captured_stderr err;
  touch_needs_cleanup();
  EXPECT_EQ(err.text(),
            warning("Cannot touch file " + std::string(kMarker), ENOENT));
  EXPECT_FALSE(tree::present("/var/db/timezone"));
}

TEST_F(touch_needs_cleanup_test, directory_in_the_way_warns) {
  tree::make_dir(kMarker);
  captured_stderr err;
  touch_needs_cleanup();
  EXPECT_EQ(err.text(),
            warning("Cannot touch file " + std::string(kMarker), EISDIR));
}
