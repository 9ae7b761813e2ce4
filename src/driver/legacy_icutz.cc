#include "driver/legacy_icutz.h"

#include "fs/fs.h"
#include "fs/paths.h"
#include "fs/warn.h"

void migrate_legacy_icutz() {
  if (fs::exists(paths::kLegacyIcutzLink) && !fs::exists(paths::kIcutzLink)) {
    try {
      fs::create_symlink(fs::read_symlink(paths::kLegacyIcutzLink),
                         paths::kIcutzLink);
    } catch (...) {
      warn("Could not migrate /var/db/icutz to /var/db/timezone/icutz");
    }
  }
  if (fs::exists(paths::kLegacyIcutzLink)) {
    try {
      fs::remove(paths::kLegacyIcutzLink);
    } catch (...) {
      warn("Could not remove /var/db/icutz");
    }
  }
}
