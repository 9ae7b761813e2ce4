#include "dataset/version_grammar.h"

#include <regex>
#include <string>

#include "generated_text.h"
#include "gtest/gtest.h"

namespace {

// The grammar as the standard library's ECMAScript engine reads it.
const std::regex& reference() {
  static const std::regex grammar(
      R"(([0-9]+)([a-z]+)(?:\.([0-9]+))?(?:\.([0-9]+))?)");
  return grammar;
}

// The same whole-string verdict and the same four captures, as text and as
// place in text; a group that took no part is empty.
void expect_as_reference(const std::string& text) {
  std::smatch results;
  const bool matched = std::regex_match(text, results, reference());
  const std::optional<version_parts> parts = match_version(text);
  ASSERT_EQ(parts.has_value(), matched) << '"' << text << '"';
  if (!matched) {
    return;
  }
  const std::string_view got[] = {parts->major, parts->letters, parts->minor,
                                  parts->subminor};
  for (int group = 1; group <= 4; ++group) {
    const std::string_view piece = got[group - 1];
    EXPECT_EQ(piece, results[group].str()) << text << " group " << group;
    if (results[group].matched) {
      EXPECT_EQ(piece.data() - text.data(), results.position(group))
          << text << " group " << group;
    }
  }
}

std::string of_parts(const version_parts& parts) {
  return std::string(parts.major) + "|" + std::string(parts.letters) + "|" +
         std::string(parts.minor) + "|" + std::string(parts.subminor);
}

}  // namespace

TEST(match_version, splits_versions_into_their_pieces) {
  const struct {
    const char* text;
    const char* parts;
  } cases[] = {
      {"2019c.1.0", "2019|c|1|0"},
      {"2019c", "2019|c||"},
      {"2019c.1", "2019|c|1|"},
      {"2020ab.12.3", "2020|ab|12|3"},
      {"0002019c.01.00", "0002019|c|01|00"},
      {"0a", "0|a||"},
      {"1z.99999999999", "1|z|99999999999|"},
  };
  for (const auto& c : cases) {
    const std::optional<version_parts> parts = match_version(c.text);
    ASSERT_TRUE(parts.has_value()) << c.text;
    EXPECT_EQ(of_parts(*parts), c.parts) << c.text;
    expect_as_reference(c.text);
  }
}

TEST(match_version, refuses_what_is_not_a_whole_version) {
  for (const char* text :
       {"", "2019C.1.0", "2019c.1.0/", "2019c.1.0\n", "2019c.1.0.5", "2019",
        "c.1.0", " 2019c.1.0", "2019c..0", "2019c.1.", "-2019c", "2019c1.0",
        ".1.0", "2019c.", "2019c.a", "2019\xe9", "2019c.1.0 ", "2019c.+1"}) {
    EXPECT_FALSE(match_version(text).has_value()) << text;
    expect_as_reference(text);
  }
}

TEST(match_version, agrees_with_std_regex_on_generated_texts) {
  const std::vector<std::string> numbers = {"0",    "1",   "9",
                                            "2019", "007", "2147483647"};
  const std::vector<std::string> letters = {"a", "c", "z", "ab", "l", "e"};
  const std::vector<std::vector<std::string>> shape = {
      numbers, letters, {"."}, numbers, {"."}, numbers};
  generated_text texts(common_pieces(), 2019);
  int matches = 0;
  for (int i = 0; i < 40000; ++i) {
    const std::string near = texts.near(shape);
    const std::string random = texts.next(8);
    expect_as_reference(near);
    expect_as_reference(random);
    matches += match_version(near).has_value() ? 1 : 0;
    matches += match_version(random).has_value() ? 1 : 0;
  }
  // The texts must give both verdicts often, or the comparison says little.
  EXPECT_GT(matches, 10000);
  EXPECT_LT(matches, 70000);
}

TEST(match_version, agrees_with_std_regex_on_long_texts) {
  generated_text texts(common_pieces(), 7);
  for (int i = 0; i < 200; ++i) {
    expect_as_reference(texts.next(400));
  }
  const std::string digits(1500, '7');
  const std::string letters(1500, 'q');
  for (const std::string& text :
       {digits + "c.1.0", "1" + letters + ".2.3", digits + letters,
        digits + "c." + digits + "." + digits, digits, letters,
        digits + "c.1.0.", digits + "C"}) {
    expect_as_reference(text);
  }
}

// Far beyond what a recursive matcher's stack can take: the verdict is still
// given, in one pass.
TEST(match_version, judges_texts_of_any_length) {
  const std::string digits(1 << 20, '5');
  const std::string letters(1 << 20, 'k');
  const std::string version = digits + letters + "." + digits + "." + digits;
  const std::optional<version_parts> parts = match_version(version);
  ASSERT_TRUE(parts.has_value());
  EXPECT_EQ(parts->major, digits);
  EXPECT_EQ(parts->letters, letters);
  EXPECT_EQ(parts->minor, digits);
  EXPECT_EQ(parts->subminor, digits);
  for (const std::string& text :
       {digits, letters, digits + letters + ".", digits + letters + "/",
        std::string(1 << 20, '.'), std::string(100000, 'a') + ".1.0"}) {
    EXPECT_FALSE(match_version(text).has_value()) << text.size();
  }
}
