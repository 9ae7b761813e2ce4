#ifndef KESTREL_DRIVER_CLEANUP_MARKER_H_
#define KESTREL_DRIVER_CLEANUP_MARKER_H_

// Creates the empty marker /var/db/timezone/needs_cleanup, which tells the
// clean-up agent that /var/db/timezone/tz/ may hold abandoned data. An
// existing marker keeps its content and times. Warns on failure; never
// raises.
void touch_needs_cleanup();

#endif  // KESTREL_DRIVER_CLEANUP_MARKER_H_
