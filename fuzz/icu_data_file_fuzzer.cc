// The hand-written ICU data-file name match against the pattern as a
// regular expression.

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <optional>
#include <regex>
#include <string>
#include <string_view>

#include "dataset/icu_data_file.h"

namespace {

// std::regex recurses once per character; longer names are only run
// through the hand-written match.
constexpr std::size_t kRegexLimit = 1024;

void check(bool holds) {
  if (!holds) {
    std::abort();
  }
}

}  // namespace

// The first byte chooses whether the name starts with "icutz", so that the
// digits, the letter and the ending are where the search spends its time.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* bytes,
                                      std::size_t size) {
  if (size == 0) {
    return 0;
  }
  const std::string name =
      std::string(bytes[0] % 2 == 0 ? "icutz" : "") +
      std::string(reinterpret_cast<const char*>(bytes + 1), size - 1);
  const std::optional<std::string_view> schema = icu_data_file_schema(name);
  if (name.size() > kRegexLimit) {
    return 0;
  }
  static const std::regex pattern(R"(icutz([0-9]+[lbe])\.dat)");
  std::smatch results;
  const bool matched = std::regex_match(name, results, pattern);
  check(matched == schema.has_value());
  if (matched) {
    check(*schema == results[1].str());
    check(schema->data() == name.data() + results.position(1));
  }
  return 0;
}
