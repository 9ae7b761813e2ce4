#include "data/set_fault.h"

#include <dirent.h>

#include <cerrno>
#include <cstring>

#include "data/device_state.h"
#include "dataset/version_grammar.h"
#include "fs/first_word.h"

namespace {

std::string name_of(const std::string& set_path) {
  return set_path.substr(set_path.rfind('/') + 1);
}

// Why icutz/ cannot be listed; empty when it can.
std::string unreadable(const std::string& dir) {
  DIR* listing = opendir(dir.c_str());
  if (listing == nullptr) {
    return std::strerror(errno);
  }
  (void)closedir(listing);
  return {};
}

}  // namespace

std::string set_fault(const std::string& set_path) {
  if (!match_version(name_of(set_path))) {
    return "its name is not a version";
  }
  if (fs::read_first_word(set_path + "/zoneinfo/+VERSION").empty()) {
    return "no zoneinfo/+VERSION";
  }
  const std::string icu_trouble = unreadable(set_path + "/icutz");
  if (!icu_trouble.empty()) {
    return "icutz/ cannot be read: " + icu_trouble;
  }
  if (schema_of_set(set_path).empty()) {
    return "no ICU data file icutzNNx.dat in icutz/";
  }
  return {};
}
