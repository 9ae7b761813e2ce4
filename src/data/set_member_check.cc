#include "data/set_member_check.h"

#include <vector>

namespace {

std::vector<std::string_view> components(std::string_view path) {
  std::vector<std::string_view> parts;
  std::size_t start = 0;
  while (start <= path.size()) {
    const std::size_t slash = path.find('/', start);
    const std::size_t end = slash == std::string_view::npos ? path.size() : slash;
    parts.push_back(path.substr(start, end - start));
    start = end + 1;
  }
  return parts;
}

}  // namespace

bool path_stays_inside(std::string_view path) {
  if (path.empty() || path.front() == '/') {
    return false;
  }
  for (const std::string_view part : components(path)) {
    if (part.empty() || part == "." || part == "..") {
      return false;
    }
  }
  return true;
}

bool link_stays_inside(std::string_view link_path, std::string_view target) {
  if (!path_stays_inside(link_path) || target.empty() || target.front() == '/') {
    return false;
  }
  // The depth of the link's directory below the root, then the target's
  // walk from there.
  std::ptrdiff_t depth = static_cast<std::ptrdiff_t>(components(link_path).size()) - 1;
  for (const std::string_view part : components(target)) {
    if (part == "..") {
      if (--depth < 0) {
        return false;
      }
    } else if (!part.empty() && part != ".") {
      ++depth;
    }
  }
  return true;
}
