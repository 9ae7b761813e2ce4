#ifndef KESTREL_DATA_ICU_PART_H_
#define KESTREL_DATA_ICU_PART_H_

#include <string>

#include "data/release_source.h"

// Where a data set's four ICU resources come from.
struct icu_origin {
  // ICU's published resources for the release (build --icu); when empty,
  // zoneinfo64.res is converted from the release itself.
  std::string published;
  // With the converter: a directory of ICU resources holding the three
  // that come from CLDR rather than from the tz release (metaZones,
  // timezoneTypes, windowsZones; build --cldr), or empty for the system
  // ICU's own.
  std::string cldr;
};

// Makes out, a set's icutz/: the four resources, their ICU data file
// icutz44l.dat made with icupkg, and origin.txt saying where each resource
// came from. Raises std::runtime_error when a step fails.
void make_icu_part(const release_source& source, const icu_origin& origin,
                   const std::string& out);

#endif  // KESTREL_DATA_ICU_PART_H_
