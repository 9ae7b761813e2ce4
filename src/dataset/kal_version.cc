#include "dataset/kal_version.h"

#include <stdexcept>
#include <string_view>
#include <tuple>

#include "dataset/version_grammar.h"
#include "fs/warn.h"

namespace {

// A number in the version string, converted as std::stoi does: leading zeros
// are fine, and one beyond 32 bits raises std::out_of_range out of parse.
std::int32_t number(std::string_view digits) {
  return std::stoi(std::string(digits));
}

// A number after the letters that the version string leaves out. It is -1 so
// that 2019c counts as older than 2019c.0, and 2019c.1 as older than
// 2019c.1.0.
std::int32_t optional_number(std::string_view digits) {
  return digits.empty() ? -1 : number(digits);
}

}  // namespace

kal_version::kal_version(const std::string& text) { parse(text); }

void kal_version::parse(const std::string& text) {
  const std::optional<version_parts> parts = match_version(text);
  if (!parts) {
    // A failed match keeps no results, hence their count of 0.
    warn("Cannot parse version string %s, results.size() = 0", text.c_str());
    warn("Cannot parse version string %s", text.c_str());
    *this = kal_version();
    return;
  }
  major = number(parts->major);
  letters = parts->letters;
  minor = optional_number(parts->minor);
  subminor = optional_number(parts->subminor);
}

bool kal_version::operator>(const kal_version& other) const {
  // Letters compare as strings, byte by byte, so 2019z is newer than 2019ab.
  return std::tie(major, letters, minor, subminor) >
         std::tie(other.major, other.letters, other.minor, other.subminor);
}

bool kal_version::operator==(const kal_version& other) const {
  return std::tie(major, letters, minor, subminor) ==
         std::tie(other.major, other.letters, other.minor, other.subminor);
}
