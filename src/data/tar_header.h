#ifndef KESTREL_DATA_TAR_HEADER_H_
#define KESTREL_DATA_TAR_HEADER_H_

#include <array>
#include <cstdint>
#include <string>

// One 512-byte header block of a POSIX ustar archive, the format of
// kestrel-data's archives.
class tar_header {
 public:
  static constexpr std::size_t kBlock = 512;
  using block = std::array<char, kBlock>;

  // The header of a member; raises std::runtime_error when the path does
  // not fit ustar's name and prefix fields.
  static block make(const std::string& path, char type, unsigned mode,
                    std::uint64_t size, const std::string& link_target);

  // Parses a header; raises for a bad checksum or a block that is not ustar.
  explicit tar_header(const block& bytes);

  // Whether the block is all zeros: the end of the archive.
  static bool is_end(const block& bytes);

  std::string path;
  char type = '0';
  unsigned mode = 0;
  std::uint64_t size = 0;
  std::string link_target;
};

#endif  // KESTREL_DATA_TAR_HEADER_H_
