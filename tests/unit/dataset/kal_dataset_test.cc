#include "dataset/kal_dataset.h"

#include <cerrno>
#include <stdexcept>
#include <string>
#include <vector>

#include "captured_stderr.h"
#include "clean_device.h"
#include "gtest/gtest.h"
#include "outcome.h"
#include "probe_component.h"
#include "tree.h"

namespace {

class kal_dataset_on_device : public clean_device {};

const std::string kStagedDir = "/var/db/timezone/tz/";
const std::string kSystemVersion = "/usr/share/zoneinfo.default/+VERSION";
const std::string kZoneinfoLink = "/var/db/timezone/zoneinfo";
const std::string kIcutzLink = "/var/db/timezone/icutz";
const std::string kLegacyIcutzLink = "/var/db/icutz";

// A staged data set with its zone files and ICU data of schema 57l.
std::string stage(const std::string& version_string) {
  const std::string path = kStagedDir + version_string;
  tree::write_file(path + "/zoneinfo/+VERSION", "2019c\n");
  tree::write_file(path + "/icutz/icutz57l.dat", "data");
  return path;
}

void install_system(const std::string& version_word) {
  tree::write_file(kSystemVersion, version_word + "\n");
  tree::write_file("/usr/share/icu/icutzformat.txt", "57l\n");
}

}  // namespace

TEST_F(kal_dataset_on_device, empty_path_is_the_system_data_set) {
  install_system("2019c");
  captured_stderr err;
  for (const kal_dataset& system : {kal_dataset(), kal_dataset("")}) {
    EXPECT_EQ(system.path, "");
    EXPECT_EQ(system.version_string, "2019c.1.0");
    EXPECT_EQ(system.get_version_string(), "2019c.1.0");
    EXPECT_EQ(system.version.major, 2019);
    EXPECT_EQ(system.version.letters, "c");
    EXPECT_EQ(system.version.minor, 1);
    EXPECT_EQ(system.version.subminor, 0);
    EXPECT_EQ(system.components.size(), 2U);
  }
  EXPECT_EQ(err.text(), "");
}

TEST_F(kal_dataset_on_device, system_without_version_word_is_unversioned) {
  // The failed read of "+VERSION" leaves its errno for the warning lines.
  const struct {
    const char* name;
    void (*build)();
    int stale_errno;
  } cases[] = {
      {"missing", [] {}, ENOENT},
      {"blank", [] { tree::write_file(kSystemVersion, " \n"); }, EAGAIN},
      {"unreadable", [] { tree::make_dir(kSystemVersion); }, EISDIR},
  };
  for (const auto& c : cases) {
    tree::clear("/usr/share");
    c.build();
    captured_stderr err;
    errno = EAGAIN;
    const kal_dataset system;
    EXPECT_EQ(system.version_string, ".1.0") << c.name;
    EXPECT_TRUE(system.version == kal_version()) << c.name;
    EXPECT_EQ(system.components.size(), 2U) << c.name;
    EXPECT_EQ(err.text(),
              warning("Cannot parse version string .1.0, results.size() = 0",
                      c.stale_errno) +
                  warning("Cannot parse version string .1.0", c.stale_errno))
        << c.name;
  }
}

TEST_F(kal_dataset_on_device, staged_version_string_is_its_directory_name) {
  const kal_dataset staged(stage("2020a.1.1"));
  EXPECT_EQ(staged.path, kStagedDir + "2020a.1.1");
  EXPECT_EQ(staged.get_version_string(), "2020a.1.1");
  EXPECT_TRUE(staged.version == kal_version("2020a.1.1"));
}

TEST_F(kal_dataset_on_device, staged_versions_order_against_the_system) {
  install_system("2020a");
  const kal_dataset system;
  const kal_dataset newer(stage("2020a.1.1"));
  const kal_dataset same(stage("2020a.1.0"));
  const kal_dataset older(stage("2020a"));
  EXPECT_TRUE(newer > system);
  EXPECT_FALSE(system > newer);
  EXPECT_FALSE(same > system);
  EXPECT_FALSE(system > same);
  EXPECT_FALSE(older > system);
  EXPECT_TRUE(system > older);
}

