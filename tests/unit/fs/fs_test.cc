#include "fs/fs.h"

#include <cerrno>
#include <string>

#include "captured_stderr.h"
#include "gtest/gtest.h"
#include "outcome.h"
#include "scratch_dir.h"
#include "tree.h"

TEST(remove, missing_path_is_silent_and_false) {
  scratch_dir dir;
  captured_stderr err;
  EXPECT_FALSE(fs::remove(dir / "missing"));
  EXPECT_EQ(err.text(), "");
}

TEST(remove, deletes_a_file) {
  scratch_dir dir;
  tree::write_file(dir / "file", "x");
  captured_stderr err;
  fs::remove(dir / "file");
  EXPECT_FALSE(tree::present(dir / "file"));
  EXPECT_EQ(err.text(), "");
}

TEST(remove, result_after_success_is_whether_errno_is_zero) {
  scratch_dir dir;
  tree::write_file(dir / "a", "");
  tree::write_file(dir / "b", "");
  errno = 0;
  EXPECT_TRUE(fs::remove(dir / "a"));
  errno = EINTR;
  EXPECT_FALSE(fs::remove(dir / "b"));
  EXPECT_FALSE(tree::present(dir / "b"));
}

TEST(remove, deletes_a_link_and_keeps_its_target) {
  scratch_dir dir;
  tree::write_file(dir / "target", "data");
  tree::make_link(dir / "target", dir / "link");
  fs::remove(dir / "link");
  EXPECT_FALSE(tree::present(dir / "link"));
  EXPECT_EQ(tree::file_content(dir / "target"), "data");
}

TEST(remove, directory_is_logged_and_raised) {
  scratch_dir dir;
  tree::make_dir(dir / "sub");
  captured_stderr err;
  EXPECT_EQ(raised_by([&] { fs::remove(dir / "sub"); }), EISDIR);
  EXPECT_EQ(err.text(), "kestrel: remove: could not remove " + (dir / "sub") +
                            ": Is a directory\n");
  EXPECT_TRUE(tree::present(dir / "sub"));
}

TEST(exists, answers_for_each_kind_of_entry) {
  scratch_dir dir;
  tree::write_file(dir / "file", "");
  tree::make_dir(dir / "dir");
  tree::make_link(dir / "file", dir / "link_to_file");
  tree::make_link(dir / "dir", dir / "link_to_dir");
  tree::make_link(dir / "nothing", dir / "dangling");
  const struct {
    const char* name;
    bool expected;
  } cases[] = {
      {"file", true},        {"dir", true},       {"link_to_file", true},
      {"link_to_dir", true}, {"dangling", false}, {"missing", false},
  };
  captured_stderr err;
  for (const auto& c : cases) {
    EXPECT_EQ(fs::exists(dir / c.name), c.expected) << c.name;
  }
  EXPECT_EQ(err.text(), "");
}

TEST(read_symlink, missing_path_is_silent_and_empty) {
  scratch_dir dir;
  captured_stderr err;
  EXPECT_EQ(fs::read_symlink(dir / "missing"), "");
  EXPECT_EQ(err.text(), "");
}

TEST(read_symlink, returns_target_text_of_a_dangling_link) {
  scratch_dir dir;
  tree::make_link("/var/db/timezone/tz/2019c.1.0/zoneinfo", dir / "link");
  EXPECT_EQ(fs::read_symlink(dir / "link"),
            "/var/db/timezone/tz/2019c.1.0/zoneinfo");
}

TEST(read_symlink, keeps_a_relative_target_as_written) {
  scratch_dir dir;
  tree::make_link("../zoneinfo//Europe/Paris", dir / "link");
  EXPECT_EQ(fs::read_symlink(dir / "link"), "../zoneinfo//Europe/Paris");
}

TEST(read_symlink, entries_that_are_not_links_are_logged_and_raised) {
  scratch_dir dir;
  tree::write_file(dir / "file", "");
  tree::make_dir(dir / "dir");
  const struct {
    std::string path;
    int error;
    const char* text;
  } cases[] = {
      {dir / "file", EINVAL, "Invalid argument"},
      {dir / "dir", EINVAL, "Invalid argument"},
      {dir / "file/below", ENOTDIR, "Not a directory"},
  };
  for (const auto& c : cases) {
    captured_stderr err;
    EXPECT_EQ(raised_by([&] { fs::read_symlink(c.path); }), c.error) << c.path;
    EXPECT_EQ(err.text(),
              "kestrel: read_symlink: " + c.path + ": " + c.text + "\n");
  }
}

TEST(read_symlink, cuts_a_long_target_to_1024_bytes) {
  scratch_dir dir;
  std::string target = "/";
  for (int i = 0; target.size() < 1500; ++i) {
    target += "component" + std::to_string(i) + "/";
  }
  tree::make_link(target, dir / "link");
  EXPECT_EQ(fs::read_symlink(dir / "link"), target.substr(0, 1024));
}

TEST(read_symlink, target_of_exactly_1024_bytes_is_whole) {
  scratch_dir dir;
  const std::string target = "/" + std::string(1023, 'a');
  tree::make_link(target, dir / "link");
  EXPECT_EQ(fs::read_symlink(dir / "link"), target);
}

TEST(create_symlink, creates_a_link_to_a_missing_target) {
  scratch_dir dir;
  captured_stderr err;
  fs::create_symlink("/usr/share/zoneinfo.default", dir / "zoneinfo");
  EXPECT_EQ(tree::link_target(dir / "zoneinfo"), "/usr/share/zoneinfo.default");
  EXPECT_EQ(err.text(), "");
}

TEST(create_symlink, existing_entry_is_logged_link_first_and_raised) {
  scratch_dir dir;
  tree::write_file(dir / "file", "keep");
  tree::make_link("/old", dir / "link");
  for (const std::string& existing : {dir / "file", dir / "link"}) {
    captured_stderr err;
    EXPECT_EQ(raised_by([&] { fs::create_symlink("/new", existing); }), EEXIST);
    EXPECT_EQ(err.text(), "kestrel: create_symlink: from " + existing +
                              " to /new: File exists\n");
  }
  EXPECT_EQ(tree::file_content(dir / "file"), "keep");
  EXPECT_EQ(tree::link_target(dir / "link"), "/old");
}

TEST(create_symlink, missing_parent_is_logged_and_raised) {
  scratch_dir dir;
  captured_stderr err;
  EXPECT_EQ(raised_by([&] { fs::create_symlink("/t", dir / "no/link"); }),
            ENOENT);
  EXPECT_EQ(err.text(), "kestrel: create_symlink: from " + (dir / "no/link") +
                            " to /t: No such file or directory\n");
}
