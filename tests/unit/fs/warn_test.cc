#include "fs/warn.h"

#include <cerrno>
#include <string>
#include <string_view>

#include "captured_stderr.h"
#include "gtest/gtest.h"

TEST(warn, writes_name_message_and_errno_text) {
  captured_stderr err;
  errno = ENOENT;
  warn("Bad zoneinfo link %s", "/x");
  EXPECT_EQ(err.text(),
            "kestrel: Bad zoneinfo link /x: No such file or directory\n");
}

TEST(warn, uses_whatever_errno_holds) {
  captured_stderr err;
  errno = 0;
  warn("Symlink points at data incompatible with installed system");
  EXPECT_EQ(err.text(),
            "kestrel: Symlink points at data incompatible with installed "
            "system: Success\n");
}

TEST(warn, leaves_errno_as_it_was) {
  captured_stderr err;
  errno = EEXIST;
  warn("message");
  EXPECT_EQ(errno, EEXIST);
}

TEST(warn, prints_an_empty_argument_as_nothing) {
  captured_stderr err;
  errno = ENOENT;
  warn("Bad zoneinfo link %s", "");
  EXPECT_EQ(err.text(),
            "kestrel: Bad zoneinfo link : No such file or directory\n");
}

namespace {

std::string sunk;

void keep(std::string_view line) { sunk += line; }

}  // namespace

TEST(warn, a_sink_takes_the_lines_in_place_of_standard_error) {
  captured_stderr err;
  sunk.clear();
  EXPECT_EQ(set_warn_sink(keep), nullptr);
  errno = ENOENT;
  warn("Bad zoneinfo link %s", "/x");
  EXPECT_EQ(errno, ENOENT);
  EXPECT_EQ(set_warn_sink(nullptr), keep);
  warn("after");
  EXPECT_EQ(sunk, "kestrel: Bad zoneinfo link /x: No such file or directory\n");
  EXPECT_EQ(err.text(), "kestrel: after: No such file or directory\n");
}
