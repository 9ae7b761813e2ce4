#ifndef KESTREL_FS_FIRST_WORD_H_
#define KESTREL_FS_FIRST_WORD_H_

#include <string>

namespace fs {

// The first word of the file at path, read at once; see word_file for what
// counts as a word and when it is empty. Never logs, never raises.
std::string read_first_word(const std::string& path);

}  // namespace fs

#endif  // KESTREL_FS_FIRST_WORD_H_
