#ifndef KESTREL_DRIVER_CURRENT_DATA_H_
#define KESTREL_DRIVER_CURRENT_DATA_H_

#include <string>

// The target of /var/db/timezone/tz_latest, the directory of the latest
// staged update; empty when there is no such link.
std::string read_latest_update();

// The data-set directory that /var/db/timezone/zoneinfo designates; empty for
// the system partition. A bad link is warned about and raised as int -1.
std::string current_dataset_path();

// Maps a zoneinfo link target back to its data-set directory:
// /var/db/timezone/tz/<version>/zoneinfo gives /var/db/timezone/tz/<version>,
// /usr/share/zoneinfo.default gives the empty path of the system partition,
// anything else is warned about and raised as int -1.
std::string dataset_path_from_link(const std::string& link_target);

// The reconciliation at the heart of every start: checks the data the links
// designate against the system partition, adopts a newer staged update named
// by /var/db/timezone/tz_latest, records the change and asks for clean-up.
// Any failure resets the links to the system partition; only a failure of
// that reset itself leaves this function.
void select_current_data();

#endif  // KESTREL_DRIVER_CURRENT_DATA_H_
