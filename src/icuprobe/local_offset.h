#ifndef KESTREL_ICUPROBE_LOCAL_OFFSET_H_
#define KESTREL_ICUPROBE_LOCAL_OFFSET_H_

#include <cstdint>

// What a reader of a zone says of one instant: the total offset from UTC in
// seconds and whether daylight time is in effect.
struct local_offset {
  std::int64_t seconds = 0;
  bool daylight = false;

  bool operator==(const local_offset&) const = default;
};

#endif  // KESTREL_ICUPROBE_LOCAL_OFFSET_H_
