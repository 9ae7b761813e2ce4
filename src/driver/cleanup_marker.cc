#include "driver/cleanup_marker.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include "fs/paths.h"
#include "fs/warn.h"

namespace {

constexpr mode_t kMarkerMode = 0666;

// Opens the marker, creating it, without truncating an existing one. Where
// the platform has data-protection classes the marker gets class D; here an
// ordinary create-open with the same flags and mode does the same job.
int open_marker() {
  return open(paths::kNeedsCleanup, O_RDWR | O_CREAT, kMarkerMode);
}

}  // namespace

void touch_needs_cleanup() {
  const int fd = open_marker();
  if (fd < 0) {
    warn("Cannot touch file %s", paths::kNeedsCleanup);
    return;
  }
  struct stat status {};
  if (fstat(fd, &status) != 0) {
    // The descriptor stays open until the process exits, which is soon.
    warn("Cannot touch file %s", paths::kNeedsCleanup);
    return;
  }
  if (close(fd) != 0) {
    warn("Cannot touch file %s", paths::kNeedsCleanup);
  }
}
