#include "data/set_directory.h"

#include <fcntl.h>
#include <fts.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <fstream>
#include <iterator>
#include <map>
#include <stdexcept>
#include <utility>

#include "data/file_tree.h"

namespace {

[[noreturn]] void fail(const std::string& what, const std::string& path) {
  throw std::runtime_error(what + " " + path + ": " + std::strerror(errno));
}

int by_name(const FTSENT** a, const FTSENT** b) {
  return std::strcmp((*a)->fts_name, (*b)->fts_name);
}

std::string file_bytes(const char* path) {
  std::ifstream in(path, std::ios::binary);
  if (!in) {
    fail("cannot read", path);
  }
  return {std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>()};
}

// The first name met of each regular file that has several, by inode.
using first_names = std::map<std::pair<dev_t, ino_t>, std::string>;

set_member member_of(const FTSENT& entry, std::size_t root_length,
                     first_names& named) {
  set_member member;
  member.path = std::string(entry.fts_path).substr(root_length + 1);
  member.mode = entry.fts_statp->st_mode & 0777;
  const auto inode =
      std::make_pair(entry.fts_statp->st_dev, entry.fts_statp->st_ino);
  if (entry.fts_info == FTS_D) {
    member.type = set_member::kind::directory;
  } else if (entry.fts_info == FTS_F && named.contains(inode)) {
    member.type = set_member::kind::hard_link;
    member.data = named.at(inode);
  } else if (entry.fts_info == FTS_F) {
    if (entry.fts_statp->st_nlink > 1) {
      named.emplace(inode, member.path);
    }
    member.data = file_bytes(entry.fts_accpath);
  } else if (entry.fts_info == FTS_SL || entry.fts_info == FTS_SLNONE) {
    member.type = set_member::kind::link;
    char target[4096];
    const ssize_t n = readlink(entry.fts_accpath, target, sizeof target);
    if (n < 0) {
      fail("cannot read link", entry.fts_path);
    }
    member.data.assign(target, static_cast<std::size_t>(n));
  } else {
    throw std::runtime_error(std::string(entry.fts_path) +
                             " is neither a directory, a regular file nor a "
                             "link");
  }
  return member;
}

void write_file(const std::string& path, const set_member& member) {
  const int fd =
      open(path.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, member.mode);
  if (fd < 0) {
    fail("cannot create", path);
  }
  std::string_view rest = member.data;
  while (!rest.empty()) {
    const ssize_t n = write(fd, rest.data(), rest.size());
    if (n <= 0) {
      (void)close(fd);
      fail("cannot write", path);
    }
    rest.remove_prefix(static_cast<std::size_t>(n));
  }
  if (fchmod(fd, member.mode) != 0) {
    (void)close(fd);
    fail("cannot set the mode of", path);
  }
  file_tree::sync_and_close(fd, path);
}

}  // namespace

set_image read_set_directory(const std::string& dir) {
  std::string root = dir;
  while (root.size() > 1 && root.back() == '/') {
    root.pop_back();
  }
  char* const roots[] = {root.data(), nullptr};
  FTS* walk = fts_open(roots, FTS_PHYSICAL | FTS_NOCHDIR, by_name);
  if (walk == nullptr) {
    fail("cannot read", dir);
  }
  set_image image;
  first_names named;
  try {
    for (FTSENT* entry = fts_read(walk); entry != nullptr;
         entry = fts_read(walk)) {
      if (entry->fts_info == FTS_DP || entry->fts_level == 0) {
        continue;
      }
      if (entry->fts_info == FTS_DNR || entry->fts_info == FTS_ERR ||
          entry->fts_info == FTS_NS) {
        errno = entry->fts_errno;
        fail("cannot read", entry->fts_path);
      }
      image.add(member_of(*entry, root.size(), named));
    }
  } catch (...) {
    (void)fts_close(walk);
    throw;
  }
  (void)fts_close(walk);
  return image;
}

void write_set_directory(const set_image& image, const std::string& dir) {
  std::vector<std::string> directories{dir};
  for (const set_member& member : image.members()) {
    const std::string path = dir + "/" + member.path;
    if (member.type == set_member::kind::directory) {
      if (mkdir(path.c_str(), member.mode) != 0 ||
          chmod(path.c_str(), member.mode) != 0) {
        fail("cannot make", path);
      }
      directories.push_back(path);
    } else if (member.type == set_member::kind::link) {
      if (symlink(member.data.c_str(), path.c_str()) != 0) {
        fail("cannot link", path);
      }
    } else if (member.type == set_member::kind::hard_link) {
      if (link((dir + "/" + member.data).c_str(), path.c_str()) != 0) {
        fail("cannot link", path);
      }
    } else {
      write_file(path, member);
    }
  }
  // Deepest first, so that each directory is synced after what it holds.
  std::reverse(directories.begin(), directories.end());
  for (const std::string& path : directories) {
    file_tree::sync_directory(path);
  }
}
