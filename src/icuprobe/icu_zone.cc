#include "icuprobe/icu_zone.h"

#include <unicode/basictz.h>
#include <unicode/strenum.h>
#include <unicode/tztrans.h>
#include <unicode/unistr.h>

namespace {

constexpr std::int64_t kMillis = 1000;

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
  icu::TimeZoneTransition next;
  // Inclusive of from itself, then each strictly after the previous one.
  UDate at = static_cast<UDate>(from * kMillis) - 1;
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
