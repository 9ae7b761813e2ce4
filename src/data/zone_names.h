#ifndef KESTREL_DATA_ZONE_NAMES_H_
#define KESTREL_DATA_ZONE_NAMES_H_

#include <istream>
#include <string>
#include <vector>

// The names of every zone ("Z NAME ...") and link ("L TARGET NAME") of a
// release in zic's input format, as in tzdata.zi, in file order.
std::vector<std::string> zone_and_link_names(std::istream& zi);

// The same, read from the file at path; an unreadable file raises
// std::runtime_error.
std::vector<std::string> zone_and_link_names(const std::string& path);

#endif  // KESTREL_DATA_ZONE_NAMES_H_
