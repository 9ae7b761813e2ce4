#include "data/clean.h"

#include <dirent.h>
#include <fcntl.h>
#include <ftw.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <iostream>
#include <optional>
#include <set>
#include <stdexcept>
#include <string_view>

#include "data/staging_lock.h"
#include "data/usage_error.h"
#include "fs/paths.h"

namespace data {

namespace {

constexpr std::string_view kZoneinfoSuffix = "/zoneinfo";
constexpr std::string_view kIcutzSuffix = "/icutz";
constexpr std::string_view kLeftoverPrefixes[] = {".stage-", ".remove-"};

// Why the links stop the clean-up; nothing when they are consistent.
struct designation {
  std::set<std::string> kept;
  std::string trouble;
};

bool is_set_directory(const std::string& name) {
  if (name.empty() || name[0] == '.' || name.find('/') != name.npos) {
    return false;
  }
  DIR* dir = opendir((paths::kStagedDir + name).c_str());
  if (dir == nullptr) {
    return false;
  }
  closedir(dir);
  return true;
}

// The target of a link; nullopt when there is none, with errno saying why.
std::optional<std::string> link_text(const char* path) {
  char buffer[4096];
  const ssize_t length = readlink(path, buffer, sizeof(buffer));
  if (length < 0 || length == sizeof(buffer)) {
    return std::nullopt;
  }
  return std::string(buffer, length);
}

// The name of the staged set whose directory plus suffix target is, or
// nothing.
std::string staged_name(const std::string& target, std::string_view suffix) {
  if (!paths::is_staged(target) || !target.ends_with(suffix)) {
    return {};
  }
  const std::string name = target.substr(
      paths::kStagedPrefix.size(),
      target.size() - paths::kStagedPrefix.size() - suffix.size());
  return is_set_directory(name) ? name : std::string();
}

designation read_designation() {
  designation result;
  const auto zoneinfo = link_text(paths::kZoneinfoLink);
  if (!zoneinfo) {
    result.trouble = std::string("cannot read ") + paths::kZoneinfoLink + ": " +
                     std::strerror(errno);
    return result;
  }
  std::string current;
  if (*zoneinfo != paths::kSystemZoneinfo) {
    current = staged_name(*zoneinfo, kZoneinfoSuffix);
    if (current.empty()) {
      result.trouble = std::string(paths::kZoneinfoLink) + " -> " + *zoneinfo +
                       " designates no data set in " + paths::kStagedDir;
      return result;
    }
    result.kept.insert(current);
  }
  // kestrel re-points zoneinfo first and icutz after it: a start cut short
  // between the two leaves them disagreeing until the next start.
  const auto icutz = link_text(paths::kIcutzLink);
  const bool icutz_absent = !icutz && errno == ENOENT;
  if (current.empty()
          ? !icutz_absent
          : !icutz || staged_name(*icutz, kIcutzSuffix) != current) {
    result.trouble = std::string(paths::kIcutzLink) +
                     (icutz ? " -> " + *icutz : std::string(" unreadable")) +
                     " disagrees with " + paths::kZoneinfoLink;
    return result;
  }
  const auto latest = link_text(paths::kLatestLink);
  if (!latest && errno != ENOENT) {
    result.trouble = std::string("cannot read ") + paths::kLatestLink + ": " +
                     std::strerror(errno);
  } else if (latest) {
    const std::string name = staged_name(*latest + "/", "/");
    if (name.empty()) {
      result.trouble = std::string(paths::kLatestLink) + " -> " + *latest +
                       " names no data set in " + paths::kStagedDir;
    }
    result.kept.insert(name);
  }
  return result;
}

int remove_entry(const char* path, const struct stat* /*status*/, int kind,
                 struct FTW* /*where*/) {
  return (kind == FTW_DP ? rmdir(path) : unlink(path)) == 0 ? 0 : errno;
}

// Deletes path and everything under it, never following a link.
bool remove_tree(const std::string& path) {
  return nftw(path.c_str(), remove_entry, 16, FTW_DEPTH | FTW_PHYS) == 0;
}

void sync_staged_dir() {
  const int dir = open(paths::kStagedDir, O_RDONLY | O_DIRECTORY | O_CLOEXEC);
  if (dir >= 0) {
    fsync(dir);
    close(dir);
  }
}

bool is_leftover(std::string_view name) {
  for (const std::string_view prefix : kLeftoverPrefixes) {
    if (name.starts_with(prefix)) {
      return true;
    }
  }
  return false;
}

// The entries of tz/ in two lists: leftovers, then sets not kept.
struct removals {
  std::vector<std::string> leftovers;
  std::vector<std::string> sets;
};

[[noreturn]] void unreadable_staged_dir(int error) {
  throw std::runtime_error(std::string("cannot read ") + paths::kStagedDir +
                           ": " + std::strerror(error) + "; nothing removed");
}

// No tz/ is nothing to remove; one that cannot be read is not.
removals what_to_remove(const std::set<std::string>& kept) {
  removals result;
  DIR* dir = opendir(paths::kStagedDir);
  if (dir == nullptr) {
    if (errno != ENOENT) {
      unreadable_staged_dir(errno);
    }
    return result;
  }
  for (;;) {
    errno = 0;
    const dirent* entry = readdir(dir);
    if (entry == nullptr) {
      break;
    }
    const std::string name = entry->d_name;
    if (is_leftover(name)) {
      result.leftovers.push_back(name);
    } else if (name[0] != '.' && !kept.contains(name)) {
      result.sets.push_back(name);
    }
  }
  const int error = errno;
  closedir(dir);
  if (error != 0) {
    unreadable_staged_dir(error);
  }
  // In name order, so that what a run says does not depend on the directory.
  std::sort(result.leftovers.begin(), result.leftovers.end());
  std::sort(result.sets.begin(), result.sets.end());
  return result;
}

}  // namespace

int clean(std::ostream& out, std::ostream& err) {
  const std::string me = "kestrel-data clean: ";
  int status = 0;
  try {
    const staging_lock lock(
        "another kestrel-data command is changing the device; nothing "
        "removed");
    const designation links = read_designation();
    if (!links.trouble.empty()) {
      err << me << links.trouble << "; nothing removed\n";
      status = 1;
    } else {
      const removals found = what_to_remove(links.kept);
      for (const std::string& name : found.leftovers) {
        if (remove_tree(paths::kStagedDir + name)) {
          out << "removed leftover " << paths::kStagedDir << name << "\n";
        } else {
          err << me << "cannot remove " << paths::kStagedDir << name << ": "
              << std::strerror(errno) << "\n";
          status = 1;
        }
      }
      for (const std::string& name : found.sets) {
        const std::string doomed = paths::kStagedDir + (".remove-" + name);
        if (std::rename((paths::kStagedDir + name).c_str(), doomed.c_str()) !=
            0) {
          err << me << "cannot rename " << paths::kStagedDir << name << " to "
              << doomed << ": " << std::strerror(errno) << "\n";
          status = 1;
          continue;
        }
        sync_staged_dir();
        if (remove_tree(doomed)) {
          out << "removed " << paths::kStagedDir << name << "\n";
        } else {
          err << me << "cannot remove " << doomed << ": "
              << std::strerror(errno) << "\n";
          status = 1;
        }
      }
    }
  } catch (const std::runtime_error& refused) {
    err << me << refused.what() << "\n";
    status = 1;
  }
  if (unlink(paths::kNeedsCleanup) != 0 && errno != ENOENT) {
    err << me << "cannot remove " << paths::kNeedsCleanup << ": "
        << std::strerror(errno) << "\n";
    status = 1;
  }
  return status;
}

int run_clean(const std::vector<std::string>& args) {
  if (!args.empty()) {
    throw usage_error("clean");
  }
  return clean(std::cout, std::cerr);
}

}  // namespace data
