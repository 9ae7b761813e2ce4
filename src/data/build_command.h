#ifndef KESTREL_DATA_BUILD_COMMAND_H_
#define KESTREL_DATA_BUILD_COMMAND_H_

#include <string>
#include <vector>

#include "data/icu_part.h"

// The ICU schema of every data set kestrel-data makes: ICU's time-zone
// resources in format 44, little-endian, as ICU publishes them ("44/le"),
// readable by every ICU since 4.4. A set's ICU data file carries it in its
// name, icutz44l.dat, and the system partition's icutzformat.txt names it.
inline constexpr char kIcuSchema[] = "44l";

// The four resources ICU reads from ICU_TIMEZONE_FILES_DIR.
inline constexpr const char* kIcuResources[] = {
    "zoneinfo64.res", "metaZones.res", "timezoneTypes.res", "windowsZones.res"};

// The three of them that come from CLDR, not from the tz release.
inline constexpr const char* kCldrResources[] = {
    "metaZones.res", "timezoneTypes.res", "windowsZones.res"};

// Makes the data set of a tz release in out_dir: zoneinfo/ compiled by zic,
// with +VERSION, the zone tables and tzdata.zi; icutz/ with the ICU
// resources icu names (see make_icu_part), their ICU data file and a note
// of their origin.
// The set is made beside out_dir under a temporary name and verified there;
// only a set that passes is renamed to out_dir, otherwise it is removed and
// std::runtime_error raised.
void build_set(const std::string& release, const icu_origin& icu,
               const std::string& out_dir);

// kestrel-data build [--icu DIR | --cldr DIR] RELEASE OUTDIR
int run_build(const std::vector<std::string>& args);

#endif  // KESTREL_DATA_BUILD_COMMAND_H_
