#ifndef KESTREL_DATA_SET_MEMBER_CHECK_H_
#define KESTREL_DATA_SET_MEMBER_CHECK_H_

#include <string_view>

// Whether path, relative to a data set's root, names something inside it:
// not empty, not absolute, no "." or ".." component, no empty component.
bool path_stays_inside(std::string_view path);

// Whether a link at link_path with this target resolves inside the set: the
// target is relative and, followed from the link's directory, never climbs
// above the set's root.
bool link_stays_inside(std::string_view link_path, std::string_view target);

#endif  // KESTREL_DATA_SET_MEMBER_CHECK_H_
