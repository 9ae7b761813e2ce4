#ifndef KESTREL_DATA_SET_IMAGE_H_
#define KESTREL_DATA_SET_IMAGE_H_

#include <sys/types.h>

#include <cstdint>
#include <string>
#include <vector>

// One entry of a data set, with paths relative to the set's root.
struct set_member {
  enum class kind : char { directory = 'd', file = 'f', link = 'l' };

  std::string path;
  kind type = kind::file;
  mode_t mode = 0644;
  // A file's bytes or a link's target.
  std::string data;
};

// A whole data set held in memory, so that it is checked completely before
// anything of it is written: every path stays inside the set, every link is
// relative and resolves inside the set, and nothing but directories,
// regular files and links is in it. Anything else raises std::runtime_error
// naming the entry.
class set_image {
 public:
  void add(set_member member);

  // The release of the set's zoneinfo/+VERSION; raises when it has none.
  std::string release() const;
  // The schema in the name of its ICU data file, icutz/icutzNNx.dat; empty
  // when it has none.
  std::string schema() const;
  // What the set takes on disk, rounded up to whole blocks of block_size.
  std::uint64_t disk_bytes(std::uint64_t block_size) const;

  const std::vector<set_member>& members() const { return entries; }

 private:
  std::vector<set_member> entries;
};

#endif  // KESTREL_DATA_SET_IMAGE_H_
