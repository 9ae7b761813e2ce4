#ifndef KESTREL_DATASET_KAL_ZONEINFO_H_
#define KESTREL_DATASET_KAL_ZONEINFO_H_

#include <string>

#include "dataset/kal_dataset_component.h"
#include "fs/word_file.h"

// The compiled zone files of a data set, reached by every reader through
// /var/db/timezone/zoneinfo. Its release word, from "+VERSION", is also the
// system partition's version.
class kal_zoneinfo final : public kal_dataset_component {
 public:
  kal_zoneinfo();
  // An empty dataset_path stands for the system partition.
  explicit kal_zoneinfo(const std::string& dataset_path);

  // The first word of "+VERSION"; empty when there is none, the file cannot
  // be read or is not a regular file.
  std::string version() const;

  // Always true: zone files of any release can stand in for each other.
  bool compatible_schema(const kal_dataset_component& other) const override;

  // Replaces /var/db/timezone/zoneinfo with a link to zoneinfo_dir.
  void make_current() const override;

 private:
  const std::string zoneinfo_dir;
  // Opened with the component but read only when version() is asked for.
  // Only the system partition's word is ever asked for: it becomes that data
  // set's version. A staged data set takes its version from its directory's
  // name, so its "+VERSION" word, however long, costs neither reading nor
  // memory. Opening it at once still leaves errno as the component has always
  // left it, for the warnings that follow.
  fs::word_file version_file;
};

#endif  // KESTREL_DATASET_KAL_ZONEINFO_H_
