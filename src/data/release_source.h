#ifndef KESTREL_DATA_RELEASE_SOURCE_H_
#define KESTREL_DATA_RELEASE_SOURCE_H_

#include <string>

// A tz release as IANA publishes it, a tzdataRELEASE.tar.gz or a directory
// of its files, laid out in a scratch directory of its own so that its
// Makefile can run there without touching the original. The scratch
// directory goes with the object.
class release_source {
 public:
  explicit release_source(const std::string& tarball_or_dir);
  ~release_source();
  release_source(const release_source&) = delete;
  release_source& operator=(const release_source&) = delete;

  // The release named by its "version" file, such as 2026a; raises
  // std::runtime_error when that is missing or not a release name.
  std::string version() const;

  // Makes the release's tzdata.zi, the whole release in one zic input file,
  // with the release's own Makefile, in rearguard form; returns its path.
  std::string make_tzdata_zi() const;

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
