#ifndef KESTREL_TESTS_DATASET_PROBE_COMPONENT_H_
#define KESTREL_TESTS_DATASET_PROBE_COMPONENT_H_

#include <memory>
#include <string>
#include <vector>

#include "dataset/kal_dataset_component.h"

// A kind of component the tool does not have. It writes what it is asked into
// a log shared with the test and answers as it is told.
class probe_component final : public kal_dataset_component {
 public:
  // answer: what compatible_schema says; error: the int make_current raises,
  // none when 0.
  probe_component(std::string name, std::vector<std::string>& log,
                  bool answer = true, int error = 0);

  // Logs "<name> asks <other's name>", or "<name> asks another kind".
  bool compatible_schema(const kal_dataset_component& other) const override;
  // Logs "<name> current", then raises error if there is one.
  void make_current() const override;

 private:
  std::string name;
  std::vector<std::string>* log;
  bool answer;
  int error;
};

// A probe owned the way the data set owns its components.
std::shared_ptr<kal_dataset_component> make_probe(const std::string& name,
                                                  std::vector<std::string>& log,
                                                  bool answer = true,
                                                  int error = 0);

#endif  // KESTREL_TESTS_DATASET_PROBE_COMPONENT_H_
