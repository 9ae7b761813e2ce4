// kestrel-zoneinfo64 RELEASE-DIR OUT.txt: writes ICU's zoneinfo64 resource
// text made from the tz release in RELEASE-DIR.
#include <cstdio>
#include <fstream>
#include <stdexcept>

#include "zoneinfo64/zoneinfo64.h"

int main(int argc, char** argv) {
  if (argc != 3) {
    (void)std::fputs("usage: kestrel-zoneinfo64 RELEASE-DIR OUT.txt\n", stderr);
    return 2;
  }
  try {
    const std::string text = zoneinfo64_text(argv[1]);
    std::ofstream out(argv[2], std::ios::binary | std::ios::trunc);
    out << text;
    out.close();
    if (!out) throw std::runtime_error(std::string("cannot write ") + argv[2]);
  } catch (const std::runtime_error& error) {
    (void)std::fprintf(stderr, "kestrel-zoneinfo64: %s\n", error.what());
    return 1;
  }
  return 0;
}
