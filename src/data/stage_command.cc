#include "data/stage_command.h"

#include <sys/stat.h>
#include <sys/statvfs.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <stdexcept>

#include "data/adoption.h"
#include "data/device_state.h"
#include "data/file_tree.h"
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
  if (need > free_bytes || image.members().size() > disk.f_favail) {
    refuse("the set needs " + std::to_string(need) + " bytes and " +
           std::to_string(image.members().size()) + " inodes, " +
           paths::kTimezoneDir + " has " + std::to_string(free_bytes) +
           " bytes and " + std::to_string(disk.f_favail) + " inodes free");
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

void point_latest_at(const std::string& set_path) {
  if (unlink(kNewLatest) != 0 && errno != ENOENT) {
    throw std::runtime_error(std::string("cannot remove ") + kNewLatest);
  }
  if (symlink(set_path.c_str(), kNewLatest) != 0 ||
      rename(kNewLatest, paths::kLatestLink) != 0) {
    throw std::runtime_error(std::string("cannot re-point ") +
                             paths::kLatestLink);
  }
  file_tree::sync_directory(paths::kTimezoneDir);
}

std::string install_verified(const set_image& image) {
  const std::string scratch = file_tree::make_temporary(
      std::string(paths::kStagedDir) + kScratchPrefix + "XXXXXX");
  try {
    if (chmod(scratch.c_str(), 0755) != 0) {
      throw std::runtime_error("cannot open up " + scratch);
    }
    image.write_into(scratch);
    if (!verify_set(scratch)) {
      refuse("the set does not pass verification");
    }
    const std::string final_path =
        paths::kStagedDir + next_version(image.release());
    if (rename(scratch.c_str(), final_path.c_str()) != 0) {
      throw std::runtime_error("cannot rename " + scratch + " to " + final_path);
    }
    file_tree::sync_directory(paths::kStagedDir);
    return final_path;
  } catch (...) {
    file_tree::remove(scratch);
    throw;
  }
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
  const std::string staged = install_verified(image);
  point_latest_at(staged);
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
