#include "data/staging_lock.h"

#include <fcntl.h>
#include <sys/file.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <stdexcept>
#include <string>

namespace {

constexpr char kLockFile[] = "/var/db/timezone/.kestrel-data.lock";

}  // namespace

staging_lock::staging_lock(const char* busy)
    : fd(open(kLockFile, O_RDWR | O_CREAT | O_CLOEXEC, 0600)) {
  if (fd < 0) {
    throw std::runtime_error(std::string("cannot open ") + kLockFile + ": " +
                             std::strerror(errno));
  }
  if (flock(fd, LOCK_EX | LOCK_NB) != 0) {
    const int saved = errno;
    (void)close(fd);
    throw std::runtime_error(saved == EWOULDBLOCK
                                 ? std::string(busy)
                                 : std::string("cannot lock ") + kLockFile +
                                       ": " + std::strerror(saved));
  }
}

staging_lock::~staging_lock() { (void)close(fd); }
