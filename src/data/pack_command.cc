#include "data/pack_command.h"

#include <cstdio>
#include <cstdlib>

#include "data/set_archive.h"
#include "data/set_directory.h"
#include "data/usage_error.h"

int run_pack(const std::vector<std::string>& args) {
  if (args.size() != 2) {
    throw usage_error("pack SETDIR ARCHIVE");
  }
  const set_image image = read_set_directory(args[0]);
  (void)image.release();  // a set without its release is no set
  write_set_archive(image, args[1]);
  std::printf("packed %s into %s\n", args[0].c_str(), args[1].c_str());
  return EXIT_SUCCESS;
}
