// kestrel-icu-probe: reads time-zone data through the system's ICU for
// kestrel-data's verification. ICU takes its resources from
// ICU_TIMEZONE_FILES_DIR when that is set, from its own data otherwise.
//
//   kestrel-icu-probe ids            every zone ID ICU knows, one per line
//   kestrel-icu-probe check RELEASE ZONEINFO
//       compares ICU with the C library (TZDIR=ZONEINFO) for every zone and
//       link of ZONEINFO/tzdata.zi and checks that each ID read from
//       standard input resolves; exits 1 on any difference.
//   kestrel-icu-probe at ZONE SECONDS
//       ICU's offset and daylight time in ZONE at SECONDS since the epoch,
//       with ICU's data version: what an ICU program on the device sees.
//   kestrel-icu-probe data DIR
//       writes the system ICU's own data package into DIR for icupkg and
//       prints its path: where a set's CLDR resources come from when none
//       are given.

#include <cstdio>
#include <cstdlib>
#include <exception>
#include <string>

#include "icuprobe/icu_zone.h"
#include "icuprobe/probe_check.h"
#include "icuprobe/system_data.h"

int main(int argc, char** argv) {
  const std::string command = argc > 1 ? argv[1] : "";
  if (command == "ids" && argc == 2) {
    (void)std::fputs(icu_zone::all_ids().c_str(), stdout);
    return EXIT_SUCCESS;
  }
  if (command == "check" && argc == 4) {
    return run_probe_check(argv[2], argv[3]) ? EXIT_SUCCESS : EXIT_FAILURE;
  }
  if (command == "at" && argc == 4) {
    return print_offset(argv[2], argv[3]) ? EXIT_SUCCESS : EXIT_FAILURE;
  }
  if (command == "data" && argc == 3) {
    try {
      (void)std::puts(write_system_data(argv[2]).c_str());
      return EXIT_SUCCESS;
    } catch (const std::exception& e) {
      (void)std::fprintf(stderr, "kestrel-icu-probe: %s\n", e.what());
      return EXIT_FAILURE;
    }
  }
  (void)std::fputs(
      "usage: kestrel-icu-probe ids | check RELEASE ZONEINFO | at ZONE "
      "SECONDS | data DIR\n",
      stderr);
  return 2;
}
