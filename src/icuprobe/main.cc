// kestrel-icu-probe: reads time-zone data through the system's ICU for
// kestrel-data's verification. ICU takes its resources from
// ICU_TIMEZONE_FILES_DIR when that is set, from its own data otherwise.
//
//   kestrel-icu-probe ids            every zone ID ICU knows, one per line
//   kestrel-icu-probe check RELEASE ZONEINFO
//       compares ICU with the C library (TZDIR=ZONEINFO) for every zone and
//       link of ZONEINFO/tzdata.zi and checks that each ID read from
//       standard input resolves; exits 1 on any difference.

#include <cstdio>
#include <cstdlib>
#include <string>

#include "icuprobe/icu_zone.h"
#include "icuprobe/probe_check.h"

int main(int argc, char** argv) {
  const std::string command = argc > 1 ? argv[1] : "";
  if (command == "ids" && argc == 2) {
    std::fputs(icu_zone::all_ids().c_str(), stdout);
    return EXIT_SUCCESS;
  }
  if (command == "check" && argc == 4) {
    return run_probe_check(argv[2], argv[3]) ? EXIT_SUCCESS : EXIT_FAILURE;
  }
  std::fputs("usage: kestrel-icu-probe ids | check RELEASE ZONEINFO\n", stderr);
  return 2;
}
