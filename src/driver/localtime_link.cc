#include "driver/localtime_link.h"

#include <cstdio>
#include <string>
#include <string_view>

#include "fs/fs.h"
#include "fs/paths.h"
#include "fs/warn.h"

namespace {

// Where the zone files used to be read directly, before the data link.
constexpr std::string_view kOldZoneinfo = "/usr/share/zoneinfo";
constexpr char kDefaultZone[] = "America/Los_Angeles";

// Keeps, rewrites or refuses the link; refusal is an int -1.
void keep_or_correct() {
  std::string target = fs::read_symlink(paths::kLocaltimeLink);
  // Bare prefix tests: what follows the prefix is not looked at.
  if (target.starts_with(paths::kZoneinfoLink)) {
    return;
  }
  if (!target.starts_with(kOldZoneinfo)) {
    throw -1;
  }
  target.replace(0, kOldZoneinfo.size(), paths::kZoneinfoLink);
  warn("Correcting localtime link to %s", target.c_str());
  // Reached through the data link, so the zone must be in the current data.
  if (!fs::exists(target)) {
    throw -1;
  }
  (void)std::remove(paths::kLocaltimeLink);
  fs::create_symlink(target, paths::kLocaltimeLink);
}

}  // namespace

void repair_localtime_link() {
  try {
    keep_or_correct();
  } catch (...) {
    warn("localtime link invalid; resetting to %s", kDefaultZone);
    (void)std::remove(paths::kLocaltimeLink);
    fs::create_symlink(std::string(paths::kZoneinfoLink) + "/" + kDefaultZone,
                       paths::kLocaltimeLink);
  }
}
