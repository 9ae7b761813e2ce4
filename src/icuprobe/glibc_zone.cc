#include "icuprobe/glibc_zone.h"

#include <cstdlib>
#include <ctime>

glibc_zone::glibc_zone(const std::string& name) {
  (void)setenv("TZ", (":" + name).c_str(), 1);
  tzset();
}

local_offset glibc_zone::at(std::int64_t instant) const {
  const std::time_t t = instant;
  std::tm local{};
  if (localtime_r(&t, &local) == nullptr) {
    return {};
  }
  return {local.tm_gmtoff, local.tm_isdst > 0};
}
