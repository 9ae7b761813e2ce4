#ifndef KESTREL_ICUPROBE_PROBE_CHECK_H_
#define KESTREL_ICUPROBE_PROBE_CHECK_H_

#include <string>

// The whole check of one data set: ICU's data version against release, every
// zone and link of zoneinfo/tzdata.zi compared with the C library reading
// zoneinfo, and every ID on standard input resolved. Prints the counts and
// names what differs on standard output; true when nothing differs.
bool run_probe_check(const std::string& release, const std::string& zoneinfo);

#endif  // KESTREL_ICUPROBE_PROBE_CHECK_H_
