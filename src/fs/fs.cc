#include "fs/fs.h"

#include <unistd.h>

#include <cerrno>

#include "fs/warn.h"

namespace fs {

namespace {

// Longest link target the tool reads; longer ones are cut, not refused.
constexpr std::size_t kLinkTargetMax = 1024;

}  // namespace

bool remove(const std::string& path) {
  if (unlink(path.c_str()) == 0 || errno == ENOENT) {
    return errno == 0;
  }
  warn("remove: could not remove %s", path.c_str());
  throw errno;
}

bool exists(const std::string& path) { return access(path.c_str(), F_OK) == 0; }

std::string read_symlink(const std::string& path) {
  char buffer[kLinkTargetMax + 1];
  const ssize_t length = readlink(path.c_str(), buffer, kLinkTargetMax);
  if (length >= 0) {
    buffer[length] = '\0';
    return buffer;
  }
  if (errno == ENOENT) {
    return {};
  }
  warn("read_symlink: %s", path.c_str());
  throw errno;
}

void create_symlink(const std::string& target, const std::string& link_path) {
  if (symlink(target.c_str(), link_path.c_str()) == 0) {
    return;
  }
  // The link's name comes first in the message, then what it points at.
  warn("create_symlink: from %s to %s", link_path.c_str(), target.c_str());
  throw errno;
}

}  // namespace fs
