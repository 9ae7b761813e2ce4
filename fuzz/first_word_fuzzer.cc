// The first-word reader of "+VERSION" and "icutzformat.txt" against
// formatted extraction from a file stream, over a scratch file.

#include <sys/mman.h>

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <fstream>
#include <string>

#include "fs/first_word.h"

namespace {

// One scratch file per process, in memory and reached through its
// descriptor, so that nothing is left behind however the run ends.
const std::string& scratch_file() {
  static const std::string path = [] {
    const int fd = memfd_create("kestrel-first-word", 0);
    if (fd < 0) {
      std::abort();
    }
    return "/proc/self/fd/" + std::to_string(fd);
  }();
  return path;
}

std::string stream_word(const std::string& path) {
  std::string word;
  std::ifstream file(path);
  file >> word;
  return word;
}

}  // namespace

// The first two bytes put up to 44 KiB of one byte before the rest, so that
// words and blanks cross the reader's 16 KiB reads.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* bytes,
                                      std::size_t size) {
  if (size < 2) {
    return 0;
  }
  std::string content(std::size_t{bytes[0]} * 173, static_cast<char>(bytes[1]));
  content.append(reinterpret_cast<const char*>(bytes + 2), size - 2);
  {
    std::ofstream out(scratch_file(), std::ios::binary | std::ios::trunc);
    out << content;
  }
  if (fs::read_first_word(scratch_file()) != stream_word(scratch_file())) {
    std::abort();
  }
  return 0;
}
