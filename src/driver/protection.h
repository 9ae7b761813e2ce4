#ifndef KESTREL_DRIVER_PROTECTION_H_
#define KESTREL_DRIVER_PROTECTION_H_

// Gives the directory at path data-protection class D, the class without
// protection, so that the data is readable before the device is first
// unlocked. A directory that cannot be opened is left alone, silently. Where
// the platform has no protection classes it does nothing and makes no call.
void set_protection_class(const char* path);

// Gives /var/db/timezone/ and /var/db/timezone/tz/ class D. Creates nothing.
void protect_data_directories();

#endif  // KESTREL_DRIVER_PROTECTION_H_
