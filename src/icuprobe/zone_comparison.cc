#include "icuprobe/zone_comparison.h"

#include <cstdio>
#include <ctime>
#include <exception>

#include "data/check_instants.h"
#include "icuprobe/glibc_zone.h"
#include "icuprobe/icu_zone.h"

namespace {

std::string describe(const local_offset& offset) {
  const std::int64_t minutes = offset.seconds / 60;
  const std::int64_t whole = minutes < 0 ? -minutes : minutes;
  char text[32];
  (void)std::snprintf(text, sizeof text, "%c%02lld:%02lld%s",
                      minutes < 0 ? '-' : '+',
                      static_cast<long long>(whole / 60),
                      static_cast<long long>(whole % 60),
                      offset.daylight ? " daylight" : "");
  return text;
}

std::string utc_text(std::int64_t instant) {
  const std::time_t t = instant;
  std::tm utc{};
  char text[32] = "?";
  if (gmtime_r(&t, &utc) != nullptr) {
    (void)std::strftime(text, sizeof text, "%Y-%m-%dT%H:%M:%SZ", &utc);
  }
  return text;
}

}  // namespace

zone_comparison::zone_comparison(const std::string& name,
                                 const std::string& zoneinfo) {
  const icu_zone icu(name);
  if (!icu.known()) {
    disagreements = 1;
    first = "unknown to ICU";
    return;
  }
  std::vector<std::int64_t> checked;
  try {
    checked = check_instants(read_tzif(zoneinfo + "/" + name));
  } catch (const std::exception& e) {
    disagreements = 1;
    first = e.what();
    return;
  }
  const glibc_zone glibc(name);
  for (const std::int64_t instant : checked) {
    ++instants;
    const local_offset by_icu = icu.at(instant);
    const local_offset by_glibc = glibc.at(instant);
    if (by_icu == by_glibc) {
      continue;
    }
    if (disagreements++ == 0) {
      first = "at " + utc_text(instant) + " ICU " + describe(by_icu) +
              ", glibc " + describe(by_glibc);
    }
  }
}
