#ifndef KESTREL_ICUPROBE_SYSTEM_DATA_H_
#define KESTREL_ICUPROBE_SYSTEM_DATA_H_

#include <string>

// Writes the common data package the system's ICU library carries compiled
// in (Debian's libicudata exports it as icudtNN_dat) into dir as a .dat file
// named after the package, such as icudt72l.dat, which icupkg reads; returns
// its path. Throws std::runtime_error when the package cannot be found or
// written.
std::string write_system_data(const std::string& dir);

#endif  // KESTREL_ICUPROBE_SYSTEM_DATA_H_