TEST_F(kal_dataset_on_device, bad_paths_are_refused) {
  for (const std::string path :
       {"/var/db/timezone/tz/", "/var/db/timezone/zoneinfo",
        "/var/db/timezone/tz", "var/db/timezone/tz/2019c.1.0",
        "/var/db/timezone/tzx2019c.1.0", "/var/db/timezone/TZ/2019c.1.0"}) {
    captured_stderr err;
    try {
      const kal_dataset data_set(path);
      ADD_FAILURE() << path << " was accepted";
    } catch (const std::invalid_argument& error) {
      EXPECT_STREQ(error.what(), "badpath") << path;
    }
    // The failed read of the zone files' "+VERSION" leaves its errno.
    EXPECT_EQ(
        err.text(),
        warning("kal_dataset::create_components: bad path " + path, ENOENT));
  }
}

TEST_F(kal_dataset_on_device, trailing_slash_leaves_the_default_version) {
  const std::string path = stage("2020a.1.1") + "/";
  captured_stderr err;
  errno = EAGAIN;
  const kal_dataset staged(path);
  EXPECT_EQ(staged.version_string, "2020a.1.1/");
  EXPECT_TRUE(staged.version == kal_version());
  EXPECT_EQ(staged.components.size(), 2U);
  EXPECT_EQ(err.text(),
            warning("Cannot parse version string 2020a.1.1/, "
                    "results.size() = 0",
                    EAGAIN) +
                warning("Cannot parse version string 2020a.1.1/", EAGAIN));
  staged.make_current();
  EXPECT_EQ(tree::link_target(kZoneinfoLink), path + "/zoneinfo");
  EXPECT_EQ(tree::link_target(kIcutzLink), path + "/icutz");
}

TEST_F(kal_dataset_on_device, number_beyond_32_bits_ends_construction) {
  EXPECT_THROW(kal_dataset(stage("2019c.99999999999.0")), std::out_of_range);
}

TEST_F(kal_dataset_on_device, data_set_is_compatible_with_its_twin) {
  const std::string path = stage("2019c.1.0");
  const kal_dataset one(path);
  const kal_dataset twin(path);
  EXPECT_TRUE(one.compatible(twin));
  EXPECT_TRUE(twin.compatible(one));
}

TEST_F(kal_dataset_on_device, staged_needs_the_system_icu_schema) {
  install_system("2019c");
  const kal_dataset staged(stage("2020a.1.0"));
  EXPECT_TRUE(staged.compatible(kal_dataset()));
  tree::write_file("/usr/share/icu/icutzformat.txt", "58l\n");
  EXPECT_FALSE(staged.compatible(kal_dataset()));
}

TEST_F(kal_dataset_on_device, different_numbers_of_components_never_match) {
  install_system("2019c");
  const kal_dataset whole;
  kal_dataset shorter;
  shorter.components.pop_back();
  EXPECT_FALSE(whole.compatible(shorter));
  EXPECT_FALSE(shorter.compatible(whole));
  kal_dataset empty;
  empty.components.clear();
  EXPECT_FALSE(whole.compatible(empty));
  EXPECT_FALSE(empty.compatible(whole));
  EXPECT_TRUE(empty.compatible(empty));
}

TEST_F(kal_dataset_on_device, compatible_asks_pairs_until_the_first_no) {
  install_system("2019c");
  std::vector<std::string> log;
  kal_dataset mine;
  kal_dataset theirs;
  mine.components = {make_probe("a1", log), make_probe("a2", log, false),
                     make_probe("a3", log)};
  theirs.components = {make_probe("b1", log), make_probe("b2", log),
                       make_probe("b3", log)};
  EXPECT_FALSE(mine.compatible(theirs));
  EXPECT_EQ(log, (std::vector<std::string>{"a1 asks b1", "a2 asks b2"}));
  log.clear();
  EXPECT_TRUE(theirs.compatible(mine));
  EXPECT_EQ(log, (std::vector<std::string>{"b1 asks a1", "b2 asks a2",
                                           "b3 asks a3"}));
}

TEST_F(kal_dataset_on_device, equality_is_by_path) {
  install_system("2019c");
  const std::string path = stage("2019c.1.0");
  EXPECT_TRUE(kal_dataset() == kal_dataset());
  EXPECT_TRUE(kal_dataset(path) == kal_dataset(path));
  EXPECT_FALSE(kal_dataset(path) == kal_dataset());
  EXPECT_FALSE(kal_dataset() == kal_dataset(path));
  EXPECT_FALSE(kal_dataset(path) == kal_dataset(stage("2019c.1.1")));
}

