#ifndef KESTREL_ICUPROBE_ICU_ZONE_H_
#define KESTREL_ICUPROBE_ICU_ZONE_H_

#include <unicode/timezone.h>

#include <cstdint>
#include <memory>
#include <string>

#include "icuprobe/local_offset.h"

// A zone as ICU reads it, from its own data or from the resources in
// ICU_TIMEZONE_FILES_DIR.
class icu_zone {
 public:
  explicit icu_zone(const std::string& name);

  // Whether ICU knows the name: an unknown one reads as Etc/Unknown.
  bool known() const;
  local_offset at(std::int64_t instant) const;

  // ICU's version of its time-zone data, such as 2026a.
  static std::string data_version();
  // Every zone ID ICU knows, one per line.
  static std::string all_ids();

 private:
  std::unique_ptr<icu::TimeZone> zone;
};

#endif  // KESTREL_ICUPROBE_ICU_ZONE_H_
