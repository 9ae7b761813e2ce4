#include "data/check_instants.h"

#include <algorithm>

#include "data/posix_tz_rule.h"

namespace {

constexpr std::int64_t kYearFrom = 1900;
constexpr std::int64_t kYearTo = 2100;
constexpr std::int64_t kSecondsPerDay = 86400;

// The year of an instant, close enough to pick the years a rule must be
// worked out for: one year early at worst.
std::int64_t year_of(std::int64_t instant) {
  return 1970 + (instant / kSecondsPerDay - 1) / 366;
}

std::vector<std::int64_t> transitions_in_span(const tzif_file& zone) {
  std::vector<std::int64_t> all;
  for (const std::int64_t t : zone.transitions) {
    if (t >= kCheckFrom && t < kCheckTo) {
      all.push_back(t);
    }
  }
  const std::int64_t last =
      zone.transitions.empty() ? kCheckFrom : zone.transitions.back();
  if (!zone.footer.empty()) {
    const posix_tz_rule rule(zone.footer);
    for (std::int64_t year = std::max(kYearFrom, year_of(last));
         year < kYearTo; ++year) {
      for (const std::int64_t t : rule.changes_in(year)) {
        if (t > last && t >= kCheckFrom && t < kCheckTo) {
          all.push_back(t);
        }
      }
    }
  }
  std::sort(all.begin(), all.end());
  return all;
}

}  // namespace

std::vector<std::int64_t> check_instants(const tzif_file& zone) {
  std::vector<std::int64_t> instants{kCheckFrom, kCheckTo - 1};
  std::int64_t previous = kCheckFrom;
  for (const std::int64_t t : transitions_in_span(zone)) {
    instants.push_back(t);
    instants.push_back(t - 1);
    instants.push_back(previous + (t - previous) / 2);
    previous = t;
  }
  instants.push_back(previous + (kCheckTo - previous) / 2);
  std::sort(instants.begin(), instants.end());
  instants.erase(std::unique(instants.begin(), instants.end()), instants.end());
  return instants;
}
