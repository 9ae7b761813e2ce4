#ifndef KESTREL_DATA_TZIF_FILE_H_
#define KESTREL_DATA_TZIF_FILE_H_

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

// What verification needs of a compiled zone file (TZif, RFC 9636): the
// instants of its explicit transitions, from its 64-bit data block, and its
// footer, the rule that goes on after the last of them.
struct tzif_file {
  std::vector<std::int64_t> transitions;
  std::string footer;
};

// Parses the bytes of a TZif file of version 2 or later. Anything else, or a
// file cut short, raises std::runtime_error naming what is wrong.
tzif_file parse_tzif(std::string_view bytes);

// Reads and parses the file at path; an unreadable file raises as well.
tzif_file read_tzif(const std::string& path);

#endif  // KESTREL_DATA_TZIF_FILE_H_
