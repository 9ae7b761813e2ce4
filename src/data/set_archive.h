#ifndef KESTREL_DATA_SET_ARCHIVE_H_
#define KESTREL_DATA_SET_ARCHIVE_H_

#include <string>

#include "data/set_image.h"

// A data set in one file for carrying to devices: a gzip-compressed POSIX
// ustar archive whose first member is the manifest (SHA256SUMS), then the
// set's directories, files and links in the order of a walk of the set. A
// file's further names are ustar hard links to the name that came first.

// Writes image, with its manifest, to the archive at path.
void write_set_archive(const set_image& image, const std::string& path);

// Reads the archive at path completely and checks it against its manifest.
// Refuses, with std::runtime_error naming the fault, an archive that is
// truncated or corrupt, that does not match its manifest, whose paths or
// links leave the set, whose hard links name no regular file before them, or
// that holds anything but directories, regular files and links.
set_image read_set_archive(const std::string& path);

#endif  // KESTREL_DATA_SET_ARCHIVE_H_
