#ifndef KESTREL_DATA_STAGE_COMMAND_H_
#define KESTREL_DATA_STAGE_COMMAND_H_

#include <string>
#include <vector>

#include "data/set_image.h"

// Installs a data set on this device as /var/db/timezone/tz/RELEASE.1.N and
// points tz_latest at it, for kestrel to adopt at the next start. Refuses,
// changing nothing, a set kestrel would not adopt, a second staging at the
// same time and a disk too small for it; the set is written and verified in
// a scratch directory under /var/db/timezone/tz, made durable and renamed
// into place before tz_latest is re-pointed, a new link renamed over the
// old. The links kestrel owns (zoneinfo, icutz, localtime) are never
// touched. Returns the new set's directory; a refusal raises
// std::runtime_error.
std::string stage_set(const set_image& image);

// kestrel-data stage SETDIR|ARCHIVE
int run_stage(const std::vector<std::string>& args);

#endif  // KESTREL_DATA_STAGE_COMMAND_H_
