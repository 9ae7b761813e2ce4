#ifndef KESTREL_ZONEINFO64_ZONEINFO64_H_
#define KESTREL_ZONEINFO64_ZONEINFO64_H_

#include <string>

// ICU's zoneinfo64 resource, in ICU's text format for genrb, made from the
// tz release in release_dir (see read_release). Throws std::runtime_error
// with a message for a release it cannot read or convert.
std::string zoneinfo64_text(const std::string& release_dir);

#endif  // KESTREL_ZONEINFO64_ZONEINFO64_H_
