#ifndef KESTREL_ZONEINFO64_RELEASE_READER_H_
#define KESTREL_ZONEINFO64_RELEASE_READER_H_

#include <string>

// The parts of a tz release the converter reads.
struct release_text {
  std::string zic_text;  // every Zone, Rule and Link line
  std::string zone_tab;
  std::string version;
};

// Reads a release directory. A directory as IANA publishes it (its data
// files and ziguard.awk) gives its rearguard form, made by running the
// release's own ziguard.awk with awk over the files its Makefile names, so
// that no saving is negative. A directory holding only tzdata.zi (the whole
// release in one file, as distributions install it) gives that file, in
// main form, with its negative savings folded away (fold_negative_saves),
// and the version from its first line when there is no version file.
// Throws std::runtime_error naming what is missing or fails.
release_text read_release(const std::string& dir);

#endif  // KESTREL_ZONEINFO64_RELEASE_READER_H_
