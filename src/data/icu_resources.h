#ifndef KESTREL_DATA_ICU_RESOURCES_H_
#define KESTREL_DATA_ICU_RESOURCES_H_

#include <span>
#include <string>

#include "data/release_source.h"

// The three ways a data set's ICU resources reach its icutz/ directory.
// Failures raise std::runtime_error.
namespace icu_resources {

// Copies the named resources from the directory dir into out.
void copy(const std::string& dir, std::span<const char* const> names,
          const std::string& out);

// Converts the release into ICU's zoneinfo64 text with the project's
// converter and compiles it with genrb into out/zoneinfo64.res.
void convert_zoneinfo64(const release_source& source, const std::string& out);

// Extracts the named resources from the system ICU's own data package, as
// the ICU probe writes it, into out with icupkg; returns the package's name
// (such as icudt72l).
std::string copy_from_system(const release_source& source,
                             std::span<const char* const> names,
                             const std::string& out);

}  // namespace icu_resources

#endif  // KESTREL_DATA_ICU_RESOURCES_H_
