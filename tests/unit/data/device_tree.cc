#include "device_tree.h"

#include <fts.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cstring>
#include <functional>
#include <stdexcept>
#include <utility>

#include "tree.h"

namespace {

int by_name(const FTSENT** a, const FTSENT** b) {
  return std::strcmp((*a)->fts_name, (*b)->fts_name);
}

// Each entry under root, root included, in a walk by name that never
// follows a link; directories once, before what they hold.
void walk(const std::string& root,
          const std::function<void(const FTSENT&)>& visit) {
  std::string path = root;
  char* const roots[] = {path.data(), nullptr};
  FTS* tree_walk = fts_open(roots, FTS_PHYSICAL | FTS_NOCHDIR, by_name);
  if (tree_walk == nullptr) {
    throw std::runtime_error("cannot walk " + root);
  }
  for (FTSENT* e = fts_read(tree_walk); e != nullptr; e = fts_read(tree_walk)) {
    if (e->fts_info != FTS_DP) {
      visit(*e);
    }
  }
  (void)fts_close(tree_walk);
}

}  // namespace

std::map<std::string, std::string> snapshot(const std::string& root) {
  std::map<std::string, std::string> entries;
  walk(root, [&](const FTSENT& e) {
    const std::string mode = std::to_string(e.fts_statp->st_mode & 07777);
    std::string& described = entries[e.fts_path];
    if (e.fts_info == FTS_D) {
      described = "dir " + mode;
    } else if (e.fts_info == FTS_SL || e.fts_info == FTS_SLNONE) {
      described = "link " + tree::link_target(e.fts_path);
    } else if (e.fts_info == FTS_F) {
      described = "file " + mode + " " + tree::file_content(e.fts_path);
    } else {
      described = "other";
    }
  });
  return entries;
}

std::map<std::string, std::string> relative_snapshot(const std::string& root) {
  std::map<std::string, std::string> relative;
  for (const auto& [path, what] : snapshot(root)) {
    relative[path.substr(root.size())] = what;
  }
  return relative;
}

std::map<std::string, std::string> shared_inodes(const std::string& root) {
  std::map<std::string, std::string> files;
  std::map<std::pair<dev_t, ino_t>, std::string> first_names;
  walk(root, [&](const FTSENT& e) {
    if (e.fts_info == FTS_F) {
      const std::string name = std::string(e.fts_path).substr(root.size());
      const auto first = first_names.emplace(
          std::make_pair(e.fts_statp->st_dev, e.fts_statp->st_ino), name);
      files[name] = std::to_string(e.fts_statp->st_nlink) + " names, first " +
                    first.first->second;
    }
  });
  return files;
}

void make_device(const std::string& system_release,
                 const std::string& system_schema) {
  tree::write_file("/usr/share/zoneinfo.default/+VERSION",
                   system_release + "\n");
  tree::write_file("/usr/share/icu/icutzformat.txt", system_schema + "\n");
  tree::make_link("/usr/share/zoneinfo.default", "/var/db/timezone/zoneinfo");
}
