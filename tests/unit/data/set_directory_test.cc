#include "data/set_directory.h"

#include <unistd.h>

#include <string>

#include "device_tree.h"
#include "gtest/gtest.h"
#include "scratch_dir.h"
#include "tree.h"

namespace {

TEST(set_directory_test, a_written_set_shares_inodes_as_the_set_read) {
  const scratch_dir dir;
  tree::write_file(dir / "set/zoneinfo/+VERSION", "2026a\n");
  tree::write_file(dir / "set/zoneinfo/Europe/Prague", "TZif Prague");
  tree::write_file(dir / "set/zoneinfo/Europe/Paris", "TZif Paris");
  tree::make_link("Prague", dir / "set/zoneinfo/Europe/Symbolic");
  for (const char* name : {"Europe/Bratislava", "Czech", "Europe/Zz"}) {
    ASSERT_EQ(link((dir / "set/zoneinfo/Europe/Prague").c_str(),
                   (dir / "set/zoneinfo/" + name).c_str()),
              0);
  }
  tree::make_dir(dir / "copy");
  write_set_directory(read_set_directory(dir / "set"), dir / "copy");
  EXPECT_EQ(relative_snapshot(dir / "copy"), relative_snapshot(dir / "set"));
  EXPECT_EQ(shared_inodes(dir / "copy"), shared_inodes(dir / "set"));
  EXPECT_EQ(shared_inodes(dir / "copy").at("/zoneinfo/Czech"),
            "4 names, first /zoneinfo/Czech");
}

}  // namespace
