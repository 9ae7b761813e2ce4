#ifndef KESTREL_ZONEINFO64_NEGATIVE_SAVES_H_
#define KESTREL_ZONEINFO64_NEGATIVE_SAVES_H_

#include <string>
#include <string_view>

// Rewrites zic input in main form, where a saving may be negative (Ireland's
// winter, Morocco's Ramadan, Namibia 1994-2017, Czechoslovakia's winter of
// 1946-47), into input with none that gives every instant the same total
// offset and abbreviation; zic and the converter both read the result, so
// zoneinfo and ICU agree on when daylight time is in effect.
//
// A zone line with a fixed negative saving takes it into its standard
// offset. A zone line following rules with negative savings is cut at the
// first transition to one and at the transition after the last: between the
// two its standard offset is lowered by the most negative saving, and it
// follows a copy of the rules named NAME_SECONDS whose savings are all raised
// by those seconds, so that the negative savings become standard time and
// the others daylight time. A "STD/DST" abbreviation is swapped there.
// Text without negative savings comes back unchanged. Throws
// std::runtime_error for text it cannot read, or where a "STD/DST"
// abbreviation would have to name three savings.
std::string fold_negative_saves(std::string_view text);

#endif  // KESTREL_ZONEINFO64_NEGATIVE_SAVES_H_
