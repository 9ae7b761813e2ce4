#include "fs/warn.h"

#include <cerrno>
#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string_view>

namespace {

warn_sink current_sink = nullptr;

// The line is put together in memory and written at once, so that it is
// never interleaved with anything else on standard error.
void write_line(std::string_view message, std::string_view error_text) {
  const std::string_view parts[] = {"kestrel: ", message, ": ", error_text,
                                    "\n"};
  std::size_t length = 0;
  for (const std::string_view part : parts) {
    length += part.size();
  }
  char* const line = static_cast<char*>(std::malloc(length));
  if (line == nullptr) {
    return;
  }
  char* end = line;
  for (const std::string_view part : parts) {
    end = static_cast<char*>(std::memcpy(end, part.data(), part.size())) +
          part.size();
  }
  if (current_sink == nullptr) {
    (void)std::fwrite(line, 1, length, stderr);
  } else {
    current_sink({line, length});
  }
  std::free(line);
}

}  // namespace

void warn(const char* format, ...) {
  const int saved_errno = errno;
  char* message = nullptr;
  va_list args;
  va_start(args, format);
  const int length = vasprintf(&message, format, args);
  va_end(args);
  if (length >= 0) {
    write_line({message, static_cast<std::size_t>(length)},
               std::strerror(saved_errno));
    std::free(message);
  }
  errno = saved_errno;
}

warn_sink set_warn_sink(warn_sink sink) {
  const warn_sink before = current_sink;
  current_sink = sink;
  return before;
}
