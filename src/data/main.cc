// kestrel-data: makes time-zone data sets from tz releases and stages them
// on the device, for kestrel to adopt at the next start.

#include <cstdio>
#include <cstdlib>
#include <exception>
#include <string>
#include <vector>

#include "data/build_command.h"
#include "data/clean.h"
#include "data/pack_command.h"
#include "data/set_zone.h"
#include "data/stage_command.h"
#include "data/status_command.h"
#include "data/usage_error.h"
#include "data/verify_command.h"

namespace {

struct subcommand {
  const char* name;
  int (*run)(const std::vector<std::string>&);
};

constexpr subcommand kSubcommands[] = {
    {"build", run_build},       {"verify", run_verify},
    {"pack", run_pack},         {"stage", run_stage},
    {"status", run_status},     {"set-zone", data::run_set_zone},
    {"clean", data::run_clean},
};

}  // namespace

int main(int argc, char** argv) {
  const std::string name = argc > 1 ? argv[1] : "";
  const std::vector<std::string> args(argv + (argc > 1 ? 2 : 1), argv + argc);
  for (const subcommand& command : kSubcommands) {
    if (name != command.name) {
      continue;
    }
    try {
      return command.run(args);
    } catch (const usage_error& e) {
      (void)std::fprintf(stderr, "%s\n", e.what());
      return 2;
    } catch (const std::exception& e) {
      (void)std::fprintf(stderr, "kestrel-data: %s\n", e.what());
      return EXIT_FAILURE;
    } catch (...) {
      // kestrel's own helpers raise errno as an int, after their warning.
      (void)std::fprintf(stderr, "kestrel-data: %s failed\n", command.name);
      return EXIT_FAILURE;
    }
  }
  (void)std::fputs(
      "usage: kestrel-data build|verify|pack|stage|status|set-zone|clean ...\n"
      "see kestrel-data(1)\n",
      stderr);
  return 2;
}
