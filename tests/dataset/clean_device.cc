#include "clean_device.h"

#include <cstring>

#include "tree.h"

void clean_device::SetUp() {
  tree::clear("/var");
  tree::clear("/usr/share");
  tree::make_dir("/var/db/timezone");
}

std::string warning(const std::string& message, int error) {
  return "kestrel: " + message + ": " + std::strerror(error) + "\n";
}
