#include "icuprobe/icu_zone.h"

#include <unicode/basictz.h>
#include <unicode/dtrule.h>
#include <unicode/strenum.h>
#include <unicode/tzrule.h>
#include <unicode/tztrans.h>

#include <unicode/unistr.h>
#include <algorithm>
#include <limits>

namespace {

constexpr std::int64_t kMillis = 1000;

// Adds to found the start times in [from, to) of the zone's rules that are
// arrays of UTC times, and returns the latest of all their times (or the
// earliest possible date when there is none). The rules stay the zone's.
UDate historic_transitions(const icu::BasicTimeZone& zone, std::int64_t from,
                           std::int64_t to, std::vector<std::int64_t>& found) {
  UDate latest = -std::numeric_limits<UDate>::max();
  UErrorCode status = U_ZERO_ERROR;
  const std::int32_t count = zone.countTransitionRules(status);
  if (U_FAILURE(status) || count <= 0) {
    return latest;
  }
  std::vector<const icu::TimeZoneRule*> rules(static_cast<std::size_t>(count));
  const icu::InitialTimeZoneRule* initial = nullptr;
  std::int32_t filled = count;
  zone.getTimeZoneRules(initial, rules.data(), filled, status);
  for (std::int32_t i = 0; U_SUCCESS(status) && i < filled; ++i) {
    const auto* times =
        dynamic_cast<const icu::TimeArrayTimeZoneRule*>(rules[i]);
    if (times == nullptr ||
        times->getTimeType() != icu::DateTimeRule::UTC_TIME) {
      continue;
    }
    for (std::int32_t j = 0; j < times->countStartTimes(); ++j) {
      UDate start = 0;
      if (!times->getStartTimeAt(j, start)) {
        continue;
      }
      latest = std::max(latest, start);
      const auto second = static_cast<std::int64_t>(start / kMillis);
      if (second >= from && second < to) {
        found.push_back(second);
      }
    }
  }
  return latest;
}

}  // namespace

icu_zone::icu_zone(const std::string& name)
    : zone(icu::TimeZone::createTimeZone(icu::UnicodeString::fromUTF8(name))) {}

bool icu_zone::known() const {
  return zone != nullptr && *zone != icu::TimeZone::getUnknown();
}

local_offset icu_zone::at(std::int64_t instant) const {
  UErrorCode status = U_ZERO_ERROR;
  int32_t raw = 0;
  int32_t dst = 0;
  zone->getOffset(static_cast<UDate>(instant * kMillis), false, raw, dst,
                  status);
  if (U_FAILURE(status)) {
    return {};
  }
  return {(raw + dst) / kMillis, dst != 0};
}

std::vector<std::int64_t> icu_zone::transitions(std::int64_t from,
                                                std::int64_t to) const {
  std::vector<std::int64_t> found;
  const auto* basic = dynamic_cast<const icu::BasicTimeZone*>(zone.get());
  if (basic == nullptr) {
    return found;
  }
  // The historic transitions straight from the zone's rules: asking for
  // them one by one copies the whole array of times at every step.
  const UDate last_historic = historic_transitions(*basic, from, to, found);
  // Then the rule-based ones that follow, one by one.
  icu::TimeZoneTransition next;
  UDate at = std::max(static_cast<UDate>(from * kMillis) - 1, last_historic);
  while (basic->getNextTransition(at, false, next)) {
    at = next.getTime();
    const auto second = static_cast<std::int64_t>(at / kMillis);
    if (second >= to) {
      break;
    }
    found.push_back(second);
  }
  return found;
}

std::string icu_zone::data_version() {
  UErrorCode status = U_ZERO_ERROR;
  const char* version = icu::TimeZone::getTZDataVersion(status);
  return U_SUCCESS(status) && version != nullptr ? version : "";
}

std::string icu_zone::all_ids() {
  UErrorCode status = U_ZERO_ERROR;
  std::unique_ptr<icu::StringEnumeration> ids(
      icu::TimeZone::createEnumeration(status));
  std::string text;
  for (const icu::UnicodeString* id = ids->snext(status);
       ids != nullptr && U_SUCCESS(status) && id != nullptr;
       id = ids->snext(status)) {
    id->toUTF8String(text);
    text += '\n';
  }
  return text;
}
