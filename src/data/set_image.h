#ifndef KESTREL_DATA_SET_IMAGE_H_
#define KESTREL_DATA_SET_IMAGE_H_

#include <sys/types.h>

#include <cstdint>
#include <map>
#include <string>
#include <vector>

// One entry of a data set, with paths relative to the set's root.
struct set_member {
  // A link is a symbolic link; a hard link is one more name of a regular
  // file that comes before it in the set.
  enum class kind : char {
    directory = 'd',
    file = 'f',
    link = 'l',
    hard_link = 'h'
  };

  std::string path;
  kind type = kind::file;
  mode_t mode = 0644;
  // A file's bytes, a link's target, or the path of a hard link's file.
  std::string data;
};

// A whole data set held in memory, so that it is checked completely before
// anything of it is written: every path stays inside the set, every link is
// relative and resolves inside the set, every hard link names a regular file
// added before it, and nothing but directories, regular files and links is in
// it. Anything else raises std::runtime_error naming the entry.
class set_image {
 public:
  void add(set_member member);

  // The release of the set's zoneinfo/+VERSION; raises when it has none.
  std::string release() const;
  // The schema in the name of its ICU data file, icutz/icutzNNx.dat; empty
  // when it has none.
  std::string schema() const;
  // What the set takes on disk, rounded up to whole blocks of block_size,
  // and the inodes it takes: a hard link takes neither.
  std::uint64_t disk_bytes(std::uint64_t block_size) const;
  std::size_t inodes() const;

  // The bytes of a regular file, or of the file a hard link names.
  const std::string& bytes_of(const set_member& member) const;

  const std::vector<set_member>& members() const { return entries; }

 private:
  void check_hard_link(const set_member& member) const;

  std::vector<set_member> entries;
  // The regular files among the entries, by path: their index in entries.
  std::map<std::string, std::size_t> files;
};

#endif  // KESTREL_DATA_SET_IMAGE_H_
