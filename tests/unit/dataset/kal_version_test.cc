#include "dataset/kal_version.h"

#include <cerrno>
#include <cstring>
#include <stdexcept>
#include <string>

#include "captured_stderr.h"
#include "gtest/gtest.h"

namespace {

// errno as the parse finds it; its text ends every warning line, stale.
constexpr int kStaleErrno = EAGAIN;

std::string warning(const std::string& message) {
  return "kestrel: " + message + ": " + std::strerror(kStaleErrno) + "\n";
}

// Both lines of a text that is not a version.
std::string unparsable(const std::string& text) {
  return warning("Cannot parse version string " + text +
                 ", results.size() = 0") +
         warning("Cannot parse version string " + text);
}

struct fields {
  int major;
  std::string letters;
  int minor;
  int subminor;
};

void expect_fields(const kal_version& version, const fields& expected,
                   const std::string& text) {
  EXPECT_EQ(version.major, expected.major) << text;
  EXPECT_EQ(version.letters, expected.letters) << text;
  EXPECT_EQ(version.minor, expected.minor) << text;
  EXPECT_EQ(version.subminor, expected.subminor) << text;
}

const fields kDefault = {-1, "", -1, -1};

}  // namespace

TEST(kal_version, default_value_is_all_absent) {
  expect_fields(kal_version(), kDefault, "default");
}

TEST(kal_version, parses_versions_silently) {
  const struct {
    const char* text;
    fields expected;
  } cases[] = {
      {"2019c.1.0", {2019, "c", 1, 0}},
      {"2019c", {2019, "c", -1, -1}},
      {"2019c.1", {2019, "c", 1, -1}},
      {"2020ab.12.3", {2020, "ab", 12, 3}},
      {"0002019c.01.00", {2019, "c", 1, 0}},
      {"2147483647z.2147483647.2147483647",
       {2147483647, "z", 2147483647, 2147483647}},
  };
  for (const auto& c : cases) {
    captured_stderr err;
    expect_fields(kal_version(c.text), c.expected, c.text);
    EXPECT_EQ(err.text(), "") << c.text;
  }
}

TEST(kal_version, non_versions_give_default_value_and_two_warnings) {
  const char* const texts[] = {
      "2019C.1.0", "2019c.1.0/", "2019c.1.0\n", "2019c.1.0.5", "2019",
      "c.1.0",     "",           " 2019c.1.0",  "2019c..0",    "2019c.1.",
      "-2019c",    "2019c1.0",   ".1.0",
  };
  for (const char* text : texts) {
    captured_stderr err;
    errno = kStaleErrno;
    const kal_version version(text);
    expect_fields(version, kDefault, text);
    EXPECT_EQ(err.text(), unparsable(text)) << text;
  }
}

TEST(kal_version, rejects_upper_case_letters) {
  captured_stderr err;
  errno = kStaleErrno;
  const kal_version version("2019C");
  expect_fields(version, kDefault, "2019C");
  EXPECT_EQ(err.text(), unparsable("2019C"));
}

TEST(kal_version, failed_parse_overwrites_earlier_fields) {
  kal_version version("2019c.1.0");
  captured_stderr err;
  errno = kStaleErrno;
  version.parse("2019c.1.0/");
  expect_fields(version, kDefault, "2019c.1.0/");
  EXPECT_EQ(err.text(), unparsable("2019c.1.0/"));
}

TEST(kal_version, parse_overwrites_absent_numbers) {
  kal_version version("2020ab.12.3");
  version.parse("2019c");
  expect_fields(version, {2019, "c", -1, -1}, "2019c");
}

TEST(kal_version, number_beyond_32_bits_raises_and_keeps_earlier_fields) {
  const struct {
    const char* text;
    fields expected;
  } cases[] = {
      {"2147483648c.1.0", {7, "q", 8, 9}},
      {"2019c.99999999999.0", {2019, "c", 8, 9}},
      {"2019c.4294967296.0", {2019, "c", 8, 9}},
      {"2019c.1.2147483648", {2019, "c", 1, 9}},
  };
  for (const auto& c : cases) {
    kal_version version("7q.8.9");
    captured_stderr err;
    EXPECT_THROW(version.parse(c.text), std::out_of_range) << c.text;
    expect_fields(version, c.expected, c.text);
    EXPECT_EQ(err.text(), "") << c.text;
  }
}

TEST(kal_version, constructor_raises_for_a_number_beyond_32_bits) {
  EXPECT_THROW(kal_version("2019c.1.99999999999"), std::out_of_range);
}

TEST(kal_version, equal_versions_are_not_greater) {
  const kal_version a("2019c.1.0");
  const kal_version b("2019c.1.0");
  EXPECT_TRUE(a == b);
  EXPECT_FALSE(a > b);
  EXPECT_FALSE(b > a);
}

TEST(kal_version, orders_by_major_letters_minor_subminor) {
  const struct {
    const char* newer;
    const char* older;
  } cases[] = {
      {"2019d.1.0", "2019c.9.9"},  {"2020a", "2019z.9.9"},
      {"2019c.1.1", "2019c.1.0"},  {"2019c.1.0", "2019c.1"},
      {"2019c.1", "2019c"},        {"2019c.0", "2019c"},
      {"2019ca", "2019c"},         {"2019z", "2019ab"},
      {"2019ab", "2019a"},         {"2019c.10.0", "2019c.9.9"},
      {"2019c.1.10", "2019c.1.9"}, {"10a", "9z"},
  };
  for (const auto& c : cases) {
    const kal_version newer(c.newer);
    const kal_version older(c.older);
    EXPECT_TRUE(newer > older) << c.newer << " > " << c.older;
    EXPECT_FALSE(older > newer) << c.older << " > " << c.newer;
    EXPECT_FALSE(newer == older) << c.newer << " == " << c.older;
  }
}

TEST(kal_version, default_is_not_greater_than_default) {
  EXPECT_FALSE(kal_version() > kal_version());
  EXPECT_TRUE(kal_version() == kal_version());
}

TEST(kal_version, unparsable_equals_default) {
  captured_stderr err;
  EXPECT_TRUE(kal_version("2019C") == kal_version());
  EXPECT_FALSE(kal_version("2019C") > kal_version(""));
}

TEST(kal_version, every_parsed_version_is_greater_than_default) {
  for (const char* text : {"0a", "2019c", "2019c.1.0", "0a.0.0"}) {
    EXPECT_TRUE(kal_version(text) > kal_version()) << text;
    EXPECT_FALSE(kal_version() > kal_version(text)) << text;
  }
}

TEST(kal_version, equality_needs_every_field) {
  const kal_version base("2019c.1.0");
  for (const char* text : {"2018c.1.0", "2019d.1.0", "2019cc.1.0", "2019c.2.0",
                           "2019c.1.1", "2019c.1", "2019c"}) {
    EXPECT_FALSE(base == kal_version(text)) << text;
  }
  EXPECT_TRUE(base == kal_version("02019c.01.0"));
}
