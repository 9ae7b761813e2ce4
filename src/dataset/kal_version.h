#ifndef KESTREL_DATASET_KAL_VERSION_H_
#define KESTREL_DATASET_KAL_VERSION_H_

#include <cstdint>
#include <string>

// The version of a data set, parsed from a version string such as 2019c.1.0:
// a release number, release letters and up to two further numbers. A number
// that is absent, and every field of a text that does not parse, is -1 (empty
// for the letters), so an unparsable version is older than every parsed one.
class kal_version {
 public:
  kal_version() = default;
  explicit kal_version(const std::string& text);

  // Overwrites the fields from text. A text that is not a version gives two
  // warnings and the default value; a number beyond 32 bits raises
  // std::out_of_range, keeping the fields written before it.
  void parse(const std::string& text);

  // Strictly newer: compares major, letters, minor, subminor in that order.
  bool operator>(const kal_version& other) const;
  bool operator==(const kal_version& other) const;

  std::int32_t major = -1;
  std::string letters;
  std::int32_t minor = -1;
  std::int32_t subminor = -1;
};

#endif  // KESTREL_DATASET_KAL_VERSION_H_
