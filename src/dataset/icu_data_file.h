#ifndef KESTREL_DATASET_ICU_DATA_FILE_H_
#define KESTREL_DATASET_ICU_DATA_FILE_H_

#include <optional>
#include <string_view>

// The schema in the name of an ICU time-zone data file: for icutz57l.dat,
// 57l (ICU data version and format letter l, b or e). The whole name must be
// icutz, one or more ASCII digits, one of l, b, e, and .dat, as the pattern
//   icutz([0-9]+[lbe])\.dat
// matches it; anything else has no schema. The view points into name.
std::optional<std::string_view> icu_data_file_schema(std::string_view name);

#endif  // KESTREL_DATASET_ICU_DATA_FILE_H_
