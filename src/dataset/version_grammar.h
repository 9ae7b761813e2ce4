#ifndef KESTREL_DATASET_VERSION_GRAMMAR_H_
#define KESTREL_DATASET_VERSION_GRAMMAR_H_

#include <optional>
#include <string_view>

// The four pieces of a version string such as 2019c.1.0: release number,
// release letters, then up to two dot-separated numbers. An absent number is
// empty. The views point into the text that was matched.
struct version_parts {
  std::string_view major, letters, minor, subminor;
};

// Whether the whole of text is a version string, that is, a full match of
//   ([0-9]+)([a-z]+)(?:\.([0-9]+))?(?:\.([0-9]+))?
// (ASCII digits and lower-case letters only), and its pieces if so. One pass
// over the text, without recursion, so that a text of any length is judged
// in constant stack.
std::optional<version_parts> match_version(std::string_view text);

#endif  // KESTREL_DATASET_VERSION_GRAMMAR_H_
