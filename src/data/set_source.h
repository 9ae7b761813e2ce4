#ifndef KESTREL_DATA_SET_SOURCE_H_
#define KESTREL_DATA_SET_SOURCE_H_

#include <string>

#include "data/set_image.h"

// A data set named on the command line: a directory made by build, or an
// archive made by pack.
set_image load_set(const std::string& set_dir_or_archive);

#endif  // KESTREL_DATA_SET_SOURCE_H_
