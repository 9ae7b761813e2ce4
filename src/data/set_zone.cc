#include "data/set_zone.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstring>
#include <iostream>
#include <optional>
#include <stdexcept>
#include <string_view>

#include "data/staging_lock.h"
#include "data/usage_error.h"
#include "fs/paths.h"

namespace data {

namespace {

constexpr char kEtcLocaltime[] = "/etc/localtime";
// New links are made beside the old ones, then renamed over them.
constexpr char kNewLocaltime[] = "/var/db/timezone/.localtime.new";
constexpr char kNewEtcLocaltime[] = "/etc/.localtime.kestrel-new";
constexpr std::string_view kNameBytes =
    "abcdefghijklmnopqrstuvwxyzABCDEFGHIJKLMNOPQRSTUVWXYZ0123456789/_+-.";

// A name that stays inside the zone directory: no empty, "." or ".."
// component, only the bytes tz's own names use.
bool valid_name(std::string_view zone) {
  if (zone.empty() || zone.find_first_not_of(kNameBytes) != zone.npos) {
    return false;
  }
  std::size_t start = 0;
  while (start <= zone.size()) {
    const std::size_t end = std::min(zone.find('/', start), zone.size());
    const std::string_view part = zone.substr(start, end - start);
    if (part.empty() || part == "." || part == "..") {
      return false;
    }
    start = end + 1;
  }
  return true;
}

// Whether path leads to a compiled zone: a regular file that begins with the
// magic of tzfile(5).
bool is_zone_file(const std::string& path) {
  const int fd = open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK);
  if (fd < 0) {
    return false;
  }
  struct stat status {};
  std::array<char, 4> magic{};
  const bool zone = fstat(fd, &status) == 0 && S_ISREG(status.st_mode) &&
                    read(fd, magic.data(), magic.size()) == 4 &&
                    std::string_view(magic.data(), magic.size()) == "TZif";
  close(fd);
  return zone;
}

// Makes the link at scratch and renames it over link, then makes the rename
// durable. Under the lock, an entry already at scratch is a leftover of an
// interrupted run.
bool replace_link(const std::string& target, const char* link,
                  const char* scratch) {
  unlink(scratch);
  if (symlink(target.c_str(), scratch) != 0) {
    return false;
  }
  if (rename(scratch, link) != 0) {
    const int error = errno;
    unlink(scratch);
    errno = error;
    return false;
  }
  const std::string dir_path(link, std::strrchr(link, '/'));
  const int dir = open(dir_path.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
  if (dir >= 0) {
    fsync(dir);
    close(dir);
  }
  return true;
}

// Whether /etc/localtime leads to the device's link, as the package lays it
// out; timedatectl and tzdata's postinst point it into /usr/share/zoneinfo.
bool etc_localtime_is_the_devices() {
  char target[sizeof(paths::kLocaltimeLink) + 1] = {};
  const ssize_t length = readlink(kEtcLocaltime, target, sizeof(target) - 1);
  return length >= 0 && std::string_view(target, length) ==
                            std::string_view(paths::kLocaltimeLink);
}

}  // namespace

int set_zone(const std::string& zone, std::ostream& out, std::ostream& err) {
  const std::string me = "kestrel-data set-zone: ";
  if (!valid_name(zone)) {
    err << me << "\"" << zone << "\" is not a zone name\n";
    return 1;
  }
  std::optional<staging_lock> lock;
  try {
    lock.emplace(
        "another kestrel-data command is changing the device; try again when "
        "it is done");
  } catch (const std::runtime_error& busy) {
    err << me << busy.what() << "\n";
    return 1;
  }
  const std::string target = std::string(paths::kZoneinfoLink) + "/" + zone;
  if (!is_zone_file(target)) {
    err << me << "no zone " << zone << " in the current data ("
        << paths::kZoneinfoLink << ")\n";
    return 1;
  }
  if (!replace_link(target, paths::kLocaltimeLink, kNewLocaltime)) {
    err << me << "cannot point " << paths::kLocaltimeLink << " at " << target
        << ": " << std::strerror(errno) << "\n";
    return 1;
  }
  out << "The device's zone is " << zone << ".\n";
  if (etc_localtime_is_the_devices()) {
    return 0;
  }
  if (!replace_link(paths::kLocaltimeLink, kEtcLocaltime, kNewEtcLocaltime)) {
    err << me << "cannot point " << kEtcLocaltime << " at "
        << paths::kLocaltimeLink << ": " << std::strerror(errno)
        << "; programs do not see the device's zone until it leads there\n";
    return 1;
  }
  out << kEtcLocaltime << " led elsewhere; it leads to "
      << paths::kLocaltimeLink << " again.\n";
  return 0;
}

int run_set_zone(const std::vector<std::string>& args) {
  if (args.size() != 1) {
    throw usage_error("set-zone ZONE");
  }
  return set_zone(args[0], std::cout, std::cerr);
}

}  // namespace data
