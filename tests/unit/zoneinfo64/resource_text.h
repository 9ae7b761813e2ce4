#ifndef KESTREL_TESTS_UNIT_ZONEINFO64_RESOURCE_TEXT_H_
#define KESTREL_TESTS_UNIT_ZONEINFO64_RESOURCE_TEXT_H_

#include <string>
#include <string_view>
#include <vector>

// A resource of ICU's text format as genrb reads it: its label ("key:type",
// ":type" or "key"), its plain values (strings without quotes, numbers) and
// its nested resources, in order. Comments are dropped.
struct resource_node {
  std::string label;
  std::vector<std::string> values;
  std::vector<resource_node> children;

  // The nested resource whose label is key or starts with "key:".
  const resource_node* child(std::string_view key) const;
};

// Parses a whole resource file; throws std::runtime_error on bad text.
resource_node parse_resource_text(std::string_view text);

#endif  // KESTREL_TESTS_UNIT_ZONEINFO64_RESOURCE_TEXT_H_
