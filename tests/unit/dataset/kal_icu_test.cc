#include "dataset/kal_icu.h"

#include <dirent.h>

#include <cerrno>
#include <string>
#include <vector>

#include "captured_stderr.h"
#include "clean_device.h"
#include "dataset/kal_zoneinfo.h"
#include "gtest/gtest.h"
#include "outcome.h"
#include "probe_component.h"
#include "tree.h"

namespace {

class kal_icu_on_device : public clean_device {};

const std::string kStaged = "/var/db/timezone/tz/2019c.1.0";
const std::string kStagedIcu = kStaged + "/icutz";
const std::string kFormatFile = "/usr/share/icu/icutzformat.txt";
const std::string kLink = "/var/db/timezone/icutz";
const std::string kLegacyLink = "/var/db/icutz";

// A completed walk leaves errno at 0, and that is the text on the line.
const std::string kNoSchema = warning("No ICU schema found for " + kStaged, 0);

// Whether icu holds exactly schema: it is compared with a system component
// whose format file names that schema.
bool has_schema(const kal_icu& icu, const std::string& schema) {
  tree::write_file(kFormatFile, schema);
  return icu.compatible_schema(kal_icu());
}

// Of names, the one that a walk of dir meets first.
std::string first_yielded(const std::string& dir,
                          const std::vector<std::string>& names) {
  DIR* stream = opendir(dir.c_str());
  std::string first;
  for (dirent* entry = readdir(stream); entry != nullptr && first.empty();
       entry = readdir(stream)) {
    for (const std::string& name : names) {
      if (name == entry->d_name) {
        first = name;
      }
    }
  }
  closedir(stream);
  return first;
}

}  // namespace

TEST_F(kal_icu_on_device, takes_schema_from_data_file_name) {
  for (const char* schema : {"57l", "123b", "7e", "0057l"}) {
    tree::clear("/var/db/timezone");
    tree::write_file(kStagedIcu + "/icutz" + schema + ".dat", "data");
    captured_stderr err;
    const kal_icu icu(kStaged);
    EXPECT_EQ(err.text(), "") << schema;
    EXPECT_TRUE(has_schema(icu, schema)) << schema;
  }
}

TEST_F(kal_icu_on_device, names_that_do_not_match_give_no_schema) {
  for (const char* name :
       {"icutz57L.dat", "icutz57.dat", "icutz57l.dat.bak", "old-icutz57l.dat",
        "icutzl.dat", "icutz57x.dat", "icutz57l.Dat", "icutz57l0dat"}) {
    tree::clear("/var/db/timezone");
    tree::write_file(kStagedIcu + "/" + name, "data");
    captured_stderr err;
    const kal_icu icu(kStaged);
    EXPECT_EQ(err.text(), kNoSchema) << name;
    EXPECT_TRUE(has_schema(icu, "")) << name;
  }
}

TEST_F(kal_icu_on_device, link_to_a_data_file_is_not_taken) {
  tree::write_file("/var/db/timezone/tz/elsewhere/icutz57l.dat", "data");
  tree::make_link("/var/db/timezone/tz/elsewhere/icutz57l.dat",
                  kStagedIcu + "/icutz57l.dat");
  captured_stderr err;
  const kal_icu icu(kStaged);
  EXPECT_EQ(err.text(), kNoSchema);
  EXPECT_TRUE(has_schema(icu, ""));
}

TEST_F(kal_icu_on_device, file_not_readable_by_others_is_not_taken) {
  tree::write_file(kStagedIcu + "/icutz57l.dat", "data", 0640);
  captured_stderr err;
  const kal_icu icu(kStaged);
  EXPECT_EQ(err.text(), kNoSchema);
  EXPECT_TRUE(has_schema(icu, ""));
}

TEST_F(kal_icu_on_device, file_readable_only_by_others_is_taken) {
  tree::write_file(kStagedIcu + "/icutz57l.dat", "data", 0004);
  captured_stderr err;
  const kal_icu icu(kStaged);
  EXPECT_EQ(err.text(), "");
  EXPECT_TRUE(has_schema(icu, "57l"));
}

TEST_F(kal_icu_on_device, directory_with_a_data_file_name_is_not_taken) {
  tree::make_dir(kStagedIcu + "/icutz57l.dat");
  captured_stderr err;
  const kal_icu icu(kStaged);
  EXPECT_EQ(err.text(), kNoSchema);
}

TEST_F(kal_icu_on_device, data_file_in_a_subdirectory_is_not_taken) {
  tree::write_file(kStagedIcu + "/sub/icutz57l.dat", "data");
  captured_stderr err;
  const kal_icu icu(kStaged);
  EXPECT_EQ(err.text(), kNoSchema);
  EXPECT_TRUE(has_schema(icu, ""));
}

