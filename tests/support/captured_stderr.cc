#include "captured_stderr.h"

#include <fcntl.h>
#include <unistd.h>

#include <cstdio>
#include <stdexcept>

captured_stderr::captured_stderr() {
  std::fflush(stderr);
  file_fd = open("/tmp", O_TMPFILE | O_RDWR, 0600);
  saved_fd = dup(STDERR_FILENO);
  if (file_fd < 0 || saved_fd < 0 || dup2(file_fd, STDERR_FILENO) < 0) {
    throw std::runtime_error("cannot capture standard error");
  }
}

captured_stderr::~captured_stderr() {
  std::fflush(stderr);
  dup2(saved_fd, STDERR_FILENO);
  close(saved_fd);
  close(file_fd);
}

std::string captured_stderr::text() const {
  std::fflush(stderr);
  std::string result;
  char buffer[4096];
  off_t offset = 0;
  ssize_t n;
  while ((n = pread(file_fd, buffer, sizeof buffer, offset)) > 0) {
    result.append(buffer, static_cast<std::size_t>(n));
    offset += n;
  }
  return result;
}
