// kestrel: reconciles the device's time-zone data links once, early at start,
// before anything reads time-zone data. Arguments are ignored.

#include <cstdio>

#include "driver/current_data.h"
#include "driver/legacy_icutz.h"
#include "driver/localtime_link.h"
#include "driver/protection.h"
#include "fs/paths.h"

// The two aborts: the outer guard's reset or the default localtime link
// fails, and its exception leaves main for std::terminate (SIGABRT).
int main() {
  protect_data_directories();
  migrate_legacy_icutz();
  // The previous run's clean-up request and the old ICU entry; the C
  // library's remove also takes an empty directory. Results do not matter.
  (void)std::remove(paths::kNeedsCleanup);
  (void)std::remove(paths::kLegacyIcu);
  select_current_data();
  repair_localtime_link();
  return 0;
}
