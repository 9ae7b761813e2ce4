#include "driver/current_data.h"

#include <fcntl.h>
#include <unistd.h>

#include <string_view>

#include "dataset/kal_dataset.h"
#include "driver/cleanup_marker.h"
#include "fs/fs.h"
#include "fs/paths.h"
#include "fs/warn.h"

namespace {

// Readable and writable by all, less the process's umask.
constexpr mode_t kRecordMode = 0666;

// A link that cannot be read or mapped is reset to the system partition at
// once, and the reconciliation goes on with the system's data.
std::string designated_dataset_path() {
  try {
    return current_dataset_path();
  } catch (...) {
    warn("Invalid current symlinks; resetting to system partition");
    kal_dataset::reset_to_system();
    return {};
  }
}

// The data set that was current before an update and the update itself, as
// "<old version string>_<new version string>", with no line end. Created or
// truncated as fopen's mode "w" does; a failure is neither tested nor
// reported, and what could not be written stays unwritten.
void write_version_record(const kal_dataset& before, const kal_dataset& now) {
  const std::string record =
      before.get_version_string() + "_" + now.get_version_string();
  const int fd = open(paths::kVersionRecord,
                      O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, kRecordMode);
  if (fd < 0) {
    return;
  }
  std::string_view rest = record;
  while (!rest.empty()) {
    const ssize_t written = write(fd, rest.data(), rest.size());
    if (written <= 0) {
      break;
    }
    rest.remove_prefix(static_cast<std::size_t>(written));
  }
  (void)close(fd);
}

void reconcile() {
  const kal_dataset system;
  const std::string latest = read_latest_update();
  const kal_dataset cur(designated_dataset_path());

  // Compatibility first, then age: data older than the system partition's
  // own is abandoned as well.
  const kal_dataset* selected = &cur;
  if (!cur.compatible(system) || system > cur) {
    warn("Symlink points at data incompatible with installed system");
    kal_dataset::reset_to_system();
    touch_needs_cleanup();
    selected = &system;
  }
  if (latest.empty()) {
    return;
  }

  // The update is weighed against the data set the link designated, even
  // when that one has just been abandoned for the system partition's.
  const kal_dataset update(latest);
  if (!update.compatible(system) || !(update > cur)) {
    warn("New update not compatible or older version: %s vs. %s",
         update.get_version_string().c_str(), cur.get_version_string().c_str());
    return;
  }
  update.make_current();
  if (!(*selected == system)) {
    touch_needs_cleanup();
  }
  write_version_record(*selected, update);
}

}  // namespace

std::string read_latest_update() {
  return fs::read_symlink(paths::kLatestLink);
}

std::string current_dataset_path() {
  return dataset_path_from_link(fs::read_symlink(paths::kZoneinfoLink));
}

std::string dataset_path_from_link(const std::string& link_target) {
  if (paths::is_staged(link_target)) {
    // The data-set directory is everything before the last "/", which must
    // come after at least one byte of the version string.
    const std::size_t last_slash = link_target.rfind('/');
    if (last_slash != std::string::npos &&
        last_slash > paths::kStagedPrefix.size()) {
      return link_target.substr(0, last_slash);
    }
  } else if (link_target == paths::kSystemZoneinfo) {
    return {};
  }
  warn("Bad zoneinfo link %s", link_target.c_str());
  throw -1;
}

void select_current_data() {
  try {
    reconcile();
  } catch (...) {
    warn("Unable to locate data; resetting to system partition");
    kal_dataset::reset_to_system();
  }
}
