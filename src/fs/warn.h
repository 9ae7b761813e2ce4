#ifndef KESTREL_FS_WARN_H_
#define KESTREL_FS_WARN_H_

#include <string_view>

// The tool's one diagnostic line, in the shape of warn(3):
//   "kestrel: " + the formatted message + ": " + the text of errno + "\n"
// on standard error. The errno text is whatever errno holds on entry, even a
// value left over from an earlier call; errno itself is left as it was.
void warn(const char* format, ...) __attribute__((format(printf, 1, 2)));

// Receives each whole line, "\n" included, in place of standard error.
using warn_sink = void (*)(std::string_view line);

// Sends the lines to sink from now on, for a program that reuses the tool's
// logic but must not speak as the tool; nullptr, the default, sends them to
// standard error. Returns the sink in place before.
warn_sink set_warn_sink(warn_sink sink);

#endif  // KESTREL_FS_WARN_H_
