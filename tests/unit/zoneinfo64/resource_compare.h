#ifndef KESTREL_TESTS_UNIT_ZONEINFO64_RESOURCE_COMPARE_H_
#define KESTREL_TESTS_UNIT_ZONEINFO64_RESOURCE_COMPARE_H_

#include <cstdio>
#include <map>
#include <string>

#include "resource_text.h"

// Compares two zoneinfo64 resources part by part: Names, each name's zone
// (an alias by the name it points to; a zone by its transitions, offsets,
// type map, final rule and links, links by name), Rules and Regions. Prints
// each difference to out and returns the number of differences by part.
std::map<std::string, int> compare_zoneinfo64(const resource_node& mine,
                                              const resource_node& theirs,
                                              std::FILE* out);

#endif  // KESTREL_TESTS_UNIT_ZONEINFO64_RESOURCE_COMPARE_H_
