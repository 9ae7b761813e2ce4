#ifndef KESTREL_FS_FS_H_
#define KESTREL_FS_FS_H_

#include <string>

// Wrappers over the link and file calls with which the tool inspects and
// rewrites its links. A missing entry is a normal, silent outcome where that
// makes sense; every other failure is logged once, here, with warn() and then
// raised as a bare int holding errno.
//
// These are kept in their own namespace, apart from the C library's
// ::remove, which also removes empty directories and never raises.
namespace fs {

// unlink(2) the path: a file or a link itself, never a directory. A missing
// path is silent and gives false. Otherwise the result is whether errno is
// zero afterwards, which after a success depends on earlier calls; nothing
// relies on it.
bool remove(const std::string& path);

// Whether access(2) reaches the path; a dangling link does not count.
bool exists(const std::string& path);

// The target text of the link at path, cut to its first 1024 bytes; empty
// when there is no such entry.
std::string read_symlink(const std::string& path);

// Creates the link link_path with the text target, in the argument order of
// symlink(2). Never replaces an existing entry: callers remove it first.
void create_symlink(const std::string& target, const std::string& link_path);

}  // namespace fs

#endif  // KESTREL_FS_FS_H_
