#include "data/release_source.h"

#include <sys/stat.h>

#include <cstdlib>
#include <regex>
#include <stdexcept>

#include "data/child_process.h"
#include "data/file_tree.h"

namespace {

std::string temporary_root() {
  const char* tmp = std::getenv("TMPDIR");
  return tmp != nullptr && *tmp != '\0' ? tmp : "/tmp";
}

}  // namespace

release_source::release_source(const std::string& tarball_or_dir)
    : dir(file_tree::make_temporary(temporary_root() +
                                    "/kestrel-data-release.XXXXXX")) {
  try {
    struct stat info {};
    if (stat(tarball_or_dir.c_str(), &info) != 0) {
      throw std::runtime_error("no release at " + tarball_or_dir);
    }
    if (S_ISDIR(info.st_mode)) {
      file_tree::copy_files(tarball_or_dir, dir);
    } else if (child_process{{"tar", "-xzf", tarball_or_dir, "-C", dir}}
                   .run() != 0) {
      throw std::runtime_error("cannot unpack " + tarball_or_dir);
    }
  } catch (...) {
    file_tree::remove(dir);
    throw;
  }
}

release_source::~release_source() {
  try {
    file_tree::remove(dir);
  } catch (...) {
    // A scratch directory left under TMPDIR harms nothing.
  }
}

std::string release_source::version() const {
  std::string version = text().version;
  if (!is_release_name(version)) {
    throw std::runtime_error(
        "the release's version does not name a release: \"" + version + "\"");
  }
  return version;
}

release_text release_source::text() const { return read_release(dir); }

std::string release_source::file(const std::string& name) const {
  return dir + "/" + name;
}

bool is_release_name(const std::string& text) {
  return std::regex_match(text, std::regex("[0-9]{4}[a-z]+"));
}
