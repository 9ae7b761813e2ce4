// Linked with -Wl,--wrap=fts_open: every walk of an ICU directory in this
// binary fails to start, with the errno the test chooses.

#include <fts.h>

#include <cerrno>
#include <cstring>
#include <string>

#include "captured_stderr.h"
#include "clean_device.h"
#include "dataset/kal_dataset.h"
#include "dataset/kal_icu.h"
#include "gtest/gtest.h"
#include "outcome.h"
#include "tree.h"

namespace {

int walk_errno = EMFILE;
int walks = 0;
std::string walk_root;
int walk_options = 0;
bool walk_sorted = false;

class kal_icu_walk_failure : public clean_device {
 protected:
  void SetUp() override {
    clean_device::SetUp();
    walk_errno = EMFILE;
    walks = 0;
  }
};

const std::string kStaged = "/var/db/timezone/tz/2019c.1.0";
const std::string kStagedIcu = kStaged + "/icutz";

std::string walk_failure(int error) {
  return warning("ka_icu::initialize: fts_open of " + kStagedIcu + " failed, " +
                     std::strerror(error),
                 error);
}

}  // namespace

extern "C" FTS* __wrap_fts_open(char* const* roots, int options,
                                int (*compare)(const FTSENT**,
                                               const FTSENT**)) {
  ++walks;
  walk_root = roots[0] != nullptr && roots[1] == nullptr ? roots[0] : "";
  walk_options = options;
  walk_sorted = compare != nullptr;
  errno = walk_errno;
  return nullptr;
}

TEST_F(kal_icu_walk_failure, update_walk_is_asked_as_the_device_needs) {
  tree::write_file(kStagedIcu + "/icutz57l.dat", "data");
  captured_stderr err;
  EXPECT_EQ(raised_by([] { kal_icu icu(kStaged); }), EMFILE);
  EXPECT_EQ(walks, 1);
  EXPECT_EQ(walk_root, kStagedIcu);
  EXPECT_EQ(walk_options,
            FTS_COMFOLLOW | FTS_NOCHDIR | FTS_PHYSICAL | FTS_XDEV);
  EXPECT_EQ(walk_options, 0x55);
  EXPECT_FALSE(walk_sorted);
  EXPECT_EQ(err.text(), walk_failure(EMFILE));
}

TEST_F(kal_icu_walk_failure, walk_that_cannot_start_is_logged_and_raised) {
  for (const int error : {EMFILE, ENOMEM, EACCES}) {
    walk_errno = error;
    captured_stderr err;
    EXPECT_EQ(raised_by([] { kal_icu icu(kStaged); }), error);
    EXPECT_EQ(err.text(), walk_failure(error));
  }
}

TEST_F(kal_icu_walk_failure, system_partition_needs_no_walk) {
  tree::write_file("/usr/share/icu/icutzformat.txt", "57l\n");
  captured_stderr err;
  const kal_icu system;
  const kal_icu from_empty_path("");
  EXPECT_EQ(walks, 0);
  EXPECT_EQ(err.text(), "");
}

TEST_F(kal_icu_walk_failure, data_set_passes_the_failure_on) {
  tree::write_file(kStaged + "/zoneinfo/+VERSION", "2019c\n");
  walk_errno = ENFILE;
  captured_stderr err;
  EXPECT_EQ(raised_by([] { kal_dataset data_set(kStaged); }), ENFILE);
  EXPECT_EQ(err.text(), walk_failure(ENFILE));
}
