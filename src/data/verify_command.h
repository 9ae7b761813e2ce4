#ifndef KESTREL_DATA_VERIFY_COMMAND_H_
#define KESTREL_DATA_VERIFY_COMMAND_H_

#include <string>
#include <vector>

// The gate every data set passes before it is kept or staged: the ICU probe
// loads the set's icutz/ through ICU_TIMEZONE_FILES_DIR and compares it with
// the C library reading the set's zoneinfo/ through TZDIR, for every zone and
// link of the release, and checks that every zone ID the system's own ICU
// knows still resolves. The probe's report goes to standard output. True
// when the set passes.
bool verify_set(const std::string& set_dir);

// The ICU probe: the one KESTREL_ICU_PROBE names, else the one beside this
// program when there is one (a build tree), else the installed one.
std::string icu_probe_path();

// kestrel-data verify SETDIR
int run_verify(const std::vector<std::string>& args);

#endif  // KESTREL_DATA_VERIFY_COMMAND_H_
