#include "dataset/icu_data_file.h"

#include <algorithm>

namespace {

constexpr std::string_view kPrefix = "icutz";
constexpr std::string_view kSuffix = ".dat";
constexpr std::string_view kFormatLetters = "lbe";
// At least one digit and the format letter.
constexpr std::size_t kShortestSchema = 2;

bool is_digit(char c) { return c >= '0' && c <= '9'; }

}  // namespace

std::optional<std::string_view> icu_data_file_schema(std::string_view name) {
  if (name.size() < kPrefix.size() + kShortestSchema + kSuffix.size() ||
      !name.starts_with(kPrefix) || !name.ends_with(kSuffix)) {
    return std::nullopt;
  }
  const std::string_view schema = name.substr(
      kPrefix.size(), name.size() - kPrefix.size() - kSuffix.size());
  const std::string_view digits = schema.substr(0, schema.size() - 1);
  if (kFormatLetters.find(schema.back()) == std::string_view::npos ||
      !std::all_of(digits.begin(), digits.end(), is_digit)) {
    return std::nullopt;
  }
  return schema;
}
