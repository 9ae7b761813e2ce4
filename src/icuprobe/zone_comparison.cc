#include "icuprobe/zone_comparison.h"

#include <algorithm>
#include <cstdio>
#include <ctime>
#include <exception>

#include "data/check_instants.h"
#include "icuprobe/glibc_zone.h"
#include "icuprobe/icu_zone.h"

namespace {

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
  // ICU's own transitions as well, so that a change only one side makes is
  // met where that side makes it.
  for (const std::int64_t t : icu.transitions(kCheckFrom, kCheckTo)) {
    checked.push_back(t);
    checked.push_back(t - 1);
  }
  std::sort(checked.begin(), checked.end());
  checked.erase(std::unique(checked.begin(), checked.end()), checked.end());
  const glibc_zone glibc(name);
  for (const std::int64_t instant : checked) {
    ++instants;
    const local_offset by_icu = icu.at(instant);
    const local_offset by_glibc = glibc.at(instant);
    if (by_icu == by_glibc) {
      continue;
    }
    if (disagreements++ == 0) {
      first = "at " + utc_text(instant) + " ICU " + describe_offset(by_icu) +
              ", glibc " + describe_offset(by_glibc);
    }
  }
}
