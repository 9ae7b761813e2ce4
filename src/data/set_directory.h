#ifndef KESTREL_DATA_SET_DIRECTORY_H_
#define KESTREL_DATA_SET_DIRECTORY_H_

#include <string>

#include "data/set_image.h"

// A data set as a directory tree: a set made by build, or a set being
// staged. Failures raise std::runtime_error naming the path.

// Reads the set in dir, never following a link. A regular file met again by
// another name (zic writes a zone's links so) is a hard link to the name met
// first.
set_image read_set_directory(const std::string& dir);

// Writes every member of image below the existing directory dir, hard links
// as further names of their files, and makes it all durable: each file and each
// directory, dir included, is fsync'ed.
void write_set_directory(const set_image& image, const std::string& dir);

#endif  // KESTREL_DATA_SET_DIRECTORY_H_
