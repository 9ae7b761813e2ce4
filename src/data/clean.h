#ifndef KESTREL_DATA_CLEAN_H_
#define KESTREL_DATA_CLEAN_H_

#include <ostream>
#include <string>
#include <vector>

namespace data {

// kestrel-data clean: removes from /var/db/timezone/tz every data set that
// neither the zoneinfo link nor tz_latest designates, and the leftovers of
// kestrel-data's own runs (".stage-*" scratch directories, ".remove-*" sets
// whose removal was cut short); then removes the clean-up marker
// /var/db/timezone/needs_cleanup, which it consumes whatever the outcome, so
// that the path unit watching it does not start it again and again.
//
// It holds kestrel-data's lock throughout. It removes nothing when the links
// are unreadable or inconsistent: a zoneinfo link that designates neither
// the system partition nor the zoneinfo directory of a set present in tz/,
// an icutz link that is not that same set's (or present while the system
// partition is designated), or a tz_latest that names no set present in tz/.
// kestrel's next start repairs such links and sets the marker again.
//
// A set is first renamed to ".remove-NAME" (a name neither kestrel nor
// status takes for a set), the rename made durable, and then deleted: a run
// cut short leaves either the set whole or a leftover the next run removes.
//
// Returns the exit status: 0 when done, 1 when refused or a removal failed
// (a line on err).
int clean(std::ostream& out, std::ostream& err);

// The subcommand: it takes no argument.
int run_clean(const std::vector<std::string>& args);

}  // namespace data

#endif  // KESTREL_DATA_CLEAN_H_
