#include "driver/protection.h"

#include <fcntl.h>
#include <unistd.h>

#include "fs/paths.h"

#ifdef F_SETPROTECTIONCLASS

namespace {

// Data-protection class D: no protection.
constexpr int kProtectionClassD = 4;

}  // namespace

void set_protection_class(const char* path) {
  const int fd = open(path, O_RDONLY | O_CLOEXEC);
  if (fd == -1) {
    return;
  }
  (void)fcntl(fd, F_SETPROTECTIONCLASS, kProtectionClassD);
  close(fd);
}

#else

// Where the platform has no protection classes every file is readable
// without unlocking, which is what class D asks for: there is nothing to set,
// so the step makes no call at all.
void set_protection_class(const char* /*path*/) {}

#endif

void protect_data_directories() {
  set_protection_class(paths::kTimezoneDir);
  set_protection_class(paths::kStagedDir);
}
