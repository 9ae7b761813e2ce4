#ifndef KESTREL_DATA_CHECK_INSTANTS_H_
#define KESTREL_DATA_CHECK_INSTANTS_H_

#include <cstdint>
#include <vector>

#include "data/tzif_file.h"

// The checked span: from 1900-01-01 up to, not including, 2100-01-01 UTC.
inline constexpr std::int64_t kCheckFrom = -2208988800;
inline constexpr std::int64_t kCheckTo = 4102444800;

// The instants at which two readers of a zone must agree: each transition
// within the span (the file's own, then those of its footer's rule up to the
// span's end), the second before it and the midpoint since the previous one,
// and the span's first and last second. Sorted, each once.
std::vector<std::int64_t> check_instants(const tzif_file& zone);

#endif  // KESTREL_DATA_CHECK_INSTANTS_H_
