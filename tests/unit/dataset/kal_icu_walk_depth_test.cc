// Linked with -Wl,--wrap=fts_read: records every entry the walk of an ICU
// directory meets, to show what the walk goes through and in what order.

#include <dirent.h>
#include <fts.h>

#include <string>
#include <vector>

#include "captured_stderr.h"
#include "clean_device.h"
#include "dataset/kal_icu.h"
#include "gtest/gtest.h"
#include "tree.h"

namespace {

struct met {
  std::string name;
  int level;
  int info;
};

std::vector<met> entries;

class kal_icu_walk_depth : public clean_device {
 protected:
  void SetUp() override {
    clean_device::SetUp();
    entries.clear();
  }
};

const std::string kStaged = "/var/db/timezone/tz/2019c.1.0";
const std::string kStagedIcu = kStaged + "/icutz";

// The names directly in dir, in the order the directory yields them.
std::vector<std::string> directory_order(const std::string& dir) {
  std::vector<std::string> names;
  DIR* stream = opendir(dir.c_str());
  for (dirent* entry = readdir(stream); entry != nullptr;
       entry = readdir(stream)) {
    const std::string name = entry->d_name;
    if (name != "." && name != "..") {
      names.push_back(name);
    }
  }
  closedir(stream);
  return names;
}

// Whether icu holds exactly schema, judged by a system component.
bool has_schema(const kal_icu& icu, const std::string& schema) {
  tree::write_file("/usr/share/icu/icutzformat.txt", schema);
  return icu.compatible_schema(kal_icu());
}

}  // namespace

extern "C" FTSENT* __real_fts_read(FTS* walk);

extern "C" FTSENT* __wrap_fts_read(FTS* walk) {
  FTSENT* entry = __real_fts_read(walk);
  if (entry != nullptr) {
    entries.push_back({entry->fts_name, entry->fts_level, entry->fts_info});
  }
  return entry;
}

TEST_F(kal_icu_walk_depth, never_goes_below_the_icu_directory) {
  for (int i = 0; i < 20; ++i) {
    const std::string sub = kStagedIcu + "/sub" + std::to_string(i);
    tree::write_file(sub + "/icutz57l.dat", "data");
    tree::write_file(sub + "/deeper/still/icutz58l.dat", "data");
  }
  captured_stderr err;
  const kal_icu icu(kStaged);
  EXPECT_EQ(err.text(),
            "kestrel: No ICU schema found for " + kStaged + ": Success\n");
  ASSERT_FALSE(entries.empty());
  int directories = 0;
  for (const met& entry : entries) {
    EXPECT_LE(entry.level, 1) << entry.name;
    directories += entry.level == 1 && entry.info == FTS_D ? 1 : 0;
  }
  EXPECT_EQ(directories, 20);
}

TEST_F(kal_icu_walk_depth, meets_the_directory_entries_in_their_own_order) {
  for (int i = 0; i < 12; ++i) {
    const std::string name = std::to_string(i);
    tree::write_file(kStagedIcu + "/icutz" + name + "l.dat", "data");
    tree::write_file(kStagedIcu + "/dir" + name + "/icutz99b.dat", "data");
  }
  const std::vector<std::string> order = directory_order(kStagedIcu);
  const kal_icu icu(kStaged);
  std::vector<std::string> met_at_depth_1;
  for (const met& entry : entries) {
    // A directory comes back once more after it, in post-order.
    if (entry.level == 1 && entry.info != FTS_DP) {
      met_at_depth_1.push_back(entry.name);
    }
  }
  // The walk stops on the read after the first data file: up to there the
  // entries are the directory's own, in its own order.
  std::string first_file;
  for (const std::string& name : order) {
    if (name.starts_with("icutz")) {
      first_file = name;
      break;
    }
  }
  ASSERT_FALSE(met_at_depth_1.empty());
  ASSERT_LE(met_at_depth_1.size(), order.size());
  EXPECT_EQ(met_at_depth_1,
            std::vector<std::string>(
                order.begin(),
                order.begin() + static_cast<long>(met_at_depth_1.size())));
  EXPECT_TRUE(has_schema(icu, first_file.substr(5, first_file.size() - 9)));
}
