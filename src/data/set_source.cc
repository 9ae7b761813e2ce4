#include "data/set_source.h"

#include <sys/stat.h>

#include <stdexcept>

#include "data/set_archive.h"
#include "data/set_directory.h"

set_image load_set(const std::string& set_dir_or_archive) {
  struct stat info {};
  if (stat(set_dir_or_archive.c_str(), &info) != 0) {
    throw std::runtime_error("no data set at " + set_dir_or_archive);
  }
  return S_ISDIR(info.st_mode) ? read_set_directory(set_dir_or_archive)
                               : read_set_archive(set_dir_or_archive);
}
