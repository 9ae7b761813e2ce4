// The mapping of a zoneinfo link target to its data-set directory against a
// plain rendering of its rules.

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <optional>
#include <string>

#include "driver/current_data.h"

namespace {

const std::string kStaged = "/var/db/timezone/tz/";
const std::string kSystem = "/usr/share/zoneinfo.default";

// A staged target of at least 21 bytes maps to everything before its last
// "/", which must stand at 21 or later; the system's directory maps to the
// empty path; anything else is bad.
std::optional<std::string> expected_path(const std::string& target) {
  if (target.size() >= 21 && target.compare(0, 20, kStaged) == 0) {
    const std::size_t last = target.rfind('/');
    if (last < 21) {
      return std::nullopt;
    }
    return target.substr(0, last);
  }
  if (target == kSystem) {
    return std::string();
  }
  return std::nullopt;
}

std::optional<std::string> actual_path(const std::string& target) {
  try {
    return dataset_path_from_link(target);
  } catch (int error) {
    if (error != -1) {
      std::abort();
    }
    return std::nullopt;
  }
}

}  // namespace

// The first byte chooses a start for the target, so that the staged prefix
// and the system's directory are not left to chance.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* bytes,
                                      std::size_t size) {
  if (size == 0) {
    return 0;
  }
  const std::string starts[] = {"", kStaged, kSystem};
  const std::string target =
      starts[bytes[0] % 3] +
      std::string(reinterpret_cast<const char*>(bytes + 1), size - 1);
  if (actual_path(target) != expected_path(target)) {
    std::abort();
  }
  return 0;
}
