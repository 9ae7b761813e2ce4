#include <cerrno>
#include <cstring>
#include <string>

#include "captured_stderr.h"
#include "dataset/kal_version.h"
#include "gtest/gtest.h"

namespace {

std::string warning(const std::string& message) {
  return "kestrel: " + message + ": " + std::strerror(EAGAIN) + "\n";
}

}  // namespace

// Far beyond what a recursive matcher's stack can take, as a system
// "+VERSION" word followed by ".1.0" can be.
TEST(kal_version, text_of_100000_characters_gives_default_and_two_warnings) {
  for (const std::string& text :
       {std::string(100000, 'a') + ".1.0", std::string(100000, '9') + ".1.0",
        "2019c" + std::string(100000, '.') + ".1.0"}) {
    captured_stderr err;
    errno = EAGAIN;
    const kal_version version(text);
    EXPECT_TRUE(version == kal_version());
    EXPECT_TRUE(err.text() ==
                warning("Cannot parse version string " + text +
                        ", results.size() = 0") +
                    warning("Cannot parse version string " + text));
  }
}

TEST(kal_version, long_letters_and_zero_padded_numbers_parse) {
  const std::string letters(100000, 'q');
  const std::string zeros(100000, '0');
  const kal_version version(zeros + "7" + letters + "." + zeros + "1.0");
  EXPECT_EQ(version.major, 7);
  EXPECT_EQ(version.letters, letters);
  EXPECT_EQ(version.minor, 1);
  EXPECT_EQ(version.subminor, 0);
}

TEST(kal_version, long_number_is_out_of_range) {
  EXPECT_THROW(kal_version(std::string(100000, '9') + "c.1.0"),
               std::out_of_range);
}
