#ifndef KESTREL_FS_WORD_FILE_H_
#define KESTREL_FS_WORD_FILE_H_

#include <string>

namespace fs {

// A small text file opened for its first word, such as "+VERSION" or
// "icutzformat.txt". Only a regular file (once links are followed) is kept
// open: a FIFO, a socket, a directory or a device counts as unreadable, so
// nothing is ever waited on or read without end. Opening sets errno as
// reading the file with a stream always did: the open's failure, or EISDIR
// for a directory; warnings printed later carry that text.
class word_file {
 public:
  explicit word_file(const std::string& path);
  ~word_file();
  word_file(const word_file&) = delete;
  word_file& operator=(const word_file&) = delete;

  // The first word, as formatted extraction from a file stream reads it:
  // leading " \t\n\v\f\r" skipped, then every byte up to the next of them or
  // the end of the file, with no length limit. Empty, silently, when the
  // file is missing, unreadable, blank or not a regular file. Reads from the
  // start each time.
  std::string first_word() const;

 private:
  int fd;
};

}  // namespace fs

#endif  // KESTREL_FS_WORD_FILE_H_
