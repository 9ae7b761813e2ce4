#ifndef KESTREL_DATASET_KAL_ZONEINFO_H_
#define KESTREL_DATASET_KAL_ZONEINFO_H_

#include <string>

#include "dataset/kal_dataset_component.h"

// The compiled zone files of a data set, reached by every reader through
// /var/db/timezone/zoneinfo. Its release word, from "+VERSION", is also the
// system partition's version.
class kal_zoneinfo final : public kal_dataset_component {
 public:
  kal_zoneinfo();
  // An empty dataset_path stands for the system partition.
  explicit kal_zoneinfo(const std::string& dataset_path);

  // The first word of "+VERSION"; empty when there is none.
  std::string version() const;

  // Always true: zone files of any release can stand in for each other.
  bool compatible_schema(const kal_dataset_component& other) const override;

  // Replaces /var/db/timezone/zoneinfo with a link to zoneinfo_dir.
  void make_current() const override;

 private:
  void read_version();

  const std::string zoneinfo_dir;
  std::string version_;
};

#endif  // KESTREL_DATASET_KAL_ZONEINFO_H_
