#include "data/icu_resources.h"

#include <sys/stat.h>

#include <stdexcept>

#include "data/child_process.h"
#include "data/file_tree.h"
#include "data/verify_command.h"
#include "zoneinfo64/zoneinfo64.h"

namespace icu_resources {

void copy(const std::string& dir, std::span<const char* const> names,
          const std::string& out) {
  for (const char* name : names) {
    file_tree::copy_file(dir + "/" + name, out + "/" + name, 0644);
  }
}

void convert_zoneinfo64(const release_source& source, const std::string& out) {
  const std::string text_file = source.file("kestrel-zoneinfo64.txt");
  file_tree::write_text(text_file, zoneinfo64_text(source.directory()));
  if (child_process{{"genrb", "-q", "-d", out, text_file}}.run() != 0) {
    throw std::runtime_error(
        "genrb could not compile the converted zoneinfo64");
  }
}

std::string copy_from_system(const release_source& source,
                             std::span<const char* const> names,
                             const std::string& out) {
  const std::string scratch = source.file("kestrel-system-icu");
  if (mkdir(scratch.c_str(), 0700) != 0) {
    throw std::runtime_error("cannot make " + scratch);
  }
  child_process probe({icu_probe_path(), "data", scratch});
  probe.capture = true;
  if (probe.run() != 0) {
    throw std::runtime_error("the ICU probe could not write the system's data");
  }
  const std::string package = probe.output.substr(0, probe.output.find('\n'));
  std::string list;
  for (const char* name : names) {
    list += std::string(name) + "\n";
  }
  // icupkg reads a list of items from a file whose name ends in .txt.
  const std::string list_file = scratch + "/items.txt";
  file_tree::write_text(list_file, list);
  if (child_process{{"icupkg", "-x", list_file, "-d", out, package}}.run() !=
      0) {
    throw std::runtime_error("icupkg could not extract the CLDR resources of " +
                             package);
  }
  for (const char* name : names) {
    if (chmod((out + "/" + name).c_str(), 0644) != 0) {
      throw std::runtime_error("cannot open up " + out + "/" + name);
    }
  }
  file_tree::remove(scratch);
  const std::string base = package.substr(package.rfind('/') + 1);
  return base.substr(0, base.rfind('.'));
}

}  // namespace icu_resources
