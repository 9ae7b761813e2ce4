#include "data/set_image.h"

#include <string>
#include <vector>

#include "gtest/gtest.h"

namespace {

using kind = set_member::kind;

TEST(set_image_test, counts_each_file_once_however_many_names_it_has) {
  const std::string zone(5000, 'z');
  const struct {
    const char* name;
    std::vector<set_member> members;
    std::uint64_t bytes;
    std::size_t inodes;
  } kCases[] = {
      {"one file", {{"Paris", kind::file, 0644, zone}}, 8192, 1},
      {"a file and two hard links",
       {{"Paris", kind::file, 0644, zone},
        {"Monaco", kind::hard_link, 0644, "Paris"},
        {"Andorra", kind::hard_link, 0644, "Paris"}},
       8192,
       1},
      {"two files",
       {{"Paris", kind::file, 0644, zone}, {"Monaco", kind::file, 0644, zone}},
       16384,
       2},
      {"a directory, an empty file, a link and a hard link",
       {{"Europe", kind::directory, 0755, ""},
        {"Europe/Paris", kind::file, 0644, ""},
        {"Europe/Monaco", kind::link, 0777, "Paris"},
        {"Europe/Andorra", kind::hard_link, 0644, "Europe/Paris"}},
       3 * 4096,
       3},
  };
  for (const auto& c : kCases) {
    set_image image;
    for (const set_member& member : c.members) {
      image.add(member);
    }
    EXPECT_EQ(image.disk_bytes(4096), c.bytes) << c.name;
    EXPECT_EQ(image.inodes(), c.inodes) << c.name;
  }
}

TEST(set_image_test, a_hard_link_has_the_bytes_of_its_file) {
  set_image image;
  image.add({"Paris", kind::file, 0644, "TZif"});
  image.add({"Monaco", kind::hard_link, 0644, "Paris"});
  EXPECT_EQ(image.bytes_of(image.members()[1]), "TZif");
  EXPECT_EQ(image.bytes_of(image.members()[0]), "TZif");
}

}  // namespace
