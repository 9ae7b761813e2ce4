#include "data/verify_command.h"

#include <unistd.h>

#include <climits>
#include <cstdio>
#include <cstdlib>
#include <stdexcept>

#include "data/child_process.h"
#include "data/usage_error.h"
#include "fs/first_word.h"

namespace {

std::string absolute(const std::string& path) {
  char resolved[PATH_MAX];
  if (realpath(path.c_str(), resolved) == nullptr) {
    throw std::runtime_error("no data set at " + path);
  }
  return resolved;
}

}  // namespace

std::string icu_probe_path() {
  const char* named = std::getenv("KESTREL_ICU_PROBE");
  if (named != nullptr && *named != '\0') {
    return named;
  }
  char self[PATH_MAX] = {};
  const ssize_t n = readlink("/proc/self/exe", self, sizeof self - 1);
  std::string beside =
      n > 0 ? std::string(self, static_cast<std::size_t>(n)) : std::string();
  beside = beside.substr(0, beside.rfind('/') + 1) + "kestrel-icu-probe";
  return access(beside.c_str(), X_OK) == 0 ? beside : KESTREL_ICU_PROBE;
}

bool verify_set(const std::string& set_dir) {
  const std::string set = absolute(set_dir);
  const std::string release = fs::read_first_word(set + "/zoneinfo/+VERSION");
  if (release.empty()) {
    throw std::runtime_error("no zoneinfo/+VERSION in " + set);
  }
  const std::string probe = icu_probe_path();
  child_process system_ids({probe, "ids"});
  system_ids.environment = {{"ICU_TIMEZONE_FILES_DIR", ""}};
  system_ids.capture = true;
  if (system_ids.run() != 0) {
    throw std::runtime_error("the ICU probe could not list the system's zones");
  }
  child_process check({probe, "check", release, set + "/zoneinfo"});
  check.environment = {{"ICU_TIMEZONE_FILES_DIR", set + "/icutz"}};
  check.input = system_ids.output;
  (void)std::fflush(stdout);
  return check.run() == 0;
}

int run_verify(const std::vector<std::string>& args) {
  if (args.size() != 1) {
    throw usage_error("verify SETDIR");
  }
  if (!verify_set(args[0])) {
    (void)std::fprintf(stderr, "kestrel-data: %s does not pass verification\n",
                       args[0].c_str());
    return EXIT_FAILURE;
  }
  return EXIT_SUCCESS;
}
