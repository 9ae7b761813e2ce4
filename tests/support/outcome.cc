#include "outcome.h"

#include <cstring>
#include <string_view>

namespace {

// The errno text of a line that ends in ": any" is any of them.
constexpr std::string_view kAnyErrno = ": any";
constexpr std::string_view kAny = "any";
// Past the last errno number of Linux.
constexpr int kErrnoCount = 134;

bool same_line(std::string_view actual, std::string_view expected) {
  if (!expected.ends_with(kAnyErrno)) {
    return actual == expected;
  }
  expected.remove_suffix(kAny.size());
  if (!actual.starts_with(expected)) {
    return false;
  }
  actual.remove_prefix(expected.size());
  for (int error = 0; error < kErrnoCount; ++error) {
    if (actual == std::strerror(error)) {
      return true;
    }
  }
  return false;
}

}  // namespace

std::string warning(const std::string& message, int error) {
  return "kestrel: " + message + ": " + std::strerror(error) + "\n";
}

testing::AssertionResult same_lines(const std::string& text,
                                    const std::vector<std::string>& lines) {
  std::string expected;
  for (const std::string& line : lines) {
    expected += line + "\n";
  }
  std::string_view rest = text;
  for (const std::string& line : lines) {
    const std::size_t end = rest.find('\n');
    if (end == std::string_view::npos ||
        !same_line(rest.substr(0, end), line)) {
      return testing::AssertionFailure() << "lines:\n"
                                         << text << "expected:\n"
                                         << expected;
    }
    rest.remove_prefix(end + 1);
  }
  if (!rest.empty()) {
    return testing::AssertionFailure() << "lines:\n"
                                       << text << "expected:\n"
                                       << expected;
  }
  return testing::AssertionSuccess();
}