TEST_F(kal_icu_on_device, first_data_file_in_directory_order_wins) {
  tree::write_file(kStagedIcu + "/icutz57l.dat", "data");
  tree::write_file(kStagedIcu + "/icutz58l.dat", "data");
  const std::string first =
      first_yielded(kStagedIcu, {"icutz57l.dat", "icutz58l.dat"});
  ASSERT_FALSE(first.empty());
  const std::string taken = first == "icutz57l.dat" ? "57l" : "58l";
  const std::string other = first == "icutz57l.dat" ? "58l" : "57l";
  const kal_icu icu(kStaged);
  EXPECT_TRUE(has_schema(icu, taken));
  EXPECT_FALSE(has_schema(icu, other));
}

TEST_F(kal_icu_on_device, missing_icu_directory_gives_no_schema) {
  tree::make_dir(kStaged);
  captured_stderr err;
  const kal_icu icu(kStaged);
  EXPECT_EQ(err.text(), kNoSchema);
  EXPECT_TRUE(has_schema(icu, ""));
}

TEST_F(kal_icu_on_device, empty_icu_directory_gives_no_schema) {
  tree::make_dir(kStagedIcu);
  captured_stderr err;
  const kal_icu icu(kStaged);
  EXPECT_EQ(err.text(), kNoSchema);
}

TEST_F(kal_icu_on_device, icu_directory_that_is_a_link_is_followed) {
  tree::write_file("/var/db/timezone/tz/shared/icutz57l.dat", "data");
  tree::make_link("/var/db/timezone/tz/shared", kStagedIcu);
  captured_stderr err;
  const kal_icu icu(kStaged);
  EXPECT_EQ(err.text(), "");
  EXPECT_TRUE(has_schema(icu, "57l"));
}

TEST_F(kal_icu_on_device, system_schema_is_first_word_of_format_file) {
  tree::write_file(kFormatFile, "  57l\nsecond line\n");
  const kal_icu icu;
  tree::write_file(kStagedIcu + "/icutz57l.dat", "data");
  EXPECT_TRUE(icu.compatible_schema(kal_icu(kStaged)));
}

TEST_F(kal_icu_on_device, system_format_file_is_not_checked) {
  tree::write_file(kFormatFile, "anything-at-all\n");
  const kal_icu icu("");
  EXPECT_TRUE(has_schema(icu, "anything-at-all"));
}

TEST_F(kal_icu_on_device, system_without_format_word_has_empty_schema) {
  const struct {
    const char* name;
    void (*build)();
  } cases[] = {
      {"missing", [] {}},
      {"empty", [] { tree::write_file(kFormatFile, ""); }},
      {"blank", [] { tree::write_file(kFormatFile, " \n\t\n"); }},
      {"unreadable", [] { tree::make_dir(kFormatFile); }},
  };
  for (const auto& c : cases) {
    tree::clear("/usr/share");
    c.build();
    captured_stderr err;
    const kal_icu icu;
    EXPECT_EQ(err.text(), "") << c.name;
    tree::clear("/usr/share");
    EXPECT_TRUE(has_schema(icu, "")) << c.name;
  }
}

TEST_F(kal_icu_on_device, update_is_compatible_only_with_the_same_schema) {
  tree::write_file(kStagedIcu + "/icutz57l.dat", "data");
  const kal_icu update(kStaged);
  const struct {
    const char* system;
    bool compatible;
  } cases[] = {
      {"57l", true},   {"57l\n", true}, {"57b", false}, {"58l", false},
      {"057l", false}, {"57", false},   {"57L", false}, {"", false},
  };
  for (const auto& c : cases) {
    tree::write_file(kFormatFile, c.system);
    const kal_icu system;
    EXPECT_EQ(update.compatible_schema(system), c.compatible) << c.system;
    EXPECT_EQ(system.compatible_schema(update), c.compatible) << c.system;
  }
}

TEST_F(kal_icu_on_device, two_empty_schemas_are_compatible) {
  captured_stderr err;
  const kal_icu system;
  const kal_icu update(kStaged);
  EXPECT_TRUE(update.compatible_schema(system));
  EXPECT_TRUE(system.compatible_schema(update));
  EXPECT_EQ(err.text(), kNoSchema);
}

