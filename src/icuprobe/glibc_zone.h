#ifndef KESTREL_ICUPROBE_GLIBC_ZONE_H_
#define KESTREL_ICUPROBE_GLIBC_ZONE_H_

#include <cstdint>
#include <string>

#include "icuprobe/local_offset.h"

// A zone as the C library reads it: TZ=":NAME", looked up under TZDIR.
// Selecting a zone changes the process's TZ, so one at a time.
class glibc_zone {
 public:
  explicit glibc_zone(const std::string& name);
  local_offset at(std::int64_t instant) const;
};

#endif  // KESTREL_ICUPROBE_GLIBC_ZONE_H_
