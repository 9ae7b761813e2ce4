#include "dataset/kal_zoneinfo.h"

#include "fs/fs.h"
#include "fs/paths.h"
#include "fs/warn.h"

namespace {

// The file at the top of every zoneinfo directory naming its release.
constexpr char kVersionFile[] = "+VERSION";

// A staged data set keeps its zone files in its own "zoneinfo" directory.
std::string zoneinfo_dir_of(const std::string& dataset_path) {
  if (dataset_path.empty()) {
    return paths::kSystemZoneinfo;
  }
  return dataset_path + "/zoneinfo";
}

}  // namespace

kal_zoneinfo::kal_zoneinfo() : kal_zoneinfo(std::string()) {}

kal_zoneinfo::kal_zoneinfo(const std::string& dataset_path)
    : kal_dataset_component(dataset_path),
      zoneinfo_dir(zoneinfo_dir_of(dataset_path)),
      version_file(zoneinfo_dir + "/" + kVersionFile) {}

std::string kal_zoneinfo::version() const { return version_file.first_word(); }

bool kal_zoneinfo::compatible_schema(
    const kal_dataset_component& /*other*/) const {
  return true;
}

void kal_zoneinfo::make_current() const {
  // symlink never overwrites, so the old link goes first; if it cannot, the
  // creation below fails and reports why.
  try {
    fs::remove(paths::kZoneinfoLink);
  } catch (...) {
    warn("Unlink of zoneinfo softlink failed");
  }
  fs::create_symlink(zoneinfo_dir, paths::kZoneinfoLink);
}
