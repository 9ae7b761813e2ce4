#include "dataset/version_grammar.h"

#include <cstddef>

namespace {

bool is_digit(char c) { return c >= '0' && c <= '9'; }
bool is_letter(char c) { return c >= 'a' && c <= 'z'; }

// Takes the longest run at the front of rest whose bytes all pass the test.
template <typename Test>
std::string_view take_run(std::string_view& rest, Test test) {
  std::size_t length = 0;
  while (length < rest.size() && test(rest[length])) {
    ++length;
  }
  const std::string_view run = rest.substr(0, length);
  rest.remove_prefix(length);
  return run;
}

// A "." and at least one digit; the digits, or nothing if rest does not
// start that way. A dot that no digit follows can never end a match.
std::optional<std::string_view> take_dotted_number(std::string_view& rest) {
  if (!rest.starts_with('.')) {
    return std::nullopt;
  }
  rest.remove_prefix(1);
  const std::string_view digits = take_run(rest, is_digit);
  if (digits.empty()) {
    return std::nullopt;
  }
  return digits;
}

}  // namespace

// Digits and letters are disjoint and every piece is followed by a byte that
// cannot continue it, so the longest run of each piece is the only one that
// can lead to a full match: no backtracking is ever needed.
std::optional<version_parts> match_version(std::string_view text) {
  std::string_view rest = text;
  version_parts parts;
  parts.major = take_run(rest, is_digit);
  parts.letters = take_run(rest, is_letter);
  if (parts.major.empty() || parts.letters.empty()) {
    return std::nullopt;
  }
  for (std::string_view* number : {&parts.minor, &parts.subminor}) {
    if (rest.empty()) {
      return parts;
    }
    const std::optional<std::string_view> digits = take_dotted_number(rest);
    if (!digits) {
      return std::nullopt;
    }
    *number = *digits;
  }
  if (!rest.empty()) {
    return std::nullopt;
  }
  return parts;
}
