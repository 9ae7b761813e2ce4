#ifndef KESTREL_ICUPROBE_PROBE_CHECK_H_
#define KESTREL_ICUPROBE_PROBE_CHECK_H_

#include <string>

// The whole check of one data set: ICU's data version against release, every
// zone and link of zoneinfo/tzdata.zi compared with the C library reading
// zoneinfo, and every ID on standard input resolved. Prints the counts and
// names what differs on standard output; true when nothing differs.
bool run_probe_check(const std::string& release, const std::string& zoneinfo);

// Prints ICU's reading of one zone at one instant, as
// "ZONE +HH:MM[ daylight] (ICU tz VERSION)"; false for an unknown zone or
// an instant that is not a number.
bool print_offset(const std::string& zone, const std::string& seconds);

#endif  // KESTREL_ICUPROBE_PROBE_CHECK_H_
