#include "data/zone_names.h"

#include <fstream>
#include <sstream>
#include <stdexcept>

std::vector<std::string> zone_and_link_names(std::istream& zi) {
  std::vector<std::string> names;
  std::string line;
  while (std::getline(zi, line)) {
    std::istringstream fields(line);
    std::string kind;
    std::string name;
    fields >> kind >> name;
    // zic takes any unambiguous abbreviation of "Zone" and "Link".
    const bool zone = !kind.empty() && std::string("Zone").starts_with(kind);
    const bool link = !kind.empty() && std::string("Link").starts_with(kind);
    if (link) {
      fields >> name;
    }
    if ((zone || link) && !name.empty()) {
      names.push_back(name);
    }
  }
  return names;
}

std::vector<std::string> zone_and_link_names(const std::string& path) {
  std::ifstream in(path);
  if (!in) {
    throw std::runtime_error("cannot read " + path);
  }
  return zone_and_link_names(in);
}
