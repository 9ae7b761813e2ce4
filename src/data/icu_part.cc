#include "data/icu_part.h"

#include <sys/stat.h>

#include <climits>
#include <cstdlib>
#include <stdexcept>

#include "data/build_command.h"
#include "data/child_process.h"
#include "data/file_tree.h"
#include "data/icu_resources.h"

namespace {

// Where the ICU part came from, for whoever looks at the set later.
constexpr char kOriginNote[] = "origin.txt";

std::string absolute(const std::string& path) {
  char resolved[PATH_MAX];
  return realpath(path.c_str(), resolved) != nullptr ? resolved : path;
}

void package(const release_source& source, const std::string& out) {
  std::string list;
  for (const char* resource : kIcuResources) {
    list += std::string(resource) + "\n";
  }
  // icupkg reads a list of items from a file whose name ends in .txt.
  const std::string list_file = source.file("kestrel-icu-items.txt");
  file_tree::write_text(list_file, list);
  const std::string data_file = out + "/icutz" + kIcuSchema + ".dat";
  if (child_process{
          {"icupkg", "-tl", "-a", list_file, "-s", out, "new", data_file}}
              .run() != 0 ||
      chmod(data_file.c_str(), 0644) != 0) {
    throw std::runtime_error("icupkg could not package the ICU resources");
  }
}

}  // namespace

void make_icu_part(const release_source& source, const icu_origin& origin,
                   const std::string& out) {
  if (mkdir(out.c_str(), 0755) != 0) {
    throw std::runtime_error("cannot make " + out);
  }
  std::string note;
  if (!origin.published.empty()) {
    icu_resources::copy(origin.published, kIcuResources, out);
    note = "ICU resources as published by ICU, copied from " +
           absolute(origin.published) + "\n";
  } else {
    icu_resources::convert_zoneinfo64(source, out);
    note = "zoneinfo64.res: converted from tz release " + source.version() +
           " by kestrel-data\n";
    note += "metaZones.res timezoneTypes.res windowsZones.res: ";
    if (origin.cldr.empty()) {
      note += "the system ICU's own data (" +
              icu_resources::copy_from_system(source, kCldrResources, out) +
              ")\n";
    } else {
      icu_resources::copy(origin.cldr, kCldrResources, out);
      note += "ICU resources copied from " + absolute(origin.cldr) + "\n";
    }
  }
  package(source, out);
  file_tree::write_text(out + "/" + kOriginNote, note);
}
