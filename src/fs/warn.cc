#include "fs/warn.h"

#include <cerrno>
#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <cstring>

void warn(const char* format, ...) {
  const int saved_errno = errno;

  // The line is put together in memory and written at once, so that it is
  // never interleaved with anything else on standard error.
  char* line = nullptr;
  std::size_t length = 0;
  FILE* out = open_memstream(&line, &length);
  if (out == nullptr) {
    errno = saved_errno;
    return;
  }
  va_list args;
  va_start(args, format);
  (void)std::fputs("kestrel: ", out);
  (void)std::vfprintf(out, format, args);
  (void)std::fprintf(out, ": %s\n", std::strerror(saved_errno));
  va_end(args);
  if (std::fclose(out) == 0) {
    (void)std::fwrite(line, 1, length, stderr);
  }
  std::free(line);
  errno = saved_errno;
}
