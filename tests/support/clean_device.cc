#include "clean_device.h"

#include "tree.h"

void clean_device::SetUp() {
  tree::clear("/var");
  tree::clear("/usr/share");
  tree::make_dir("/var/db/timezone");
}
