#include "dataset/kal_icu.h"

#include <fts.h>
#include <sys/stat.h>

#include <cerrno>
#include <cstring>

#include "dataset/icu_data_file.h"
#include "fs/first_word.h"
#include "fs/fs.h"
#include "fs/paths.h"
#include "fs/warn.h"

namespace {

// The system partition names its ICU schema in this file.
constexpr char kFormatFile[] = "icutzformat.txt";

// A staged data set keeps its ICU data in its own "icutz" directory.
std::string icu_path_of(const std::string& dataset_path) {
  if (dataset_path.empty()) {
    return paths::kSystemIcu;
  }
  return dataset_path + "/icutz";
}

// Whatever first word the system's format file holds; a missing, unreadable
// or blank file leaves it empty, silently.
std::string format_file_schema(const std::string& icu_path) {
  return fs::read_first_word(icu_path + "/" + kFormatFile);
}

// Only a regular file lying directly in the ICU directory and readable by
// every program on the device can be the data that ICU loads.
bool may_hold_data(const FTSENT& entry) {
  return entry.fts_errno == 0 && entry.fts_level == 1 &&
         entry.fts_namelen != 0 && entry.fts_info == FTS_F &&
         (entry.fts_statp->st_mode & S_IROTH) != 0;
}

// The schema in the name of the first data file the directory yields, such
// as 57l from icutz57l.dat; empty when there is none.
std::string data_file_schema(const std::string& icu_path) {
  std::string root = icu_path;
  char* const roots[] = {root.data(), nullptr};
  // A linked ICU directory is followed, but no link inside it, and the walk
  // stays on the data set's file system. Without a comparison the directory's
  // own order decides which data file wins. The walk never changes directory:
  // it looks at each entry by its whole path, which spares the calls to open
  // the starting directory and to change into and back out of each one.
  FTS* walk = fts_open(
      roots, FTS_COMFOLLOW | FTS_NOCHDIR | FTS_PHYSICAL | FTS_XDEV, nullptr);
  if (walk == nullptr) {
    warn("ka_icu::initialize: fts_open of %s failed, %s", icu_path.c_str(),
         std::strerror(errno));
    throw errno;
  }
  std::string schema;
  for (FTSENT* entry = fts_read(walk); entry != nullptr && schema.empty();
       entry = fts_read(walk)) {
    if (may_hold_data(*entry)) {
      schema = icu_data_file_schema(entry->fts_name).value_or("");
    } else if (entry->fts_level == 1 && entry->fts_info == FTS_D) {
      // Nothing below the ICU directory's own entries can qualify, so the
      // walk never goes down. A skipped directory comes back once more, as
      // FTS_DP, which never qualifies either: the entries met, their kinds,
      // depths and order at depth 1 are those of a full walk.
      (void)fts_set(walk, entry, FTS_SKIP);
    }
  }
  (void)fts_close(walk);
  return schema;
}

}  // namespace

kal_icu::kal_icu() : kal_icu(std::string()) {}

kal_icu::kal_icu(const std::string& dataset_path)
    : kal_dataset_component(dataset_path), icu_path(icu_path_of(dataset_path)) {
  initialize();
}

bool kal_icu::compatible_schema(const kal_dataset_component& other) const {
  const auto* other_icu = dynamic_cast<const kal_icu*>(&other);
  if (other_icu == nullptr) {
    warn("kal_icu::compatible_schema: could not dynamic_cast other component");
    return false;
  }
  return schema == other_icu->schema;
}

void kal_icu::make_current() const {
  // The link of the older layout goes too, every time, so that no reader
  // finds ICU data that is no longer current.
  try {
    fs::remove(paths::kIcutzLink);
    fs::remove(paths::kLegacyIcutzLink);
  } catch (...) {
    warn("unlink of ICU softlink failed");
  }
  // Without the link, ICU reads the system's own data in /usr/share/icu.
  if (!dataset_path.empty()) {
    fs::create_symlink(icu_path, paths::kIcutzLink);
  }
}

void kal_icu::initialize() {
  if (dataset_path.empty()) {
    schema = format_file_schema(icu_path);
    return;
  }
  schema = data_file_schema(icu_path);
  if (schema.empty()) {
    warn("No ICU schema found for %s", dataset_path.c_str());
  }
}
