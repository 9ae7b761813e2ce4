#ifndef KESTREL_DATASET_KAL_DATASET_H_
#define KESTREL_DATASET_KAL_DATASET_H_

#include <memory>
#include <string>
#include <vector>

#include "dataset/kal_dataset_component.h"
#include "dataset/kal_version.h"

// One complete copy of the device's time-zone data: the system partition's
// (empty path) or a staged update in /var/db/timezone/tz/<version string>.
// Its components are, in this order, the zone files and the ICU data.
class kal_dataset {
 public:
  // The system partition's data set.
  kal_dataset();
  // The data set in path; an empty path is the system partition's.
  explicit kal_dataset(const std::string& path);

  // Whether every component of this data set accepts the schema of the
  // other's component at the same place.
  bool compatible(const kal_dataset& other) const;
  // Newer by version; nothing else is compared.
  bool operator>(const kal_dataset& other) const;
  // The same directory; nothing else is compared.
  bool operator==(const kal_dataset& other) const;

  // Re-points the links at this data set, zone files first.
  void make_current() const;
  std::string get_version_string() const;

  // Makes the system partition's data current.
  static void reset_to_system();

  kal_version version;
  std::string version_string;
  std::string path;
  std::vector<std::shared_ptr<kal_dataset_component>> components;

 private:
  void create_components();
};

#endif  // KESTREL_DATASET_KAL_DATASET_H_
