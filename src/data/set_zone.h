#ifndef KESTREL_DATA_SET_ZONE_H_
#define KESTREL_DATA_SET_ZONE_H_

#include <ostream>
#include <string>
#include <vector>

namespace data {

// kestrel-data set-zone ZONE: makes ZONE the device's local zone by pointing
// /var/db/timezone/localtime at /var/db/timezone/zoneinfo/ZONE, so that the
// zone keeps following every data set kestrel adopts.
//
// ZONE must be a zone name (letters, digits and "/_+-.", no "." or ".."
// component) whose file in the data the zoneinfo link designates is a
// compiled zone. The link is made beside the old one and renamed over it:
// readers find the old zone or the new one, never none. It holds the lock
// of kestrel-data's commands. Then, if another program (timedatectl,
// tzdata's postinst) pointed /etc/localtime elsewhere, it points it back at
// /var/db/timezone/localtime the same way.
//
// Returns the exit status: 0 when the zone is set and /etc/localtime leads
// to it, 1 otherwise (a line on err; a refusal changes nothing).
int set_zone(const std::string& zone, std::ostream& out, std::ostream& err);

// The subcommand: its one argument is the zone.
int run_set_zone(const std::vector<std::string>& args);

}  // namespace data

#endif  // KESTREL_DATA_SET_ZONE_H_
