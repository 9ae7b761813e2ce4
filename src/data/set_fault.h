#ifndef KESTREL_DATA_SET_FAULT_H_
#define KESTREL_DATA_SET_FAULT_H_

#include <string>

// What is wrong with the staged data set in set_path, in a few words for
// status: its directory's name is not a version, it has no
// zoneinfo/+VERSION, or its icutz/ cannot be read or holds no ICU data file.
// Empty when none of these is so.
std::string set_fault(const std::string& set_path);

#endif  // KESTREL_DATA_SET_FAULT_H_
