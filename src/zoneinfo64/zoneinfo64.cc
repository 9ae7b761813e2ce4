#include "zoneinfo64/zoneinfo64.h"

#include "zoneinfo64/release_reader.h"
#include "zoneinfo64/zoneinfo64_data.h"
#include "zoneinfo64/zoneinfo64_writer.h"

std::string zoneinfo64_text(const std::string& release_dir) {
  const release_text release = read_release(release_dir);
  return write_zoneinfo64(
      build_zoneinfo64(release.zic_text, release.zone_tab, release.version));
}
