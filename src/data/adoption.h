#ifndef KESTREL_DATA_ADOPTION_H_
#define KESTREL_DATA_ADOPTION_H_

#include <string>

// kestrel's rules for the data sets of this device, stated once for staging
// and for status. At start kestrel adopts the staged set that tz_latest
// names when that set's ICU schema is the system partition's and its
// version is strictly newer than that of the set the links designate (the
// system partition's RELEASE.1.0 when they designate it or cannot be read),
// even when the designated set is itself older than the system partition's.
// The decisions are made by kestrel's own data-set classes.

struct verdict {
  bool yes = false;
  // Why, in a few words for status and for refusals.
  std::string reason;
};

// Whether kestrel would adopt the staged set in set_path at its next start,
// were tz_latest to name it.
verdict kestrel_would_adopt(const std::string& set_path);

// Whether a set of this release and ICU schema may be staged: its schema
// must be the system partition's, its release newer than the system
// partition's and not older than that of the set the links designate, so
// that kestrel adopts it at the next start: a re-release of the designated
// release gets an N above the designated set's.
verdict may_stage(const std::string& release, const std::string& schema);

#endif  // KESTREL_DATA_ADOPTION_H_
