#include "data/set_archive.h"

#include <unistd.h>

#include <functional>
#include <map>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

#include "data/manifest.h"
#include "data/set_directory.h"
#include "data/tar_header.h"
#include "gtest/gtest.h"
#include "hand_made_archive.h"
#include "scratch_dir.h"
#include "tree.h"

namespace {

const std::string kVersion = "2026a\n";

TEST(set_archive_test, a_packed_set_reads_back_the_same) {
  const scratch_dir dir;
  tree::write_file(dir / "set/zoneinfo/+VERSION", kVersion);
  tree::write_file(dir / "set/zoneinfo/Europe/Paris", std::string(1300, 'x'));
  tree::make_link("../+VERSION", dir / "set/zoneinfo/Europe/V");
  tree::write_file(dir / "set/icutz/icutz44l.dat", "data", 0644);
  const set_image image = read_set_directory(dir / "set");
  write_set_archive(image, dir / "a.tgz");
  const set_image back = read_set_archive(dir / "a.tgz");
  ASSERT_EQ(back.members().size(), image.members().size());
  for (std::size_t i = 0; i < image.members().size(); ++i) {
    EXPECT_EQ(back.members()[i].path, image.members()[i].path);
    EXPECT_EQ(back.members()[i].type, image.members()[i].type);
    EXPECT_EQ(back.members()[i].data, image.members()[i].data);
    EXPECT_EQ(back.members()[i].mode, image.members()[i].mode);
  }
  EXPECT_EQ(back.release(), "2026a");
  EXPECT_EQ(back.schema(), "44l");
}

TEST(set_archive_test, a_hand_made_good_archive_is_read) {
  const scratch_dir dir;
  write_gzip(dir / "a.tgz", tar_bytes(good_members()));
  EXPECT_EQ(read_set_archive(dir / "a.tgz").members().size(), 3U);
}

TEST(set_archive_test, a_hand_made_hard_link_to_an_earlier_file_is_read) {
  const scratch_dir dir;
  auto m = good_members();
  m.push_back({"zoneinfo/H", '1', "zoneinfo/+VERSION"});
  m[0].data += sha256_hex(kVersion) + "  zoneinfo/H\n";
  write_gzip(dir / "a.tgz", tar_bytes(m));
  const set_image image = read_set_archive(dir / "a.tgz");
  ASSERT_EQ(image.members().size(), 4U);
  EXPECT_EQ(image.members()[3].type, set_member::kind::hard_link);
  EXPECT_EQ(image.bytes_of(image.members()[3]), kVersion);
}

TEST(set_archive_test, a_packed_set_keeps_its_hard_links) {
  const scratch_dir dir;
  tree::write_file(dir / "set/zoneinfo/+VERSION", kVersion);
  tree::write_file(dir / "set/zoneinfo/Europe/Prague", std::string(1300, 'x'));
  tree::make_dir(dir / "set/zoneinfo/Etc");
  ASSERT_EQ(link((dir / "set/zoneinfo/Europe/Prague").c_str(),
                 (dir / "set/zoneinfo/Europe/Bratislava").c_str()),
            0);
  ASSERT_EQ(link((dir / "set/zoneinfo/+VERSION").c_str(),
                 (dir / "set/zoneinfo/Etc/V").c_str()),
            0);
  const set_image image = read_set_directory(dir / "set");
  write_set_archive(image, dir / "a.tgz");
  const set_image back = read_set_archive(dir / "a.tgz");
  // Met first in a walk by name, each file's first name keeps its bytes.
  const std::map<std::string, std::pair<set_member::kind, std::string>>
      kExpected = {
          {"zoneinfo", {set_member::kind::directory, ""}},
          {"zoneinfo/+VERSION", {set_member::kind::file, kVersion}},
          {"zoneinfo/Etc", {set_member::kind::directory, ""}},
          {"zoneinfo/Etc/V",
           {set_member::kind::hard_link, "zoneinfo/+VERSION"}},
          {"zoneinfo/Europe", {set_member::kind::directory, ""}},
          {"zoneinfo/Europe/Bratislava",
           {set_member::kind::file, std::string(1300, 'x')}},
          {"zoneinfo/Europe/Prague",
           {set_member::kind::hard_link, "zoneinfo/Europe/Bratislava"}},
      };
  for (const set_image* read : {&image, &back}) {
    std::map<std::string, std::pair<set_member::kind, std::string>> members;
    for (const set_member& m : read->members()) {
      members[m.path] = {m.type, m.data};
    }
    EXPECT_EQ(members, kExpected);
  }
  // The manifest sums every name, so that sha256sum -c checks them all.
  EXPECT_NE(make_manifest(image).find(sha256_hex(std::string(1300, 'x')) +
                                      "  zoneinfo/Europe/Prague\n"),
            std::string::npos);
}

TEST(set_archive_test, bad_archives_are_refused_naming_the_fault) {
  const std::string good = tar_bytes(good_members());
  const struct {
    const char* name;
    std::function<std::string()> bytes;
    const char* message;
  } kBad[] = {
      {"truncated", [&] { return good.substr(0, 1500); }, "truncated"},
      {"wrong sum",
       [] {
         auto m = good_members();
         m[2].data = "2026b\n";
         return tar_bytes(m);
       },
       "does not match its SHA-256 sum"},
      {"no manifest",
       [] {
         auto m = good_members();
         m.erase(m.begin());
         return tar_bytes(m);
       },
       "no manifest"},
      {"dot-dot path",
       [] {
         return tar_bytes(good_members_and({"zoneinfo/../../etc", '5', ""}));
       },
       "leaves the data set"},
      {"absolute path",
       [] {
         return tar_bytes(good_members_and({"/etc/x", '5', ""}));
       },
       "leaves the data set"},
      {"absolute link",
       [] {
         return tar_bytes(good_members_and({"zoneinfo/L", '2', "/etc/passwd"}));
       },
       "leaves the data set"},
      {"link climbing out",
       [] {
         return tar_bytes(good_members_and({"zoneinfo/L", '2', "../../x"}));
       },
       "leaves the data set"},
      {"character device",
       [] {
         return tar_bytes(good_members_and({"zoneinfo/null", '3', ""}));
       },
       "device file"},
      {"block device",
       [] {
         return tar_bytes(good_members_and({"zoneinfo/sda", '4', ""}));
       },
       "device file"},
      {"FIFO",
       [] {
         return tar_bytes(good_members_and({"zoneinfo/fifo", '6', ""}));
       },
       "FIFO"},
      {"hard link to a missing member",
       [] {
         return tar_bytes(
             good_members_and({"zoneinfo/H", '1', "zoneinfo/none"}));
       },
       "the hard link zoneinfo/H to zoneinfo/none names no member before it"},
      {"hard link to a later member",
       [] {
         auto m = good_members();
         m.insert(m.begin() + 2, {"zoneinfo/H", '1', "zoneinfo/+VERSION"});
         m[0].data += sha256_hex(kVersion) + "  zoneinfo/H\n";
         return tar_bytes(m);
       },
       "names no member before it"},
      {"hard link to a directory",
       [] {
         return tar_bytes(good_members_and({"zoneinfo/H", '1', "zoneinfo"}));
       },
       "the hard link zoneinfo/H to zoneinfo names no regular file"},
      {"hard link to a symbolic link",
       [] {
         return tar_bytes(good_members_and({"zoneinfo/H", '1', "zoneinfo/V"}));
       },
       "names no regular file"},
      {"hard link climbing out",
       [] {
         return tar_bytes(good_members_and(
             {"zoneinfo/H", '1', "zoneinfo/../../etc/passwd"}));
       },
       "leaves the data set"},
      {"hard link to an absolute path",
       [] {
         return tar_bytes(good_members_and({"zoneinfo/H", '1', "/etc/passwd"}));
       },
       "the hard link zoneinfo/H to /etc/passwd leaves the data set"},
      {"hard link to the manifest",
       [] {
         return tar_bytes(good_members_and({"zoneinfo/H", '1', kManifestName}));
       },
       "names no member before it"},
      {"hard link with a wrong sum",
       [] {
         auto m = good_members();
         m.push_back({"zoneinfo/H", '1', "zoneinfo/+VERSION"});
         m[0].data += sha256_hex("2026b\n") + "  zoneinfo/H\n";
         return tar_bytes(m);
       },
       "zoneinfo/H does not match its SHA-256 sum"},
      {"hard link missing from the manifest",
       [] {
         return tar_bytes(
             good_members_and({"zoneinfo/H", '1', "zoneinfo/+VERSION"}));
       },
       "zoneinfo/H is not in the manifest"},
      {"bad checksum",
       [&] {
         std::string b = good;
         b[0] = 'X';
         return b;
       },
       "bad checksum"},
      {"not tar", [] { return std::string(2048, 'z'); }, "not a ustar"},
  };
  for (const auto& bad : kBad) {
    const scratch_dir dir;
    write_gzip(dir / "a.tgz", bad.bytes());
    try {
      (void)read_set_archive(dir / "a.tgz");
      ADD_FAILURE() << "accepted: " << bad.name;
    } catch (const std::runtime_error& e) {
      EXPECT_NE(std::string(e.what()).find(bad.message), std::string::npos)
          << bad.name << ": " << e.what();
    }
  }
}

TEST(set_archive_test, a_truncated_gzip_stream_is_refused) {
  const scratch_dir dir;
  write_gzip(dir / "whole.tgz", tar_bytes(good_members()));
  const std::string whole = tree::file_content(dir / "whole.tgz");
  tree::write_file(dir / "cut.tgz", whole.substr(0, whole.size() / 2));
  EXPECT_THROW(read_set_archive(dir / "cut.tgz"), std::runtime_error);
}

TEST(set_archive_test, long_paths_use_the_ustar_prefix) {
  const std::string path = std::string(120, 'd') + "/" + std::string(90, 'f');
  const tar_header header(tar_header::make(path, '0', 0644, 7, ""));
  EXPECT_EQ(header.path, path);
  EXPECT_EQ(header.size, 7U);
  EXPECT_THROW(tar_header::make(std::string(300, 'x'), '0', 0644, 0, ""),
               std::runtime_error);
}

}  // namespace
