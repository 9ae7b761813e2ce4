#include "data/device_state.h"

#include <unistd.h>

#include <fstream>
#include <iterator>

#include "data/file_tree.h"
#include "data/muted_warnings.h"
#include "data/set_fault.h"
#include "dataset/icu_data_file.h"
#include "dataset/kal_dataset.h"
#include "driver/current_data.h"
#include "fs/first_word.h"
#include "fs/fs.h"
#include "fs/paths.h"

namespace {

std::string file_text(const char* path) {
  std::ifstream in(path, std::ios::binary);
  return {std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>()};
}

// A broken set is not adoptable for its fault, whatever else kestrel would
// have against it; kestrel still adopts one whose fault it never looks at.
verdict with_fault(verdict adoption, const std::string& fault) {
  if (fault.empty()) {
    return adoption;
  }
  if (adoption.yes) {
    return {true, adoption.reason + "; broken: " + fault};
  }
  return {false, "not adoptable: " + fault};
}

}  // namespace

std::string schema_of_set(const std::string& set_path) {
  for (const std::string& name : file_tree::entries(set_path + "/icutz")) {
    if (const auto schema = icu_data_file_schema(name)) {
      return std::string(*schema);
    }
  }
  return {};
}

std::vector<std::string> staged_set_names() {
  std::vector<std::string> names;
  for (const std::string& name : file_tree::entries(paths::kStagedDir)) {
    if (!name.starts_with(".")) {
      names.push_back(name);
    }
  }
  return names;
}

device_state device_state::read() {
  const muted_warnings quiet;
  device_state state;
  state.system_version = kal_dataset().get_version_string();
  state.system_schema =
      fs::read_first_word(std::string(paths::kSystemIcu) + "/icutzformat.txt");
  try {
    state.designated_path = current_dataset_path();
    state.designated_version =
        state.designated_path.empty()
            ? state.system_version
            : state.designated_path.substr(paths::kStagedPrefix.size());
  } catch (...) {
    state.designated_version = "unreadable links (kestrel resets them)";
  }
  try {
    state.latest = fs::read_symlink(paths::kLatestLink);
  } catch (...) {
    state.latest = "(unreadable)";
  }
  for (const std::string& name : staged_set_names()) {
    const std::string path = paths::kStagedDir + name;
    const std::string fault = set_fault(path);
    state.staged.push_back(
        {path, name, schema_of_set(path), fault,
         with_fault(path == state.latest
                        ? kestrel_would_adopt(path)
                        : verdict{false, "tz_latest names another set"},
                    fault)});
  }
  state.cleanup_marker = access(paths::kNeedsCleanup, F_OK) == 0;
  state.version_record = file_text(paths::kVersionRecord);
  return state;
}
