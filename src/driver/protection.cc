#include "driver/protection.h"

#include <fcntl.h>
#include <unistd.h>

#include "fs/paths.h"

namespace {

// Data-protection class D: no protection.
[[maybe_unused]] constexpr int kProtectionClassD = 4;

}  // namespace

void set_protection_class(const char* path) {
  const int fd = open(path, O_RDONLY | O_CLOEXEC);
  if (fd == -1) {
    return;
  }
#ifdef F_SETPROTECTIONCLASS
  (void)fcntl(fd, F_SETPROTECTIONCLASS, kProtectionClassD);
#endif
  // Where the platform has no protection classes every file is readable
  // without unlocking, which is what class D asks for: nothing to set.
  close(fd);
}

void protect_data_directories() {
  set_protection_class(paths::kTimezoneDir);
  set_protection_class(paths::kStagedDir);
}
