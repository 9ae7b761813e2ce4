#include "dataset/kal_zoneinfo.h"

#include <cerrno>
#include <string>
#include <vector>

#include "captured_stderr.h"
#include "clean_device.h"
#include "dataset/kal_icu.h"
#include "gtest/gtest.h"
#include "outcome.h"
#include "probe_component.h"
#include "tree.h"

namespace {

class kal_zoneinfo_on_device : public clean_device {};

const std::string kStaged = "/var/db/timezone/tz/2019c.1.0";
const std::string kStagedZoneinfo = kStaged + "/zoneinfo";
const std::string kSystemZoneinfo = "/usr/share/zoneinfo.default";
const std::string kLink = "/var/db/timezone/zoneinfo";

}  // namespace

TEST_F(kal_zoneinfo_on_device, reads_the_first_word_of_the_version_file) {
  const struct {
    const char* content;
    const char* version;
  } cases[] = {
      {"2019c\n", "2019c"},
      {"  2019c more words\nand a second line\n", "2019c"},
      {"2019c.1.0", "2019c.1.0"},
      {"\t\n\v\f\r 2020a", "2020a"},
  };
  for (const auto& c : cases) {
    tree::write_file(kStagedZoneinfo + "/+VERSION", c.content);
    captured_stderr err;
    EXPECT_EQ(kal_zoneinfo(kStaged).version(), c.version) << c.content;
    EXPECT_EQ(err.text(), "");
  }
}

TEST_F(kal_zoneinfo_on_device, missing_or_blank_version_file_gives_empty) {
  tree::make_dir(kStagedZoneinfo);
  captured_stderr err;
  EXPECT_EQ(kal_zoneinfo(kStaged).version(), "");
  tree::write_file(kStagedZoneinfo + "/+VERSION", "");
  EXPECT_EQ(kal_zoneinfo(kStaged).version(), "");
  tree::write_file(kStagedZoneinfo + "/+VERSION", " \n\t\n");
  EXPECT_EQ(kal_zoneinfo(kStaged).version(), "");
  EXPECT_EQ(err.text(), "");
}

TEST_F(kal_zoneinfo_on_device, unreadable_version_file_gives_empty) {
  tree::make_dir(kStagedZoneinfo + "/+VERSION");
  captured_stderr err;
  EXPECT_EQ(kal_zoneinfo(kStaged).version(), "");
  EXPECT_EQ(err.text(), "");
}

TEST_F(kal_zoneinfo_on_device, empty_path_reads_the_system_partition) {
  tree::write_file(kSystemZoneinfo + "/+VERSION", "2018e\n");
  tree::write_file(kStagedZoneinfo + "/+VERSION", "2019c\n");
  EXPECT_EQ(kal_zoneinfo("").version(), "2018e");
  EXPECT_EQ(kal_zoneinfo().version(), "2018e");
}

TEST_F(kal_zoneinfo_on_device, staged_path_reads_its_zoneinfo_directory) {
  tree::write_file(kSystemZoneinfo + "/+VERSION", "2018e\n");
  tree::write_file(kStaged + "/+VERSION", "2017a\n");
  tree::write_file(kStagedZoneinfo + "/+VERSION", "2019c\n");
  EXPECT_EQ(kal_zoneinfo(kStaged).version(), "2019c");
}

TEST_F(kal_zoneinfo_on_device, trailing_slash_doubles_it_in_the_directory) {
  tree::write_file(kStagedZoneinfo + "/+VERSION", "2019c\n");
  const kal_zoneinfo zoneinfo(kStaged + "/");
  EXPECT_EQ(zoneinfo.version(), "2019c");
  zoneinfo.make_current();
  EXPECT_EQ(tree::link_target(kLink), kStaged + "//zoneinfo");
}

TEST_F(kal_zoneinfo_on_device, any_other_component_is_compatible) {
  tree::write_file("/usr/share/icu/icutzformat.txt", "57l\n");
  const kal_zoneinfo zoneinfo(kStaged);
  const kal_icu icu;
  std::vector<std::string> log;
  const probe_component probe("probe", log, false);
  captured_stderr err;
  EXPECT_TRUE(zoneinfo.compatible_schema(icu));
  EXPECT_TRUE(zoneinfo.compatible_schema(probe));
  EXPECT_TRUE(zoneinfo.compatible_schema(kal_zoneinfo()));
  EXPECT_EQ(err.text(), "");
  EXPECT_TRUE(log.empty());
}

TEST_F(kal_zoneinfo_on_device, make_current_creates_a_missing_link) {
  const kal_zoneinfo zoneinfo(kStaged);
  captured_stderr err;
  zoneinfo.make_current();
  EXPECT_EQ(tree::link_target(kLink), kStagedZoneinfo);
  EXPECT_EQ(err.text(), "");
}

TEST_F(kal_zoneinfo_on_device, make_current_replaces_a_link_elsewhere) {
  tree::make_link("/var/db/timezone/tz/2018a.1.0/zoneinfo", kLink);
  const kal_zoneinfo zoneinfo(kStaged);
  captured_stderr err;
  zoneinfo.make_current();
  EXPECT_EQ(tree::link_target(kLink), kStagedZoneinfo);
  EXPECT_EQ(err.text(), "");
}

TEST_F(kal_zoneinfo_on_device, system_links_even_a_missing_directory) {
  tree::make_link(kStagedZoneinfo, kLink);
  const kal_zoneinfo zoneinfo;
  zoneinfo.make_current();
  EXPECT_EQ(tree::link_target(kLink), kSystemZoneinfo);
  EXPECT_FALSE(tree::present(kSystemZoneinfo));
}

TEST_F(kal_zoneinfo_on_device, make_current_can_be_repeated) {
  const kal_zoneinfo zoneinfo(kStaged);
  zoneinfo.make_current();
  zoneinfo.make_current();
  EXPECT_EQ(tree::link_target(kLink), kStagedZoneinfo);
}

TEST_F(kal_zoneinfo_on_device, link_that_cannot_be_removed_fails_creation) {
  tree::make_dir(kLink);
  const kal_zoneinfo zoneinfo(kStaged);
  captured_stderr err;
  EXPECT_EQ(raised_by([&] { zoneinfo.make_current(); }), EEXIST);
  EXPECT_EQ(
      err.text(),
      warning("remove: could not remove " + kLink, EISDIR) +
          warning("Unlink of zoneinfo softlink failed", EISDIR) +
          warning("create_symlink: from " + kLink + " to " + kStagedZoneinfo,
                  EEXIST));
  EXPECT_TRUE(tree::present(kLink));
  EXPECT_EQ(tree::link_target(kLink), "(none)");
}

TEST_F(kal_zoneinfo_on_device, link_that_cannot_be_created_raises) {
  tree::clear("/var");
  const kal_zoneinfo zoneinfo(kStaged);
  captured_stderr err;
  EXPECT_EQ(raised_by([&] { zoneinfo.make_current(); }), ENOENT);
  EXPECT_EQ(err.text(),
            warning("create_symlink: from " + kLink + " to " + kStagedZoneinfo,
                    ENOENT));
}
