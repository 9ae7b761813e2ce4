#ifndef KESTREL_DRIVER_LEGACY_ICUTZ_H_
#define KESTREL_DRIVER_LEGACY_ICUTZ_H_

// Moves the ICU link of the older layout, /var/db/icutz, to its present place
// /var/db/timezone/icutz (unless a working one is there already) and removes
// the old one. A dangling old link is left as it is. Warns on failure; never
// raises.
void migrate_legacy_icutz();

#endif  // KESTREL_DRIVER_LEGACY_ICUTZ_H_
