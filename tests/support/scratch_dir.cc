#include "scratch_dir.h"

#include <stdlib.h>

#include <filesystem>
#include <stdexcept>

scratch_dir::scratch_dir() {
  char name[] = "/tmp/kestrel-test.XXXXXX";
  if (mkdtemp(name) == nullptr) {
    throw std::runtime_error("cannot create a scratch directory");
  }
  root = name;
}

scratch_dir::~scratch_dir() {
  std::error_code ignored;
  std::filesystem::remove_all(root, ignored);
}

std::string scratch_dir::operator/(const std::string& name) const {
  return root + "/" + name;
}
