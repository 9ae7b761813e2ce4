#include "data/file_tree.h"

#include <dirent.h>
#include <fcntl.h>
#include <ftw.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <fstream>
#include <memory>
#include <stdexcept>
#include <vector>

namespace {

constexpr int kOpenFiles = 16;

[[noreturn]] void fail(const std::string& what, const std::string& path) {
  throw std::runtime_error(what + " " + path + ": " + std::strerror(errno));
}

int remove_entry(const char* path, const struct stat* /*info*/, int /*kind*/,
                 struct FTW* /*walk*/) {
  return std::remove(path) == 0 ? 0 : -1;
}

}  // namespace

namespace file_tree {

void remove(const std::string& path) {
  struct stat info {};
  if (lstat(path.c_str(), &info) != 0 && errno == ENOENT) {
    return;
  }
  if (nftw(path.c_str(), remove_entry, kOpenFiles, FTW_DEPTH | FTW_PHYS) != 0) {
    fail("cannot remove", path);
  }
}

void copy_file(const std::string& from, const std::string& to, int mode) {
  const int in = open(from.c_str(), O_RDONLY | O_CLOEXEC);
  if (in < 0) {
    fail("cannot read", from);
  }
  const int out = open(to.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC,
                       static_cast<mode_t>(mode));
  if (out < 0) {
    (void)close(in);
    fail("cannot create", to);
  }
  char buffer[65536];
  ssize_t got = 0;
  bool ok = true;
  while (ok && (got = read(in, buffer, sizeof buffer)) > 0) {
    ok = write(out, buffer, static_cast<std::size_t>(got)) == got;
  }
  ok = ok && got == 0 && fchmod(out, static_cast<mode_t>(mode)) == 0;
  (void)close(in);
  if (close(out) != 0 || !ok) {
    fail("cannot copy to", to);
  }
}

void copy_files(const std::string& from, const std::string& to) {
  const std::unique_ptr<DIR, int (*)(DIR*)> dir(opendir(from.c_str()),
                                                closedir);
  if (!dir) {
    fail("cannot read", from);
  }
  while (const dirent* entry = readdir(dir.get())) {
    const std::string source = from + "/" + entry->d_name;
    struct stat info {};
    if (stat(source.c_str(), &info) == 0 && S_ISREG(info.st_mode)) {
      copy_file(source, to + "/" + entry->d_name, 0644);
    }
  }
}

void write_text(const std::string& path, const std::string& text) {
  std::ofstream out(path, std::ios::binary | std::ios::trunc);
  out << text;
  if (!out.flush()) {
    throw std::runtime_error("cannot write " + path);
  }
}

std::string make_temporary(const std::string& pattern) {
  std::vector<char> name(pattern.begin(), pattern.end());
  name.push_back('\0');
  if (mkdtemp(name.data()) == nullptr) {
    fail("cannot make a directory like", pattern);
  }
  return name.data();
}

std::vector<std::string> entries(const std::string& path) {
  std::vector<std::string> names;
  const std::unique_ptr<DIR, int (*)(DIR*)> listing(opendir(path.c_str()),
                                                    closedir);
  if (listing) {
    while (const dirent* entry = readdir(listing.get())) {
      names.emplace_back(entry->d_name);
    }
  }
  std::sort(names.begin(), names.end());
  return names;
}

void sync_and_close(int fd, const std::string& path) {
  if (fd < 0 || fsync(fd) != 0) {
    const int saved = errno;
    if (fd >= 0) {
      (void)close(fd);
    }
    errno = saved;
    fail("cannot sync", path);
  }
  if (close(fd) != 0) {
    fail("cannot close", path);
  }
}

void sync_directory(const std::string& path) {
  sync_and_close(open(path.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC), path);
}

}  // namespace file_tree
