#include "icuprobe/icu_zone.h"

#include <unicode/strenum.h>
#include <unicode/unistr.h>

namespace {

constexpr std::int64_t kMillis = 1000;

}  // namespace

icu_zone::icu_zone(const std::string& name)
    : zone(icu::TimeZone::createTimeZone(
          icu::UnicodeString::fromUTF8(name))) {}

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
       ids != nullptr && U_SUCCESS(status) && id != nullptr; id = ids->snext(status)) {
    id->toUTF8String(text);
    text += '\n';
  }
  return text;
}
