#ifndef KESTREL_DATA_SET_ZONE_H_
#define KESTREL_DATA_SET_ZONE_H_

#include <ostream>
#include <string>

namespace data {

// kestrel-data set-zone ZONE: makes ZONE the device's local zone by pointing
// /var/db/timezone/localtime at /var/db/timezone/zoneinfo/ZONE, so that the
// zone keeps following every data set kestrel adopts.
//
// ZONE must be a zone name (letters, digits and "/_+-.", no "." or ".."
// component) whose file in the data the zoneinfo link designates is a
// compiled zone. The link is made beside the old one and renamed over it:
// readers find the old zone or the new one, never none. It holds the lock
// of kestrel-data's commands. Afterwards it says whether /etc/localtime
// still leads to the device's zone (another program may have rewritten it).
//
// Returns the exit status: 0 when the zone is set, 1 when refused (a line
// on err, nothing changed).
int set_zone(const std::string& zone, std::ostream& out, std::ostream& err);

}  // namespace data

#endif  // KESTREL_DATA_SET_ZONE_H_
