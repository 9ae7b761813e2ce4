#include "icuprobe/local_offset.h"

#include <cstdio>

std::string describe_offset(const local_offset& offset) {
  const std::int64_t minutes = offset.seconds / 60;
  const std::int64_t whole = minutes < 0 ? -minutes : minutes;
  char text[32];
  (void)std::snprintf(
      text, sizeof text, "%c%02lld:%02lld%s", minutes < 0 ? '-' : '+',
      static_cast<long long>(whole / 60), static_cast<long long>(whole % 60),
      offset.daylight ? " daylight" : "");
  return text;
}
