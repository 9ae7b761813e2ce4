#include "device_tree.h"

#include <fts.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cstring>
#include <stdexcept>

#include "tree.h"

namespace {

int by_name(const FTSENT** a, const FTSENT** b) {
  return std::strcmp((*a)->fts_name, (*b)->fts_name);
}

}  // namespace

std::map<std::string, std::string> snapshot(const std::string& root) {
  std::map<std::string, std::string> entries;
  std::string path = root;
  char* const roots[] = {path.data(), nullptr};
  FTS* walk = fts_open(roots, FTS_PHYSICAL | FTS_NOCHDIR, by_name);
  if (walk == nullptr) {
    throw std::runtime_error("cannot walk " + root);
  }
  for (FTSENT* e = fts_read(walk); e != nullptr; e = fts_read(walk)) {
    if (e->fts_info == FTS_DP) {
      continue;
    }
    const std::string mode = std::to_string(e->fts_statp->st_mode & 07777);
    std::string& described = entries[e->fts_path];
    if (e->fts_info == FTS_D) {
      described = "dir " + mode;
    } else if (e->fts_info == FTS_SL || e->fts_info == FTS_SLNONE) {
      described = "link " + tree::link_target(e->fts_path);
    } else if (e->fts_info == FTS_F) {
      described = "file " + mode + " " + tree::file_content(e->fts_path);
    } else {
      described = "other";
    }
  }
  (void)fts_close(walk);
  return entries;
}

void make_device(const std::string& system_release,
                 const std::string& system_schema) {
  tree::write_file("/usr/share/zoneinfo.default/+VERSION", system_release + "\n");
  tree::write_file("/usr/share/icu/icutzformat.txt", system_schema + "\n");
  tree::make_link("/usr/share/zoneinfo.default", "/var/db/timezone/zoneinfo");
}
