#ifndef KESTREL_ZONEINFO64_ZONEINFO64_WRITER_H_
#define KESTREL_ZONEINFO64_ZONEINFO64_WRITER_H_

#include <string>

#include "zoneinfo64/zoneinfo64_data.h"

// The resource in ICU's text format, as genrb compiles it: a table
// zoneinfo64 of TZVersion, Zones, Names, Rules and Regions. A zone lists its
// offsets as (raw, saving) pairs, type 0 being the one before its first
// transition and the others in ascending order, then one byte per
// transition naming its type; transitions that need more than 32 bits are
// written as (high, low) pairs in transPre32 and transPost32.
std::string write_zoneinfo64(const zoneinfo64_data& data);

#endif  // KESTREL_ZONEINFO64_ZONEINFO64_WRITER_H_
