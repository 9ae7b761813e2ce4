#include "fs/word_file.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstddef>
#include <string_view>

namespace fs {

namespace {

// The white space of the "C" locale, which ends and separates words.
constexpr std::string_view kBlanks = " \t\n\v\f\r";

// Bytes read at a time; the word may span any number of reads.
constexpr std::size_t kChunk = 16384;

// Opening must not wait either: a FIFO without a writer would block a
// plain open, and a terminal must not become the tool's own.
int open_regular_file(const std::string& path) {
  const int fd =
      open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK | O_NOCTTY);
  if (fd < 0) {
    return fd;
  }
  struct stat status {};
  const bool regular = fstat(fd, &status) == 0 && S_ISREG(status.st_mode);
  if (!regular) {
    (void)close(fd);
    if (S_ISDIR(status.st_mode)) {
      // What a read of the directory would have reported.
      errno = EISDIR;
    }
    return -1;
  }
  return fd;
}

// Adds the part of chunk that belongs to the word; true once the word has
// ended inside it.
bool take_word_part(std::string_view chunk, std::string& word) {
  if (word.empty()) {
    const std::size_t start = chunk.find_first_not_of(kBlanks);
    if (start == std::string_view::npos) {
      return false;
    }
    chunk.remove_prefix(start);
  }
  const std::size_t end = chunk.find_first_of(kBlanks);
  word.append(chunk.substr(0, end));
  return end != std::string_view::npos;
}

}  // namespace

word_file::word_file(const std::string& path) : fd(open_regular_file(path)) {}

word_file::~word_file() {
  if (fd >= 0) {
    (void)close(fd);
  }
}

// A failed read makes the whole file unreadable, so its word is empty.
std::string word_file::first_word() const {
  std::string word;
  if (fd < 0) {
    return word;
  }
  char buffer[kChunk];
  off_t offset = 0;
  for (;;) {
    const ssize_t length = pread(fd, buffer, sizeof buffer, offset);
    if (length < 0) {
      return {};
    }
    if (length == 0 ||
        take_word_part({buffer, static_cast<std::size_t>(length)}, word)) {
      return word;
    }
    offset += length;
  }
}

}  // namespace fs
