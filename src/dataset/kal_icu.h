#ifndef KESTREL_DATASET_KAL_ICU_H_
#define KESTREL_DATASET_KAL_ICU_H_

#include <string>

#include "dataset/kal_dataset_component.h"

// The ICU time-zone data of a data set. Its schema (ICU data version and
// format letter, such as 57l) decides whether another data set's ICU data can
// replace it; the system's is named in /usr/share/icu/icutzformat.txt, an
// update's in the name of its data file, icutz<schema>.dat.
class kal_icu final : public kal_dataset_component {
 public:
  kal_icu();
  // An empty dataset_path stands for the system partition.
  explicit kal_icu(const std::string& dataset_path);

  // True when other is an ICU component with the very same schema text.
  bool compatible_schema(const kal_dataset_component& other) const override;

  // Clears /var/db/timezone/icutz and /var/db/icutz; an update then links
  // /var/db/timezone/icutz to its own ICU data. Without the link, the
  // system's data in /usr/share/icu is current.
  void make_current() const override;

 private:
  void initialize();

  std::string schema;
  const std::string icu_path;
};

#endif  // KESTREL_DATASET_KAL_ICU_H_
