#ifndef KESTREL_DRIVER_LOCALTIME_LINK_H_
#define KESTREL_DRIVER_LOCALTIME_LINK_H_

// Keeps /var/db/timezone/localtime when it points through the data link
// /var/db/timezone/zoneinfo, rewrites an old-style link into
// /usr/share/zoneinfo to go through the data link instead, and replaces
// anything else with the default zone, America/Los_Angeles. If even the
// default link cannot be created, the exception leaves this function.
void repair_localtime_link();

#endif  // KESTREL_DRIVER_LOCALTIME_LINK_H_
