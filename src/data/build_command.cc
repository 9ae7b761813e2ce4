#include "data/build_command.h"

#include <sys/stat.h>

#include <cerrno>
#include <climits>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <stdexcept>

#include "data/child_process.h"
#include "data/file_tree.h"
#include "data/release_source.h"
#include "data/usage_error.h"
#include "data/verify_command.h"

namespace {

// The tables beside the zone files that readers of a zoneinfo tree expect.
constexpr const char* kTables[] = {"zone.tab", "zone1970.tab", "iso3166.tab"};

void make_dir(const std::string& path) {
  if (mkdir(path.c_str(), 0755) != 0) {
    throw std::runtime_error("cannot make " + path);
  }
}

void write_text(const std::string& path, const std::string& text) {
  std::ofstream out(path);
  out << text;
  if (!out.flush()) {
    throw std::runtime_error("cannot write " + path);
  }
}

void make_zoneinfo(const release_source& source, const std::string& out) {
  const std::string zi = source.make_tzdata_zi();
  make_dir(out);
  if (child_process{{"zic", "-d", out, zi}}.run() != 0) {
    throw std::runtime_error("zic could not compile the release");
  }
  file_tree::copy_file(zi, out + "/tzdata.zi", 0644);
  for (const char* table : kTables) {
    file_tree::copy_file(source.file(table), out + "/" + table, 0644);
  }
  write_text(out + "/+VERSION", source.version() + "\n");
}

// Where the ICU part came from, for whoever looks at the set later.
constexpr char kOriginNote[] = "origin.txt";

void make_icutz(const release_source& source, const std::string& icu_dir,
                const std::string& out) {
  make_dir(out);
  std::string list;
  for (const char* resource : kIcuResources) {
    file_tree::copy_file(icu_dir + "/" + resource, out + "/" + resource, 0644);
    list += std::string(resource) + "\n";
  }
  // icupkg reads a list of items from a file whose name ends in .txt.
  const std::string list_file = source.file("kestrel-icu-items.txt");
  write_text(list_file, list);
  const std::string data_file = out + "/icutz" + kIcuSchema + ".dat";
  if (child_process{{"icupkg", "-tl", "-a", list_file, "-s", out, "new",
                     data_file}}
              .run() != 0 ||
      chmod(data_file.c_str(), 0644) != 0) {
    throw std::runtime_error("icupkg could not package the ICU resources");
  }
  char from[PATH_MAX];
  const bool resolved = realpath(icu_dir.c_str(), from) != nullptr;
  write_text(out + "/" + kOriginNote,
             "ICU resources as published by ICU, copied from " +
                 (resolved ? std::string(from) : icu_dir) + "\n");
}

// The directory that holds path, as a prefix to join names to.
std::string parent_of(const std::string& path) {
  const std::size_t slash = path.rfind('/');
  return slash == std::string::npos ? "./" : path.substr(0, slash + 1);
}

}  // namespace

void build_set(const std::string& release, const std::string& icu_dir,
               const std::string& out_dir) {
  struct stat info {};
  if (lstat(out_dir.c_str(), &info) == 0 || errno != ENOENT) {
    throw std::runtime_error(out_dir + " already exists");
  }
  const release_source source(release);
  const std::string version = source.version();
  const std::string building = file_tree::make_temporary(
      parent_of(out_dir) + ".kestrel-data-build.XXXXXX");
  try {
    // mkdtemp makes it private; a data set is read by every program.
    if (chmod(building.c_str(), 0755) != 0) {
      throw std::runtime_error("cannot open up " + building);
    }
    make_zoneinfo(source, building + "/zoneinfo");
    make_icutz(source, icu_dir, building + "/icutz");
    if (!verify_set(building)) {
      throw std::runtime_error("release " + version +
                               " does not pass verification; nothing built");
    }
    if (rename(building.c_str(), out_dir.c_str()) != 0) {
      throw std::runtime_error("cannot rename the set to " + out_dir);
    }
  } catch (...) {
    file_tree::remove(building);
    throw;
  }
}

int run_build(const std::vector<std::string>& args) {
  std::vector<std::string> rest;
  std::string icu_dir;
  for (std::size_t i = 0; i < args.size(); ++i) {
    if (args[i] == "--icu" && i + 1 < args.size()) {
      icu_dir = args[++i];
    } else {
      rest.push_back(args[i]);
    }
  }
  if (rest.size() != 2) {
    throw usage_error("build [--icu DIR] RELEASE.tar.gz|RELEASE-DIR OUTDIR");
  }
  if (icu_dir.empty()) {
    throw std::runtime_error(
        "no ICU resources given: name ICU's published resources for the "
        "release with --icu DIR");
  }
  build_set(rest[0], icu_dir, rest[1]);
  std::printf("built %s\n", rest[1].c_str());
  return EXIT_SUCCESS;
}
