#ifndef KESTREL_DATA_MUTED_WARNINGS_H_
#define KESTREL_DATA_MUTED_WARNINGS_H_

#include "fs/warn.h"

// While one lives, the lines kestrel's own code would write as the boot tool
// ("kestrel: ...") are dropped: kestrel-data reuses that code to read data
// sets as kestrel does, and reports what it finds in its own words.
class muted_warnings {
 public:
  muted_warnings();
  ~muted_warnings();
  muted_warnings(const muted_warnings&) = delete;
  muted_warnings& operator=(const muted_warnings&) = delete;

 private:
  warn_sink before;
};

#endif  // KESTREL_DATA_MUTED_WARNINGS_H_
