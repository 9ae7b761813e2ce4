#ifndef KESTREL_DATASET_KAL_DATASET_COMPONENT_H_
#define KESTREL_DATASET_KAL_DATASET_COMPONENT_H_

#include <string>

// One kind of data inside a data set. The destructor is deliberately not
// virtual: components are always owned by a std::shared_ptr made from the
// concrete type, whose deleter runs the concrete destructor. Never delete a
// component through a pointer to this class.
class kal_dataset_component {
 public:
  kal_dataset_component() = default;
  explicit kal_dataset_component(const std::string& dataset_path);

  kal_dataset_component(const kal_dataset_component&) = delete;
  kal_dataset_component& operator=(const kal_dataset_component&) = delete;

  // Whether other, the same kind of component of another data set, holds data
  // of a schema this one can stand in for. Never raises.
  virtual bool compatible_schema(const kal_dataset_component& other) const = 0;

  // Points this component's well-known link at its data. Failures are raised
  // as the int errno of the file-system helpers.
  virtual void make_current() const = 0;

 protected:
  ~kal_dataset_component() = default;

  // The data set's directory under /var/db/timezone/tz/; empty for the
  // system partition.
  const std::string dataset_path;
};

#endif  // KESTREL_DATASET_KAL_DATASET_COMPONENT_H_
