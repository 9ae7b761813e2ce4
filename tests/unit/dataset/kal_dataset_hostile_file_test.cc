// Data sets built over files that are not what the device expects: version
// words far longer than any release name, and FIFOs where a word is read.

#include <sys/stat.h>

#include <cerrno>
#include <cstring>
#include <string>

#include "captured_stderr.h"
#include "clean_device.h"
#include "dataset/kal_dataset.h"
#include "dataset/kal_icu.h"
#include "dataset/kal_zoneinfo.h"
#include "deadline.h"
#include "gtest/gtest.h"
#include "outcome.h"
#include "tree.h"

namespace {

class hostile_file_on_device : public clean_device {};

const std::string kSystemVersion = "/usr/share/zoneinfo.default/+VERSION";
const std::string kFormatFile = "/usr/share/icu/icutzformat.txt";
const std::string kStaged = "/var/db/timezone/tz/2020a.1.0";
const std::string kStagedVersion = kStaged + "/zoneinfo/+VERSION";

void make_fifo(const std::string& path) {
  tree::make_dir(path.substr(0, path.rfind('/')));
  ASSERT_EQ(mkfifo(path.c_str(), 0644), 0) << std::strerror(errno);
}

// The system data set built over a "+VERSION" word: its version string, and
// exactly the two warnings of a text that is not a version.
void expect_unversioned_system(const std::string& word) {
  tree::write_file(kSystemVersion, word + "\n");
  tree::write_file(kFormatFile, "57l\n");
  captured_stderr err;
  errno = EAGAIN;
  const kal_dataset system;
  const std::string text = word + ".1.0";
  EXPECT_EQ(system.version_string, text);
  EXPECT_TRUE(system.version == kal_version());
  EXPECT_EQ(system.components.size(), 2U);
  EXPECT_TRUE(
      err.text() ==
      warning("Cannot parse version string " + text + ", results.size() = 0",
              EAGAIN) +
          warning("Cannot parse version string " + text, EAGAIN))
      << "warnings of " << err.text().size() << " bytes";
}

}  // namespace

TEST_F(hostile_file_on_device, long_system_word_gives_the_two_warnings) {
  expect_unversioned_system(std::string(100000, 'a'));
  expect_unversioned_system(std::string(100000, '7'));
  expect_unversioned_system("2019c" + std::string(100000, '.'));
}

TEST_F(hostile_file_on_device, system_word_of_1_mib_gives_both_warnings_whole) {
  expect_unversioned_system(std::string(1 << 20, 'z'));
}

TEST_F(hostile_file_on_device, long_release_letters_are_a_version) {
  const std::string letters(100000, 'c');
  tree::write_file(kSystemVersion, "2019" + letters + "\n");
  captured_stderr err;
  const kal_dataset system;
  EXPECT_EQ(system.version.major, 2019);
  EXPECT_EQ(system.version.letters, letters);
  EXPECT_EQ(system.version.minor, 1);
  EXPECT_EQ(system.version.subminor, 0);
  EXPECT_EQ(err.text(), "");
}

TEST_F(hostile_file_on_device, fifo_version_file_gives_an_empty_version) {
  make_fifo(kSystemVersion);
  make_fifo(kStagedVersion);
  const deadline guard;
  captured_stderr err;
  EXPECT_EQ(kal_zoneinfo().version(), "");
  EXPECT_EQ(kal_zoneinfo(kStaged).version(), "");
  EXPECT_EQ(err.text(), "");
}

TEST_F(hostile_file_on_device, fifo_version_file_leaves_system_unversioned) {
  make_fifo(kSystemVersion);
  const deadline guard;
  captured_stderr err;
  errno = EAGAIN;
  const kal_dataset system;
  EXPECT_EQ(system.version_string, ".1.0");
  EXPECT_TRUE(system.version == kal_version());
  EXPECT_EQ(
      err.text(),
      warning("Cannot parse version string .1.0, results.size() = 0", EAGAIN) +
          warning("Cannot parse version string .1.0", EAGAIN));
}

TEST_F(hostile_file_on_device, fifo_format_file_gives_an_empty_schema) {
  make_fifo(kFormatFile);
  const deadline guard;
  captured_stderr err;
  const kal_icu system;
  EXPECT_EQ(err.text(), "");
  tree::clear("/usr/share");
  tree::write_file(kFormatFile, "");
  EXPECT_TRUE(system.compatible_schema(kal_icu()));
}

TEST_F(hostile_file_on_device, staged_version_file_is_never_waited_on) {
  tree::write_file(kSystemVersion, "2019c\n");
  tree::write_file(kStaged + "/icutz/icutz57l.dat", "data");
  make_fifo(kStagedVersion);
  const deadline guard;
  captured_stderr err;
  const kal_dataset staged(kStaged);
  EXPECT_EQ(staged.version_string, "2020a.1.0");
  EXPECT_EQ(err.text(), "");
}
