#ifndef KESTREL_DATA_DEVICE_STATE_H_
#define KESTREL_DATA_DEVICE_STATE_H_

#include <string>
#include <vector>

#include "data/adoption.h"

// A staged data set in /var/db/timezone/tz.
struct staged_set {
  std::string path;
  std::string version;
  std::string schema;
  // What is wrong with the set; empty when nothing is.
  std::string fault;
  verdict adoption;
};

// What status reports of the device's time-zone data, read without changing
// anything and without a line on standard error: what kestrel's own reading
// would warn about is in the state instead.
struct device_state {
  static device_state read();

  std::string system_version;
  std::string system_schema;
  // The set the links designate: its directory (empty for the system
  // partition) and version, or the link's trouble.
  std::string designated_path;
  std::string designated_version;
  std::string latest;
  std::vector<staged_set> staged;
  bool cleanup_marker = false;
  // The content of TZVersionDiffRecord; empty when there is none.
  std::string version_record;
};

// The ICU schema of a data-set directory, from the name of its data file
// icutz/icutzNNx.dat; empty when it has none.
std::string schema_of_set(const std::string& set_path);

// The names of the data sets in /var/db/timezone/tz: every entry whose name
// does not start with "." (those are leftovers of kestrel-data itself).
std::vector<std::string> staged_set_names();

#endif  // KESTREL_DATA_DEVICE_STATE_H_
