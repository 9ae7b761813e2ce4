#include "data/build_command.h"

#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <stdexcept>

#include "data/child_process.h"
#include "data/file_tree.h"
#include "data/icu_part.h"
#include "data/release_source.h"
#include "data/usage_error.h"
#include "data/verify_command.h"

namespace {

// The tables beside the zone files that readers of a zoneinfo tree expect,
// those the release has: a distribution's tzdata.zi may come with zone.tab
// alone, which the release cannot lack (read_release reads it).
constexpr const char* kTables[] = {"zone.tab", "zone1970.tab", "iso3166.tab"};

void make_dir(const std::string& path) {
  if (mkdir(path.c_str(), 0755) != 0) {
    throw std::runtime_error("cannot make " + path);
  }
}

// zic compiles the same text the ICU part is converted from, so both say
// the same about daylight time.
void make_zoneinfo(const release_source& source, const std::string& out) {
  make_dir(out);
  const std::string zi = out + "/tzdata.zi";
  file_tree::write_text(zi, source.text().zic_text);
  if (child_process{{"zic", "-d", out, zi}}.run() != 0) {
    throw std::runtime_error("zic could not compile the release");
  }
  for (const char* table : kTables) {
    if (access(source.file(table).c_str(), F_OK) == 0) {
      file_tree::copy_file(source.file(table), out + "/" + table, 0644);
    }
  }
  file_tree::write_text(out + "/+VERSION", source.version() + "\n");
}

// The directory that holds path, as a prefix to join names to.
std::string parent_of(const std::string& path) {
  const std::size_t slash = path.rfind('/');
  return slash == std::string::npos ? "./" : path.substr(0, slash + 1);
}

}  // namespace

void build_set(const std::string& release, const icu_origin& icu,
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
    make_icu_part(source, icu, building + "/icutz");
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
  icu_origin icu;
  for (std::size_t i = 0; i < args.size(); ++i) {
    if (args[i] == "--icu" && i + 1 < args.size()) {
      icu.published = args[++i];
    } else if (args[i] == "--cldr" && i + 1 < args.size()) {
      icu.cldr = args[++i];
    } else {
      rest.push_back(args[i]);
    }
  }
  // ICU's published resources bring their own CLDR part.
  if (rest.size() != 2 || (!icu.published.empty() && !icu.cldr.empty())) {
    throw usage_error(
        "build [--icu DIR | --cldr DIR] RELEASE.tar.gz|RELEASE-DIR OUTDIR");
  }
  build_set(rest[0], icu, rest[1]);
  std::printf("built %s\n", rest[1].c_str());
  return EXIT_SUCCESS;
}
