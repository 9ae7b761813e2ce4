#ifndef KESTREL_TESTS_TREE_H_
#define KESTREL_TESTS_TREE_H_

#include <sys/types.h>

#include <string>

// Small builders and readers for the trees the tests run on. Parent
// directories are created as needed; every failure throws, so a test never
// goes on over a tree it did not mean to build.
namespace tree {

void make_dir(const std::string& path, mode_t mode = 0755);
void write_file(const std::string& path, const std::string& content,
                mode_t mode = 0644);
void make_link(const std::string& target, const std::string& link_path);

// The target text of a link, or "(none)" when there is no link there.
std::string link_target(const std::string& path);
std::string file_content(const std::string& path);
// Whether anything, even a dangling link, is at path.
bool present(const std::string& path);

// Removes everything inside dir, leaving dir itself.
void clear(const std::string& dir);

}  // namespace tree

#endif  // KESTREL_TESTS_TREE_H_
