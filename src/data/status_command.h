#ifndef KESTREL_DATA_STATUS_COMMAND_H_
#define KESTREL_DATA_STATUS_COMMAND_H_

#include <string>
#include <vector>

#include "data/device_state.h"

// The device's state as text for people or, with json, as one JSON object.
std::string format_status(const device_state& state, bool json);

// kestrel-data status [--json]
int run_status(const std::vector<std::string>& args);

#endif  // KESTREL_DATA_STATUS_COMMAND_H_