TEST_F(kal_dataset_on_device, make_current_points_both_links) {
  const std::string path = stage("2019c.1.0");
  tree::make_link("/old/zoneinfo", kZoneinfoLink);
  tree::make_link("/old/icutz", kLegacyIcutzLink);
  captured_stderr err;
  kal_dataset(path).make_current();
  EXPECT_EQ(tree::link_target(kZoneinfoLink), path + "/zoneinfo");
  EXPECT_EQ(tree::link_target(kIcutzLink), path + "/icutz");
  EXPECT_FALSE(tree::present(kLegacyIcutzLink));
  EXPECT_EQ(err.text(), "");
}

TEST_F(kal_dataset_on_device, make_current_replaces_zoneinfo_before_icu) {
  const std::string path = stage("2019c.1.0");
  tree::make_link("/old/zoneinfo", kZoneinfoLink);
  tree::make_dir(kIcutzLink);
  const kal_dataset staged(path);
  captured_stderr err;
  EXPECT_EQ(raised_by([&] { staged.make_current(); }), EEXIST);
  EXPECT_EQ(tree::link_target(kZoneinfoLink), path + "/zoneinfo");
  EXPECT_EQ(err.text(),
            warning("remove: could not remove " + kIcutzLink, EISDIR) +
                warning("unlink of ICU softlink failed", EISDIR) +
                warning("create_symlink: from " + kIcutzLink + " to " + path +
                            "/icutz",
                        EEXIST));
}

TEST_F(kal_dataset_on_device, zoneinfo_failure_leaves_icu_links_alone) {
  const std::string path = stage("2019c.1.0");
  tree::make_dir(kZoneinfoLink);
  tree::make_link("/old/icutz", kIcutzLink);
  tree::make_link("/old/icutz", kLegacyIcutzLink);
  const kal_dataset staged(path);
  captured_stderr err;
  EXPECT_EQ(raised_by([&] { staged.make_current(); }), EEXIST);
  EXPECT_EQ(tree::link_target(kIcutzLink), "/old/icutz");
  EXPECT_EQ(tree::link_target(kLegacyIcutzLink), "/old/icutz");
}

TEST_F(kal_dataset_on_device, make_current_walks_components_in_order) {
  install_system("2019c");
  std::vector<std::string> log;
  kal_dataset data_set;
  data_set.components = {make_probe("a1", log), make_probe("a2", log),
                         make_probe("a3", log)};
  data_set.make_current();
  EXPECT_EQ(log, (std::vector<std::string>{"a1 current", "a2 current",
                                           "a3 current"}));
  log.clear();
  data_set.components[1] = make_probe("a2", log, true, EIO);
  EXPECT_EQ(raised_by([&] { data_set.make_current(); }), EIO);
  EXPECT_EQ(log, (std::vector<std::string>{"a1 current", "a2 current"}));
}

TEST_F(kal_dataset_on_device, reset_to_system_points_at_system_data) {
  install_system("2019c");
  const std::string path = stage("2019c.1.0");
  tree::make_link(path + "/zoneinfo", kZoneinfoLink);
  tree::make_link(path + "/icutz", kIcutzLink);
  tree::make_link(path + "/icutz", kLegacyIcutzLink);
  captured_stderr err;
  kal_dataset::reset_to_system();
  EXPECT_EQ(tree::link_target(kZoneinfoLink), "/usr/share/zoneinfo.default");
  EXPECT_FALSE(tree::present(kIcutzLink));
  EXPECT_FALSE(tree::present(kLegacyIcutzLink));
  EXPECT_EQ(err.text(), "");
}

TEST_F(kal_dataset_on_device, reset_to_system_raises_what_a_component_raises) {
  install_system("2019c");
  tree::make_dir(kZoneinfoLink);
  tree::make_link("/old/icutz", kIcutzLink);
  captured_stderr err;
  EXPECT_EQ(raised_by([] { kal_dataset::reset_to_system(); }), EEXIST);
  EXPECT_EQ(tree::link_target(kIcutzLink), "/old/icutz");
  EXPECT_EQ(err.text(),
            warning("remove: could not remove " + kZoneinfoLink, EISDIR) +
                warning("Unlink of zoneinfo softlink failed", EISDIR) +
                warning("create_symlink: from " + kZoneinfoLink +
                            " to /usr/share/zoneinfo.default",
                        EEXIST));
}
