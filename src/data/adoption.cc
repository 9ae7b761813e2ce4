#include "data/adoption.h"

#include "data/muted_warnings.h"
#include "dataset/kal_dataset.h"
#include "dataset/kal_version.h"
#include "driver/current_data.h"
#include "fs/first_word.h"
#include "fs/paths.h"

namespace {

// The set the links designate, as kestrel takes it: the system partition's
// when the link cannot be read.
kal_dataset designated_set() {
  try {
    return kal_dataset(current_dataset_path());
  } catch (...) {
    return kal_dataset();
  }
}

// A version's release alone, major number and letters, comparable by
// kal_version's order.
kal_version release_part(const kal_version& version) {
  kal_version release = version;
  release.minor = 0;
  release.subminor = 0;
  return release;
}

}  // namespace

verdict kestrel_would_adopt(const std::string& set_path) {
  try {
    const kal_dataset system;
    const kal_dataset update(set_path);
    const kal_dataset designated = designated_set();
    if (!update.compatible(system)) {
      return {false, "ICU schema is not the system partition's"};
    }
    if (!(update > designated)) {
      return {false, "not newer than " + designated.get_version_string()};
    }
    return {true, "newer than " + designated.get_version_string()};
  } catch (...) {
    return {false, "unreadable"};
  }
}

verdict may_stage(const std::string& release, const std::string& schema) {
  const muted_warnings quiet;
  const std::string system_schema =
      fs::read_first_word(std::string(paths::kSystemIcu) + "/icutzformat.txt");
  if (schema != system_schema) {
    return {false, "its ICU schema \"" + schema +
                       "\" is not the system partition's \"" + system_schema +
                       "\""};
  }
  const kal_version candidate = release_part(kal_version(release + ".1.0"));
  const kal_dataset system;
  const kal_dataset designated = designated_set();
  if (!(candidate > release_part(system.version))) {
    return {false, "release " + release + " is not newer than " +
                       system.get_version_string() +
                       " of the system partition"};
  }
  // A re-release of the designated set's release is staged under the next
  // N of that release, which kestrel takes as newer.
  if (release_part(designated.version) > candidate) {
    return {false, "release " + release + " is older than " +
                       designated.get_version_string() +
                       ", the set the links designate"};
  }
  return {true,
          "release " + release +
              (candidate > release_part(designated.version) ? " is newer than "
                                                            : " re-releases ") +
              designated.get_version_string()};
}
