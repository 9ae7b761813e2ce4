#ifndef KESTREL_FS_PATHS_H_
#define KESTREL_FS_PATHS_H_

#include <string_view>

// The fixed places of the device's time-zone data. There is no configuration:
// every reader on the device finds the data through these same links.
namespace paths {

// The directories that hold the links and the staged data sets, spelled with
// the trailing slash under which they get their protection class.
inline constexpr char kTimezoneDir[] = "/var/db/timezone/";
inline constexpr char kStagedDir[] = "/var/db/timezone/tz/";
// The same, for measuring and slicing paths inside it.
inline constexpr std::string_view kStagedPrefix = kStagedDir;

// The links every other program reads the data through.
inline constexpr char kZoneinfoLink[] = "/var/db/timezone/zoneinfo";
inline constexpr char kIcutzLink[] = "/var/db/timezone/icutz";
inline constexpr char kLocaltimeLink[] = "/var/db/timezone/localtime";

// The link to the directory of the latest staged update.
inline constexpr char kLatestLink[] = "/var/db/timezone/tz_latest";

// The record of the last version change and the clean-up marker.
inline constexpr char kVersionRecord[] = "/var/db/timezone/TZVersionDiffRecord";
inline constexpr char kNeedsCleanup[] = "/var/db/timezone/needs_cleanup";

// Entries of older layouts.
inline constexpr char kLegacyIcutzLink[] = "/var/db/icutz";
inline constexpr char kLegacyIcu[] = "/var/db/icu";

// The system partition's own data.
inline constexpr char kSystemZoneinfo[] = "/usr/share/zoneinfo.default";
inline constexpr char kSystemIcu[] = "/usr/share/icu";

// Whether path names something inside the staged directory: its prefix and
// at least one byte more. Nothing else about the path is checked.
inline bool is_staged(std::string_view path) {
  return path.size() > kStagedPrefix.size() && path.starts_with(kStagedPrefix);
}

}  // namespace paths

#endif  // KESTREL_FS_PATHS_H_
