#include "tree.h"

#include <sys/stat.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>
#include <iterator>
#include <stdexcept>

namespace tree {

namespace {

namespace stdfs = std::filesystem;

void make_parent(const std::string& path) {
  const stdfs::path parent = stdfs::path(path).parent_path();
  if (!parent.empty()) {
    stdfs::create_directories(parent);
  }
}

}  // namespace

void make_dir(const std::string& path, mode_t mode) {
  stdfs::create_directories(path);
  if (chmod(path.c_str(), mode) != 0) {
    throw std::runtime_error("cannot chmod " + path);
  }
}

void write_file(const std::string& path, const std::string& content,
                mode_t mode) {
  make_parent(path);
  std::ofstream out(path, std::ios::binary | std::ios::trunc);
  out << content;
  out.close();
  if (!out || chmod(path.c_str(), mode) != 0) {
    throw std::runtime_error("cannot write " + path);
  }
}

void make_link(const std::string& target, const std::string& link_path) {
  make_parent(link_path);
  if (symlink(target.c_str(), link_path.c_str()) != 0) {
    throw std::runtime_error("cannot link " + link_path);
  }
}

std::string link_target(const std::string& path) {
  std::error_code error;
  const stdfs::path target = stdfs::read_symlink(path, error);
  return error ? "(none)" : target.string();
}

std::string file_content(const std::string& path) {
  std::ifstream in(path, std::ios::binary);
  if (!in) {
    throw std::runtime_error("cannot read " + path);
  }
  return {std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>()};
}

bool present(const std::string& path) {
  struct stat status {};
  return lstat(path.c_str(), &status) == 0;
}

void clear(const std::string& dir) {
  for (const auto& entry : stdfs::directory_iterator(dir)) {
    stdfs::remove_all(entry.path());
  }
}

}  // namespace tree
