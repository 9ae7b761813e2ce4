#include "fs/first_word.h"

#include "fs/word_file.h"

namespace fs {

std::string read_first_word(const std::string& path) {
  return word_file(path).first_word();
}

}  // namespace fs
