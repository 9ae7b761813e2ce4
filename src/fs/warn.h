#ifndef KESTREL_FS_WARN_H_
#define KESTREL_FS_WARN_H_

// The tool's one diagnostic line, in the shape of warn(3):
//   "kestrel: " + the formatted message + ": " + the text of errno + "\n"
// on standard error. The errno text is whatever errno holds on entry, even a
// value left over from an earlier call; errno itself is left as it was.
void warn(const char* format, ...) __attribute__((format(printf, 1, 2)));

#endif  // KESTREL_FS_WARN_H_
