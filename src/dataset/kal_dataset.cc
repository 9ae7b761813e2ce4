#include "dataset/kal_dataset.h"

#include <cstddef>
#include <stdexcept>

#include "dataset/kal_icu.h"
#include "dataset/kal_zoneinfo.h"
#include "fs/paths.h"
#include "fs/warn.h"

namespace {

// The system partition records only its release, such as 2019c; its data
// counts as minor 1, subminor 0 of that release.
constexpr char kSystemVersionSuffix[] = ".1.0";

}  // namespace

kal_dataset::kal_dataset() { create_components(); }

kal_dataset::kal_dataset(const std::string& path) : path(path) {
  create_components();
}

bool kal_dataset::compatible(const kal_dataset& other) const {
  std::size_t i = 0;
  for (; i < components.size() && i < other.components.size(); ++i) {
    if (!components[i]->compatible_schema(*other.components[i])) {
      return false;
    }
  }
  return i == components.size() && i == other.components.size();
}

bool kal_dataset::operator>(const kal_dataset& other) const {
  return version > other.version;
}

bool kal_dataset::operator==(const kal_dataset& other) const {
  return path == other.path;
}

void kal_dataset::make_current() const {
  for (const auto& component : components) {
    component->make_current();
  }
}

std::string kal_dataset::get_version_string() const { return version_string; }

void kal_dataset::reset_to_system() { kal_dataset().make_current(); }

// Each component is handed to a shared_ptr of its own type at once: the
// component interface has no virtual destructor, so that pointer's deleter is
// what runs the right one.
void kal_dataset::create_components() {
  const std::shared_ptr<kal_zoneinfo> zoneinfo(new kal_zoneinfo(path));
  if (path.empty()) {
    version_string = zoneinfo->version() + kSystemVersionSuffix;
  } else if (paths::is_staged(path)) {
    // The rest of the path is the version string. A deeper path or a
    // trailing slash stays in the text, for the version parse to refuse.
    version_string = path.substr(paths::kStagedPrefix.size());
  } else {
    warn("kal_dataset::create_components: bad path %s", path.c_str());
    throw std::invalid_argument("badpath");
  }
  version.parse(version_string);
  components.push_back(zoneinfo);
  components.push_back(std::shared_ptr<kal_icu>(new kal_icu(path)));
}
