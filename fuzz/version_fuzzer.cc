// The hand-written version matcher against the grammar as a regular
// expression, and the version order's laws over generated versions.

#include <fuzzer/FuzzedDataProvider.h>

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <optional>
#include <regex>
#include <string>
#include <string_view>

#include "dataset/kal_version.h"
#include "dataset/version_grammar.h"

namespace {

// std::regex recurses once per character: beyond this it could overflow
// the stack itself, so longer texts are only run through match_version.
constexpr std::size_t kRegexLimit = 1024;

void check(bool holds) {
  if (!holds) {
    std::abort();
  }
}

// The piece a capture group took, and where: empty and unplaced when the
// group did not take part.
void check_piece(std::string_view text, std::string_view piece,
                 const std::csub_match& group) {
  if (!group.matched) {
    check(piece.empty());
    return;
  }
  check(piece == std::string_view(group.first, group.second));
  check(piece.data() == text.data() + (group.first - text.data()));
}

void check_match(std::string_view text) {
  const std::optional<version_parts> parts = match_version(text);
  if (text.size() > kRegexLimit) {
    return;
  }
  static const std::regex grammar(
      R"(([0-9]+)([a-z]+)(?:\.([0-9]+))?(?:\.([0-9]+))?)");
  std::cmatch results;
  const bool matched = std::regex_match(text.data(), text.data() + text.size(),
                                        results, grammar);
  check(matched == parts.has_value());
  if (matched) {
    check_piece(text, parts->major, results[1]);
    check_piece(text, parts->letters, results[2]);
    check_piece(text, parts->minor, results[3]);
    check_piece(text, parts->subminor, results[4]);
  }
}

// Versions drawn from a few values per field, so that equal fields, prefixes
// among the letters and absent numbers (-1) all come up often.
kal_version generated_version(FuzzedDataProvider& data) {
  kal_version version;
  version.major = data.ConsumeIntegralInRange<std::int32_t>(-1, 2);
  version.letters =
      data.ConsumeBytesAsString(data.ConsumeIntegralInRange(0, 3));
  version.minor = data.ConsumeIntegralInRange<std::int32_t>(-1, 2);
  version.subminor = data.ConsumeIntegralInRange<std::int32_t>(-1, 2);
  return version;
}

void check_order(FuzzedDataProvider& data) {
  const kal_version a = generated_version(data);
  const kal_version b = generated_version(data);
  const kal_version c = generated_version(data);
  check(!(a > a) && a == a);
  check(!(a > b && b > a));
  check(!(a > b && b > c) || a > c);
  check((a == b) == (!(a > b) && !(b > a)));
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* bytes,
                                      std::size_t size) {
  check_match({reinterpret_cast<const char*>(bytes), size});
  FuzzedDataProvider data(bytes, size);
  check_order(data);
  return 0;
}
