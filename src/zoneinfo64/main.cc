// kestrel-zoneinfo64 RELEASE-DIR OUT.txt [OUT.zi]: writes ICU's zoneinfo64
// resource text made from the tz release in RELEASE-DIR, and the zic input
// it was made from (no negative saving) to OUT.zi when given.
#include <cstdio>
#include <fstream>
#include <stdexcept>

#include "zoneinfo64/release_reader.h"
#include "zoneinfo64/zoneinfo64.h"

namespace {

void write(const char* path, const std::string& text) {
  std::ofstream out(path, std::ios::binary | std::ios::trunc);
  out << text;
  out.close();
  if (!out) throw std::runtime_error(std::string("cannot write ") + path);
}

}  // namespace

int main(int argc, char** argv) {
  if (argc != 3 && argc != 4) {
    (void)std::fputs("usage: kestrel-zoneinfo64 RELEASE-DIR OUT.txt [OUT.zi]\n",
                     stderr);
    return 2;
  }
  try {
    write(argv[2], zoneinfo64_text(argv[1]));
    if (argc == 4) write(argv[3], read_release(argv[1]).zic_text);
  } catch (const std::runtime_error& error) {
    (void)std::fprintf(stderr, "kestrel-zoneinfo64: %s\n", error.what());
    return 1;
  }
  return 0;
}
