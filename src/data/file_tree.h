#ifndef KESTREL_DATA_FILE_TREE_H_
#define KESTREL_DATA_FILE_TREE_H_

#include <string>
#include <vector>

// Whole-directory operations over the trees kestrel-data makes: release
// sources, built sets and staging scratch directories. Failures raise
// std::runtime_error naming the path.
namespace file_tree {

// Removes path and everything below it, never following a link; a missing
// path is fine.
void remove(const std::string& path);

// Copies the regular files of the directory from into the existing
// directory to, one level deep.
void copy_files(const std::string& from, const std::string& to);

// Copies one regular file, giving the copy mode.
void copy_file(const std::string& from, const std::string& to, int mode);

// Writes text as the whole content of the file at path.
void write_text(const std::string& path, const std::string& text);

// A fresh directory made by mkdtemp(3) from pattern (ending in XXXXXX).
std::string make_temporary(const std::string& pattern);

// The names in the directory at path, sorted, "." and ".." among them; none
// when it cannot be read.
std::vector<std::string> entries(const std::string& path);

// fsync(2) and close(2) of fd, opened on path (a negative fd fails at once,
// with the errno of its open).
void sync_and_close(int fd, const std::string& path);

// fsync(2) of the directory at path, so that the entries made in it last.
void sync_directory(const std::string& path);

}  // namespace file_tree

#endif  // KESTREL_DATA_FILE_TREE_H_
