#include "data/stage_command.h"

#include <sys/stat.h>
#include <sys/statvfs.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <stdexcept>

#include "data/adoption.h"
#include "data/device_state.h"
#include "data/file_tree.h"
#include "data/set_directory.h"
#include "data/set_source.h"
#include "data/staging_lock.h"
#include "data/usage_error.h"
#include "data/verify_command.h"
#include "fs/paths.h"

namespace {

constexpr char kScratchPrefix[] = ".stage-";
constexpr char kNewLatest[] = "/var/db/timezone/.tz_latest.new";

[[noreturn]] void refuse(const std::string& why) {
  throw std::runtime_error("refused: " + why + "; nothing staged");
}

void refuse_unless_adoptable(const set_image& image) {
  const verdict staging = may_stage(image.release(), image.schema());
  if (!staging.yes) {
    refuse(staging.reason);
  }
}

void check_space(const set_image& image) {
  struct statvfs disk {};
  if (statvfs(paths::kTimezoneDir, &disk) != 0) {
    refuse(std::string("cannot measure the free space of ") +
           paths::kTimezoneDir);
  }
  const std::uint64_t need = image.disk_bytes(disk.f_frsize);
  const std::uint64_t free_bytes =
      static_cast<std::uint64_t>(disk.f_bavail) * disk.f_frsize;
  if (need > free_bytes || image.inodes() > disk.f_favail) {
    refuse("the set needs " + std::to_string(need) + " bytes and " +
           std::to_string(image.inodes()) + " inodes, " + paths::kTimezoneDir +
           " has " + std::to_string(free_bytes) + " bytes and " +
           std::to_string(disk.f_favail) + " inodes free");
  }
}

// Scratch directories of an earlier staging that did not finish.
void remove_leftover_scratch() {
  for (const std::string& name : file_tree::entries(paths::kStagedDir)) {
    if (name.starts_with(kScratchPrefix)) {
      file_tree::remove(paths::kStagedDir + name);
    }
  }
}

// RELEASE.1.N with N one more than that of any staged set of the release.
std::string next_version(const std::string& release) {
  const std::string prefix = release + ".1.";
  long highest = 0;
  for (const std::string& name : staged_set_names()) {
    const std::string rest = name.substr(std::min(name.size(), prefix.size()));
    if (name.starts_with(prefix) && !rest.empty() && rest.size() < 10 &&
        rest.find_first_not_of("0123456789") == std::string::npos) {
      highest = std::max(highest, std::stol(rest));
    }
  }
  return prefix + std::to_string(highest + 1);
}

[[noreturn]] void fail(const std::string& what) {
  throw std::runtime_error(what + ": " + std::strerror(errno));
}

// A new link renamed over tz_latest: readers see the old target or the new,
// never no link. A leftover new link of an earlier staging goes first.
void point_latest_at(const std::string& set_path) {
  if (unlink(kNewLatest) != 0 && errno != ENOENT) {
    fail(std::string("cannot remove ") + kNewLatest);
  }
  if (symlink(set_path.c_str(), kNewLatest) != 0) {
    fail(std::string("cannot make ") + kNewLatest);
  }
  if (rename(kNewLatest, paths::kLatestLink) != 0) {
    const int saved = errno;
    (void)unlink(kNewLatest);
    errno = saved;
    fail(std::string("cannot re-point ") + paths::kLatestLink);
  }
}

// The scratch directory, written, synced and verified, renamed to the set's
// name and tz_latest pointed at it. Until tz_latest names it, a failure
// takes the set back to its scratch name and removes it as far as it can;
// what is left is a scratch directory for the next staging to remove.
std::string install_verified(const set_image& image) {
  const std::string scratch = file_tree::make_temporary(
      std::string(paths::kStagedDir) + kScratchPrefix + "XXXXXX");
  std::string final_path;
  try {
    if (chmod(scratch.c_str(), 0755) != 0) {
      fail("cannot open up " + scratch);
    }
    write_set_directory(image, scratch);
    if (!verify_set(scratch)) {
      refuse("the set does not pass verification");
    }
    final_path = paths::kStagedDir + next_version(image.release());
    if (rename(scratch.c_str(), final_path.c_str()) != 0) {
      final_path.clear();
      fail("cannot rename " + scratch);
    }
    file_tree::sync_directory(paths::kStagedDir);
    point_latest_at(final_path);
  } catch (...) {
    if (!final_path.empty()) {
      (void)rename(final_path.c_str(), scratch.c_str());
    }
    try {
      file_tree::remove(scratch);
    } catch (...) {
      // Left for the next staging, which removes every scratch directory.
    }
    throw;
  }
  return final_path;
}

}  // namespace

std::string stage_set(const set_image& image) {
  // Checked before the lock, so that a refusal leaves not even the lock
  // file, and again under it, against what another staging may have done.
  refuse_unless_adoptable(image);
  check_space(image);
  const staging_lock lock;
  refuse_unless_adoptable(image);
  check_space(image);
  if (mkdir(paths::kStagedDir, 0755) != 0 && errno != EEXIST) {
    throw std::runtime_error(std::string("cannot make ") + paths::kStagedDir);
  }
  remove_leftover_scratch();
  std::string staged = install_verified(image);
  // tz_latest names the complete set now; only its durability is left.
  try {
    file_tree::sync_directory(paths::kTimezoneDir);
  } catch (const std::runtime_error& e) {
    throw std::runtime_error("staged " + staged + ", but " + e.what());
  }
  return staged;
}

int run_stage(const std::vector<std::string>& args) {
  if (args.size() != 1) {
    throw usage_error("stage SETDIR|ARCHIVE");
  }
  const std::string staged = stage_set(load_set(args[0]));
  std::printf("staged %s; kestrel adopts it at the next start\n",
              staged.c_str());
  return EXIT_SUCCESS;
}
