#ifndef KESTREL_ZONEINFO64_ZONE_COMPILER_H_
#define KESTREL_ZONEINFO64_ZONE_COMPILER_H_

#include <vector>

#include "zoneinfo64/compiled_zone.h"
#include "zoneinfo64/tz_source.h"

// Expands a zone's lines and the rules they name into transitions as zic
// does (the offset in force at each line's start is that of the rule that
// last took effect before it; an until time is read with the offsets in
// force just before it; a transition that would not move the local clock
// forward replaces the one before it), keeping raw offset and saving apart.
// Where the last line follows two rules for ever, the transitions stop at
// the end of the first year those two rules give alone, and the rest is the
// final rule. Throws std::runtime_error for a rule set that does not exist.
compiled_zone compile_zone(const tz_source& source,
                           const std::vector<tz_era>& eras);

#endif  // KESTREL_ZONEINFO64_ZONE_COMPILER_H_