TEST_F(kal_icu_on_device, another_kind_of_component_is_not_compatible) {
  const kal_icu icu;
  const kal_zoneinfo zoneinfo;
  std::vector<std::string> log;
  const probe_component probe("probe", log);
  captured_stderr err;
  errno = EPERM;
  EXPECT_FALSE(icu.compatible_schema(zoneinfo));
  EXPECT_FALSE(icu.compatible_schema(probe));
  const std::string line = warning(
      "kal_icu::compatible_schema: could not dynamic_cast other component",
      EPERM);
  EXPECT_EQ(err.text(), line + line);
  EXPECT_TRUE(log.empty());
}

TEST_F(kal_icu_on_device, system_make_current_removes_both_links) {
  tree::make_link(kStagedIcu, kLink);
  tree::make_link(kStagedIcu, kLegacyLink);
  const kal_icu icu;
  captured_stderr err;
  icu.make_current();
  EXPECT_FALSE(tree::present(kLink));
  EXPECT_FALSE(tree::present(kLegacyLink));
  icu.make_current();
  EXPECT_FALSE(tree::present(kLink));
  EXPECT_FALSE(tree::present(kLegacyLink));
  EXPECT_EQ(err.text(), "");
}

TEST_F(kal_icu_on_device, update_make_current_links_its_icu_directory) {
  tree::write_file(kStagedIcu + "/icutz57l.dat", "data");
  tree::make_link("/var/db/timezone/tz/2018a.1.0/icutz", kLink);
  tree::make_link("/var/db/timezone/tz/2018a.1.0/icutz", kLegacyLink);
  const kal_icu icu(kStaged);
  captured_stderr err;
  icu.make_current();
  EXPECT_EQ(tree::link_target(kLink), kStagedIcu);
  EXPECT_FALSE(tree::present(kLegacyLink));
  icu.make_current();
  EXPECT_EQ(tree::link_target(kLink), kStagedIcu);
  EXPECT_FALSE(tree::present(kLegacyLink));
  EXPECT_EQ(err.text(), "");
}

TEST_F(kal_icu_on_device, update_links_even_without_a_schema) {
  captured_stderr err;
  const kal_icu icu(kStaged + "/");
  icu.make_current();
  EXPECT_EQ(err.text(), warning("No ICU schema found for " + kStaged + "/", 0));
  EXPECT_EQ(tree::link_target(kLink), kStaged + "//icutz");
}

TEST_F(kal_icu_on_device, unremovable_link_keeps_legacy_and_still_links) {
  tree::write_file(kStagedIcu + "/icutz57l.dat", "data");
  tree::make_dir(kLink);
  tree::make_link(kStagedIcu, kLegacyLink);
  const kal_icu icu(kStaged);
  captured_stderr err;
  EXPECT_EQ(raised_by([&] { icu.make_current(); }), EEXIST);
  EXPECT_EQ(err.text(),
            warning("remove: could not remove " + kLink, EISDIR) +
                warning("unlink of ICU softlink failed", EISDIR) +
                warning("create_symlink: from " + kLink + " to " + kStagedIcu,
                        EEXIST));
  EXPECT_EQ(tree::link_target(kLegacyLink), kStagedIcu);
}

TEST_F(kal_icu_on_device, unremovable_link_on_system_is_only_logged) {
  tree::make_dir(kLink);
  tree::make_link(kStagedIcu, kLegacyLink);
  const kal_icu icu;
  captured_stderr err;
  icu.make_current();
  EXPECT_EQ(err.text(), warning("remove: could not remove " + kLink, EISDIR) +
                            warning("unlink of ICU softlink failed", EISDIR));
  EXPECT_EQ(tree::link_target(kLegacyLink), kStagedIcu);
}

TEST_F(kal_icu_on_device, unremovable_legacy_link_is_logged_and_links) {
  tree::write_file(kStagedIcu + "/icutz57l.dat", "data");
  tree::make_link("/var/db/timezone/tz/2018a.1.0/icutz", kLink);
  tree::make_dir(kLegacyLink);
  const kal_icu icu(kStaged);
  captured_stderr err;
  icu.make_current();
  EXPECT_EQ(err.text(),
            warning("remove: could not remove " + kLegacyLink, EISDIR) +
                warning("unlink of ICU softlink failed", EISDIR));
  EXPECT_EQ(tree::link_target(kLink), kStagedIcu);
}

TEST_F(kal_icu_on_device, link_that_cannot_be_created_raises) {
  tree::write_file(kStagedIcu + "/icutz57l.dat", "data");
  const kal_icu icu(kStaged);
  tree::clear("/var");
  captured_stderr err;
  EXPECT_EQ(raised_by([&] { icu.make_current(); }), ENOENT);
  EXPECT_EQ(
      err.text(),
      warning("create_symlink: from " + kLink + " to " + kStagedIcu, ENOENT));
}
