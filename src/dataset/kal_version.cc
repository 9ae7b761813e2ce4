#include "dataset/kal_version.h"

#include <regex>
#include <stdexcept>
#include <tuple>

#include "fs/warn.h"

namespace {

// A number after the letters that the version string leaves out. It is -1 so
// that 2019c counts as older than 2019c.0, and 2019c.1 as older than
// 2019c.1.0. Only a missing number is forgiven: one beyond 32 bits raises
// std::out_of_range out of parse.
std::int32_t optional_number(const std::string& digits) {
  try {
    return std::stoi(digits);
  } catch (const std::invalid_argument&) {
    return -1;
  }
}

}  // namespace

kal_version::kal_version(const std::string& text) { parse(text); }

void kal_version::parse(const std::string& text) {
  try {
    const std::regex grammar(
        R"(([0-9]+)([a-z]+)(?:\.([0-9]+))?(?:\.([0-9]+))?)");
    std::smatch results;
    if (!std::regex_match(text, results, grammar) || results.size() != 5) {
      warn("Cannot parse version string %s, results.size() = %d", text.c_str(),
           static_cast<int>(results.size()));
      throw std::invalid_argument("no match");
    }
    major = std::stoi(results[1].str());
    letters = results[2].str();
    minor = optional_number(results[3].str());
    subminor = optional_number(results[4].str());
  } catch (const std::invalid_argument&) {
    warn("Cannot parse version string %s", text.c_str());
    *this = kal_version();
  }
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
