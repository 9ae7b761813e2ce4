// Staging killed, or failed by one system call, at the calls that change the
// file system (strace --inject, on kestrel-data alone): tz_latest names the
// previous set or the complete new one, never a partial one; kestrel's next
// start gives one of the two outcomes it gives without the fault; and the
// next staging succeeds, leaving no scratch behind.

#include <fcntl.h>
#include <unistd.h>

#include <fstream>
#include <map>
#include <set>
#include <sstream>
#include <stdexcept>
#include <string>
#include <vector>

#include "clean_device.h"
#include "data/child_process.h"
#include "data/file_tree.h"
#include "device_tree.h"
#include "gtest/gtest.h"
#include "scratch_dir.h"
#include "tree.h"

namespace {

const std::string kSet = KESTREL_TEST_SET_2026A;
const std::string kData = KESTREL_DATA_BINARY;
constexpr char kStaged[] = "/var/db/timezone/tz/2026a.1.1";
constexpr char kChangingCalls[] =
    "openat,write,fchmod,chmod,fsync,mkdir,rename,symlink,link,linkat,unlink,"
    "unlinkat,rmdir,flock";

// A device that has staged before: its lock file and tz/ are there.
void fresh_device() {
  tree::clear("/var");
  tree::clear("/usr/share");
  tree::make_dir("/var/db/timezone/tz");
  tree::write_file("/var/db/timezone/.kestrel-data.lock", "", 0600);
  make_device("2025b");
}

// How many times staging makes each changing call.
std::map<std::string, int> call_counts() {
  fresh_device();
  const scratch_dir dir;
  child_process traced({"strace", "-qq", "-o", dir / "log", "-e",
                        std::string("trace=") + kChangingCalls, kData, "stage",
                        kSet});
  traced.capture = true;
  EXPECT_EQ(traced.run(), 0);
  std::map<std::string, int> counts;
  std::istringstream log(tree::file_content(dir / "log"));
  std::string line;
  while (std::getline(log, line)) {
    const std::size_t paren = line.find('(');
    if (paren != std::string::npos && line.find_first_of(" <") > paren) {
      ++counts[line.substr(0, paren)];
    }
  }
  return counts;
}

// Every call when there are few, else the first, the middle and the last
// three: the set's files are written alike, the links and renames are few.
std::set<int> sampled(int count) {
  std::set<int> picks;
  for (int n = 1; n <= count; ++n) {
    if (count <= 6 || n == 1 || n == count / 2 || n > count - 3) {
      picks.insert(n);
    }
  }
  return picks;
}

// The links after kestrel has started on the device as it is.
std::string kestrel_outcome() {
  EXPECT_EQ(child_process({KESTREL_BINARY}).run(), 0);
  return tree::link_target("/var/db/timezone/zoneinfo") + " " +
         tree::link_target("/var/db/timezone/icutz");
}

std::string outcome_after(bool staged) {
  fresh_device();
  if (staged) {
    child_process stage({kData, "stage", kSet});
    stage.capture = true;
    EXPECT_EQ(stage.run(), 0);
  }
  return kestrel_outcome();
}

// No entry of tz/ is a partial set; tz_latest names nothing or the whole set.
void expect_no_partial_set() {
  for (const std::string& name : file_tree::entries("/var/db/timezone/tz")) {
    if (!name.starts_with(".")) {
      const std::string path = "/var/db/timezone/tz/" + name;
      EXPECT_EQ(relative_snapshot(path), relative_snapshot(kSet)) << path;
    }
  }
  const std::string latest = tree::link_target("/var/db/timezone/tz_latest");
  EXPECT_TRUE(latest == "(none)" || latest == kStaged) << latest;
}

// The next staging succeeds and removes what the interrupted one left.
void expect_next_staging_cleans_up() {
  child_process again({kData, "stage", kSet});
  again.capture = true;
  EXPECT_EQ(again.run(), 0) << again.output;
  for (const auto& [path, what] : snapshot("/var/db/timezone")) {
    EXPECT_EQ(path.find("/."), path.find("/.kestrel-data.lock")) << path;
  }
}

int staged_with(const std::string& inject) {
  child_process traced(
      {"strace", "-qq", "-o", "/dev/null", "-e", inject, kData, "stage", kSet});
  traced.capture = true;
  try {
    return traced.run();
  } catch (const std::runtime_error&) {
    return -1;  // strace dies of the signal that killed its tracee
  }
}

class stage_fault_test : public clean_device {};

TEST_F(stage_fault_test, a_kill_at_any_changing_call_leaves_old_or_new) {
  const std::string before = outcome_after(false);
  const std::string after = outcome_after(true);
  ASSERT_NE(before, after);
  const auto counts = call_counts();
  // The set's files and directories, its rename and tz_latest's.
  EXPECT_GE(counts.at("rename"), 2);
  EXPECT_GE(counts.at("symlink"), 1);
  // A zone's links that zic made as hard links stay hard links.
  EXPECT_GT(counts.contains("link") ? counts.at("link") : counts.at("linkat"),
            100);
  EXPECT_GT(counts.at("fsync"), 100);
  int killed_before_done = 0;
  int killed_after_done = 0;
  for (const auto& [call, count] : counts) {
    for (const int n : sampled(count)) {
      SCOPED_TRACE(call + " #" + std::to_string(n));
      fresh_device();
      (void)staged_with("inject=" + call +
                        ":signal=KILL:when=" + std::to_string(n));
      expect_no_partial_set();
      const bool complete =
          tree::link_target("/var/db/timezone/tz_latest") == kStaged;
      EXPECT_EQ(kestrel_outcome(), complete ? after : before);
      ++(complete ? killed_after_done : killed_before_done);
      fresh_device();
      (void)staged_with("inject=" + call +
                        ":signal=KILL:when=" + std::to_string(n));
      expect_next_staging_cleans_up();
    }
  }
  EXPECT_GT(killed_before_done, 0);
  EXPECT_GT(killed_after_done, 0);
}

TEST_F(stage_fault_test, a_failed_call_leaves_the_device_as_it_was) {
  int refused = 0;
  for (const auto& [call, count] : call_counts()) {
    for (const int n : sampled(count)) {
      SCOPED_TRACE(call + " #" + std::to_string(n));
      fresh_device();
      auto device = snapshot("/var");
      const int status = staged_with("inject=" + call +
                                     ":error=EIO:when=" + std::to_string(n));
      expect_no_partial_set();
      if (status != 0 &&
          tree::link_target("/var/db/timezone/tz_latest") == "(none)") {
        // As it was, but for a scratch directory at most.
        auto now = snapshot("/var");
        std::erase_if(now, [](const auto& entry) {
          return entry.first.find("/tz/.stage-") != std::string::npos;
        });
        EXPECT_EQ(now, device);
        ++refused;
      }
      expect_next_staging_cleans_up();
    }
  }
  EXPECT_GT(refused, 10);
}

}  // namespace
