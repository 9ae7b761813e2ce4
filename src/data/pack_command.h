#ifndef KESTREL_DATA_PACK_COMMAND_H_
#define KESTREL_DATA_PACK_COMMAND_H_

#include <string>
#include <vector>

// kestrel-data pack SETDIR ARCHIVE: the set, checked as staging checks it,
// in one archive with its manifest of SHA-256 sums.
int run_pack(const std::vector<std::string>& args);

#endif  // KESTREL_DATA_PACK_COMMAND_H_
