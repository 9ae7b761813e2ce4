#include "data/stage_command.h"

#include <fcntl.h>
#include <sys/file.h>
#include <sys/mount.h>
#include <unistd.h>

#include <functional>
#include <stdexcept>
#include <string>

#include "clean_device.h"
#include "data/child_process.h"
#include "data/manifest.h"
#include "data/set_archive.h"
#include "data/set_source.h"
#include "device_tree.h"
#include "gtest/gtest.h"
#include "hand_made_archive.h"
#include "scratch_dir.h"
#include "tree.h"

namespace {

// Built from tzdata2026a.tar.gz and ICU's 2026a resources by the test
// fixture that runs before this binary.
const std::string kSet = KESTREL_TEST_SET_2026A;
constexpr char kStaged1[] = "/var/db/timezone/tz/2026a.1.1";

class stage_test : public clean_device {
 protected:
  void TearDown() override { (void)umount2("/var/db/timezone", MNT_DETACH); }
};

std::map<std::string, std::string> whole_device() {
  auto all = snapshot("/var");
  all.merge(snapshot("/usr/share"));
  return all;
}

TEST_F(stage_test, installs_the_set_and_points_tz_latest_at_it) {
  make_device("2025b");
  EXPECT_EQ(stage_set(load_set(kSet)), kStaged1);
  EXPECT_EQ(tree::link_target("/var/db/timezone/tz_latest"), kStaged1);
  EXPECT_EQ(relative_snapshot(kStaged1), relative_snapshot(kSet));
  // kestrel's own links are left for kestrel.
  EXPECT_EQ(tree::link_target("/var/db/timezone/zoneinfo"),
            "/usr/share/zoneinfo.default");
  EXPECT_FALSE(tree::present("/var/db/timezone/icutz"));
  EXPECT_FALSE(tree::present("/var/db/timezone/localtime"));
  EXPECT_FALSE(tree::present("/var/db/timezone/.tz_latest.new"));
  const auto names = snapshot("/var/db/timezone/tz");
  for (const auto& [path, what] : names) {
    EXPECT_EQ(path.find("/.stage-"), std::string::npos) << path;
  }
}

TEST_F(stage_test, kestrel_adopts_the_staged_set_at_its_next_start) {
  make_device("2025b");
  (void)stage_set(load_set(kSet));
  EXPECT_EQ(child_process({KESTREL_BINARY}).run(), 0);
  EXPECT_EQ(tree::link_target("/var/db/timezone/zoneinfo"),
            std::string(kStaged1) + "/zoneinfo");
  EXPECT_EQ(tree::link_target("/var/db/timezone/icutz"),
            std::string(kStaged1) + "/icutz");
  EXPECT_EQ(tree::file_content("/var/db/timezone/TZVersionDiffRecord"),
            "2025b.1.0_2026a.1.1");
}

TEST_F(stage_test, kestrel_adopts_a_re_release_of_the_designated_release) {
  make_device("2025b");
  (void)stage_set(load_set(kSet));
  ASSERT_EQ(child_process({KESTREL_BINARY}).run(), 0);
  EXPECT_EQ(stage_set(load_set(kSet)), "/var/db/timezone/tz/2026a.1.2");
  EXPECT_EQ(child_process({KESTREL_BINARY}).run(), 0);
  EXPECT_EQ(tree::link_target("/var/db/timezone/zoneinfo"),
            "/var/db/timezone/tz/2026a.1.2/zoneinfo");
  EXPECT_EQ(tree::file_content("/var/db/timezone/TZVersionDiffRecord"),
            "2026a.1.1_2026a.1.2");
  // The set it replaces is left for the clean-up agent.
  EXPECT_TRUE(tree::present("/var/db/timezone/needs_cleanup"));
}

TEST_F(stage_test, numbers_a_release_one_above_its_highest_staged_set) {
  make_device("2025b");
  tree::make_dir("/var/db/timezone/tz/2026a.1.4");
  tree::make_dir("/var/db/timezone/tz/2025a.1.9");
  EXPECT_EQ(stage_set(load_set(kSet)), "/var/db/timezone/tz/2026a.1.5");
  EXPECT_EQ(stage_set(load_set(kSet)), "/var/db/timezone/tz/2026a.1.6");
}

TEST_F(stage_test, removes_the_scratch_an_earlier_staging_left) {
  make_device("2025b");
  tree::write_file("/var/db/timezone/tz/.stage-AbC123/zoneinfo/x", "partial");
  (void)stage_set(load_set(kSet));
  EXPECT_FALSE(tree::present("/var/db/timezone/tz/.stage-AbC123"));
}

// Staging reads the designated set as kestrel would, but a broken one is
// not reported in kestrel's words: the staging command has its own.
TEST_F(stage_test, writes_no_kestrel_lines_over_a_broken_designated_set) {
  make_device("2025b");
  tree::make_dir("/var/db/timezone/tz/2025c.1.1/zoneinfo");
  ASSERT_EQ(::unlink("/var/db/timezone/zoneinfo"), 0);
  tree::make_link("/var/db/timezone/tz/2025c.1.1/zoneinfo",
                  "/var/db/timezone/zoneinfo");
  testing::internal::CaptureStderr();
  EXPECT_EQ(stage_set(load_set(kSet)), kStaged1);
  EXPECT_EQ(testing::internal::GetCapturedStderr(), "");
}

TEST_F(stage_test, stages_a_packed_archive) {
  make_device("2025b");
  const scratch_dir dir;
  write_set_archive(load_set(kSet), dir / "set.tgz");
  EXPECT_EQ(stage_set(load_set(dir / "set.tgz")), kStaged1);
  EXPECT_EQ(relative_snapshot(kStaged1), relative_snapshot(kSet));
}

// zic writes a zone's links as hard links; a staged set keeps them, whether
// it comes as the directory build made or as an archive.
TEST_F(stage_test, keeps_the_hard_links_of_the_set) {
  const auto source = shared_inodes(kSet);
  ASSERT_EQ(source.at("/zoneinfo/Europe/Bratislava"),
            source.at("/zoneinfo/Europe/Prague"));
  const struct {
    const char* name;
    std::function<std::string(const scratch_dir&)> source;
  } kSources[] = {
      {"directory", [](const scratch_dir& /*dir*/) { return kSet; }},
      {"archive",
       [](const scratch_dir& dir) {
         write_set_archive(load_set(kSet), dir / "set.tgz");
         return dir / "set.tgz";
       }},
  };
  for (const auto& from : kSources) {
    SCOPED_TRACE(from.name);
    (void)umount2("/var/db/timezone", MNT_DETACH);
    clean_device::SetUp();
    make_device("2025b");
    const scratch_dir dir;
    EXPECT_EQ(stage_set(load_set(from.source(dir))), kStaged1);
    EXPECT_EQ(shared_inodes(kStaged1), source);
  }
}

// Room for the set's files counted once, not for a copy of each name.
TEST_F(stage_test, needs_room_for_each_file_once) {
  const set_image image = load_set(kSet);
  const std::uint64_t once = image.disk_bytes(4096);
  std::uint64_t every_name = 0;
  for (const set_member& member : image.members()) {
    every_name += (image.bytes_of(member).size() + 4095) / 4096 * 4096;
  }
  ASSERT_GT(every_name, once + (256U << 10U));
  const std::string size = "size=" + std::to_string(once + (128U << 10U));
  ASSERT_EQ(mount("small", "/var/db/timezone", "tmpfs", 0, size.c_str()), 0);
  make_device("2025b");
  EXPECT_EQ(stage_set(image), kStaged1);
  EXPECT_EQ(shared_inodes(kStaged1), shared_inodes(kSet));
}

// Each refusal: how the device is made, what is staged, what the message
// says. The device is compared whole before and after.
struct refusal {
  const char* name;
  std::function<void()> make;
  std::function<std::string(const scratch_dir&)> source;
  const char* message;
};

std::string the_set(const scratch_dir& /*dir*/) { return kSet; }

std::string hand_made(const scratch_dir& dir,
                      const std::vector<raw_member>& m) {
  write_gzip(dir / "bad.tgz", tar_bytes(m));
  return dir / "bad.tgz";
}

// A hand-made archive of the good members and one more.
std::function<std::string(const scratch_dir&)> adding(raw_member extra) {
  return [extra](const scratch_dir& dir) {
    return hand_made(dir, good_members_and(extra));
  };
}

void on_2025b() { make_device("2025b"); }

int held_lock = -1;

const refusal kRefusals[] = {
    {"system partition of the same release", [] { make_device("2026a"); },
     the_set,
     "release 2026a is not newer than 2026a.1.0 of the system partition"},
    {"system partition newer", [] { make_device("2026b"); }, the_set,
     "not newer than 2026b.1.0 of the system partition"},
    {"links designate a set of a newer release",
     [] {
       make_device("2025b");
       tree::make_dir("/var/db/timezone/tz/2026b.1.1/icutz");
       (void)unlink("/var/db/timezone/zoneinfo");
       tree::make_link("/var/db/timezone/tz/2026b.1.1/zoneinfo",
                       "/var/db/timezone/zoneinfo");
     },
     the_set,
     "release 2026a is older than 2026b.1.1, the set the links designate"},
    {"another ICU schema", [] { make_device("2025b", "72l"); }, the_set,
     "its ICU schema \"44l\" is not the system partition's \"72l\""},
    {"another staging running",
     [] {
       make_device("2025b");
       held_lock = open("/var/db/timezone/.kestrel-data.lock",
                        O_RDWR | O_CREAT | O_CLOEXEC, 0600);
       ASSERT_EQ(flock(held_lock, LOCK_EX), 0);
     },
     the_set, "another staging is running"},
    {"no room for the set",
     [] {
       ASSERT_EQ(mount("small", "/var/db/timezone", "tmpfs", 0, "size=256k"),
                 0);
       make_device("2025b");
     },
     the_set, "the set needs"},
    // Verification runs on the copy in tz/, so a device that has staged
    // before (its lock file and tz/ there) is left exactly as it was.
    {"a set that fails verification",
     [] {
       make_device("2025b");
       tree::write_file("/var/db/timezone/.kestrel-data.lock", "", 0600);
       tree::make_dir("/var/db/timezone/tz");
     },
     [](const scratch_dir& dir) {
       // ICU's 2026a resources under zone files that claim 2026c.
       (void)child_process({"cp", "-a", kSet, dir / "set"}).run();
       tree::write_file(dir / "set/zoneinfo/+VERSION", "2026c\n");
       return dir / "set";
     },
     "does not pass verification"},
    {"truncated archive", on_2025b,
     [](const scratch_dir& dir) {
       write_set_archive(load_set(kSet), dir / "whole.tgz");
       const std::string whole = tree::file_content(dir / "whole.tgz");
       tree::write_file(dir / "cut.tgz", whole.substr(0, whole.size() / 2));
       return dir / "cut.tgz";
     },
     "truncated or corrupt"},
    {"wrong sums", on_2025b,
     [](const scratch_dir& dir) {
       auto m = good_members();
       m[2].data = "2026b\n";
       return hand_made(dir, m);
     },
     "does not match its SHA-256 sum"},
    {"path with ..", on_2025b, adding({"zoneinfo/../../../etc/x", '5', ""}),
     "leaves the data set"},
    {"absolute link", on_2025b, adding({"zoneinfo/L", '2', "/etc/passwd"}),
     "leaves the data set"},
    {"device file", on_2025b, adding({"zoneinfo/null", '3', ""}),
     "device file"},
    {"hard link to a missing file", on_2025b,
     adding({"zoneinfo/H", '1', "zoneinfo/none"}), "names no member before it"},
    {"hard link to a later file", on_2025b,
     [](const scratch_dir& dir) {
       auto m = good_members();
       m.insert(m.begin() + 2, {"zoneinfo/H", '1', "zoneinfo/+VERSION"});
       return hand_made(dir, m);
     },
     "names no member before it"},
    {"hard link to a directory", on_2025b,
     adding({"zoneinfo/H", '1', "zoneinfo"}), "names no regular file"},
    {"hard link out of the set", on_2025b,
     adding({"zoneinfo/H", '1', "/etc/passwd"}), "leaves the data set"},
    {"hard link with a wrong sum", on_2025b,
     [](const scratch_dir& dir) {
       auto m = good_members();
       m.push_back({"zoneinfo/H", '1', "zoneinfo/+VERSION"});
       m[0].data += sha256_hex("2026b\n") + "  zoneinfo/H\n";
       return hand_made(dir, m);
     },
     "zoneinfo/H does not match its SHA-256 sum"},
    {"FIFO", on_2025b, adding({"zoneinfo/fifo", '6', ""}), "FIFO"},
};

TEST_F(stage_test, refuses_with_a_clear_message_and_changes_nothing) {
  for (const refusal& r : kRefusals) {
    SCOPED_TRACE(r.name);
    (void)umount2("/var/db/timezone", MNT_DETACH);
    clean_device::SetUp();
    r.make();
    const scratch_dir dir;
    const std::string source = r.source(dir);
    const auto before = whole_device();
    try {
      (void)stage_set(load_set(source));
      ADD_FAILURE() << "staged";
    } catch (const std::runtime_error& e) {
      EXPECT_NE(std::string(e.what()).find(r.message), std::string::npos)
          << e.what();
    }
    EXPECT_EQ(whole_device(), before);
    if (held_lock >= 0) {
      (void)close(held_lock);
      held_lock = -1;
    }
  }
}

}  // namespace
