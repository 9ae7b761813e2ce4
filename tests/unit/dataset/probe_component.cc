#include "probe_component.h"

#include <utility>

probe_component::probe_component(std::string name,
                                 std::vector<std::string>& log, bool answer,
                                 int error)
    : name(std::move(name)), log(&log), answer(answer), error(error) {}

bool probe_component::compatible_schema(
    const kal_dataset_component& other) const {
  const auto* probe = dynamic_cast<const probe_component*>(&other);
  log->push_back(name + " asks " +
                 (probe != nullptr ? probe->name : "another kind"));
  return answer;
}

void probe_component::make_current() const {
  log->push_back(name + " current");
  if (error != 0) {
    throw error;
  }
}

std::shared_ptr<kal_dataset_component> make_probe(const std::string& name,
                                                  std::vector<std::string>& log,
                                                  bool answer, int error) {
  return std::shared_ptr<probe_component>(
      new probe_component(name, log, answer, error));
}
