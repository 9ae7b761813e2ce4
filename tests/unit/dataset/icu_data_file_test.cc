#include "dataset/icu_data_file.h"

#include <regex>
#include <string>

#include "generated_text.h"
#include "gtest/gtest.h"

namespace {

// The data-file name as the standard library's ECMAScript engine reads it.
const std::regex& reference() {
  static const std::regex name(R"(icutz([0-9]+[lbe])\.dat)");
  return name;
}

// The same whole-name verdict and the same capture, as text and as place.
void expect_as_reference(const std::string& name) {
  std::smatch results;
  const bool matched = std::regex_match(name, results, reference());
  const std::optional<std::string_view> schema = icu_data_file_schema(name);
  ASSERT_EQ(schema.has_value(), matched) << '"' << name << '"';
  if (matched) {
    EXPECT_EQ(*schema, results[1].str()) << name;
    EXPECT_EQ(schema->data() - name.data(), results.position(1)) << name;
  }
}

}  // namespace

TEST(icu_data_file_schema, takes_digits_and_format_letter) {
  const struct {
    const char* name;
    const char* schema;
  } cases[] = {
      {"icutz57l.dat", "57l"}, {"icutz123b.dat", "123b"},
      {"icutz7e.dat", "7e"},   {"icutz0057l.dat", "0057l"},
      {"icutz0l.dat", "0l"},
  };
  for (const auto& c : cases) {
    const std::optional<std::string_view> schema = icu_data_file_schema(c.name);
    ASSERT_TRUE(schema.has_value()) << c.name;
    EXPECT_EQ(*schema, c.schema) << c.name;
    expect_as_reference(c.name);
  }
}

TEST(icu_data_file_schema, refuses_other_names) {
  for (const char* name : {"",
                           "icutz57L.dat",
                           "icutz57.dat",
                           "icutz57l.dat.bak",
                           "old-icutz57l.dat",
                           "icutzl.dat",
                           "icutz57x.dat",
                           "icutz57l.Dat",
                           "icutz57l0dat",
                           "icutz.dat",
                           "icutz",
                           ".dat",
                           "icutz57ll.dat",
                           "icutz5l7l.dat",
                           "ICUTZ57l.dat",
                           "icutz57l.dat\n",
                           " icutz57l.dat",
                           "icutz\xd9l.dat",
                           "icutz57l/.dat",
                           "icutz57lb.dat",
                           "icutzdat"}) {
    EXPECT_FALSE(icu_data_file_schema(name).has_value()) << name;
    expect_as_reference(name);
  }
}

TEST(icu_data_file_schema, agrees_with_std_regex_on_generated_names) {
  std::vector<std::string> pieces = common_pieces();
  // The literal parts of the name come often, whole and split.
  for (const char* piece : {"icutz", "icutz", "icutz", ".dat", ".dat", ".dat",
                            "icu", "tz", "dat", "d"}) {
    pieces.emplace_back(piece);
  }
  const std::vector<std::vector<std::string>> shape = {
      {"icutz"},
      {"0", "5", "57", "123", "2147483647"},
      {"l", "b", "e"},
      {".dat"}};
  generated_text names(pieces, 57);
  int matches = 0;
  for (int i = 0; i < 40000; ++i) {
    const std::string near = names.near(shape);
    const std::string random = names.next(5);
    expect_as_reference(near);
    expect_as_reference(random);
    matches += icu_data_file_schema(near).has_value() ? 1 : 0;
    matches += icu_data_file_schema(random).has_value() ? 1 : 0;
  }
  // The names must give both verdicts often, or the comparison says little.
  EXPECT_GT(matches, 10000);
  EXPECT_LT(matches, 70000);
}

TEST(icu_data_file_schema, agrees_with_std_regex_on_long_names) {
  const std::string digits(2000, '4');
  for (const std::string& name :
       {"icutz" + digits + "l.dat", "icutz" + digits + ".dat",
        "icutz" + digits + "e.dat.dat", "icutz" + digits + "L.dat",
        "icutz" + std::string(2000, 'l') + ".dat"}) {
    expect_as_reference(name);
  }
  const std::string huge(1 << 20, '9');
  EXPECT_EQ(icu_data_file_schema("icutz" + huge + "b.dat"), huge + "b");
  EXPECT_FALSE(icu_data_file_schema("icutz" + huge + ".dat").has_value());
}
