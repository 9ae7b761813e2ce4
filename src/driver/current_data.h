#ifndef KESTREL_DRIVER_CURRENT_DATA_H_
#define KESTREL_DRIVER_CURRENT_DATA_H_

// The reconciliation at the heart of every start: checks the data the links
// designate against the system partition, adopts a newer staged update named
// by /var/db/timezone/tz_latest, records the change and asks for clean-up.
// Any failure resets the links to the system partition; only a failure of
// that reset itself leaves this function.
void select_current_data();

#endif  // KESTREL_DRIVER_CURRENT_DATA_H_
