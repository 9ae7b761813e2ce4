#ifndef KESTREL_DATA_RELEASE_SOURCE_H_
#define KESTREL_DATA_RELEASE_SOURCE_H_

#include <string>

#include "zoneinfo64/release_reader.h"

// A tz release, a tzdataRELEASE.tar.gz or a directory of its files as IANA
// publishes them, or a directory holding only a distribution's tzdata.zi
// and zone tables (Debian's /usr/share/zoneinfo), laid out in a scratch
// directory of its own so that nothing is written beside the original. The
// scratch directory goes with the object.
class release_source {
 public:
  explicit release_source(const std::string& tarball_or_dir);
  ~release_source();
  release_source(const release_source&) = delete;
  release_source& operator=(const release_source&) = delete;

  // The release named by its "version" file or tzdata.zi's "# version"
  // line, such as 2026a; raises std::runtime_error when there is neither or
  // it is not a release name.
  std::string version() const;

  // The whole release as one zic input text with no negative saving, its
  // zone.tab and version (see read_release).
  release_text text() const;

  // The scratch directory holding the release's files.
  std::string directory() const { return dir; }

  // The path of one of the release's files.
  std::string file(const std::string& name) const;

 private:
  std::string dir;
};

// Whether text names a tz release: four digits and one or more lower-case
// letters, such as 2026a.
bool is_release_name(const std::string& text);

#endif  // KESTREL_DATA_RELEASE_SOURCE_H_
